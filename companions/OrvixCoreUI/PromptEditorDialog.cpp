#include "PromptEditorDialog.h"

#include "OrvixPromptTable.h"
#include "resource.h"

#include <algorithm>
#include <iterator>
#include <string>

namespace
{

struct Answer
{
    unsigned long action;
    const wchar_t* words;
};

/// In the order of precedence in which a stored action is read; the last one also stands for no answer at all.
constexpr Answer Answers[] = {{0x1, L"Ask"}, {0x2, L"Yes"}, {0x8, L"Yes to all"}, {0x10, L"No to all"}, {0x4, L"No"}};

std::size_t AnswerIndex(unsigned long action)
{
    const auto* found = std::find_if(std::begin(Answers), std::end(Answers),
                                     [action](const Answer& answer) { return (action & answer.action) != 0; });
    return found == std::end(Answers) ? std::size(Answers) - 1 : static_cast<std::size_t>(found - std::begin(Answers));
}

} // namespace

PromptEditorDialog::PromptEditorDialog(IOrvixCoreUIClientAccess* access, OrvixPromptTable& prompts)
    : Dialog(IDD_PROMPT_EDITOR, access), m_prompts(prompts)
{
    const auto count = static_cast<unsigned int>(prompts.NumPrompts());
    for (unsigned int row = 0; row < count; ++row)
        m_actions.push_back(prompts.GetPrompt(row));
}

void PromptEditorDialog::OnInit()
{
    for (const Answer& answer : Answers)
        SendMessageW(Item(IDC_ANSWER), CB_ADDSTRING, 0, reinterpret_cast<LPARAM>(answer.words));
    EnableWindow(Item(IDC_ANSWER), FALSE);

    m_list = ListView(Item(IDC_PROMPTS), Colors(), false);
    m_list.AddColumn(0, L"Prompt", m_list.Width() * 2 / 3);
    m_list.AddColumn(1, L"Answer", m_list.Width() / 3);
    for (unsigned int row = 0; row < m_actions.size(); ++row)
    {
        m_list.AddRow(static_cast<int>(row), m_prompts.GetPromptText(row));
        ShowAction(static_cast<int>(row));
    }
}

void PromptEditorDialog::OnCommand(int control, int notification)
{
    if (control == IDC_ANSWER && notification == CBN_SELCHANGE)
        TakeAnswer();
    else if (control == IDOK)
        End(Store() ? 1 : 0);
    else if (control == IDCANCEL)
        End(0);
}

void PromptEditorDialog::OnListSelection()
{
    const auto row = m_list.Selected();
    EnableWindow(Item(IDC_ANSWER), row && !m_prompts.GetLocked(static_cast<unsigned int>(*row)));
    const WPARAM answer = row ? AnswerIndex(m_actions[static_cast<std::size_t>(*row)]) : static_cast<WPARAM>(-1);
    SendMessageW(Item(IDC_ANSWER), CB_SETCURSEL, answer, 0);
}

void PromptEditorDialog::ShowAction(int row) const
{
    std::wstring words = Answers[AnswerIndex(m_actions[static_cast<std::size_t>(row)])].words;
    if (m_prompts.GetLocked(static_cast<unsigned int>(row)))
        words += L" (locked)";
    m_list.SetText(row, 1, words.c_str());
}

void PromptEditorDialog::TakeAnswer()
{
    const auto row = m_list.Selected();
    const LRESULT answer = SendMessageW(Item(IDC_ANSWER), CB_GETCURSEL, 0, 0);
    if (!row || answer < 0)
        return;
    unsigned long& action = m_actions[static_cast<std::size_t>(*row)];
    if (AnswerIndex(action) != static_cast<std::size_t>(answer))
        action = Answers[answer].action;
    ShowAction(*row);
}

bool PromptEditorDialog::Store()
{
    bool changed = false;
    for (unsigned int row = 0; row < m_actions.size(); ++row)
    {
        if (m_actions[row] != m_prompts.GetPrompt(row))
            changed = m_prompts.SetPrompt(row, m_actions[row]) || changed;
    }
    return changed;
}
