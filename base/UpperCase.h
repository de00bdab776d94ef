#pragma once

#include <algorithm>
#include <string>

/// The letters a to z in upper case and every other character as it is, whatever the locale.
inline constexpr wchar_t UpperCaseLetter(wchar_t c)
{
    return c >= L'a' && c <= L'z' ? static_cast<wchar_t>(c - L'a' + L'A') : c;
}

/// A copy with each letter from a to z in upper case.
inline std::wstring UpperCase(std::wstring text)
{
    std::transform(text.begin(), text.end(), text.begin(), UpperCaseLetter);
    return text;
}
