#include "ArchiveText.h"

#include <windows.h>

#include <climits>
#include <cstdio>
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

std::string ToBytes(UINT codePage, std::wstring_view text)
{
    const int length = Length(text.size());
    const int size = WideCharToMultiByte(codePage, 0, text.data(), length, nullptr, 0, nullptr, nullptr);
    std::string bytes(static_cast<std::size_t>(size), '\0');
    WideCharToMultiByte(codePage, 0, text.data(), length, bytes.data(), size, nullptr, nullptr);
    return bytes;
}

std::optional<std::wstring> FromBytes(UINT codePage, DWORD flags, std::string_view bytes)
{
    const int size = Length(bytes.size());
    const int length = MultiByteToWideChar(codePage, flags, bytes.data(), size, nullptr, 0);
    if (length == 0 && size != 0)
    {
        return std::nullopt;
    }
    std::wstring text(static_cast<std::size_t>(length), L'\0');
    MultiByteToWideChar(codePage, flags, bytes.data(), size, text.data(), length);
    return text;
}

} // namespace

std::string ArchiveText::ToUtf8(std::wstring_view text)
{
    return ToBytes(CP_UTF8, text);
}

std::optional<std::wstring> ArchiveText::FromUtf8(std::string_view bytes)
{
    return FromBytes(CP_UTF8, MB_ERR_INVALID_CHARS, bytes);
}

std::string ArchiveText::ToAnsi(std::wstring_view text)
{
    return ToBytes(CP_ACP, text);
}

std::wstring ArchiveText::FromAnsi(std::string_view bytes)
{
    return FromBytes(CP_ACP, 0, bytes).value_or(L"");
}

bool ArchiveText::IsValid(std::wstring_view text)
{
    return text.empty() || WideCharToMultiByte(CP_UTF8, WC_ERR_INVALID_CHARS, text.data(), Length(text.size()), nullptr,
                                               0, nullptr, nullptr) != 0;
}

std::wstring ArchiveText::Fold(std::wstring_view text)
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

std::string ArchiveText::Escape(std::string_view text)
{
    std::string escaped;
    for (const char character : text)
    {
        switch (character)
        {
        case '\t':
            escaped += "\\t";
            break;
        case '\n':
            escaped += "\\n";
            break;
        case '\r':
            escaped += "\\r";
            break;
        case '\\':
            escaped += "\\\\";
            break;
        default:
            escaped += character;
        }
    }
    return escaped;
}

std::optional<std::string> ArchiveText::Unescape(std::string_view text)
{
    constexpr std::string_view Letters = "tnr\\";
    constexpr std::string_view Characters = "\t\n\r\\";
    std::string plain;
    for (std::size_t i = 0; i < text.size(); ++i)
    {
        if (text[i] != '\\')
        {
            plain += text[i];
            continue;
        }
        const std::size_t which = ++i < text.size() ? Letters.find(text[i]) : std::string_view::npos;
        if (which == std::string_view::npos)
        {
            return std::nullopt;
        }
        plain += Characters[which];
    }
    return plain;
}

std::wstring ArchiveText::SystemMessage(unsigned long code)
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

std::string ArchiveText::Now()
{
    SYSTEMTIME time;
    GetSystemTime(&time);
    char buffer[64];
    std::snprintf(buffer, sizeof buffer, "%04u-%02u-%02uT%02u:%02u:%02uZ", static_cast<unsigned>(time.wYear),
                  static_cast<unsigned>(time.wMonth), static_cast<unsigned>(time.wDay),
                  static_cast<unsigned>(time.wHour), static_cast<unsigned>(time.wMinute),
                  static_cast<unsigned>(time.wSecond));
    return buffer;
}
