#include "FileView.h"

#include <bit>
#include <set>
#include <utility>

void FileView::Create(HWND parent, int id)
{
    m_window = CreateWindowExW(WS_EX_CLIENTEDGE, WC_LISTVIEWW, L"",
                               WS_CHILD | WS_VISIBLE | WS_TABSTOP | LVS_REPORT | LVS_OWNERDATA | LVS_SHOWSELALWAYS |
                                   LVS_SHAREIMAGELISTS | LVS_NOSORTHEADER,
                               0, 0, 0, 0, parent, std::bit_cast<HMENU>(INT_PTR{id}), nullptr, nullptr);
    ListView_SetExtendedListViewStyle(m_window, LVS_EX_FULLROWSELECT | LVS_EX_DOUBLEBUFFER | LVS_EX_LABELTIP);
    for (int index = 0; std::wstring heading : {L"Name", L"State"})
    {
        LVCOLUMNW column{};
        column.mask = LVCF_TEXT | LVCF_WIDTH;
        column.pszText = heading.data();
        column.cx = 100;
        ListView_InsertColumn(m_window, index++, &column);
    }
}

void FileView::Show(std::vector<FileRow> rows)
{
    std::set<std::wstring> selected;
    for (const FileRow* row : Selected())
    {
        selected.insert(row->path);
    }
    m_rows = std::move(rows);
    ListView_SetItemState(m_window, -1, 0, LVIS_SELECTED | LVIS_FOCUSED);
    ListView_SetItemCountEx(m_window, static_cast<int>(m_rows.size()), 0);
    int first = -1;
    for (int i = 0; std::cmp_less(i, m_rows.size()); ++i)
    {
        if (selected.contains(m_rows[static_cast<std::size_t>(i)].path))
        {
            ListView_SetItemState(m_window, i, LVIS_SELECTED, LVIS_SELECTED);
            first = first < 0 ? i : first;
        }
    }
    ListView_SetItemState(m_window, first < 0 ? 0 : first, LVIS_FOCUSED, LVIS_FOCUSED);
}

std::vector<const FileRow*> FileView::Chosen() const
{
    std::vector<const FileRow*> chosen = Selected();
    if (chosen.empty())
    {
        for (const FileRow& row : m_rows)
        {
            chosen.push_back(&row);
        }
    }
    std::erase_if(chosen, [](const FileRow* row) { return row->excluded; });
    return chosen;
}

void FileView::FillItem(LVITEMW& item) const
{
    if (item.iItem < 0 || std::cmp_greater_equal(item.iItem, m_rows.size()))
    {
        return;
    }
    const FileRow& row = m_rows[static_cast<std::size_t>(item.iItem)];
    const FileState state = StateOf(row);
    if ((item.mask & LVIF_IMAGE) != 0)
    {
        item.iImage = static_cast<int>(state.icon);
    }
    if ((item.mask & LVIF_TEXT) != 0 && item.cchTextMax > 0)
    {
        const std::wstring& text = item.iSubItem == 0 ? row.name : state.words;
        lstrcpynW(item.pszText, text.c_str(), item.cchTextMax);
    }
}

POINT FileView::FocusedPoint() const
{
    RECT place{};
    ListView_GetItemRect(m_window, ListView_GetNextItem(m_window, -1, LVNI_FOCUSED), &place, LVIR_ICON);
    POINT point{place.right, place.bottom};
    ClientToScreen(m_window, &point);
    return point;
}

void FileView::FitColumns() const
{
    RECT inside{};
    GetClientRect(m_window, &inside);
    ListView_SetColumnWidth(m_window, 0, inside.right * 55 / 100);
    ListView_SetColumnWidth(m_window, 1, inside.right - inside.right * 55 / 100);
}

void FileView::SetColors(const Theme& theme) const
{
    ListView_SetBkColor(m_window, theme.Color(COLOR_WINDOW));
    ListView_SetTextBkColor(m_window, theme.Color(COLOR_WINDOW));
    ListView_SetTextColor(m_window, theme.Color(COLOR_WINDOWTEXT));
}

std::vector<const FileRow*> FileView::Selected() const
{
    std::vector<const FileRow*> selected;
    for (int i = ListView_GetNextItem(m_window, -1, LVNI_SELECTED); i >= 0 && std::cmp_less(i, m_rows.size());
         i = ListView_GetNextItem(m_window, i, LVNI_SELECTED))
    {
        selected.push_back(&m_rows[static_cast<std::size_t>(i)]);
    }
    return selected;
}
