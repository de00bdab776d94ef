#include "TableView.h"

#include "Texts.h"
#include "UniqueHandle.h"
#include "resource.h"

#include <algorithm>
#include <bit>
#include <iterator>
#include <numeric>
#include <utility>

namespace
{

/// The state image of a row with a check box: number 1 clear, number 2 checked.
constexpr UINT StateImageShift = 12;

/// The control's -1: every place to set a state of, and the place before the first.
constexpr auto AllPlaces = static_cast<std::size_t>(-1);

struct MenuPolicy
{
    using Handle = HMENU;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle menu) noexcept { DestroyMenu(menu); }
};
using UniqueMenu = UniqueHandle<MenuPolicy>;

/// Lets a window change many times at the cost of one drawing.
class DrawnOnce
{
public:
    explicit DrawnOnce(HWND window) : m_window(window) { SendMessageW(m_window, WM_SETREDRAW, FALSE, 0); }
    DrawnOnce(const DrawnOnce&) = delete;
    DrawnOnce& operator=(const DrawnOnce&) = delete;
    ~DrawnOnce()
    {
        SendMessageW(m_window, WM_SETREDRAW, TRUE, 0);
        InvalidateRect(m_window, nullptr, TRUE);
    }

private:
    HWND m_window;
};

int ScrollBarWidth(HWND window)
{
    return GetSystemMetricsForDpi(SM_CXVSCROLL, GetDpiForWindow(window));
}

} // namespace

TableView::TableView(HWND window, const Palette& palette, bool checkBoxes) : m_window(window), m_checkBoxes(checkBoxes)
{
    const LPARAM style =
        LVS_EX_FULLROWSELECT | LVS_EX_DOUBLEBUFFER | LVS_EX_LABELTIP | (checkBoxes ? LVS_EX_CHECKBOXES : 0);
    SendMessageW(m_window, LVM_SETEXTENDEDLISTVIEWSTYLE, 0, style);
    SendMessageW(m_window, LVM_SETCALLBACKMASK, checkBoxes ? LVIS_STATEIMAGEMASK : 0, 0);
    SendMessageW(m_window, LVM_SETBKCOLOR, 0, static_cast<LPARAM>(palette.Window()));
    SendMessageW(m_window, LVM_SETTEXTBKCOLOR, 0, static_cast<LPARAM>(palette.Window()));
    SendMessageW(m_window, LVM_SETTEXTCOLOR, 0, static_cast<LPARAM>(palette.WindowText()));
}

void TableView::AddColumn(const std::wstring& heading, int share)
{
    RECT inside{};
    GetClientRect(m_window, &inside);
    LVCOLUMNW column{};
    column.mask = LVCF_TEXT | LVCF_WIDTH;
    column.cx = (inside.right - ScrollBarWidth(m_window)) * share / 100;
    column.pszText = const_cast<wchar_t*>(heading.c_str());
    Send(LVM_INSERTCOLUMNW, m_columns++, &column);
}

void TableView::AddRow(std::vector<std::wstring> cells, bool checked)
{
    m_table.Add(std::move(cells));
    m_checked.push_back(checked);
}

void TableView::Refresh()
{
    KeepingSelection([] {});
}

void TableView::SetCell(std::size_t row, std::size_t column, std::wstring text)
{
    m_table.SetCell(row, column, std::move(text));
    InvalidateRect(m_window, nullptr, FALSE);
}

void TableView::Filter(const std::wstring& text)
{
    KeepingSelection([&] { m_table.Filter(text); });
}

std::size_t TableView::NumChecked() const
{
    return static_cast<std::size_t>(std::count(m_checked.begin(), m_checked.end(), true));
}

void TableView::CheckShown(bool checked)
{
    std::vector<std::size_t> places(m_table.NumShown());
    std::iota(places.begin(), places.end(), std::size_t{0});
    Check(places, checked);
}

std::optional<std::size_t> TableView::Selected() const
{
    const auto place = Next(AllPlaces, LVNI_SELECTED);
    return place ? std::optional(m_table.RowAt(*place)) : std::nullopt;
}

void TableView::FitColumns() const
{
    RECT inside{};
    GetClientRect(m_window, &inside);
    std::vector<int> widths;
    int total = 0;
    for (std::size_t column = 0; column < m_columns; ++column)
    {
        widths.push_back(static_cast<int>(SendMessageW(m_window, LVM_GETCOLUMNWIDTH, column, 0)));
        total += widths.back();
    }
    const int room =
        inside.right - ((GetWindowLongW(m_window, GWL_STYLE) & WS_VSCROLL) != 0 ? 0 : ScrollBarWidth(m_window));
    for (std::size_t column = 0; column < m_columns && total > 0; ++column)
    {
        SendMessageW(m_window, LVM_SETCOLUMNWIDTH, column, MAKELPARAM(MulDiv(widths[column], room, total), 0));
    }
}

