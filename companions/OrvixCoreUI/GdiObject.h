#pragma once

#include <windows.h>

#include <memory>
#include <type_traits>

struct GdiDeleter
{
    void operator()(HGDIOBJ object) const { DeleteObject(object); }
};

/// A GDI object that is deleted at the end.
template <typename Handle>
using GdiObject = std::unique_ptr<std::remove_pointer_t<Handle>, GdiDeleter>;
