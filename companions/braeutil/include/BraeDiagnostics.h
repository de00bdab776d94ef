#pragma once

#include "BraeExport.h"

struct HINSTANCE__;

/// What only the development build of braeutil has: numbers about its heap, and a way to make it fail. For tests. Not
/// thread-safe; no function throws.
namespace BraeDiagnostics
{

/// How many blocks are allocated by `BraeHeapOperators` and not freed yet.
BRAE_API long LiveBlocks() noexcept;

/// How often `BraeHeapOperators` was to free a block that it did not allocate or that was freed already.
BRAE_API long ForeignFrees() noexcept;

/// Makes an allocation of `BraeHeapOperators` fail: the next one when `countdown` is 1, the one after it when it is 2,
/// and so on. With `forGood` all allocations after that fail as well. 0 ends the failures.
BRAE_API void FailAllocation(long countdown, bool forGood) noexcept;

/// The module that was last given to `BraeSDK::Util::UseLanguagePackLocale`; null before.
BRAE_API HINSTANCE__* LanguagePackModule() noexcept;

} // namespace BraeDiagnostics
