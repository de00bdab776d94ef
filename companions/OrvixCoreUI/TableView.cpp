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

/// The state images of a row with a check box.
constexpr UINT ClearImage = 1;
constexpr UINT CheckedImage = 2;

/// To the control, -1 means every position when a state is set.
constexpr auto AllPositions = static_cast<std::size_t>(-1);

/// To the control, -1 means the position before the first when a state is searched.
constexpr auto BeforeFirst = static_cast<std::size_t>(-1);

struct MenuPolicy
{
    using Handle = HMENU;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle menu) noexcept { DestroyMenu(menu); }
};
using UniqueMenu = UniqueHandle<MenuPolicy>;

/// Lets a window change many times and be drawn once, at the end.
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
    std::vector<std::size_t> positions(m_table.NumShown());
    std::iota(positions.begin(), positions.end(), std::size_t{0});
    Check(positions, checked);
}

std::optional<std::size_t> TableView::Selected() const
{
    const auto position = Next(BeforeFirst, LVNI_SELECTED);
    return position ? std::optional(m_table.RowAt(*position)) : std::nullopt;
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
        FillItem(const_cast<NMLVDISPINFOW*>(reinterpret_cast<const NMLVDISPINFOW*>(header))->item);
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

/// Fills in what the control asks for.
void TableView::FillItem(LVITEMW& item) const
{
    const auto position = static_cast<std::size_t>(item.iItem);
    if (position >= m_table.NumShown())
    {
        return;
    }
    const std::size_t row = m_table.RowAt(position);
    if ((item.mask & LVIF_TEXT) != 0)
    {
        item.pszText = const_cast<wchar_t*>(m_table.Cell(row, static_cast<std::size_t>(item.iSubItem)).c_str());
    }
    if ((item.mask & LVIF_STATE) != 0 && m_checkBoxes)
    {
        item.state = INDEXTOSTATEIMAGEMASK(m_checked[row] ? CheckedImage : ClearImage);
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
    // The control keeps the states of positions, which get other rows now.
    std::vector<bool> selected(m_table.NumRows());
    for (const std::size_t position : SelectedPositions())
    {
        selected[m_table.RowAt(position)] = true;
    }
    const auto focusedPosition = Next(BeforeFirst, LVNI_FOCUSED);
    const std::size_t noRow = m_table.NumRows();
    const std::size_t focusedRow = focusedPosition ? m_table.RowAt(*focusedPosition) : noRow;
    std::size_t focused = 0;
    bool anySelected = false;
    {
        const DrawnOnce all(m_window);
        SetState(AllPositions, LVIS_SELECTED, 0);
        rearrange();
        SendMessageW(m_window, LVM_SETITEMCOUNT, m_table.NumShown(), 0);
        for (std::size_t position = 0; position < m_table.NumShown(); ++position)
        {
            const std::size_t row = m_table.RowAt(position);
            if (row == focusedRow)
            {
                focused = position;
            }
            if (selected[row])
            {
                SetState(position, LVIS_SELECTED, LVIS_SELECTED);
                anySelected = true;
            }
        }
    }
    if (m_table.NumShown() == 0)
    {
        return;
    }
    // Keyboard users go on from this row.
    SetState(focused, LVIS_FOCUSED, LVIS_FOCUSED);
    if (!anySelected)
    {
        SetState(focused, LVIS_SELECTED, LVIS_SELECTED);
    }
    SendMessageW(m_window, LVM_SETSELECTIONMARK, 0, static_cast<LPARAM>(focused));
    SendMessageW(m_window, LVM_ENSUREVISIBLE, focused, FALSE);
}

void TableView::SetState(std::size_t position, UINT states, UINT value) const
{
    LVITEMW item{};
    item.stateMask = states;
    item.state = value;
    Send(LVM_SETITEMSTATE, position, &item);
}

void TableView::ToggleFocused()
{
    const auto focused = Next(BeforeFirst, LVNI_FOCUSED);
    if (!focused)
    {
        return;
    }
    std::vector<std::size_t> positions = SelectedPositions();
    if (!std::binary_search(positions.begin(), positions.end(), *focused))
    {
        positions = {*focused};
    }
    Check(positions, !m_checked[m_table.RowAt(*focused)]);
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
    const auto position = static_cast<std::size_t>(found);
    Check({position}, !m_checked[m_table.RowAt(position)]);
}

/// The control does not know what is checked, so it is told to draw. Screen readers are told of the row, or of the
/// whole list when several rows change.
void TableView::Check(const std::vector<std::size_t>& positions, bool checked)
{
    for (const std::size_t position : positions)
    {
        m_checked[m_table.RowAt(position)] = checked;
    }
    InvalidateRect(m_window, nullptr, FALSE);
    NotifyWinEvent(EVENT_OBJECT_STATECHANGE, m_window, OBJID_CLIENT,
                   positions.size() == 1 ? static_cast<LONG>(positions.front()) + 1 : CHILDID_SELF);
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
        const std::size_t position = (first + i) % count;
        const std::wstring& cell = m_table.Cell(m_table.RowAt(position), 0);
        if (cell.size() >= start.size() &&
            CompareStringOrdinal(cell.c_str(), static_cast<int>(start.size()), start.c_str(),
                                 static_cast<int>(start.size()), TRUE) == CSTR_EQUAL)
        {
            return static_cast<LRESULT>(position);
        }
    }
    return -1;
}

std::vector<std::size_t> TableView::SelectedPositions() const
{
    std::vector<std::size_t> positions;
    for (auto position = Next(BeforeFirst, LVNI_SELECTED); position; position = Next(*position, LVNI_SELECTED))
    {
        positions.push_back(*position);
    }
    return positions;
}

std::optional<std::size_t> TableView::Next(std::size_t after, UINT state) const
{
    const LRESULT position = SendMessageW(m_window, LVM_GETNEXTITEM, after, state);
    if (position < 0 || static_cast<std::size_t>(position) >= m_table.NumShown())
    {
        return std::nullopt;
    }
    return static_cast<std::size_t>(position);
}

LRESULT TableView::Send(UINT message, WPARAM wParam, const void* argument) const
{
    return SendMessageW(m_window, message, wParam, reinterpret_cast<LPARAM>(argument));
}
