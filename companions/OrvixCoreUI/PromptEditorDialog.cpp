#include "PromptEditorDialog.h"

#include "OrvixPrompt.h"
#include "OrvixPromptTable.h"
#include "PromptDialog.h"
#include "Texts.h"
#include "resource.h"

#include <algorithm>
#include <iterator>
#include <string>

namespace
{

constexpr Layout::Rule EditorRules[] = {{IDC_FILTER, Layout::GrowX},
                                        {IDC_LIST, Layout::GrowX | Layout::GrowY},
                                        {IDC_WHOLE_TEXT_LABEL, Layout::MoveY},
                                        {IDC_WHOLE_TEXT, Layout::GrowX | Layout::MoveY},
                                        {IDC_ANSWER_LABEL, Layout::MoveY},
                                        {IDC_ANSWER, Layout::MoveY},
                                        {IDC_RESET, Layout::MoveY},
                                        {IDOK, Layout::MoveX | Layout::MoveY},
                                        {IDCANCEL, Layout::MoveX | Layout::MoveY}};

struct Answer
{
    std::uint32_t action;
    UINT words;
};

/// Of an action with several bits the first one in this order counts. An action without any of them is read as No.
constexpr Answer Answers[] = {{OrvixPromptAction::Ask, IDS_ASK},
                              {OrvixPromptAction::Yes, IDS_YES},
                              {OrvixPromptAction::YesToAll, IDS_YES_TO_ALL},
                              {OrvixPromptAction::NoToAll, IDS_NO_TO_ALL},
                              {OrvixPromptAction::No, IDS_NO}};
constexpr std::size_t Ask = 0;

std::size_t AnswerIndex(unsigned long action)
{
    const auto* found = std::find_if(std::begin(Answers), std::end(Answers),
                                     [action](const Answer& answer) { return (action & answer.action) != 0; });
    return found == std::end(Answers) ? std::size(Answers) - 1 : static_cast<std::size_t>(found - std::begin(Answers));
}

} // namespace

PromptEditorDialog::PromptEditorDialog(IOrvixCoreUIClientAccess* access, OrvixPromptTable& prompts)
    : Dialog(IDD_PROMPT_EDITOR, L"PromptEditor", access), m_prompts(prompts)
{
    const auto count = static_cast<unsigned int>(prompts.NumPrompts());
    for (unsigned int row = 0; row < count; ++row)
    {
        m_actions.push_back(prompts.GetPrompt(row));
    }
}

std::span<const Layout::Rule> PromptEditorDialog::Rules() const
{
    return EditorRules;
}

void PromptEditorDialog::OnInit()
{
    m_list = TableView(Item(IDC_LIST), Colors(), SettingsName(), false);
    m_list.AddColumn(Text(IDS_PROMPT), 70);
    m_list.AddColumn(Text(IDS_ANSWER), 30);
    for (unsigned int row = 0; row < m_actions.size(); ++row)
    {
        m_list.AddRow({OneLine(m_prompts.GetPromptText(row)), AnswerInWords(row)}, false);
    }
    m_list.Open();
    ShowSelected();
}

void PromptEditorDialog::OnCommand(int control, int notification)
{
    switch (control)
    {
    case IDC_FILTER:
        if (notification == EN_CHANGE)
        {
            m_list.Filter(GetText(IDC_FILTER));
        }
        break;
    case IDC_ANSWER:
        if (notification == CBN_SELCHANGE)
        {
            TakeAnswer();
        }
        break;
    case IDC_RESET:
        if (const auto row = m_list.Selected())
        {
            SetAnswer(static_cast<unsigned int>(*row), Ask);
        }
        Focus(IDC_LIST); // before the button that has it is disabled
        ShowSelected();
        break;
    case IDOK:
        End(Store() ? OrvixPromptEditorResult::Changed : OrvixPromptEditorResult::Unchanged);
        break;
    case IDCANCEL:
        End(OrvixPromptEditorResult::Unchanged);
        break;
    default:
        break;
    }
}

