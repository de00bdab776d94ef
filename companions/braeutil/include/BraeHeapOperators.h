#pragma once

#include "BraeExport.h"

#include <cstddef>

/// Base class whose objects, and arrays of objects, live on the host's heap, whichever module makes or deletes them.
/// No function throws.
class BRAE_API BraeHeapOperators
{
public:
    /// A block of `size` bytes for an object; null when the heap is exhausted, so that `new` gives null as well.
    static void* operator new(std::size_t size) noexcept;

    /// The same for an array.
    static void* operator new[](std::size_t size) noexcept;

    /// Frees the block of an object. Null is ignored.
    static void operator delete(void* block) noexcept;

    /// Frees the block of an array. Null is ignored.
    static void operator delete[](void* block) noexcept;
};
