#include "ClientAccess.h"

void ClientAccess::OutputText(const wchar_t* text, int)
{
    if (text != nullptr)
    {
        m_output.Add(text);
    }
}

std::intptr_t ClientAccess::RelayA(void* a, void*, void*, void*)
{
    OutputText(static_cast<const wchar_t*>(a), 0);
    return a != nullptr ? 1 : 0;
}

std::intptr_t ClientAccess::RelayB(void*, void*, void*, void*)
{
    return reinterpret_cast<std::intptr_t>(m_output.Owner());
}
