#pragma once

#include <algorithm>
#include <string>

/// A copy with the letters a to z in upper case and every other character as it is, whatever the locale.
inline std::wstring UpperCase(std::wstring text)
{
    std::transform(text.begin(), text.end(), text.begin(),
                   [](wchar_t c) { return c >= L'a' && c <= L'z' ? static_cast<wchar_t>(c - L'a' + L'A') : c; });
    return text;
}
