#include "Palette.h"

#include "IOrvixCoreUIClientAccess.h"

#include <iterator>

namespace
{

COLORREF Color(IOrvixCoreUIClientAccess* access, int index)
{
    return access != nullptr ? access->GetColor(index) : GetSysColor(index);
}

/// How light a colour is to the eye, from 0 to 255,000.
int Lightness(COLORREF color)
{
    return GetRValue(color) * 299 + GetGValue(color) * 587 + GetBValue(color) * 114;
}

} // namespace

Palette::Palette(IOrvixCoreUIClientAccess* access)
    : m_face(Color(access, COLOR_BTNFACE)), m_faceText(Color(access, COLOR_BTNTEXT)),
      m_window(Color(access, COLOR_WINDOW)), m_windowText(Color(access, COLOR_WINDOWTEXT)),
      m_highlight(Color(access, COLOR_HIGHLIGHT)), m_highlightText(Color(access, COLOR_HIGHLIGHTTEXT)),
      m_grayText(Color(access, COLOR_GRAYTEXT)), m_faceBrush(CreateSolidBrush(m_face)),
      m_windowBrush(CreateSolidBrush(m_window)), m_frameBrush(CreateSolidBrush(m_grayText))
{
}

bool Palette::IsOwn() const
{
    return HasOwnText() || m_face != GetSysColor(COLOR_BTNFACE) || m_window != GetSysColor(COLOR_WINDOW) ||
           m_windowText != GetSysColor(COLOR_WINDOWTEXT) || m_highlight != GetSysColor(COLOR_HIGHLIGHT) ||
           m_highlightText != GetSysColor(COLOR_HIGHLIGHTTEXT) || m_grayText != GetSysColor(COLOR_GRAYTEXT);
}

bool Palette::IsDark() const
{
    return Lightness(m_faceText) > Lightness(m_face);
}

HBRUSH Palette::Apply(UINT message, HDC context) const
{
    switch (message)
    {
    case WM_CTLCOLORDLG:
    case WM_CTLCOLORSTATIC:
    case WM_CTLCOLORBTN:
        SetBkColor(context, m_face);
        SetTextColor(context, m_faceText);
        return m_faceBrush.Get();
    case WM_CTLCOLOREDIT:
    case WM_CTLCOLORLISTBOX:
        SetBkColor(context, m_window);
        SetTextColor(context, m_windowText);
        return m_windowBrush.Get();
    default:
        return nullptr;
    }
}

LRESULT Palette::DrawButton(const NMCUSTOMDRAW& drawing) const
{
    if (drawing.dwDrawStage != CDDS_PREPAINT)
    {
        return CDRF_DODEFAULT;
    }
    const HWND button = drawing.hdr.hwndFrom;
    wchar_t text[128] = {};
    GetWindowTextW(button, text, static_cast<int>(std::size(text)));
    const LRESULT state = SendMessageW(button, BM_GETSTATE, 0, 0);
    UINT states = drawing.uItemState & (CDIS_HOT | CDIS_FOCUS);
    states |= (state & BST_PUSHED) != 0 ? CDIS_SELECTED : 0;
    states |= (state & BST_FOCUS) != 0 ? CDIS_FOCUS : 0;
    states |= IsWindowEnabled(button) == FALSE ? CDIS_DISABLED : 0;
    DrawFace(drawing.hdc, drawing.rc, text, states, DT_CENTER);
    return CDRF_SKIPDEFAULT;
}

LRESULT Palette::DrawHeading(const NMCUSTOMDRAW& drawing) const
{
    if (drawing.dwDrawStage == CDDS_PREPAINT)
    {
        RECT area{};
        GetClientRect(drawing.hdr.hwndFrom, &area);
        FillRect(drawing.hdc, &area, m_faceBrush.Get());
        return CDRF_NOTIFYITEMDRAW | CDRF_NOTIFYPOSTPAINT;
    }
    if (drawing.dwDrawStage == CDDS_POSTPAINT)
    {
        FillAfterHeadings(drawing.hdr.hwndFrom, drawing.hdc);
    }
    if (drawing.dwDrawStage != CDDS_ITEMPREPAINT)
    {
        return CDRF_DODEFAULT;
    }
    wchar_t text[128] = {};
    HDITEMW heading{};
    heading.mask = HDI_TEXT | HDI_FORMAT;
    heading.pszText = text;
    heading.cchTextMax = static_cast<int>(std::size(text)) - 2;
    SendMessageW(drawing.hdr.hwndFrom, HDM_GETITEMW, drawing.dwItemSpec, reinterpret_cast<LPARAM>(&heading));
    if ((heading.fmt & (HDF_SORTUP | HDF_SORTDOWN)) != 0)
    {
        wcscat(text, (heading.fmt & HDF_SORTUP) != 0 ? L" \u25B4" : L" \u25BE");
    }
    DrawFace(drawing.hdc, drawing.rc, text, 0, DT_LEFT | DT_NOPREFIX | DT_END_ELLIPSIS);
    return CDRF_SKIPDEFAULT;
}

/// The headings end before the scroll bar.
void Palette::FillAfterHeadings(HWND headings, HDC context) const
{
    RECT area{};
    RECT last{};
    GetClientRect(headings, &area);
    const LRESULT count = SendMessageW(headings, HDM_GETITEMCOUNT, 0, 0);
    if (count > 0 &&
        SendMessageW(headings, HDM_GETITEMRECT, static_cast<WPARAM>(count - 1), reinterpret_cast<LPARAM>(&last)) != 0)
    {
        area.left = last.right;
        FillRect(context, &area, m_faceBrush.Get());
    }
}

/// `states`: bits CDIS_*; `format`: of DrawTextW.
void Palette::DrawFace(HDC context, RECT area, const wchar_t* text, UINT states, UINT format) const
{
    const bool isLit = (states & (CDIS_HOT | CDIS_SELECTED)) != 0;
    const COLORREF words = (states & CDIS_DISABLED) != 0 ? m_grayText : m_faceText;
    FillRect(context, &area, isLit ? m_windowBrush.Get() : m_faceBrush.Get());
    FrameRect(context, &area, m_frameBrush.Get());
    if ((states & CDIS_FOCUS) != 0)
    {
        RECT inner = area;
        InflateRect(&inner, -3, -3);
        SetTextColor(context, words);
        SetBkColor(context, m_face);
        DrawFocusRect(context, &inner);
    }
    InflateRect(&area, -6, 0);
    SetBkMode(context, TRANSPARENT);
    SetTextColor(context, isLit ? m_windowText : words);
    DrawTextW(context, text, -1, &area, format | DT_VCENTER | DT_SINGLELINE);
}
