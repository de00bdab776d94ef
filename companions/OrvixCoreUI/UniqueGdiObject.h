#pragma once

#include "UniqueHandle.h"

/// How a GDI object, such as a brush or a font, is deleted.
template <typename Object>
struct GdiObjectPolicy
{
    using Handle = Object;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle object) noexcept { DeleteObject(object); }
};

/// Owns a GDI object.
template <typename Object>
using UniqueGdiObject = UniqueHandle<GdiObjectPolicy<Object>>;
