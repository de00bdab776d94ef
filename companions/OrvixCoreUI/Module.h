#pragma once

#include <windows.h>

#include <bit>
#include <cstdint>

/// Where the linker puts this module.
extern "C" IMAGE_DOS_HEADER __ImageBase;

inline HINSTANCE ThisModule()
{
    return reinterpret_cast<HINSTANCE>(&__ImageBase);
}

/// The name of a resource that has a number.
inline const wchar_t* ResourceName(std::uintptr_t id)
{
    return std::bit_cast<const wchar_t*>(id);
}
