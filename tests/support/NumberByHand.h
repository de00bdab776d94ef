#pragma once

#include <cstdlib>
#include <cwchar>

/// A number of a long test, which an environment variable changes by hand.
inline unsigned int NumberByHand(const wchar_t* variable, unsigned int otherwise)
{
    const wchar_t* text = _wgetenv(variable);
    return text == nullptr ? otherwise : static_cast<unsigned int>(std::wcstoul(text, nullptr, 10));
}
