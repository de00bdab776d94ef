#include "GitText.h"

#include <windows.h>

#include <climits>
#include <iterator>
#include <stdexcept>

namespace
{

int Length(std::size_t size)
{
    if (size > INT_MAX)
    {
        throw std::length_error("text too long");
    }
    return static_cast<int>(size);
}

} // namespace

std::string GitText::ToUtf8(std::wstring_view text)
{
    const int length = Length(text.size());
    const int size = WideCharToMultiByte(CP_UTF8, 0, text.data(), length, nullptr, 0, nullptr, nullptr);
    std::string bytes(static_cast<std::size_t>(size), '\0');
    WideCharToMultiByte(CP_UTF8, 0, text.data(), length, bytes.data(), size, nullptr, nullptr);
    return bytes;
}

std::wstring GitText::FromUtf8(std::string_view bytes)
{
    const int size = Length(bytes.size());
    const int length = MultiByteToWideChar(CP_UTF8, 0, bytes.data(), size, nullptr, 0);
    std::wstring text(static_cast<std::size_t>(length), L'\0');
    MultiByteToWideChar(CP_UTF8, 0, bytes.data(), size, text.data(), length);
    return text;
}

std::wstring GitText::Fold(std::wstring_view text)
{
    const int length = Length(text.size());
    std::wstring folded(text);
    if (length != 0)
    {
        LCMapStringEx(LOCALE_NAME_INVARIANT, LCMAP_UPPERCASE, text.data(), length, folded.data(), length, nullptr,
                      nullptr, 0);
    }
    return folded;
}

std::vector<std::string_view> GitText::Split(std::string_view text, char separator)
{
    std::vector<std::string_view> parts;
    while (!text.empty())
    {
        const std::size_t end = text.find(separator);
        parts.push_back(text.substr(0, end));
        text.remove_prefix(end == std::string_view::npos ? text.size() : end + 1);
    }
    return parts;
}

std::vector<std::wstring> GitText::Lines(std::string_view printed)
{
    std::vector<std::wstring> lines;
    for (std::string_view line : Split(printed, '\n'))
    {
        if (line.ends_with('\r'))
        {
            line.remove_suffix(1);
        }
        line.remove_prefix(line.rfind('\r') + 1); // npos + 1 is 0
        if (line.find_first_not_of(" \t") != std::string_view::npos)
        {
            lines.push_back(FromUtf8(line));
        }
    }
    return lines;
}

std::wstring GitText::SystemMessage(unsigned long code)
{
    wchar_t buffer[512];
    std::size_t length =
        FormatMessageW(FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS | FORMAT_MESSAGE_MAX_WIDTH_MASK,
                       nullptr, code, 0, buffer, static_cast<DWORD>(std::size(buffer)), nullptr);
    while (length > 0 && buffer[length - 1] <= L' ')
    {
        --length;
    }
    return length > 0 ? std::wstring(buffer, length) : L"Windows error " + std::to_wstring(code);
}
