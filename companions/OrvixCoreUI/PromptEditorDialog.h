#pragma once

#include "Dialog.h"
#include "ListView.h"

#include <vector>

class OrvixPromptTable;

/// Shows the stored answers and lets the user change those that are not locked: 1 when one was changed, else 0.
class PromptEditorDialog final : public Dialog
{
public:
    /// `prompts` outlives the dialog.
    PromptEditorDialog(IOrvixCoreUIClientAccess* access, OrvixPromptTable& prompts);

private:
    void OnInit() override;
    void OnCommand(int control, int notification) override;
    void OnListSelection() override;

    void ShowAction(int row) const;
    void TakeAnswer();
    bool Store();

    OrvixPromptTable& m_prompts;
    std::vector<unsigned long> m_actions;
    ListView m_list;
};
