#include "Dialog.h"

#include "ActivationContext.h"
#include "ControlContext.h"
#include "DpiAwareness.h"
#include "ExceptionBarrier.h"
#include "Module.h"
#include "Settings.h"
#include "Texts.h"
#include "resource.h"

#include <commctrl.h>
#include <dwmapi.h>
#include <uxtheme.h>
#include <windowsx.h>

#include <algorithm>
#include <bit>

namespace
{

bool IsOfClass(HWND control, const wchar_t* name)
{
    wchar_t actual[32] = {};
    GetClassNameW(control, actual, static_cast<int>(std::size(actual)));
    return _wcsicmp(actual, name) == 0;
}

bool IsPushButton(HWND control)
{
    const LONG type = GetWindowLongW(control, GWL_STYLE) & BS_TYPEMASK;
    return IsOfClass(control, WC_BUTTONW) && (type == BS_PUSHBUTTON || type == BS_DEFPUSHBUTTON);
}

/// The title bar has no colours of the host, but it can be dark.
void DarkenTitle(HWND window)
{
    constexpr DWORD UseDarkMode = 20; // DWMWA_USE_IMMERSIVE_DARK_MODE, which older systems refuse
    const BOOL dark = TRUE;
    DwmSetWindowAttribute(window, UseDarkMode, &dark, sizeof dark);
}

LONG HeightOf(HWND window)
{
    RECT rect{};
    GetWindowRect(window, &rect);
    return rect.bottom - rect.top;
}

/// The height that a static control needs to show its text in its width.
LONG NeededHeight(HWND control, const std::wstring& text)
{
    const ControlContext context(control);
    RECT area{};
    GetClientRect(control, &area);
    DrawTextW(context.Get(), text.c_str(), static_cast<int>(text.size()), &area,
              DT_CALCRECT | DT_WORDBREAK | DT_EDITCONTROL | DT_NOPREFIX | DT_EXPANDTABS);
    return area.bottom;
}

} // namespace

std::optional<std::int32_t> Dialog::Run(HWND owner)
{
    // Version 6 of the common controls. Without it the dialog has the host's look.
    const UniqueActivationContext manifest = MakeManifestContext(ThisModule());
    const ActivationScope look(manifest);
    const DpiAwareness resolution;
    const INITCOMMONCONTROLSEX classes{sizeof classes, ICC_LISTVIEW_CLASSES | ICC_STANDARD_CLASSES};
    InitCommonControlsEx(&classes);
    DialogBoxParamW(ThisModule(), ResourceName(static_cast<std::uintptr_t>(m_templateId)), owner, &Procedure,
                    reinterpret_cast<LPARAM>(this));
    return m_result;
}

std::wstring Dialog::GetText(int control) const
{
    const HWND window = Item(control);
    std::wstring text(static_cast<std::size_t>(GetWindowTextLengthW(window)), L'\0');
    const int length = GetWindowTextW(window, text.data(), static_cast<int>(text.size()) + 1);
    text.resize(static_cast<std::size_t>(length));
    return text;
}

void Dialog::SetChecked(int control, bool checked) const
{
    CheckDlgButton(m_window, control, checked ? BST_CHECKED : BST_UNCHECKED);
}

void Dialog::End(std::int32_t result)
{
    m_result = result;
    EndDialog(m_window, 0);
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
    if (dialog == nullptr)
    {
        return FALSE;
    }
    INT_PTR result = TRUE;
    if (!Completes([&] { result = dialog->Handle(message, wParam, lParam); }))
    {
        EndDialog(window, 0);
    }
    return result;
}

