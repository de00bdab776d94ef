#pragma once

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

} // namespace OrvixDialogOption

/// What `IOrvixServices::ShowFileListDialog` and `IOrvixCoreUI::ShowFileListDialog` return.
namespace OrvixDialogResult
{

inline constexpr std::int32_t Cancelled = 0; ///< the user cancelled: nothing is done
inline constexpr std::int32_t Confirmed = 1; ///< the user confirmed the files

} // namespace OrvixDialogResult
