#include "TableView.h"

#include "ControlContext.h"
#include "Settings.h"
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

/// What the control leaves free at both sides of a text together, at 96 dots per inch.
constexpr int TextMargins = 12;

/// Widths of columns are remembered in thousandths of the whole.
constexpr int Whole = 1000;
constexpr int Narrowest = 20;

LONG TextWidth(HWND window, const std::wstring& text)
{
    const ControlContext context(window);
    SIZE size{};
    GetTextExtentPoint32W(context.Get(), text.c_str(), static_cast<int>(text.size()), &size);
    return size.cx;
}

/// A path, shortened in the middle to a width in pixels.
std::wstring ShortenedPath(HWND window, std::wstring path, int width)
{
    constexpr std::size_t MostMore = 4; // characters that the function may add
    const ControlContext context(window);
    RECT area{0, 0, width, 0};
    path.resize(path.size() + MostMore);
    DrawTextW(context.Get(), path.data(), -1, &area,
              DT_CALCRECT | DT_PATH_ELLIPSIS | DT_MODIFYSTRING | DT_NOPREFIX | DT_SINGLELINE);
    path.resize(wcslen(path.c_str()));
    return path;
}

} // namespace

TableView::TableView(HWND window, const Palette& palette, const wchar_t* name, bool checkBoxes)
    : m_window(window), m_palette(&palette), m_name(name), m_tip(window), m_checkBoxes(checkBoxes)
{
    const LPARAM style =
        LVS_EX_FULLROWSELECT | LVS_EX_DOUBLEBUFFER | LVS_EX_SUBITEMIMAGES | (checkBoxes ? LVS_EX_CHECKBOXES : 0);
    SendMessageW(m_window, LVM_SETEXTENDEDLISTVIEWSTYLE, 0, style);
    SendMessageW(m_window, LVM_SETCALLBACKMASK, checkBoxes ? LVIS_STATEIMAGEMASK : 0, 0);
    SendMessageW(m_window, LVM_SETBKCOLOR, 0, static_cast<LPARAM>(palette.Window()));
    SendMessageW(m_window, LVM_SETTEXTBKCOLOR, 0, static_cast<LPARAM>(palette.Window()));
    SendMessageW(m_window, LVM_SETTEXTCOLOR, 0, static_cast<LPARAM>(palette.WindowText()));
}

void TableView::AddColumn(const std::wstring& heading, int share, Content content)
{
    LVCOLUMNW column{};
    column.mask = LVCF_TEXT | LVCF_WIDTH;
    column.cx = RoomForColumns() * share / 100;
    column.pszText = const_cast<wchar_t*>(heading.c_str());
    Send(LVM_INSERTCOLUMNW, m_columns++, &column);
    m_contents.push_back(content);
}

void TableView::UseImages(HIMAGELIST images) const
{
    Send(LVM_SETIMAGELIST, LVSIL_SMALL, images);
}

void TableView::AddRow(std::vector<std::wstring> cells, bool checked, std::vector<int> images)
{
    m_table.Add(std::move(cells));
    m_checked.push_back(checked);
    m_images.push_back(std::move(images));
}

void TableView::Open()
{
    RestoreWidths();
    RestoreOrder();
    KeepingSelection([this] { Sort(); });
    ShowSortArrow();
}

void TableView::Close()
{
    const std::vector<int> widths = Widths();
    const int total = std::accumulate(widths.begin(), widths.end(), 0);
    Settings::ListView view;
    for (const int width : widths)
    {
        view.shares.push_back(total > 0 ? MulDiv(width, Whole, total) : 0);
    }
    view.sortColumn = m_sorted ? static_cast<int>(m_sortColumn) + 1 : 0;
    view.descending = !m_ascending;
    Settings::StoreListView(m_name, view);
    m_tip = {};
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
    const std::vector<int> widths = Widths();
    const int total = std::accumulate(widths.begin(), widths.end(), 0);
    const int room = RoomForColumns();
    for (std::size_t column = 0; column < m_columns && total > 0; ++column)
    {
        SendMessageW(m_window, LVM_SETCOLUMNWIDTH, column, MAKELPARAM(MulDiv(widths[column], room, total), 0));
    }
}