INT_PTR Dialog::Handle(UINT message, WPARAM wParam, LPARAM lParam)
{
    switch (message)
    {
    case WM_INITDIALOG:
        OnOpen();
        if (FirstFocus() != 0)
        {
            SetFocus(Item(FirstFocus()));
        }
        return FirstFocus() == 0 ? TRUE : FALSE;
    case WM_COMMAND:
        OnCommand(LOWORD(wParam), HIWORD(wParam));
        return TRUE;
    case WM_NOTIFY:
        SetWindowLongPtrW(m_window, DWLP_MSGRESULT, HandleNotification(*std::bit_cast<const NMHDR*>(lParam)));
        return TRUE;
    case WM_CONTEXTMENU:
        return OnContextMenu(std::bit_cast<HWND>(wParam), {GET_X_LPARAM(lParam), GET_Y_LPARAM(lParam)}) ? TRUE : FALSE;
    case WM_SIZE:
        m_layout.Apply();
        OnSize();
        return TRUE;
    case WM_GETMINMAXINFO:
        std::bit_cast<MINMAXINFO*>(lParam)->ptMinTrackSize = m_layout.SmallestWindow();
        return TRUE;
    case WM_DPICHANGED: {
        m_layout.SetDpi(LOWORD(wParam));
        const RECT& rect = *std::bit_cast<const RECT*>(lParam);
        SetWindowPos(m_window, nullptr, rect.left, rect.top, rect.right - rect.left, rect.bottom - rect.top,
                     SWP_NOZORDER | SWP_NOACTIVATE);
        return TRUE;
    }
    case WM_DESTROY:
        OnClose();
        RememberSize();
        return TRUE;
    default:
        return reinterpret_cast<INT_PTR>(m_palette.Apply(message, std::bit_cast<HDC>(wParam)));
    }
}

LRESULT Dialog::HandleNotification(const NMHDR& notification)
{
    const auto* const header = &notification;
    if (notification.code == NM_CUSTOMDRAW && m_palette.IsOwn() && IsPushButton(notification.hwndFrom))
    {
        return m_palette.DrawButton(*reinterpret_cast<const NMCUSTOMDRAW*>(header));
    }
    return OnNotify(notification);
}

void Dialog::OnOpen()
{
    ColorControls();
    OnInit();
    const Room room = RoomForMessage();
    if (room.needed > room.most)
    {
        MakeMessageScroll();
    }
    WatchControls();
    m_layout = Layout(m_window, Rules());
    const SIZE size = (m_name != nullptr ? Settings::WindowSize(m_name) : std::nullopt).value_or(SIZE{});
    const LONG smallest = m_layout.SmallestWindow().y;
    const RECT work = WorkArea();
    const LONG height = std::max(std::min<LONG>(m_layout.ToPixels(size.cy), work.bottom - work.top), smallest);
    const LONG more = std::max<LONG>(std::min(room.needed, room.most), 0);
    if (more > 0)
    {
        m_layout.MakeRoom(Item(IDC_MESSAGE), more);
    }
    Resize(m_layout.ToPixels(size.cx), height + more);
    m_roomForMessage = m_layout.FromPixels(HeightOf(m_window) - height);
}

void Dialog::WatchControls()
{
    for (HWND control = GetWindow(m_window, GW_CHILD); control != nullptr; control = GetWindow(control, GW_HWNDNEXT))
    {
        SetWindowSubclass(control, &ControlProcedure, 1, reinterpret_cast<DWORD_PTR>(this));
    }
}

LRESULT CALLBACK Dialog::ControlProcedure(HWND control, UINT message, WPARAM wParam, LPARAM lParam, UINT_PTR,
                                          DWORD_PTR dialog) noexcept
{
    auto& self = *std::bit_cast<Dialog*>(dialog);
    if (message == WM_KEYDOWN)
    {
        self.m_usedKey = false;
        Completes([&] { self.m_usedKey = self.OnKey(wParam); });
    }
    if (message == WM_MOUSEMOVE)
    {
        Completes([&] { self.OnMouseMove(GetDlgCtrlID(control)); });
    }
    // The headings of a list ask the list how to draw.
    if (message == WM_NOTIFY && self.m_palette.IsOwn() && std::bit_cast<const NMHDR*>(lParam)->code == NM_CUSTOMDRAW)
    {
        return self.m_palette.DrawHeading(*std::bit_cast<const NMCUSTOMDRAW*>(lParam));
    }
    const bool isOfUsedKey = (message == WM_KEYDOWN || message == WM_CHAR) && self.m_usedKey;
    self.m_usedKey = self.m_usedKey && message != WM_CHAR; // a key has one character
    return isOfUsedKey ? 0 : DefSubclassProc(control, message, wParam, lParam);
}

