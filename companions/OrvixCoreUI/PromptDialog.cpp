#include "PromptDialog.h"

#include "Texts.h"
#include "resource.h"

#include <algorithm>
#include <bit>
#include <iterator>
#include <optional>

namespace
{

/// From the right.
constexpr int Buttons[] = {IDC_NO_TO_ALL, IDNO, IDC_YES_TO_ALL, IDYES};

constexpr Layout::Rule PromptRules[] = {
    {IDC_MESSAGE, Layout::GrowX | Layout::GrowY}, {IDC_DO_NOT_ASK, Layout::GrowX | Layout::MoveY},
    {IDYES, Layout::MoveX | Layout::MoveY},       {IDC_YES_TO_ALL, Layout::MoveX | Layout::MoveY},
    {IDNO, Layout::MoveX | Layout::MoveY},        {IDC_NO_TO_ALL, Layout::MoveX | Layout::MoveY}};

std::optional<std::int32_t> AnswerOf(int control)
{
    switch (control)
    {
    case IDYES:
        return 1;
    case IDNO:
    case IDCANCEL:
        return 0;
    case IDC_YES_TO_ALL:
        return 2;
    case IDC_NO_TO_ALL:
        return 3;
    default:
        return std::nullopt;
    }
}

RECT PlaceOf(HWND control)
{
    RECT place{};
    GetWindowRect(control, &place);
    MapWindowPoints(nullptr, GetParent(control), reinterpret_cast<POINT*>(&place), 2);
    return place;
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
    if (Has(OnlyOk))
    {
        SetText(IDYES, Text(IDS_OK).c_str());
    }
    if (!Has(OfferDoNotAsk))
    {
        Hide(IDC_DO_NOT_ASK);
    }

    // The buttons that are offered take the places on the right.
    RECT places[std::size(Buttons)];
    std::transform(std::begin(Buttons), std::end(Buttons), places,
                   [this](int button) { return PlaceOf(Item(button)); });
    const RECT* place = places;
    for (const int button : Buttons)
    {
        if (Offers(button))
        {
            SetWindowPos(Item(button), nullptr, place->left, place->top, 0, 0, SWP_NOSIZE | SWP_NOZORDER);
            ++place;
        }
        else
        {
            Hide(button);
        }
    }
}

void PromptDialog::OnCommand(int control, int)
{
    // Where OK is all that can be said, closing says it.
    const auto answer = AnswerOf(control == IDCANCEL && Has(OnlyOk) ? IDYES : control);
    if (!answer)
    {
        return;
    }
    m_doNotAskAgain = IsTicked(IDC_DO_NOT_ASK);
    End(*answer);
}

bool PromptDialog::Offers(int button) const
{
    switch (button)
    {
    case IDYES:
        return true;
    case IDNO:
        return !Has(OnlyOk);
    case IDC_YES_TO_ALL:
        return Has(OfferYesToAll) && !Has(OnlyOk);
    default:
        return Has(OfferNoToAll) && !Has(OnlyOk);
    }
}

const wchar_t* PromptDialog::Icon() const
{
    switch (m_options & Icons)
    {
    case InformationIcon:
        return IDI_INFORMATION;
    case WarningIcon:
        return IDI_WARNING;
    case ErrorIcon:
        return IDI_ERROR;
    default:
        return Has(OnlyOk) ? IDI_INFORMATION : IDI_QUESTION;
    }
}
