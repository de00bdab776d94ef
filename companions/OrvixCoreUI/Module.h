#pragma once

#include <windows.h>

#include <bit>
#include <cstdint>

/// The start of this module in memory. The linker defines it.
extern "C" IMAGE_DOS_HEADER __ImageBase;

/// The handle of this library.
inline HINSTANCE ThisModule()
{
    return reinterpret_cast<HINSTANCE>(&__ImageBase);
}

/// The number of a resource in the form in which functions take its name.
inline const wchar_t* ResourceName(std::uintptr_t id)
{
    return std::bit_cast<const wchar_t*>(id);
}
