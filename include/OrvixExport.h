#pragma once

// Before any exported class: without it GCC exports the type information of the base class along with the class.
#include <typeinfo>

/// Marks what OrvixCore.dll exports. The library defines ORVIXCORE_BUILD; programs that link its
/// object files directly (its own unit tests) define ORVIXCORE_STATIC; everybody else imports.
#if defined(ORVIXCORE_BUILD)
#define ORVIX_API __declspec(dllexport)
#elif defined(ORVIXCORE_STATIC)
#define ORVIX_API
#else
#define ORVIX_API __declspec(dllimport)
#endif

/// Declares two overloads of one virtual operation, `first` in the lower slot of the table.
/// A comment in front of each is allowed. Microsoft's ABI lays overloads out in reverse order of declaration, GCC's in
/// order of declaration.
#if defined(_MSC_VER)
#define ORVIX_OVERLOADS_IN_SLOT_ORDER(first, second)                                                                   \
    second;                                                                                                            \
    first
#else
#define ORVIX_OVERLOADS_IN_SLOT_ORDER(first, second)                                                                   \
    first;                                                                                                             \
    second
#endif
