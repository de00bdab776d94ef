#pragma once

/// How a provider runs an operation: bits of `options` in `IOrvixProvider`. A provider ignores bits that it does not
/// know.
namespace OrvixProviderOption
{

inline constexpr unsigned long KeepCheckedOut = 0x1; ///< `CheckIn`, `Add`: keep the files checked out
inline constexpr unsigned long GetLatest = 0x2;      ///< `CheckOut`: get latest first; `UndoCheckOut`: afterwards
inline constexpr unsigned long NoDialog = 0x4;       ///< a stored answer confirmed the operation

} // namespace OrvixProviderOption
