#include "PromptDialog.h"

#include "resource.h"

#include <optional>

namespace
{

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

} // namespace

PromptDialog::PromptDialog(IOrvixCoreUIClientAccess* access, const wchar_t* title, const wchar_t* message,
                           std::uint32_t options)
    : Dialog(IDD_PROMPT, access), m_title(title ? title : L""), m_message(message ? message : L""), m_options(options)
{
}

void PromptDialog::OnInit()
{
    SetTitle(m_title);
    SetText(IDC_MESSAGE, m_message);
    if (Has(OnlyOk))
    {
        SetText(IDYES, L"OK");
        Hide(IDNO);
    }
    if (!Has(OfferYesToAll) || Has(OnlyOk))
        Hide(IDC_YES_TO_ALL);
    if (!Has(OfferNoToAll) || Has(OnlyOk))
        Hide(IDC_NO_TO_ALL);
    if (!Has(OfferDoNotAsk))
        Hide(IDC_DO_NOT_ASK);
}

void PromptDialog::OnCommand(int control, int)
{
    const auto answer = AnswerOf(control);
    if (!answer)
        return;
    m_doNotAskAgain = IsTicked(IDC_DO_NOT_ASK);
    End(*answer);
}