std::vector<int> TableView::Widths() const
{
    std::vector<int> widths;
    for (std::size_t column = 0; column < m_columns; ++column)
    {
        widths.push_back(static_cast<int>(SendMessageW(m_window, LVM_GETCOLUMNWIDTH, column, 0)));
    }
    return widths;
}

/// The width of the control without a scroll bar.
int TableView::RoomForColumns() const
{
    RECT inside{};
    GetClientRect(m_window, &inside);
    const bool hasScrollBar = (GetWindowLongW(m_window, GWL_STYLE) & WS_VSCROLL) != 0;
    return inside.right - (hasScrollBar ? 0 : ScrollBarWidth(m_window));
}

/// Widths that no user can have left, such as those of another version, are ignored.
void TableView::RestoreWidths()
{
    const std::vector<int> shares = Settings::StoredListView(m_name, m_columns).shares;
    const bool usable =
        std::all_of(shares.begin(), shares.end(), [](int share) { return share >= Narrowest && share <= Whole; });
    for (std::size_t column = 0; column < shares.size() && usable; ++column)
    {
        SendMessageW(m_window, LVM_SETCOLUMNWIDTH, column,
                     MAKELPARAM(MulDiv(RoomForColumns(), shares[column], Whole), 0));
    }
}

void TableView::RestoreOrder()
{
    const Settings::ListView view = Settings::StoredListView(m_name, m_columns);
    if (view.sortColumn >= 1 && view.sortColumn <= static_cast<int>(m_columns))
    {
        m_sorted = true;
        m_sortColumn = static_cast<std::size_t>(view.sortColumn) - 1;
        m_ascending = !view.descending;
    }
}

bool TableView::ShowMenu(POINT point, const std::wstring& more)
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
    const auto moreID = static_cast<int>(m_columns) + 1;
    if (!more.empty())
    {
        AppendMenuW(menu.Get(), MF_SEPARATOR, 0, nullptr);
        AppendMenuW(menu.Get(), MF_STRING, static_cast<UINT_PTR>(moreID), more.c_str());
    }
    const int chosen = TrackPopupMenu(menu.Get(), TPM_RETURNCMD, point.x, point.y, 0, m_window, nullptr);
    if (chosen > 0 && chosen != moreID)
    {
        SortBy(static_cast<std::size_t>(chosen) - 1);
    }
    return chosen == moreID;
}

