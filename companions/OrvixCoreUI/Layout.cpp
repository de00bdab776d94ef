#include "Layout.h"

#include <algorithm>
#include <bit>
#include <utility>

namespace
{

RECT RectOf(HWND control, HWND dialog)
{
    RECT rect{};
    // The rectangle of a combo box includes its list, as in MoveWindow.
    if (SendMessageW(control, CB_GETDROPPEDCONTROLRECT, 0, reinterpret_cast<LPARAM>(&rect)) == 0)
    {
        GetWindowRect(control, &rect);
    }
    MapWindowPoints(nullptr, dialog, reinterpret_cast<POINT*>(&rect), 2);
    return rect;
}

unsigned FollowsOf(HWND control, std::span<const Layout::Rule> rules)
{
    const int id = GetDlgCtrlID(control);
    const auto rule = std::find_if(rules.begin(), rules.end(), [id](const auto& other) { return other.control == id; });
    return rule == rules.end() ? 0 : rule->follows;
}

} // namespace

Layout::Layout(HWND dialog, std::span<const Rule> rules)
    : m_dialog(dialog), m_baseDpi(GetDpiForWindow(dialog)), m_dpi(m_baseDpi)
{
    RECT area{};
    GetClientRect(dialog, &area);
    m_clientSize = {area.right, area.bottom};
    auto* const font = std::bit_cast<HFONT>(SendMessageW(dialog, WM_GETFONT, 0, 0));
    GetObjectW(font, sizeof m_fontDescription, &m_fontDescription);
    for (HWND control = GetWindow(dialog, GW_CHILD); control != nullptr; control = GetWindow(control, GW_HWNDNEXT))
    {
        m_controls.push_back({control, RectOf(control, dialog), FollowsOf(control, rules)});
    }
}

void Layout::MakeRoom(HWND control, LONG more)
{
    const LONG below = RectOf(control, m_dialog).bottom;
    for (Control& other : m_controls)
    {
        if (other.window == control)
        {
            other.rect.bottom += more;
        }
        else if (other.rect.top >= below)
        {
            OffsetRect(&other.rect, 0, more);
        }
    }
    m_clientSize.cy += more;
}

void Layout::Apply() const
{
    RECT inside{};
    GetClientRect(m_dialog, &inside);
    const int moreX = inside.right - Scaled(m_clientSize.cx);
    const int moreY = inside.bottom - Scaled(m_clientSize.cy);
    for (const Control& control : m_controls)
    {
        const RECT& rect = control.rect;
        const auto part = [&control](unsigned rule, int more) { return (control.follows & rule) != 0 ? more : 0; };
        SetWindowPos(control.window, nullptr, Scaled(rect.left) + part(MoveX, moreX),
                     Scaled(rect.top) + part(MoveY, moreY), Scaled(rect.right - rect.left) + part(GrowX, moreX),
                     Scaled(rect.bottom - rect.top) + part(GrowY, moreY), SWP_NOZORDER | SWP_NOACTIVATE);
    }
    InvalidateRect(m_dialog, nullptr, TRUE);
}

void Layout::SetDpi(UINT dpi)
{
    m_dpi = dpi;
    LOGFONTW description = m_fontDescription;
    description.lfHeight = Scaled(description.lfHeight);
    UniqueGdiObject<HFONT> font(CreateFontIndirectW(&description));
    if (!font)
    {
        return;
    }
    for (const Control& control : m_controls)
    {
        SendMessageW(control.window, WM_SETFONT, reinterpret_cast<WPARAM>(font.Get()), FALSE);
    }
    m_font = std::move(font);
}

POINT Layout::SmallestWindow() const
{
    RECT area{0, 0, Scaled(m_clientSize.cx), Scaled(m_clientSize.cy)};
    AdjustWindowRectExForDpi(&area, static_cast<DWORD>(GetWindowLongW(m_dialog, GWL_STYLE)), FALSE,
                             static_cast<DWORD>(GetWindowLongW(m_dialog, GWL_EXSTYLE)), m_dpi);
    return {area.right - area.left, area.bottom - area.top};
}
