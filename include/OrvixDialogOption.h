#pragma once

#include "OrvixOperation.h"

#include <cstdint>

/// What a file-list dialog offers and returns: bits of `OrvixFileListDialogParams::GetOptions`.
namespace OrvixDialogOption
{

inline constexpr std::uint32_t EntriesCanBeCleared = 0x1; ///< set by `RunFileListOperation`
inline constexpr std::uint32_t OfferKeepCheckedOut = 0x4; ///< the option is to keep the files checked out
inline constexpr std::uint32_t OfferGetLatest =
    0x8; ///< the option is to get latest; counts only without `OfferKeepCheckedOut`
inline constexpr std::uint32_t OptionChecked = 0x10;   ///< the option is checked; in and out
inline constexpr std::uint32_t OfferRemember = 0x40;   ///< offers to remember the answers
inline constexpr std::uint32_t RememberChecked = 0x80; ///< the answers are to be stored; in and out

/// The bits that name an operation.
inline constexpr std::uint32_t OperationMask = 0x3E00;

/// Names the operation that the user confirms, a bit of `OrvixOperation`, to the dialog: its button then says what it
/// does ("Check in 12 files"), and there is no field for a comment when the operation takes none. Of several operations
/// the dialog names one. `RunFileListOperation` neither sets nor reads these bits.
constexpr std::uint32_t ForOperation(std::uint32_t operation)
{
    return (operation << 8) & OperationMask;
}

} // namespace OrvixDialogOption

/// What `IOrvixServices::ShowFileListDialog` and `IOrvixCoreUI::ShowFileListDialog` return.
namespace OrvixDialogResult
{

inline constexpr std::int32_t Cancelled = 0; ///< the user cancelled: nothing is done
inline constexpr std::int32_t Confirmed = 1; ///< the user confirmed the files

} // namespace OrvixDialogResult
