#pragma once

#include "BraeExport.h"

#include <cstddef>

/// Base class whose objects, and arrays of objects, live on the host's heap whichever module makes or
/// deletes them. The operators give null when the heap is exhausted; null is deleted harmlessly.
class BRAE_API BraeHeapOperators
{
public:
    /// Storage of `size` bytes for an object; null when the heap is exhausted.
    static void* operator new(std::size_t size) noexcept;
    /// Storage of `size` bytes for an array; null when the heap is exhausted.
    static void* operator new[](std::size_t size) noexcept;
    /// Frees the storage of an object; null does nothing.
    static void operator delete(void* block) noexcept;
    /// Frees the storage of an array; null does nothing.
    static void operator delete[](void* block) noexcept;
};
