#include "ListView.h"

#include <commctrl.h>

namespace
{

// The state image that a list shows for a row: number 1 not ticked, number 2 ticked.
constexpr UINT StateImageShift = 12;

LVITEMW Cell(int row, int column, const wchar_t* text)
{
    LVITEMW cell{};
    cell.mask = LVIF_TEXT;
    cell.iItem = row;
    cell.iSubItem = column;
    cell.pszText = const_cast<wchar_t*>(text);
    return cell;
}

} // namespace

ListView::ListView(HWND window, const Palette& palette, bool checkBoxes) : m_window(window)
{
    const LPARAM style = LVS_EX_FULLROWSELECT | (checkBoxes ? LVS_EX_CHECKBOXES : 0);
    SendMessageW(m_window, LVM_SETEXTENDEDLISTVIEWSTYLE, 0, style);
    SendMessageW(m_window, LVM_SETBKCOLOR, 0, static_cast<LPARAM>(palette.Window()));
    SendMessageW(m_window, LVM_SETTEXTBKCOLOR, 0, static_cast<LPARAM>(palette.Window()));
    SendMessageW(m_window, LVM_SETTEXTCOLOR, 0, static_cast<LPARAM>(palette.WindowText()));
}

void ListView::AddColumn(int column, const wchar_t* heading, int width) const
{
    LVCOLUMNW request{};
    request.mask = LVCF_TEXT | LVCF_WIDTH;
    request.cx = width;
    request.pszText = const_cast<wchar_t*>(heading);
    Send(LVM_INSERTCOLUMNW, static_cast<WPARAM>(column), &request);
}

void ListView::AddRow(int row, const wchar_t* text) const
{
    const LVITEMW cell = Cell(row, 0, text);
    Send(LVM_INSERTITEMW, 0, &cell);
}

void ListView::SetText(int row, int column, const wchar_t* text) const
{
    const LVITEMW cell = Cell(row, column, text);
    Send(LVM_SETITEMTEXTW, static_cast<WPARAM>(row), &cell);
}

void ListView::SetTicked(int row, bool ticked) const
{
    LVITEMW item{};
    item.stateMask = LVIS_STATEIMAGEMASK;
    item.state = (ticked ? 2U : 1U) << StateImageShift;
    Send(LVM_SETITEMSTATE, static_cast<WPARAM>(row), &item);
}

bool ListView::IsTicked(int row) const
{
    const LRESULT state =
        SendMessageW(m_window, LVM_GETITEMSTATE, static_cast<WPARAM>(row), static_cast<LPARAM>(LVIS_STATEIMAGEMASK));
    return state >> StateImageShift == 2;
}

std::optional<int> ListView::Selected() const
{
    const LRESULT row = SendMessageW(m_window, LVM_GETNEXTITEM, static_cast<WPARAM>(-1), LVNI_SELECTED);
    if (row < 0)
        return std::nullopt;
    return static_cast<int>(row);
}

int ListView::Width() const
{
    RECT inside{};
    GetClientRect(m_window, &inside);
    return inside.right - GetSystemMetrics(SM_CXVSCROLL);
}

LRESULT ListView::Send(UINT message, WPARAM wParam, const void* argument) const
{
    return SendMessageW(m_window, message, wParam, reinterpret_cast<LPARAM>(argument));
}
