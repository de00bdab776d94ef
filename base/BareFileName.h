#pragma once

#include "UpperCase.h"

#include <algorithm>
#include <string>
#include <string_view>

/// Whether a text is the name of a file and nothing more: no separator, no drive or stream (":"), no "..", no character
/// that Windows forbids in names, and no device such as NUL or COM1, which Windows sees with any extension too.
inline bool IsBareFileName(std::wstring_view name)
{
    constexpr std::wstring_view Forbidden = L"\\/:*?\"<>|";
    const bool isForbidden = std::any_of(
        name.begin(), name.end(), [&](wchar_t c) { return c < L' ' || Forbidden.find(c) != std::wstring_view::npos; });
    if (name.empty() || name == L"." || name.find(L"..") != std::wstring_view::npos || isForbidden)
    {
        return false;
    }
    std::wstring stem(name.substr(0, name.find(L'.')));
    stem.erase(stem.find_last_not_of(L' ') + 1);
    stem = UpperCase(stem);
    constexpr std::wstring_view Devices[] = {L"CON", L"PRN", L"AUX", L"NUL", L"CONIN$", L"CONOUT$"};
    // The superscript digits count as digits here.
    const bool isPort = stem.size() == 4 && (stem.starts_with(L"COM") || stem.starts_with(L"LPT")) &&
                        std::wstring_view(L"0123456789\u00B9\u00B2\u00B3").find(stem[3]) != std::wstring_view::npos;
    return !isPort && std::find(std::begin(Devices), std::end(Devices), stem) == std::end(Devices);
}
