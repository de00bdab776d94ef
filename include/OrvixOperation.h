#pragma once

#include <cstdint>

/// What `IOrvixServices::RunFileListOperation` does: bits of its `operations`. Several operations run in the order
/// add, check in, get latest, check out, undo check-out.
namespace OrvixOperation
{

inline constexpr std::uint32_t Notify = 0x1;        ///< tell the listeners before and after, and let them veto
inline constexpr std::uint32_t CheckIn = 0x2;       ///< `IOrvixProvider::CheckIn`
inline constexpr std::uint32_t Add = 0x4;           ///< `IOrvixProvider::Add`
inline constexpr std::uint32_t GetLatest = 0x8;     ///< `IOrvixProvider::GetLatest`
inline constexpr std::uint32_t CheckOut = 0x10;     ///< `IOrvixProvider::CheckOut`
inline constexpr std::uint32_t UndoCheckOut = 0x20; ///< `IOrvixProvider::UndoCheckOut`

} // namespace OrvixOperation

/// What `IOrvixServices::RunFileListOperation` returns. Any other value comes from the dialog.
namespace OrvixOperationResult
{

inline constexpr std::int32_t Cancelled = 0; ///< by a veto, a stored answer, the user, or arguments it cannot use
inline constexpr std::int32_t Done = 1;      ///< the provider was called, or there was nothing to do

} // namespace OrvixOperationResult
