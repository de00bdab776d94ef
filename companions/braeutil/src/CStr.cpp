#include "CStr.h"

#include <windows.h>

#include <new>

CStr::CStr(const wchar_t* text) noexcept
{
    if (text == nullptr)
    {
        return;
    }
    const int size = WideCharToMultiByte(CP_ACP, 0, text, -1, nullptr, 0, nullptr, nullptr);
    if (size <= 0)
    {
        return;
    }
    m_text = new (std::nothrow) char[static_cast<std::size_t>(size)];
    if (m_text != nullptr)
    {
        WideCharToMultiByte(CP_ACP, 0, text, -1, m_text, size, nullptr, nullptr);
    }
}

CStr::~CStr()
{
    delete[] m_text;
}
