#pragma once

#include "BraeExport.h"

struct HINSTANCE__;

/// What only the development build of braeutil offers: a look at its heap and a way to exhaust it.
/// For tests; not thread-safe.
namespace BraeDiagnostics
{

/// Blocks allocated by `BraeHeapOperators` and not freed yet.
BRAE_API long LiveBlocks() noexcept;

/// How often a block was handed to `BraeHeapOperators` that it did not allocate or had freed already.
BRAE_API long ForeignFrees() noexcept;

/// Makes an allocation fail: the next one for 1, the one after it for 2 and so on; with `forGood` all that
/// follow it as well. 0 ends the failing.
BRAE_API void FailAllocation(long countdown, bool forGood) noexcept;

/// The module last given to `BraeSDK::Util::UseLanguagePackLocale`; null before.
BRAE_API HINSTANCE__* LanguagePackModule() noexcept;

} // namespace BraeDiagnostics