void TableView::ShowMenu(POINT point)
{
    if (point.x == -1 && point.y == -1)
    {
        point = {};
        ClientToScreen(m_window, &point);
    }
    const UniqueMenu menu(CreatePopupMenu());
    for (std::size_t column = 0; column < m_columns; ++column)
    {
        const std::wstring heading = Heading(column);
        const std::wstring words = FormatText(IDS_SORT_BY, {reinterpret_cast<DWORD_PTR>(heading.c_str())});
        AppendMenuW(menu.Get(), MF_STRING, column + 1, words.c_str());
    }
    const int chosen = TrackPopupMenu(menu.Get(), TPM_RETURNCMD, point.x, point.y, 0, m_window, nullptr);
    if (chosen > 0)
    {
        SortBy(static_cast<std::size_t>(chosen) - 1);
    }
}

LRESULT TableView::Handle(const NMHDR& notification)
{
    const auto* const header = &notification;
    switch (notification.code)
    {
    case LVN_GETDISPINFOW:
        GiveItem(const_cast<NMLVDISPINFOW*>(reinterpret_cast<const NMLVDISPINFOW*>(header))->item);
        return 0;
    case LVN_COLUMNCLICK:
        SortBy(static_cast<std::size_t>(reinterpret_cast<const NMLISTVIEW*>(header)->iSubItem));
        return 0;
    case LVN_KEYDOWN:
        if (reinterpret_cast<const NMLVKEYDOWN*>(header)->wVKey == VK_SPACE)
        {
            ToggleFocused();
        }
        return 0;
    case NM_CLICK:
    case NM_DBLCLK:
        ToggleClicked(*reinterpret_cast<const NMITEMACTIVATE*>(header));
        return 0;
    case LVN_ODFINDITEMW:
        return Find(*reinterpret_cast<const NMLVFINDITEMW*>(header));
    default:
        return 0;
    }
}

std::wstring TableView::Heading(std::size_t column) const
{
    wchar_t text[64] = {};
    LVCOLUMNW request{};
    request.mask = LVCF_TEXT;
    request.pszText = text;
    request.cchTextMax = static_cast<int>(std::size(text));
    Send(LVM_GETCOLUMNW, column, &request);
    return text;
}

void TableView::GiveItem(LVITEMW& item) const
{
    const auto place = static_cast<std::size_t>(item.iItem);
    if (place >= m_table.NumShown())
    {
        return;
    }
    const std::size_t row = m_table.RowAt(place);
    if ((item.mask & LVIF_TEXT) != 0)
    {
        item.pszText = const_cast<wchar_t*>(m_table.Cell(row, static_cast<std::size_t>(item.iSubItem)).c_str());
    }
    if ((item.mask & LVIF_STATE) != 0 && m_checkBoxes)
    {
        item.state = (m_checked[row] ? 2U : 1U) << StateImageShift;
    }
}

void TableView::SortBy(std::size_t column)
{
    m_ascending = !m_sorted || column != m_sortColumn || !m_ascending;
    m_sorted = true;
    m_sortColumn = column;
    KeepingSelection([&] { m_table.Sort(column, m_ascending); });

    auto* const headings = std::bit_cast<HWND>(SendMessageW(m_window, LVM_GETHEADER, 0, 0));
    for (std::size_t i = 0; i < m_columns; ++i)
    {
        HDITEMW heading{};
        heading.mask = HDI_FORMAT;
        SendMessageW(headings, HDM_GETITEMW, i, reinterpret_cast<LPARAM>(&heading));
        heading.fmt &= ~(HDF_SORTUP | HDF_SORTDOWN);
        if (i == column)
        {
            heading.fmt |= m_ascending ? HDF_SORTUP : HDF_SORTDOWN;
        }
        SendMessageW(headings, HDM_SETITEMW, i, reinterpret_cast<LPARAM>(&heading));
    }
}

