#include "ClientAccess.h"

#include "Text.h"

#include <windows.h>

#include <iostream>

void ClientAccess::OutputText(const wchar_t* text, int)
{
    if (text != nullptr)
    {
        std::cout << PrintableLines(text) << '\n';
    }
}

std::uint32_t ClientAccess::GetColor(std::int32_t index)
{
    return GetSysColor(index);
}
