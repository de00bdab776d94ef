#include "PromptDialog.h"

#include "OrvixPrompt.h"
#include "Texts.h"
#include "resource.h"

#include <algorithm>
#include <bit>
#include <iterator>
#include <optional>

namespace
{

struct Button
{
    int control;
    std::int32_t answer;
};

/// From right to left.
constexpr Button Buttons[] = {{IDC_NO_TO_ALL, OrvixPromptAnswer::NoToAll},
                              {IDNO, OrvixPromptAnswer::No},
                              {IDC_YES_TO_ALL, OrvixPromptAnswer::YesToAll},
                              {IDYES, OrvixPromptAnswer::Yes}};

constexpr Layout::Rule PromptRules[] = {
    {IDC_MESSAGE, Layout::GrowX | Layout::GrowY}, {IDC_DO_NOT_ASK, Layout::GrowX | Layout::MoveY},
    {IDYES, Layout::MoveX | Layout::MoveY},       {IDC_YES_TO_ALL, Layout::MoveX | Layout::MoveY},
    {IDNO, Layout::MoveX | Layout::MoveY},        {IDC_NO_TO_ALL, Layout::MoveX | Layout::MoveY}};

std::optional<std::int32_t> AnswerOf(int control)
{
    const auto* found = std::find_if(std::begin(Buttons), std::end(Buttons),
                                     [control](const Button& button) { return button.control == control; });
    return found == std::end(Buttons) ? std::nullopt : std::optional(found->answer);
}

RECT RectOf(HWND control)
{
    RECT rect{};
    GetWindowRect(control, &rect);
    MapWindowPoints(nullptr, GetParent(control), reinterpret_cast<POINT*>(&rect), 2);
    return rect;
}

} // namespace

PromptDialog::PromptDialog(IOrvixCoreUIClientAccess* access, const wchar_t* title, const wchar_t* message,
                           std::uint32_t options)
    : Dialog(IDD_PROMPT, nullptr, access), m_title(title != nullptr ? title : L""),
      m_message(message != nullptr ? message : L""), m_options(options)
{
}

std::span<const Layout::Rule> PromptDialog::Rules() const
{
    return PromptRules;
}

void PromptDialog::OnInit()
{
    SetTitle(m_title);
    SetText(IDC_MESSAGE, m_message);
    SendDlgItemMessageW(Window(), IDC_ICON_OF_PROMPT, STM_SETICON, reinterpret_cast<WPARAM>(LoadIconW(nullptr, Icon())),
                        0);
    if (Has(OrvixPromptOption::OnlyOK))
    {
        SetText(IDYES, Text(IDS_OK).c_str());
    }
    if (!Has(OrvixPromptOption::OfferStopAsking))
    {
        Hide(IDC_DO_NOT_ASK);
    }
    ArrangeButtons();
}

/// Moves the buttons that are offered to the right and hides the others.
void PromptDialog::ArrangeButtons() const
{
    RECT rects[std::size(Buttons)];
    std::transform(std::begin(Buttons), std::end(Buttons), rects,
                   [this](const Button& button) { return RectOf(Item(button.control)); });
    const RECT* rect = rects;
    for (const Button& button : Buttons)
    {
        if (Offers(m_options, button.answer))
        {
            SetWindowPos(Item(button.control), nullptr, rect->left, rect->top, 0, 0, SWP_NOSIZE | SWP_NOZORDER);
            ++rect;
        }
        else
        {
            Hide(button.control);
        }
    }
}

void PromptDialog::OnCommand(int control, int)
{
    if (control == IDCANCEL)
    {
        control = Has(OrvixPromptOption::OnlyOK) ? IDYES : IDNO; // with one button, closing means OK
    }
    if (const auto answer = AnswerOf(control))
    {
        m_doNotAskAgain = IsChecked(IDC_DO_NOT_ASK);
        End(*answer);
    }
}

bool PromptDialog::Offers(std::uint32_t options, std::int32_t answer)
{
    const bool onlyOK = (options & OrvixPromptOption::OnlyOK) != 0;
    switch (answer)
    {
    case OrvixPromptAnswer::Yes:
        return true;
    case OrvixPromptAnswer::YesToAll:
        return !onlyOK && (options & OrvixPromptOption::OfferYesToAll) != 0;
    case OrvixPromptAnswer::NoToAll:
        return !onlyOK && (options & OrvixPromptOption::OfferNoToAll) != 0;
    default:
        return !onlyOK;
    }
}

const wchar_t* PromptDialog::Icon() const
{
    switch (m_options & OrvixPromptOption::IconMask)
    {
    case OrvixPromptOption::InformationIcon:
        return IDI_INFORMATION;
    case OrvixPromptOption::WarningIcon:
        return IDI_WARNING;
    case OrvixPromptOption::ErrorIcon:
        return IDI_ERROR;
    default:
        return Has(OrvixPromptOption::OnlyOK) ? IDI_INFORMATION : IDI_QUESTION;
    }
}
