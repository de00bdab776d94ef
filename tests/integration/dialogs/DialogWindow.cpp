#include "DialogWindow.h"

#include <commctrl.h>

#include <algorithm>
#include <bit>
#include <filesystem>
#include <iterator>
#include <stdexcept>

namespace
{

/// The lParam of a key message: the first press of a key, with Alt.
constexpr LPARAM AltIsDown = 0x20000001;

std::wstring TextOf(HWND window)
{
    std::wstring text(static_cast<std::size_t>(SendMessageW(window, WM_GETTEXTLENGTH, 0, 0)), L'\0');
    SendMessageW(window, WM_GETTEXT, text.size() + 1, reinterpret_cast<LPARAM>(text.data()));
    return text;
}

bool IsOfClass(HWND window, const wchar_t* name)
{
    wchar_t actual[64] = {};
    GetClassNameW(window, actual, static_cast<int>(std::size(actual)));
    return _wcsicmp(actual, name) == 0;
}

bool IsCheckBox(HWND window)
{
    return IsOfClass(window, L"Button") && (GetWindowLongW(window, GWL_STYLE) & BS_TYPEMASK) == BS_AUTOCHECKBOX;
}

/// The name that a screen reader says.
std::wstring NameOf(HWND control)
{
    const HWND label = GetWindow(control, GW_HWNDPREV);
    std::wstring name;
    if (GetDlgCtrlID(control) == IDOK)
    {
        name = L"OK";
    }
    else if (IsOfClass(control, L"Button") || IsOfClass(control, L"Static"))
    {
        name = TextOf(control);
    }
    else if (label != nullptr && IsOfClass(label, L"Static"))
    {
        name = TextOf(label);
    }
    std::erase(name, L'&');
    return name;
}

std::vector<HWND> VisibleControls(HWND dialog)
{
    std::vector<HWND> controls;
    for (HWND control = GetWindow(dialog, GW_CHILD); control != nullptr; control = GetWindow(control, GW_HWNDNEXT))
    {
        if ((GetWindowLongW(control, GWL_STYLE) & WS_VISIBLE) != 0)
        {
            controls.push_back(control);
        }
    }
    return controls;
}

/// The first control with a name. A label counts only when no other control has the name.
HWND Find(HWND dialog, const std::wstring& name)
{
    HWND label = nullptr;
    for (const HWND control : VisibleControls(dialog))
    {
        if (NameOf(control) != name)
        {
            continue;
        }
        if (!IsOfClass(control, L"Static"))
        {
            return control;
        }
        label = control;
    }
    return label;
}

RECT PlaceOf(HWND control, HWND dialog)
{
    RECT place{};
    GetWindowRect(control, &place);
    MapWindowPoints(nullptr, dialog, reinterpret_cast<POINT*>(&place), 2);
    return place;
}

std::wstring ItemText(HWND list, WPARAM item)
{
    std::wstring text(static_cast<std::size_t>(SendMessageW(list, CB_GETLBTEXTLEN, item, 0)), L'\0');
    SendMessageW(list, CB_GETLBTEXT, item, reinterpret_cast<LPARAM>(text.data()));
    return text;
}

} // namespace

void DialogWindow::Press(WORD key) const
{
    const HWND focus = FocusWindow();
    Post(focus, WM_KEYDOWN, key, 1);
    if (IsOpen())
    {
        Post(focus, WM_KEYUP, key, static_cast<LPARAM>(0xC0000001));
    }
}

void DialogWindow::Type(const std::wstring& text) const
{
    for (const wchar_t letter : text)
    {
        Post(FocusWindow(), WM_CHAR, letter, 1);
    }
}

void DialogWindow::PressAlt(wchar_t accessKey) const
{
    Post(FocusWindow(), WM_SYSCHAR, accessKey, AltIsDown);
}

void DialogWindow::PressControl(WORD key) const
{
    const DWORD thread = GetWindowThreadProcessId(m_window, nullptr);
    AttachThreadInput(GetCurrentThreadId(), thread, TRUE); // the threads share the state of the keys
    BYTE keys[256] = {};
    GetKeyboardState(keys);
    keys[VK_CONTROL] = 0x80;
    SetKeyboardState(keys);
    Press(key);
    keys[VK_CONTROL] = 0;
    SetKeyboardState(keys);
    AttachThreadInput(GetCurrentThreadId(), thread, FALSE);
}

void DialogWindow::PressAltDown() const
{
    Post(FocusWindow(), WM_SYSKEYDOWN, VK_DOWN, AltIsDown);
}

std::wstring DialogWindow::Focused() const
{
    return NameOf(FocusWindow());
}

void DialogWindow::Focus(const std::wstring& name) const
{
    Post(m_window, WM_NEXTDLGCTL, reinterpret_cast<WPARAM>(Control(name)), 1);
}

void DialogWindow::Click(const std::wstring& name) const
{
    Post(Control(name), BM_CLICK, 0, 0);
}

