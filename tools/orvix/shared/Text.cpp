#include "Text.h"

#include <windows.h>

#include <algorithm>
#include <array>
#include <cstdio>

namespace
{

std::string WithoutControls(std::wstring_view text, std::wstring_view kept)
{
    std::wstring safe(text);
    const auto isControl = [kept](wchar_t c) {
        return (c < 0x20 || (c >= 0x7F && c < 0xA0)) && kept.find(c) == std::wstring_view::npos;
    };
    std::replace_if(safe.begin(), safe.end(), isControl, L'\xFFFD');
    return Utf8(safe);
}

} // namespace

std::string Utf8(std::wstring_view text)
{
    const int length = static_cast<int>(text.size());
    std::string bytes(
        static_cast<std::size_t>(WideCharToMultiByte(CP_UTF8, 0, text.data(), length, nullptr, 0, nullptr, nullptr)),
        '\0');
    WideCharToMultiByte(CP_UTF8, 0, text.data(), length, bytes.data(), static_cast<int>(bytes.size()), nullptr,
                        nullptr);
    return bytes;
}

std::wstring Wide(std::string_view text)
{
    const int length = static_cast<int>(text.size());
    std::wstring wide(static_cast<std::size_t>(MultiByteToWideChar(CP_UTF8, 0, text.data(), length, nullptr, 0)),
                      L'\0');
    MultiByteToWideChar(CP_UTF8, 0, text.data(), length, wide.data(), static_cast<int>(wide.size()));
    return wide;
}

bool IsInAnsiCodePage(std::wstring_view text)
{
    const int length = static_cast<int>(text.size());
    if (GetACP() == CP_UTF8)
    {
        return length == 0 || WideCharToMultiByte(CP_UTF8, WC_ERR_INVALID_CHARS, text.data(), length, nullptr, 0,
                                                  nullptr, nullptr) != 0;
    }
    BOOL lost = FALSE;
    WideCharToMultiByte(CP_ACP, WC_NO_BEST_FIT_CHARS, text.data(), length, nullptr, 0, nullptr, &lost);
    return lost == FALSE;
}

std::string Printable(std::wstring_view text)
{
    return WithoutControls(text, L"");
}

std::string PrintableLines(std::wstring_view text)
{
    return WithoutControls(text, L"\t\r\n");
}

std::string Hexadecimal(unsigned long number)
{
    std::array<char, 11> text{};
    std::snprintf(text.data(), text.size(), "0x%08lX", number);
    return text.data();
}

std::wstring SystemMessage(unsigned long error, std::wstring_view file)
{
    std::array<wchar_t, 1024> buffer{};
    const DWORD length =
        FormatMessageW(FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS | FORMAT_MESSAGE_MAX_WIDTH_MASK,
                       nullptr, error, 0, buffer.data(), static_cast<DWORD>(buffer.size()), nullptr);
    std::wstring message(buffer.data(), length);
    while (!message.empty() && (message.back() == L' ' || message.back() == L'.'))
    {
        message.pop_back();
    }
    if (const std::size_t insert = message.find(L"%1"); insert != std::wstring::npos)
    {
        message.replace(insert, 2, file);
    }
    return message + (message.empty() ? L"error " : L" (error ") + std::to_wstring(error) +
           (message.empty() ? L"" : L")");
}
