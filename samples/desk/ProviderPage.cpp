#include "ProviderPage.h"

#include "IOrvixProvider.h"
#include "OrvixProviderResult.h"
#include "Settings.h"
#include "resource.h"

#include <commctrl.h>
#include <shellapi.h>

#include <bit>

namespace
{

void AddColumn(HWND list, int index, std::wstring heading, int width)
{
    LVCOLUMNW column{};
    column.mask = LVCF_TEXT | LVCF_WIDTH;
    column.pszText = heading.data();
    column.cx = width;
    ListView_InsertColumn(list, index, &column);
}

bool IsFilled(const wchar_t* text)
{
    return text != nullptr && *text != L'\0';
}

} // namespace

std::optional<std::uint32_t> ProviderPage::Show(HWND owner)
{
    PROPSHEETPAGEW page{};
    page.dwSize = sizeof page;
    page.hInstance = GetModuleHandleW(nullptr);
    page.pszTemplate = MAKEINTRESOURCEW(IDD_PROVIDERS);
    page.pfnDlgProc = &Procedure;
    page.lParam = reinterpret_cast<LPARAM>(this);
    PROPSHEETHEADERW sheet{};
    sheet.dwSize = sizeof sheet;
    sheet.dwFlags = PSH_PROPSHEETPAGE | PSH_NOAPPLYNOW | PSH_NOCONTEXTHELP;
    sheet.hwndParent = owner;
    sheet.pszCaption = L"Options";
    sheet.nPages = 1;
    sheet.ppsp = &page;
    PropertySheetW(&sheet);
    return m_confirmed && m_used != m_current ? m_used : std::nullopt;
}

INT_PTR CALLBACK ProviderPage::Procedure(HWND page, UINT message, WPARAM wParam, LPARAM lParam)
{
    if (message == WM_INITDIALOG)
    {
        const LPARAM self = std::bit_cast<const PROPSHEETPAGEW*>(lParam)->lParam;
        SetWindowLongPtrW(page, DWLP_USER, self);
        std::bit_cast<ProviderPage*>(self)->m_page = page;
    }
    auto* self = std::bit_cast<ProviderPage*>(GetWindowLongPtrW(page, DWLP_USER));
    return self != nullptr ? self->Handle(message, wParam, lParam) : FALSE;
}

INT_PTR ProviderPage::Handle(UINT message, WPARAM wParam, LPARAM lParam)
{
    switch (message)
    {
    case WM_INITDIALOG:
        Fill();
        return TRUE;
    case WM_NOTIFY:
        SetWindowLongPtrW(m_page, DWLP_MSGRESULT, OnNotify(*std::bit_cast<const NMHDR*>(lParam)));
        return TRUE;
    case WM_COMMAND:
        switch (LOWORD(wParam))
        {
        case IDC_USE:
            Use();
            return TRUE;
        case IDC_OPTIONS:
            WithProvider(L"options", [](IOrvixProvider& provider) { return provider.ShowOptions(); });
            return TRUE;
        case IDC_PROGRAM:
            RunProgram();
            return TRUE;
        default:
            return FALSE;
        }
    default:
        return FALSE;
    }
}

LRESULT ProviderPage::OnNotify(const NMHDR& notification)
{
    if (notification.code == PSN_APPLY)
    {
        Store();
        return PSNRET_NOERROR;
    }
    if (notification.code == LVN_ITEMCHANGED)
    {
        for (const int control : {IDC_USE, IDC_OPTIONS, IDC_PROGRAM})
        {
            EnableWindow(GetDlgItem(m_page, control), Selected() ? TRUE : FALSE);
        }
    }
    return 0;
}