void DialogWindow::Close() const
{
    Post(m_window, WM_SYSCOMMAND, SC_CLOSE, 0);
}

HWND DialogWindow::Control(const std::wstring& name) const
{
    const HWND control = Find(m_window, name);
    if (control == nullptr)
    {
        throw std::runtime_error("the dialog has no control " + std::filesystem::path(name).string());
    }
    return control;
}

bool DialogWindow::Has(const std::wstring& name) const
{
    return Find(m_window, name) != nullptr;
}

bool DialogWindow::IsChecked(const std::wstring& name) const
{
    return SendMessageW(Control(name), BM_GETCHECK, 0, 0) == BST_CHECKED;
}

std::vector<std::wstring> DialogWindow::Buttons() const
{
    auto controls = VisibleControls(m_window);
    std::erase_if(controls, [](HWND control) { return !IsOfClass(control, L"Button") || IsCheckBox(control); });
    std::sort(controls.begin(), controls.end(),
              [this](HWND left, HWND right) { return PlaceOf(left, m_window).left < PlaceOf(right, m_window).left; });
    std::vector<std::wstring> names;
    std::transform(controls.begin(), controls.end(), std::back_inserter(names), NameOf);
    return names;
}

std::vector<std::wstring> DialogWindow::TabStops() const
{
    std::vector<std::wstring> names;
    for (const HWND control : VisibleControls(m_window))
    {
        if ((GetWindowLongW(control, GWL_STYLE) & WS_TABSTOP) != 0 && IsWindowEnabled(control))
        {
            names.push_back(NameOf(control));
        }
    }
    return names;
}

std::wstring DialogWindow::Text(const std::wstring& name) const
{
    return TextOf(Control(name));
}

void DialogWindow::Choose(const std::wstring& name, const std::wstring& item) const
{
    Focus(name);
    const auto items = Items(name);
    const auto found = std::find(items.begin(), items.end(), item);
    if (found == items.end())
    {
        throw std::runtime_error("the list does not offer " + std::filesystem::path(item).string());
    }
    PressAltDown();
    Press(VK_HOME);
    while (Chosen(name) != item)
    {
        Press(VK_DOWN);
    }
    Press(VK_RETURN);
}

std::vector<std::wstring> DialogWindow::Items(const std::wstring& name) const
{
    const HWND list = Control(name);
    const auto count = static_cast<WPARAM>(SendMessageW(list, CB_GETCOUNT, 0, 0));
    std::vector<std::wstring> items;
    items.reserve(count);
    for (WPARAM item = 0; item < count; ++item)
    {
        items.push_back(ItemText(list, item));
    }
    return items;
}

std::wstring DialogWindow::Chosen(const std::wstring& name) const
{
    const HWND list = Control(name);
    const LRESULT item = SendMessageW(list, CB_GETCURSEL, 0, 0);
    return item < 0 ? L"" : ItemText(list, static_cast<WPARAM>(item));
}

RECT DialogWindow::Place(const std::wstring& name) const
{
    return PlaceOf(Control(name), m_window);
}

int DialogWindow::NumRows(const std::wstring& list) const
{
    return static_cast<int>(SendMessageW(Control(list), LVM_GETITEMCOUNT, 0, 0));
}

std::wstring DialogWindow::Cell(const std::wstring& list, int row, int column) const
{
    wchar_t text[1024] = {};
    LVITEMW item{};
    item.iSubItem = column;
    item.pszText = text;
    item.cchTextMax = static_cast<int>(std::size(text));
    SendMessageW(Control(list), LVM_GETITEMTEXTW, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&item));
    return item.pszText;
}

std::vector<std::wstring> DialogWindow::Column(const std::wstring& list, int column) const
{
    const int count = NumRows(list);
    std::vector<std::wstring> cells;
    cells.reserve(static_cast<std::size_t>(count));
    for (int row = 0; row < count; ++row)
    {
        cells.push_back(Cell(list, row, column));
    }
    return cells;
}

bool DialogWindow::IsRowChecked(const std::wstring& list, int row) const
{
    const LRESULT state = SendMessageW(Control(list), LVM_GETITEMSTATE, static_cast<WPARAM>(row), LVIS_STATEIMAGEMASK);
    return state == INDEXTOSTATEIMAGEMASK(2);
}

bool DialogWindow::IsRowInView(const std::wstring& list, int row) const
{
    const LRESULT top = SendMessageW(Control(list), LVM_GETTOPINDEX, 0, 0);
    return row >= top && row < top + SendMessageW(Control(list), LVM_GETCOUNTPERPAGE, 0, 0);
}

std::vector<bool> DialogWindow::CheckedRows(const std::wstring& list) const
{
    const int count = NumRows(list);
    std::vector<bool> checked;
    checked.reserve(static_cast<std::size_t>(count));
    for (int row = 0; row < count; ++row)
    {
        checked.push_back(IsRowChecked(list, row));
    }
    return checked;
}

