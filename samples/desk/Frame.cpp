#include "Frame.h"

#include "resource.h"

#include <algorithm>
#include <bit>

namespace
{

struct Button
{
    int command;
    Icon icon;
    const wchar_t* text;
};

constexpr Button Buttons[] = {{ID_ADD, Icon::Add, L"Add"},
                              {ID_CHECK_OUT, Icon::CheckOut, L"Check out"},
                              {ID_CHECK_IN, Icon::CheckIn, L"Check in"},
                              {ID_UNDO, Icon::Undo, L"Undo"},
                              {ID_GET_LATEST, Icon::GetLatest, L"Get latest"},
                              {ID_HISTORY, Icon::History, L"History"},
                              {ID_REFRESH, Icon::Refresh, L"Refresh"}};

LONG HeightOf(HWND window)
{
    RECT rect{};
    GetWindowRect(window, &rect);
    return rect.bottom - rect.top;
}

void Move(HWND control, LONG left, LONG top, LONG width, LONG height)
{
    SetWindowPos(control, nullptr, left, top, width, height, SWP_NOZORDER | SWP_NOACTIVATE);
}

} // namespace

void Frame::Create(HWND window, OutputPane& output)
{
    m_window = window;
    CreateToolbar();
    // Screen readers name a control by the text before it, and the access key of that text leads to it.
    m_foldersLabel = CreateLabel(L"F&olders");
    m_folders.Create(window, IDC_FOLDERS);
    m_filesLabel = CreateLabel(L"Fi&les");
    m_files.Create(window, IDC_FILES);
    m_outputLabel = CreateLabel(L"Outp&ut");
    output.Create(window, IDC_OUTPUT);
    m_output = output.Window();
    m_status = CreateWindowExW(0, STATUSCLASSNAMEW, L"", WS_CHILD | WS_VISIBLE | SBARS_SIZEGRIP, 0, 0, 0, 0, window,
                               std::bit_cast<HMENU>(INT_PTR{IDC_STATUS}), nullptr, nullptr);
    m_progressBar = CreateWindowExW(0, PROGRESS_CLASSW, L"", WS_CHILD, 0, 0, 0, 0, m_status, nullptr, nullptr, nullptr);
    UseResolution();
}

void Frame::CreateToolbar()
{
    m_toolbar = CreateWindowExW(0, TOOLBARCLASSNAMEW, L"Commands",
                                WS_CHILD | WS_VISIBLE | TBSTYLE_FLAT | TBSTYLE_LIST | CCS_NODIVIDER | CCS_NORESIZE, 0,
                                0, 0, 0, m_window, std::bit_cast<HMENU>(INT_PTR{IDC_TOOLBAR}), nullptr, nullptr);
    SendMessageW(m_toolbar, TB_BUTTONSTRUCTSIZE, sizeof(TBBUTTON), 0);
    for (const Button& button : Buttons)
    {
        TBBUTTON item{};
        item.iBitmap = static_cast<int>(button.icon);
        item.idCommand = button.command;
        item.fsState = TBSTATE_ENABLED;
        item.fsStyle = BTNS_BUTTON | BTNS_AUTOSIZE;
        item.iString = reinterpret_cast<INT_PTR>(button.text);
        SendMessageW(m_toolbar, TB_ADDBUTTONSW, 1, reinterpret_cast<LPARAM>(&item));
    }
}

HWND Frame::CreateLabel(const wchar_t* text) const
{
    return CreateWindowExW(0, L"Static", text, WS_CHILD | WS_VISIBLE | SS_ENDELLIPSIS, 0, 0, 0, 0, m_window, nullptr,
                           nullptr, nullptr);
}

void Frame::UseResolution()
{
    const UINT dpi = GetDpiForWindow(m_window);
    NONCLIENTMETRICSW metrics{};
    metrics.cbSize = sizeof metrics;
    SystemParametersInfoForDpi(SPI_GETNONCLIENTMETRICS, sizeof metrics, &metrics, 0, dpi);
    UniqueFont font(CreateFontIndirectW(&metrics.lfMessageFont));
    for (const HWND control : {m_toolbar, m_foldersLabel, m_folders.Window(), m_filesLabel, m_files.Window(),
                               m_outputLabel, m_output, m_status})
    {
        SendMessageW(control, WM_SETFONT, reinterpret_cast<WPARAM>(font.get()), TRUE);
    }
    m_font = std::move(font); // the controls have let go of the previous one

    UniqueImageList icons = MakeIcons(GetSystemMetricsForDpi(SM_CXSMICON, dpi));
    SendMessageW(m_toolbar, TB_SETIMAGELIST, 0, reinterpret_cast<LPARAM>(icons.get()));
    SendMessageW(m_toolbar, TB_AUTOSIZE, 0, 0);
    TreeView_SetImageList(m_folders.Window(), icons.get(), TVSIL_NORMAL);
    ListView_SetImageList(m_files.Window(), icons.get(), LVSIL_SMALL);
    m_icons = std::move(icons);
}

