#include "Dialog.h"

#include "ActivationContext.h"
#include "Module.h"

#include <commctrl.h>

#include <algorithm>
#include <bit>

std::int32_t Dialog::Run(HWND owner)
{
    const ActivationContext look;
    const INITCOMMONCONTROLSEX classes{sizeof classes, ICC_LISTVIEW_CLASSES | ICC_STANDARD_CLASSES};
    InitCommonControlsEx(&classes);
    const INT_PTR result = DialogBoxParamW(ThisModule(), ResourceName(static_cast<std::uintptr_t>(m_templateId)), owner,
                                           &Procedure, reinterpret_cast<LPARAM>(this));
    return static_cast<std::int32_t>(std::max<INT_PTR>(result, 0));
}

std::wstring Dialog::GetText(int control) const
{
    const HWND window = Item(control);
    std::wstring text(static_cast<std::size_t>(GetWindowTextLengthW(window)), L'\0');
    const int length = GetWindowTextW(window, text.data(), static_cast<int>(text.size()) + 1);
    text.resize(static_cast<std::size_t>(length));
    return text;
}

void Dialog::SetTicked(int control, bool ticked) const
{
    CheckDlgButton(m_window, control, ticked ? BST_CHECKED : BST_UNCHECKED);
}

void Dialog::Hide(int control) const
{
    ShowWindow(Item(control), SW_HIDE);
    EnableWindow(Item(control), FALSE);
}

INT_PTR CALLBACK Dialog::Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept
{
    if (message == WM_INITDIALOG)
    {
        SetWindowLongPtrW(window, DWLP_USER, lParam);
        std::bit_cast<Dialog*>(lParam)->m_window = window;
    }
    auto* dialog = std::bit_cast<Dialog*>(GetWindowLongPtrW(window, DWLP_USER));
    if (!dialog)
        return FALSE;
    try
    {
        return dialog->Handle(message, wParam, lParam);
    }
    catch (...)
    {
        dialog->End(0);
        return TRUE;
    }
}

INT_PTR Dialog::Handle(UINT message, WPARAM wParam, LPARAM lParam)
{
    switch (message)
    {
    case WM_INITDIALOG:
        OnInit();
        return TRUE;
    case WM_COMMAND:
        OnCommand(LOWORD(wParam), HIWORD(wParam));
        return TRUE;
    case WM_NOTIFY:
        if (std::bit_cast<const NMHDR*>(lParam)->code == LVN_ITEMCHANGED)
            OnListSelection();
        return FALSE;
    default:
        return reinterpret_cast<INT_PTR>(m_palette.Apply(message, std::bit_cast<HDC>(wParam)));
    }
}