void ProviderPage::Fill()
{
    m_list = GetDlgItem(m_page, IDC_PROVIDER_LIST);
    ListView_SetExtendedListViewStyle(m_list, LVS_EX_CHECKBOXES | LVS_EX_FULLROWSELECT);
    RECT inside{};
    GetClientRect(m_list, &inside);
    AddColumn(m_list, 0, L"Provider", inside.right * 45 / 100);
    AddColumn(m_list, 1, L"State", inside.right - inside.right * 45 / 100);
    for (std::uint32_t index = 0; index < m_library.Services().GetProviderCount(); ++index)
    {
        std::wstring name = m_library.Services().GetProviderName(index);
        LVITEMW item{};
        item.mask = LVIF_TEXT;
        item.iItem = static_cast<int>(index);
        item.pszText = name.data();
        ListView_InsertItem(m_list, &item);
        ListView_SetCheckState(m_list, item.iItem, Settings::IsProviderUsed(name) ? TRUE : FALSE);
    }
    ShowStates();
    ListView_SetItemState(m_list, static_cast<int>(m_used.value_or(0)), LVIS_SELECTED | LVIS_FOCUSED,
                          LVIS_SELECTED | LVIS_FOCUSED);
}

void ProviderPage::ShowStates()
{
    for (std::uint32_t index = 0; index < m_library.Services().GetProviderCount(); ++index)
    {
        std::wstring state = m_used == index ? L"in use" : L"";
        const wchar_t* root = m_library.Services().GetProviderFixedProjectRoot(index);
        if (IsFilled(root))
        {
            state += (state.empty() ? L"only for " : L", only for ") + std::wstring(root);
        }
        ListView_SetItemText(m_list, static_cast<int>(index), 1, state.data());
    }
}

void ProviderPage::Use()
{
    m_used = Selected();
    ListView_SetCheckState(m_list, static_cast<int>(*m_used), TRUE);
    ShowStates();
}

void ProviderPage::Store()
{
    m_confirmed = true;
    for (std::uint32_t index = 0; index < m_library.Services().GetProviderCount(); ++index)
    {
        Settings::StoreProviderUsed(m_library.Services().GetProviderName(index),
                                    ListView_GetCheckState(m_list, static_cast<int>(index)) != 0);
    }
    if (m_used)
    {
        Settings::StoreProvider(m_library.Services().GetProviderName(*m_used));
    }
}

/// Calls `work` with the selected provider, which is started for the call when it has no project. `offer` is what the
/// user wants to see.
template <typename Work>
void ProviderPage::WithProvider(const wchar_t* offer, Work work)
{
    const std::wstring name = m_library.Services().GetProviderName(*Selected());
    IOrvixProvider* provider = m_library.Services().GetProvider(*Selected());
    const bool starts = provider != nullptr && !provider->IsInitialized();
    if (provider == nullptr || (starts && provider->Initialize(&m_library.Client()) != OrvixProviderResult::Success))
    {
        MessageBoxW(m_page, (name + L" does not start.").c_str(), L"Provider", MB_ICONERROR);
        return;
    }
    const int result = work(*provider);
    if (starts)
    {
        provider->Uninitialize();
    }
    if (result == OrvixProviderResult::NotOffered)
    {
        MessageBoxW(m_page, (name + L" has no " + offer + L'.').c_str(), L"Provider", MB_ICONINFORMATION);
    }
    else if (result != OrvixProviderResult::Success)
    {
        m_output.Add(name + L": the " + offer + L" cannot be shown");
    }
}

void ProviderPage::RunProgram()
{
    const wchar_t* executable = m_library.Services().GetProviderAltExecutable(*Selected());
    if (IsFilled(executable))
    {
        ShellExecuteW(m_page, nullptr, executable, nullptr, nullptr, SW_SHOWNORMAL); // shows its own failures
        return;
    }
    WithProvider(L"program", [](IOrvixProvider& provider) { return provider.RunProviderClient(); });
}

std::optional<std::uint32_t> ProviderPage::Selected() const
{
    const int selected = ListView_GetNextItem(m_list, -1, LVNI_SELECTED);
    return selected >= 0 ? std::optional(static_cast<std::uint32_t>(selected)) : std::nullopt;
}
