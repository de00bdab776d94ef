#include "WStr.h"

#include <windows.h>

#include <new>

WStr::WStr(const char* text) noexcept
{
    if (text == nullptr)
    {
        return;
    }
    const int size = MultiByteToWideChar(CP_ACP, 0, text, -1, nullptr, 0);
    if (size <= 0)
    {
        return;
    }
    m_text = new (std::nothrow) wchar_t[static_cast<std::size_t>(size)];
    if (m_text != nullptr)
    {
        MultiByteToWideChar(CP_ACP, 0, text, -1, m_text, size);
    }
}

WStr::~WStr()
{
    delete[] m_text;
}
