#pragma once

/// The state of a file: low bits of an entry's FlagsOut, written by `IOrvixProvider::QueryStatus`.
namespace OrvixFileState
{

inline constexpr unsigned long NotControlled = 0x1;     ///< not under source control
inline constexpr unsigned long Controlled = 0x2;        ///< under source control
inline constexpr unsigned long CheckedOut = 0x4;        ///< checked out by this user
inline constexpr unsigned long CheckedOutByOther = 0x8; ///< checked out by another user
inline constexpr unsigned long OutOfDate = 0x10;        ///< a newer version exists
inline constexpr unsigned long Deleted = 0x20;          ///< deleted in the project
inline constexpr unsigned long Modified = 0x80;         ///< changed on the disk

} // namespace OrvixFileState

/// What a file allows in its state: high bits of an entry's FlagsOut, written by `IOrvixProvider::QueryStatus`. The
/// usual `flagsOutMask` of `IOrvixServices::RunFileListOperation`.
namespace OrvixFilePermission
{

inline constexpr unsigned long CheckIn = 0x10000;      ///< checked out by this user alone
inline constexpr unsigned long CheckOut = 0x20000;     ///< not checked out and not out of date
inline constexpr unsigned long UndoCheckOut = 0x40000; ///< checked out by this user alone
inline constexpr unsigned long Compare = 0x80000;      ///< checked out or modified
inline constexpr unsigned long Add = 0x100000;         ///< not controlled, while a project is open
inline constexpr unsigned long GetLatest = 0x200000;   ///< controlled
inline constexpr unsigned long ShowHistory = 0x400000; ///< controlled

} // namespace OrvixFilePermission

/// The marks of an entry in an operation.
namespace OrvixFileSelection
{

/// Bit of FlagsIn: the entry fits the operation. Set by `IOrvixServices::RunFileListOperation`; the file-list dialog
/// shows such an entry checked.
inline constexpr unsigned long Selected = 0x1;

/// Bit of FlagsOut after the file-list dialog: the user left the entry checked. It replaces
/// `OrvixFileState::Controlled`, so ask for the state again before you read it.
inline constexpr unsigned long Confirmed = 0x2;

} // namespace OrvixFileSelection