void DialogWindow::SelectRow(const std::wstring& list, int row) const
{
    Focus(list);
    Press(VK_HOME);
    for (int i = 0; i < row; ++i)
    {
        Press(VK_DOWN);
    }
    // If the row has the focus already, the keys do not select it.
    SetRowState(list, row, LVIS_SELECTED | LVIS_FOCUSED, true);
}

void DialogWindow::SelectEveryRow(const std::wstring& list) const
{
    SetRowState(list, -1, LVIS_SELECTED, true);
}

void DialogWindow::UnselectRow(const std::wstring& list, int row) const
{
    SetRowState(list, row, LVIS_SELECTED, false);
}

void DialogWindow::FocusRow(const std::wstring& list, int row) const
{
    SetRowState(list, row, LVIS_FOCUSED, true);
}

void DialogWindow::ClickHeading(const std::wstring& list, int column) const
{
    auto* const headings = std::bit_cast<HWND>(SendMessageW(Control(list), LVM_GETHEADER, 0, 0));
    RECT place{};
    SendMessageW(headings, HDM_GETITEMRECT, static_cast<WPARAM>(column), reinterpret_cast<LPARAM>(&place));
    ClickAt(headings, (place.left + place.right) / 2, (place.top + place.bottom) / 2);
}

void DialogWindow::ChooseFromMenu(const std::wstring& name, int item) const
{
    const HWND control = Control(name);
    Post(control, WM_CONTEXTMENU, reinterpret_cast<WPARAM>(control), -1);
    for (int i = 0; i < item; ++i)
    {
        Post(control, WM_KEYDOWN, VK_DOWN, 1);
    }
    Post(control, WM_KEYDOWN, VK_RETURN, 1);
}

void DialogWindow::ClickCheckBox(const std::wstring& list, int row) const
{
    RECT icon{};
    icon.left = LVIR_ICON; // the check box is before it
    SendMessageW(Control(list), LVM_GETITEMRECT, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&icon));
    ClickAt(Control(list), icon.left / 2, (icon.top + icon.bottom) / 2);
}

void DialogWindow::DoubleClickRow(const std::wstring& list, int row) const
{
    RECT label{};
    label.left = LVIR_LABEL;
    SendMessageW(Control(list), LVM_GETITEMRECT, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&label));
    const LPARAM point = MAKELPARAM(label.left + 5, (label.top + label.bottom) / 2);
    ClickAt(Control(list), label.left + 5, (label.top + label.bottom) / 2);
    PostMessageW(Control(list), WM_LBUTTONDBLCLK, MK_LBUTTON, point);
    Post(Control(list), WM_LBUTTONUP, 0, point);
}

void DialogWindow::PointAt(const std::wstring& list, int row, int column) const
{
    RECT cell{};
    cell.left = LVIR_LABEL;
    cell.top = column;
    SendMessageW(Control(list), LVM_GETSUBITEMRECT, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&cell));
    POINT point{cell.left + 10, (cell.top + cell.bottom) / 2};
    ClientToScreen(Control(list), &point);
    SetCursorPos(point.x, point.y);
}

std::wstring DialogWindow::ToolTip() const
{
    struct Search
    {
        DWORD thread;
        HWND found;
    };
    Search search{GetWindowThreadProcessId(m_window, nullptr), nullptr};
    for (int i = 0; i < 40 && search.found == nullptr; ++i)
    {
        Sleep(50);
        EnumThreadWindows(
            search.thread,
            [](HWND window, LPARAM parameter) -> BOOL {
                if (IsWindowVisible(window) && IsOfClass(window, TOOLTIPS_CLASSW))
                {
                    std::bit_cast<Search*>(parameter)->found = window;
                }
                return TRUE;
            },
            reinterpret_cast<LPARAM>(&search));
    }
    return search.found != nullptr ? TextOf(search.found) : L"";
}

HWND DialogWindow::FocusWindow() const
{
    GUITHREADINFO info{};
    info.cbSize = sizeof info;
    GetGUIThreadInfo(GetWindowThreadProcessId(m_window, nullptr), &info);
    return info.hwndFocus != nullptr ? info.hwndFocus : m_window;
}

void DialogWindow::SetRowState(const std::wstring& list, int row, UINT states, bool set) const
{
    LVITEMW item{};
    item.stateMask = states;
    item.state = set ? states : 0;
    SendMessageW(Control(list), LVM_SETITEMSTATE, static_cast<WPARAM>(row), reinterpret_cast<LPARAM>(&item));
}

void DialogWindow::Post(HWND control, UINT message, WPARAM wParam, LPARAM lParam) const
{
    PostMessageW(control, message, wParam, lParam);
    m_settle(m_window);
}

void DialogWindow::ClickAt(HWND control, LONG x, LONG y) const
{
    PostMessageW(control, WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(x, y));
    Post(control, WM_LBUTTONUP, 0, MAKELPARAM(x, y));
}