LRESULT PromptEditorDialog::OnNotify(const NMHDR& notification)
{
    const LRESULT result = m_list.Handle(notification);
    if (notification.code == LVN_ITEMCHANGED)
    {
        ShowSelected();
    }
    return result;
}

bool PromptEditorDialog::OnContextMenu(HWND control, POINT point)
{
    if (control != Item(IDC_LIST))
    {
        return false;
    }
    m_list.ShowMenu(point);
    return true;
}

std::wstring PromptEditorDialog::AnswerInWords(unsigned int row) const
{
    std::wstring words = Text(Answers[AnswerIndex(m_actions[row])].words);
    if (!m_prompts.GetLocked(row))
    {
        return words;
    }
    return FormatText(IDS_LOCKED, {reinterpret_cast<DWORD_PTR>(words.c_str())});
}

bool PromptEditorDialog::IsOffered(unsigned int row, std::size_t answer) const
{
    return answer == Ask ||
           PromptDialog::Offers(m_prompts.GetPromptOptions(row), OrvixPromptAction::ToAnswer(Answers[answer].action));
}

void PromptEditorDialog::ShowSelected()
{
    const HWND answers = Item(IDC_ANSWER);
    SendMessageW(answers, CB_RESETCONTENT, 0, 0);
    const auto selected = m_list.Selected();
    const bool editable = selected && !m_prompts.GetLocked(static_cast<unsigned int>(*selected));
    EnableWindow(answers, editable ? TRUE : FALSE);
    EnableWindow(Item(IDC_RESET), editable && AnswerIndex(m_actions[*selected]) != Ask ? TRUE : FALSE);
    const wchar_t* text = selected ? m_prompts.GetPromptText(static_cast<unsigned int>(*selected)) : L"";
    SetText(IDC_WHOLE_TEXT, WithFieldLineEnds(text).c_str());
    if (!selected)
    {
        return;
    }
    const std::size_t current = AnswerIndex(m_actions[*selected]);
    for (std::size_t answer = 0; answer < std::size(Answers); ++answer)
    {
        if (answer != current && !IsOffered(static_cast<unsigned int>(*selected), answer))
        {
            continue;
        }
        const std::wstring words = Text(Answers[answer].words);
        const LRESULT item = SendMessageW(answers, CB_ADDSTRING, 0, reinterpret_cast<LPARAM>(words.c_str()));
        SendMessageW(answers, CB_SETITEMDATA, static_cast<WPARAM>(item), static_cast<LPARAM>(answer));
        if (answer == current)
        {
            SendMessageW(answers, CB_SETCURSEL, static_cast<WPARAM>(item), 0);
        }
    }
}

void PromptEditorDialog::TakeAnswer()
{
    const auto row = m_list.Selected();
    const LRESULT item = SendDlgItemMessageW(Window(), IDC_ANSWER, CB_GETCURSEL, 0, 0);
    if (!row || item < 0)
    {
        return;
    }
    const LRESULT answer = SendDlgItemMessageW(Window(), IDC_ANSWER, CB_GETITEMDATA, static_cast<WPARAM>(item), 0);
    SetAnswer(static_cast<unsigned int>(*row), static_cast<std::size_t>(answer));
    EnableWindow(Item(IDC_RESET), static_cast<std::size_t>(answer) != Ask ? TRUE : FALSE);
}

void PromptEditorDialog::SetAnswer(unsigned int row, std::size_t answer)
{
    // An action with several bits that already means this answer stays as it is.
    if (AnswerIndex(m_actions[row]) != answer)
    {
        m_actions[row] = Answers[answer].action;
    }
    m_list.SetCell(row, 1, AnswerInWords(row));
}

bool PromptEditorDialog::Store()
{
    bool changed = false;
    for (unsigned int row = 0; row < m_actions.size(); ++row)
    {
        if (m_actions[row] != m_prompts.GetPrompt(row))
        {
            changed = m_prompts.SetPrompt(row, m_actions[row]) || changed;
        }
    }
    return changed;
}
