#pragma once

#include "Dialog.h"
#include "TableView.h"

#include <vector>

class OrvixPromptTable;

/// Shows the stored answers and lets the user change those that are not locked. The result is an
/// `OrvixPromptEditorResult`.
class PromptEditorDialog final : public Dialog
{
public:
    /// `prompts` outlives the dialog.
    PromptEditorDialog(IOrvixCoreUIClientAccess* access, OrvixPromptTable& prompts);

private:
    std::span<const Layout::Rule> Rules() const override;
    void OnInit() override;
    void OnCommand(int control, int notification) override;
    LRESULT OnNotify(const NMHDR& notification) override;
    bool OnContextMenu(HWND control, POINT point) override;
    void OnMouseMove(int) override { m_list.OnMouseMove(); }
    void OnSize() override { m_list.FitColumns(); }
    void OnClose() override { m_list.Close(); }

    std::wstring AnswerInWords(unsigned int row) const;
    bool IsOffered(unsigned int row, std::size_t answer) const;
    void ShowSelected();
    void TakeAnswer();
    void SetAnswer(unsigned int row, std::size_t answer);
    bool Store();

    OrvixPromptTable& m_prompts;
    std::vector<unsigned long> m_actions;
    TableView m_list;
};
