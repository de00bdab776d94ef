#include "Texts.h"

#include "Module.h"
#include "UniqueHandle.h"

std::wstring Text(UINT id)
{
    const wchar_t* text = nullptr; // points into the resource, without a terminator
    const int length = LoadStringW(ThisModule(), id, reinterpret_cast<wchar_t*>(&text), 0);
    return {text, static_cast<std::size_t>(length)};
}

std::wstring FormatText(UINT id, std::initializer_list<DWORD_PTR> inserts)
{
    UniqueLocalMemory text;
    const std::wstring form = Text(id);
    auto* arguments = reinterpret_cast<va_list*>(const_cast<DWORD_PTR*>(inserts.begin()));
    const DWORD length =
        FormatMessageW(FORMAT_MESSAGE_FROM_STRING | FORMAT_MESSAGE_ARGUMENT_ARRAY | FORMAT_MESSAGE_ALLOCATE_BUFFER,
                       form.c_str(), 0, 0, reinterpret_cast<wchar_t*>(text.Out()), 0, arguments);
    return {static_cast<const wchar_t*>(text.Get()), length};
}

std::wstring OneLine(std::wstring text)
{
    for (wchar_t& letter : text)
    {
        if (letter == L'\r' || letter == L'\n' || letter == L'\t')
        {
            letter = L' ';
        }
    }
    return text;
}

std::wstring WithFieldLineEnds(const std::wstring& text)
{
    std::wstring lines;
    for (const wchar_t letter : text)
    {
        if (letter == L'\n' && !lines.ends_with(L'\r'))
        {
            lines += L'\r';
        }
        lines += letter;
    }
    return lines;
}
