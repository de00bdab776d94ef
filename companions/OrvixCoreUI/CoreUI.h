#pragma once

#include "IOrvixCoreUI.h"

/// The reference dialogs. docs/ui-contract.md says what the pass-through arguments mean here. A dialog that cannot be
/// shown changes nothing. It gives the answer of a user who cancels, as does one that fails while it is open.
class CoreUI final : public IOrvixCoreUI
{
public:
    void SetClientAccess(IOrvixCoreUIClientAccess* access) override { m_access = access; }

    /// `a` is the owner's HWND or null; `b` is the title and `c` the message, both `const wchar_t*`, both may be null.
    /// `options` are bits of `OrvixPromptOption`. Returns an `OrvixPromptAnswer`.
    std::int32_t ShowPrompt(void* a, void* b, void* c, std::uint32_t options, bool* dontAskAgain) override;

    /// `a` is the owner's HWND or null. Returns an `OrvixDialogResult`; without a record or a file list, cancelled.
    std::int32_t ShowFileListDialog(void* a, OrvixFileListDialogParams* params) override;

    /// `a` is the owner's HWND or null; `b` is not used. Returns an `OrvixPromptEditorResult`.
    std::int32_t EditPrompts(void* a, void* b, OrvixPromptTable* prompts) override;

private:
    IOrvixCoreUIClientAccess* m_access = nullptr;
};
