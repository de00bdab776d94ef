#pragma once

#include <memory>
#include <new>

/// Makes a record or a provider, which lives on the host's heap. Throws std::bad_alloc when that heap is exhausted,
/// where the class's own operator new gives null.
template <typename Object>
std::unique_ptr<Object> MakeOnHostHeap()
{
    std::unique_ptr<Object> object(new Object);
    if (!object)
    {
        throw std::bad_alloc();
    }
    return object;
}
