#include "Layout.h"

#include <algorithm>
#include <bit>
#include <utility>

namespace
{

RECT PlaceOf(HWND control, HWND dialog)
{
    RECT place{};
    // Of a combo box, the place with its list: that is what MoveWindow sets.
    if (SendMessageW(control, CB_GETDROPPEDCONTROLRECT, 0, reinterpret_cast<LPARAM>(&place)) == 0)
    {
        GetWindowRect(control, &place);
    }
    MapWindowPoints(nullptr, dialog, reinterpret_cast<POINT*>(&place), 2);
    return place;
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
    m_inside = {area.right, area.bottom};
    auto* const font = std::bit_cast<HFONT>(SendMessageW(dialog, WM_GETFONT, 0, 0));
    GetObjectW(font, sizeof m_letters, &m_letters);
    for (HWND control = GetWindow(dialog, GW_CHILD); control != nullptr; control = GetWindow(control, GW_HWNDNEXT))
    {
        m_controls.push_back({control, PlaceOf(control, dialog), FollowsOf(control, rules)});
    }
}

void Layout::MakeRoom(HWND control, LONG more)
{
    const LONG below = PlaceOf(control, m_dialog).bottom;
    for (Control& other : m_controls)
    {
        if (other.window == control)
        {
            other.place.bottom += more;
        }
        else if (other.place.top >= below)
        {
            OffsetRect(&other.place, 0, more);
        }
    }
    m_inside.cy += more;
}

void Layout::Apply() const
{
    RECT inside{};
    GetClientRect(m_dialog, &inside);
    const int moreX = inside.right - Scaled(m_inside.cx);
    const int moreY = inside.bottom - Scaled(m_inside.cy);
    for (const Control& control : m_controls)
    {
        const RECT& place = control.place;
        const auto part = [&control](unsigned rule, int more) { return (control.follows & rule) != 0 ? more : 0; };
        SetWindowPos(control.window, nullptr, Scaled(place.left) + part(MoveX, moreX),
                     Scaled(place.top) + part(MoveY, moreY), Scaled(place.right - place.left) + part(GrowX, moreX),
                     Scaled(place.bottom - place.top) + part(GrowY, moreY), SWP_NOZORDER | SWP_NOACTIVATE);
    }
    InvalidateRect(m_dialog, nullptr, TRUE);
}

void Layout::SetDpi(UINT dpi)
{
    m_dpi = dpi;
    LOGFONTW letters = m_letters;
    letters.lfHeight = Scaled(letters.lfHeight);
    UniqueGdiObject<HFONT> font(CreateFontIndirectW(&letters));
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
    RECT area{0, 0, Scaled(m_inside.cx), Scaled(m_inside.cy)};
    AdjustWindowRectExForDpi(&area, static_cast<DWORD>(GetWindowLongW(m_dialog, GWL_STYLE)), FALSE,
                             static_cast<DWORD>(GetWindowLongW(m_dialog, GWL_EXSTYLE)), m_dpi);
    return {area.right - area.left, area.bottom - area.top};
}
