#pragma once

#include "BraeExport.h"

#include <cstddef>

/// Base class whose objects, and arrays of objects, live on the host's heap whichever module makes or
/// deletes them. The operators give null when the heap is exhausted; null is deleted harmlessly.
class BRAE_API BraeHeapOperators
{
public:
    static void* operator new(std::size_t size) noexcept;
    static void* operator new[](std::size_t size) noexcept;
    static void operator delete(void* block) noexcept;
    static void operator delete[](void* block) noexcept;
};
