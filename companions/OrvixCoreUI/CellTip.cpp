#include "CellTip.h"

#include <utility>

namespace
{

constexpr int WidestTip = 600; // pixels; a longer text continues on the next line

TOOLINFOW ToolOf(HWND list)
{
    TOOLINFOW tool{};
    tool.cbSize = sizeof tool;
    tool.uFlags = TTF_IDISHWND | TTF_SUBCLASS;
    tool.hwnd = GetParent(list);
    tool.uId = reinterpret_cast<UINT_PTR>(list);
    tool.lpszText = LPSTR_TEXTCALLBACKW;
    return tool;
}

} // namespace

CellTip::CellTip(HWND list)
    : m_list(list),
      m_tip(CreateWindowExW(WS_EX_TOPMOST, TOOLTIPS_CLASSW, nullptr, WS_POPUP | TTS_NOPREFIX | TTS_ALWAYSTIP, 0, 0, 0,
                            0, GetParent(list), nullptr, nullptr, nullptr))
{
    const TOOLINFOW tool = ToolOf(list);
    SendMessageW(m_tip.Get(), TTM_ADDTOOLW, 0, reinterpret_cast<LPARAM>(&tool));
    SendMessageW(m_tip.Get(), TTM_SETMAXTIPWIDTH, 0, WidestTip);
}

bool CellTip::IsAskedBy(const NMHDR& notification) const
{
    return notification.code == TTN_GETDISPINFOW && m_tip && notification.hwndFrom == m_tip.Get();
}

CellTip::Cell CellTip::CellUnderMouse() const
{
    LVHITTESTINFO hit{};
    GetCursorPos(&hit.pt);
    ScreenToClient(m_list, &hit.pt);
    const LRESULT found = SendMessageW(m_list, LVM_SUBITEMHITTEST, 0, reinterpret_cast<LPARAM>(&hit));
    return found < 0 ? Cell{} : Cell{hit.iItem, hit.iSubItem};
}

void CellTip::Answer(const NMHDR& notification, std::wstring text)
{
    const auto* const header = &notification;
    auto& question = *const_cast<NMTTDISPINFOW*>(reinterpret_cast<const NMTTDISPINFOW*>(header));
    m_text = std::move(text);
    m_cell = CellUnderMouse();
    question.lpszText = m_text.data();
}

void CellTip::OnMouseMove()
{
    if (m_tip && CellUnderMouse() != m_cell)
    {
        m_cell = {};
        SendMessageW(m_tip.Get(), TTM_POP, 0, 0);
    }
}
