#include "ClientAccess.h"

#include "ParentLink.h"

#include <windows.h>

void ClientAccess::OutputText(const wchar_t* text, int)
{
    if (text != nullptr)
    {
        ParentLink::Send(ParentLink::Alive);
        m_textIsResult ? m_output.Print(text) : m_output.PrintMessage(text);
    }
}

std::uint32_t ClientAccess::GetColor(std::int32_t index)
{
    return GetSysColor(index);
}