LRESULT TableView::Handle(const NMHDR& notification)
{
    const auto* const header = &notification;
    if (m_tip.IsAskedBy(notification))
    {
        m_tip.Answer(notification, TextForTip(m_tip.CellUnderMouse()));
        return 0;
    }
    if (notification.hwndFrom != m_window)
    {
        return 0;
    }
    switch (notification.code)
    {
    case NM_CUSTOMDRAW:
        return Draw(*const_cast<NMLVCUSTOMDRAW*>(reinterpret_cast<const NMLVCUSTOMDRAW*>(header)));
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
void TableView::FillItem(LVITEMW& item)
{
    const auto position = static_cast<std::size_t>(item.iItem);
    if (position >= m_table.NumShown())
    {
        return;
    }
    const std::size_t row = m_table.RowAt(position);
    const auto column = static_cast<std::size_t>(item.iSubItem);
    if ((item.mask & LVIF_TEXT) != 0)
    {
        const std::wstring* text = &m_table.Cell(row, column);
        // Screen readers ask at other times, and get the whole path.
        if (m_isDrawing && m_contents[column] == Content::Path)
        {
            m_shortened = ShortenedPath(m_window, *text, RoomForText(row, column));
            text = &m_shortened;
        }
        item.pszText = const_cast<wchar_t*>(text->c_str());
    }
    if ((item.mask & LVIF_IMAGE) != 0)
    {
        item.iImage = ImageOf(row, column);
    }
    if ((item.mask & LVIF_STATE) != 0 && m_checkBoxes)
    {
        item.state = INDEXTOSTATEIMAGEMASK(m_checked[row] ? CheckedImage : ClearImage);
    }
}

int TableView::ImageOf(std::size_t row, std::size_t column) const
{
    const std::vector<int>& images = m_images[row];
    return column < images.size() && images[column] >= 0 ? images[column] : I_IMAGENONE;
}

/// Selected rows have the host's colours, since the control itself only knows the system's.
LRESULT TableView::Draw(NMLVCUSTOMDRAW& drawing)
{
    switch (drawing.nmcd.dwDrawStage)
    {
    case CDDS_PREPAINT:
        m_isDrawing = true;
        return CDRF_NOTIFYPOSTPAINT | CDRF_NOTIFYITEMDRAW;
    case CDDS_ITEMPREPAINT:
        if (m_palette->IsOwn() && SendMessageW(m_window, LVM_GETITEMSTATE, drawing.nmcd.dwItemSpec, LVIS_SELECTED) != 0)
        {
            drawing.nmcd.uItemState &= ~static_cast<UINT>(CDIS_SELECTED);
            drawing.clrText = m_palette->HighlightText();
            drawing.clrTextBk = m_palette->Highlight();
        }
        return CDRF_DODEFAULT;
    case CDDS_POSTPAINT:
        m_isDrawing = false;
        return CDRF_DODEFAULT;
    default:
        return CDRF_DODEFAULT;
    }
}

std::wstring TableView::TextForTip(const CellTip::Cell& cell) const
{
    if (cell.position < 0 || static_cast<std::size_t>(cell.position) >= m_table.NumShown())
    {
        return {};
    }
    const std::size_t row = m_table.RowAt(static_cast<std::size_t>(cell.position));
    const auto column = static_cast<std::size_t>(cell.column);
    const std::wstring& text = m_table.Cell(row, column);
    return TextWidth(m_window, text) > RoomForText(row, column) ? text : std::wstring();
}

/// The width of a cell in pixels, without its picture and margins.
int TableView::RoomForText(std::size_t row, std::size_t column) const
{
    RECT label{};
    label.left = LVIR_LABEL;
    label.top = static_cast<LONG>(column);
    int width = static_cast<int>(SendMessageW(m_window, LVM_GETCOLUMNWIDTH, column, 0));
    if (column == 0) // the box and the picture come first
    {
        Send(LVM_GETITEMRECT, 0, &label);
        width = static_cast<int>(label.right - label.left);
    }
    else if (ImageOf(row, column) >= 0)
    {
        width -= GetSystemMetricsForDpi(SM_CXSMICON, GetDpiForWindow(m_window));
    }
    return width - MulDiv(TextMargins, static_cast<int>(GetDpiForWindow(m_window)), USER_DEFAULT_SCREEN_DPI);
}

void TableView::SortBy(std::size_t column)
{
    m_ascending = !m_sorted || column != m_sortColumn || !m_ascending;
    m_sorted = true;
    m_sortColumn = column;
    KeepingSelection([this] { Sort(); });
    ShowSortArrow();
}

void TableView::Sort()
{
    if (m_sorted)
    {
        m_table.Sort(m_sortColumn, m_ascending);
    }
}

void TableView::ShowSortArrow() const
{
    auto* const headings = std::bit_cast<HWND>(SendMessageW(m_window, LVM_GETHEADER, 0, 0));
    for (std::size_t i = 0; i < m_columns; ++i)
    {
        HDITEMW heading{};
        heading.mask = HDI_FORMAT;
        SendMessageW(headings, HDM_GETITEMW, i, reinterpret_cast<LPARAM>(&heading));
        heading.fmt &= ~(HDF_SORTUP | HDF_SORTDOWN);
        if (m_sorted && i == m_sortColumn)
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

std::optional<std::size_t> TableView::RowOf(const NMITEMACTIVATE& click) const
{
    LVHITTESTINFO hit{};
    hit.pt = click.ptAction;
    const LRESULT found = Send(LVM_HITTEST, 0, &hit);
    const bool isOnBox = (hit.flags & LVHT_ONITEM) == LVHT_ONITEMSTATEICON;
    return found < 0 || isOnBox ? std::nullopt : std::optional(m_table.RowAt(static_cast<std::size_t>(found)));
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
