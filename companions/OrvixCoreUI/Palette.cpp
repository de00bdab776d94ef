#include "Palette.h"

#include "IOrvixCoreUIClientAccess.h"

namespace
{

COLORREF Color(IOrvixCoreUIClientAccess* access, int index)
{
    return access != nullptr ? access->GetColor(index) : GetSysColor(index);
}

} // namespace

Palette::Palette(IOrvixCoreUIClientAccess* access)
    : m_face(Color(access, COLOR_BTNFACE)), m_faceText(Color(access, COLOR_BTNTEXT)),
      m_window(Color(access, COLOR_WINDOW)), m_windowText(Color(access, COLOR_WINDOWTEXT)),
      m_faceBrush(CreateSolidBrush(m_face)), m_windowBrush(CreateSolidBrush(m_window))
{
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