void Frame::UseTheme(const Theme& theme)
{
    m_theme = &theme;
    m_faceBrush.reset(CreateSolidBrush(theme.Color(COLOR_BTNFACE)));
    m_windowBrush.reset(CreateSolidBrush(theme.Color(COLOR_WINDOW)));
    m_folders.SetColors(theme);
    m_files.SetColors(theme);
    RedrawWindow(m_window, nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_ALLCHILDREN);
}

void Frame::Erase(HDC context) const
{
    RECT inside{};
    GetClientRect(m_window, &inside);
    FillRect(context, &inside, m_faceBrush.get());
}

LRESULT Frame::PaintToolbar(NMHDR& notification) const
{
    if (notification.hwndFrom != m_toolbar)
    {
        return CDRF_DODEFAULT;
    }
    auto& draw = *reinterpret_cast<NMTBCUSTOMDRAW*>(&notification);
    if (draw.nmcd.dwDrawStage == CDDS_PREPAINT)
    {
        FillRect(draw.nmcd.hdc, &draw.nmcd.rc, m_faceBrush.get());
        return CDRF_NOTIFYITEMDRAW;
    }
    draw.clrText = m_theme->Color(COLOR_BTNTEXT);
    return m_theme->IsDark() ? TBCDRF_USECDCOLORS : CDRF_DODEFAULT;
}

HBRUSH Frame::Paint(HDC context, HWND control) const
{
    const bool isOutput = control == m_output;
    SetTextColor(context, m_theme->Color(isOutput ? COLOR_WINDOWTEXT : COLOR_BTNTEXT));
    SetBkColor(context, m_theme->Color(isOutput ? COLOR_WINDOW : COLOR_BTNFACE));
    return isOutput ? m_windowBrush.get() : m_faceBrush.get();
}

void Frame::Layout()
{
    SendMessageW(m_status, WM_SIZE, 0, 0);
    RECT inside{};
    GetClientRect(m_window, &inside);
    const int gap = Pixels(6);
    const int label = Pixels(18);
    const LONG bar = HIWORD(SendMessageW(m_toolbar, TB_GETBUTTONSIZE, 0, 0)) + Pixels(6);
    const LONG height = std::max(inside.bottom - bar - HeightOf(m_status), 0L);
    const LONG output = height / 4;
    const LONG upper = height - output - 2 * label - gap;
    const LONG left = inside.right / 4;
    const LONG right = inside.right - left - 3 * gap;

    Move(m_toolbar, gap, Pixels(2), inside.right - 2 * gap, bar - Pixels(4));
    Move(m_foldersLabel, gap, bar, left, label);
    Move(m_folders.Window(), gap, bar + label, left, upper);
    Move(m_filesLabel, left + 2 * gap, bar, right, label);
    Move(m_files.Window(), left + 2 * gap, bar + label, right, upper);
    Move(m_outputLabel, gap, bar + label + upper + gap / 2, inside.right - 2 * gap, label);
    Move(m_output, gap, bar + 2 * label + upper + gap / 2, inside.right - 2 * gap, output);

    const int parts[] = {inside.right - Pixels(400), inside.right - Pixels(180), -1};
    SendMessageW(m_status, SB_SETPARTS, std::size(parts), reinterpret_cast<LPARAM>(parts));
    RECT part{};
    SendMessageW(m_status, SB_GETRECT, 2, reinterpret_cast<LPARAM>(&part));
    Move(m_progressBar, part.left + Pixels(2), part.top + Pixels(2), part.right - part.left - Pixels(20),
         part.bottom - part.top - Pixels(4));
    m_files.FitColumns();
}

void Frame::SetStatus(const std::wstring& text) const
{
    SendMessageW(m_status, SB_SETTEXTW, 0, reinterpret_cast<LPARAM>(text.c_str()));
    UpdateWindow(m_status);
}

void Frame::SetProvider(const std::wstring& text) const
{
    SendMessageW(m_status, SB_SETTEXTW, 1, reinterpret_cast<LPARAM>(text.c_str()));
}

void Frame::EnableButton(int command, bool enabled) const
{
    SendMessageW(m_toolbar, TB_ENABLEBUTTON, static_cast<WPARAM>(command), enabled ? TRUE : FALSE);
}

int Frame::Pixels(int at96Dpi) const
{
    return MulDiv(at96Dpi, static_cast<int>(GetDpiForWindow(m_window)), 96);
}
