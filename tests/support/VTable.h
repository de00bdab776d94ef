#pragma once

#include <cstddef>

/// How many slots the destructor takes: two in GCC's ABI (one that also frees the object), one in Microsoft's.
#if defined(_MSC_VER)
inline constexpr std::size_t DestructorSlots = 1;
#else
inline constexpr std::size_t DestructorSlots = 2;
#endif

/// Calls an operation by its raw slot in the object's virtual table, as a client built by another compiler
/// does. For a class whose destructor comes first, the first operation after it has slot `DestructorSlots`.
template <typename Result, typename... Arguments>
Result CallSlot(void* object, std::size_t slot, Arguments... arguments)
{
    void** table = *static_cast<void***>(object);
    return reinterpret_cast<Result (*)(void*, Arguments...)>(table[slot])(object, arguments...);
}

/// Deletes an object as another module does: through the destructor at the head of its virtual table.
inline void DeleteThroughTable(void* object)
{
#if defined(_MSC_VER)
    constexpr unsigned int FreeAsWell = 1;
    CallSlot<void*>(object, 0, FreeAsWell);
#else
    CallSlot<void>(object, 1);
#endif
}