void Dialog::ColorControls() const
{
    if (m_palette.IsDark())
    {
        DarkenTitle(m_window);
    }
    for (HWND control = GetWindow(m_window, GW_CHILD); control != nullptr; control = GetWindow(control, GW_HWNDNEXT))
    {
        const bool isCheckBox = IsOfClass(control, WC_BUTTONW) && !IsPushButton(control);
        if ((isCheckBox && m_palette.HasOwnText()) || (IsOfClass(control, WC_COMBOBOXW) && m_palette.IsOwn()))
        {
            SetWindowTheme(control, L" ", L" ");
        }
        else if (m_palette.IsDark() && (IsOfClass(control, WC_LISTVIEWW) || IsOfClass(control, WC_EDITW)))
        {
            SetWindowTheme(control, L"DarkMode_Explorer", nullptr); // for the scroll bars
        }
    }
}

Dialog::Room Dialog::RoomForMessage() const
{
    const HWND message = Item(IDC_MESSAGE);
    if (message == nullptr)
    {
        return {};
    }
    const RECT work = WorkArea();
    return {NeededHeight(message, GetText(IDC_MESSAGE)) - HeightOf(message),
            (work.bottom - work.top) * 9 / 10 - HeightOf(m_window)};
}

void Dialog::MakeMessageScroll() const
{
    const HWND label = Item(IDC_MESSAGE);
    RECT place{};
    GetWindowRect(label, &place);
    MapWindowPoints(nullptr, m_window, reinterpret_cast<POINT*>(&place), 2);
    const std::wstring text = WithFieldLineEnds(GetText(IDC_MESSAGE));
    const HWND field =
        CreateWindowExW(0, WC_EDITW, text.c_str(),
                        WS_CHILD | WS_VISIBLE | WS_TABSTOP | WS_VSCROLL | ES_MULTILINE | ES_READONLY | ES_AUTOVSCROLL,
                        place.left, place.top, place.right - place.left, place.bottom - place.top, m_window,
                        std::bit_cast<HMENU>(std::intptr_t{IDC_MESSAGE}), ThisModule(), nullptr);
    SendMessageW(field, WM_SETFONT, static_cast<WPARAM>(SendMessageW(label, WM_GETFONT, 0, 0)), FALSE);
    SetWindowPos(field, label, 0, 0, 0, 0, SWP_NOMOVE | SWP_NOSIZE | SWP_NOACTIVATE);
    SetWindowLongPtrW(label, GWLP_ID, -1);
    SetWindowTextW(label, Text(IDS_MESSAGE).c_str());
    SetWindowPos(label, nullptr, 0, 0, 0, 0, SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE); // only for screen readers
}

RECT Dialog::WorkArea() const
{
    MONITORINFO monitor{};
    monitor.cbSize = sizeof monitor;
    GetMonitorInfoW(MonitorFromWindow(m_window, MONITOR_DEFAULTTONEAREST), &monitor);
    return monitor.rcWork;
}

void Dialog::Resize(LONG width, LONG height) const
{
    const RECT work = WorkArea();
    RECT now{};
    GetWindowRect(m_window, &now);
    const POINT smallest = m_layout.SmallestWindow();
    width = std::max(std::min(width, work.right - work.left), smallest.x);
    height = std::max(std::min(height, work.bottom - work.top), smallest.y);
    const LONG left = std::min(now.left - (width - (now.right - now.left)) / 2, work.right - width);
    const LONG top = std::min(now.top - (height - (now.bottom - now.top)) / 2, work.bottom - height);
    SetWindowPos(m_window, nullptr, std::max(left, work.left), std::max(top, work.top), width, height,
                 SWP_NOZORDER | SWP_NOACTIVATE);
}

void Dialog::RememberSize() const
{
    WINDOWPLACEMENT placement{};
    placement.length = sizeof placement;
    if (m_name == nullptr || !GetWindowPlacement(m_window, &placement))
    {
        return;
    }
    const RECT& rect = placement.rcNormalPosition; // also the one of a maximised window
    // The next message may need less room or more.
    Settings::StoreWindowSize(m_name, {m_layout.FromPixels(rect.right - rect.left),
                                       m_layout.FromPixels(rect.bottom - rect.top) - m_roomForMessage});
}