template <typename Rearrange>
void TableView::KeepingSelection(const Rearrange& rearrange)
{
    // The control remembers places, and other rows come to stand there.
    std::vector<bool> selected(m_table.NumRows());
    for (const std::size_t place : SelectedPlaces())
    {
        selected[m_table.RowAt(place)] = true;
    }
    const auto focusedPlace = Next(AllPlaces, LVNI_FOCUSED);
    const std::size_t noRow = m_table.NumRows();
    const std::size_t focusedRow = focusedPlace ? m_table.RowAt(*focusedPlace) : noRow;
    std::size_t focused = 0;
    bool anySelected = false;
    {
        const DrawnOnce all(m_window);
        SetState(AllPlaces, LVIS_SELECTED, 0);
        rearrange();
        SendMessageW(m_window, LVM_SETITEMCOUNT, m_table.NumShown(), 0);
        for (std::size_t place = 0; place < m_table.NumShown(); ++place)
        {
            const std::size_t row = m_table.RowAt(place);
            if (row == focusedRow)
            {
                focused = place;
            }
            if (selected[row])
            {
                SetState(place, LVIS_SELECTED, LVIS_SELECTED);
                anySelected = true;
            }
        }
    }
    if (m_table.NumShown() == 0)
    {
        return;
    }
    // The keyboard goes on from here.
    SetState(focused, LVIS_FOCUSED, LVIS_FOCUSED);
    if (!anySelected)
    {
        SetState(focused, LVIS_SELECTED, LVIS_SELECTED);
    }
    SendMessageW(m_window, LVM_SETSELECTIONMARK, 0, static_cast<LPARAM>(focused));
    SendMessageW(m_window, LVM_ENSUREVISIBLE, focused, FALSE);
}

void TableView::SetState(std::size_t place, UINT states, UINT value) const
{
    LVITEMW item{};
    item.stateMask = states;
    item.state = value;
    Send(LVM_SETITEMSTATE, place, &item);
}

void TableView::ToggleFocused()
{
    const auto focused = Next(AllPlaces, LVNI_FOCUSED);
    if (!focused)
    {
        return;
    }
    std::vector<std::size_t> places = SelectedPlaces();
    if (!std::binary_search(places.begin(), places.end(), *focused))
    {
        places = {*focused};
    }
    Check(places, !m_checked[m_table.RowAt(*focused)]);
}

void TableView::ToggleClicked(const NMITEMACTIVATE& click)
{
    LVHITTESTINFO hit{};
    hit.pt = click.ptAction;
    const LRESULT found = Send(LVM_HITTEST, 0, &hit);
    if (found < 0 || (hit.flags & LVHT_ONITEM) != LVHT_ONITEMSTATEICON)
    {
        return;
    }
    const auto place = static_cast<std::size_t>(found);
    Check({place}, !m_checked[m_table.RowAt(place)]);
}

/// The control does not know that anything changes. Screen readers are told of one row, or of the whole list.
void TableView::Check(const std::vector<std::size_t>& places, bool checked)
{
    for (const std::size_t place : places)
    {
        m_checked[m_table.RowAt(place)] = checked;
    }
    InvalidateRect(m_window, nullptr, FALSE);
    NotifyWinEvent(EVENT_OBJECT_STATECHANGE, m_window, OBJID_CLIENT,
                   places.size() == 1 ? static_cast<LONG>(places.front()) + 1 : CHILDID_SELF);
}

LRESULT TableView::Find(const NMLVFINDITEMW& search) const
{
    if ((search.lvfi.flags & (LVFI_STRING | LVFI_PARTIAL)) == 0 || search.lvfi.psz == nullptr)
    {
        return -1;
    }
    const std::wstring start = search.lvfi.psz;
    const std::size_t count = m_table.NumShown();
    const auto first = static_cast<std::size_t>(std::max(search.iStart, 0));
    for (std::size_t i = 0; i < count; ++i)
    {
        const std::size_t place = (first + i) % count;
        const std::wstring& cell = m_table.Cell(m_table.RowAt(place), 0);
        if (cell.size() >= start.size() &&
            CompareStringOrdinal(cell.c_str(), static_cast<int>(start.size()), start.c_str(),
                                 static_cast<int>(start.size()), TRUE) == CSTR_EQUAL)
        {
            return static_cast<LRESULT>(place);
        }
    }
    return -1;
}

std::vector<std::size_t> TableView::SelectedPlaces() const
{
    std::vector<std::size_t> places;
    for (auto place = Next(AllPlaces, LVNI_SELECTED); place; place = Next(*place, LVNI_SELECTED))
    {
        places.push_back(*place);
    }
    return places;
}

std::optional<std::size_t> TableView::Next(std::size_t after, UINT state) const
{
    const LRESULT place = SendMessageW(m_window, LVM_GETNEXTITEM, after, state);
    if (place < 0 || static_cast<std::size_t>(place) >= m_table.NumShown())
    {
        return std::nullopt;
    }
    return static_cast<std::size_t>(place);
}

LRESULT TableView::Send(UINT message, WPARAM wParam, const void* argument) const
{
    return SendMessageW(m_window, message, wParam, reinterpret_cast<LPARAM>(argument));
}
