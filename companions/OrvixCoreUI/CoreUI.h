#pragma once

#include "IOrvixCoreUI.h"

/// The reference dialogs. What the pass-through arguments mean here is written down in docs/ui-contract.md.
/// A dialog that cannot be shown answers 0 and changes nothing.
class CoreUI final : public IOrvixCoreUI
{
public:
    void SetClientAccess(IOrvixCoreUIClientAccess* access) override { m_access = access; }
    std::int32_t ShowPrompt(void* a, void* b, void* c, std::uint32_t options, bool* dontAskAgain) override;
    std::int32_t ShowFileListDialog(void* a, OrvixFileListDialogParams* params) override;
    std::int32_t EditPrompts(void* a, void* b, OrvixPromptTable* prompts) override;

private:
    IOrvixCoreUIClientAccess* m_access = nullptr;
};
