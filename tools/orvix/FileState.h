#pragma once

#include <string>

/// Bits of an entry's FlagsOut, as `IOrvixProvider::QueryStatus` writes them.
namespace FileState
{

constexpr unsigned long NotControlled = 0x1;
constexpr unsigned long Controlled = 0x2;
constexpr unsigned long CheckedOut = 0x4;
constexpr unsigned long CheckedOutByOther = 0x8;
constexpr unsigned long OutOfDate = 0x10;
constexpr unsigned long Deleted = 0x20;
constexpr unsigned long Modified = 0x80;
constexpr unsigned long AllowsCheckIn = 0x10000;
constexpr unsigned long AllowsCheckOut = 0x20000;
constexpr unsigned long AllowsUndo = 0x40000;
constexpr unsigned long AllowsCompare = 0x80000;
constexpr unsigned long AllowsAdd = 0x100000;
constexpr unsigned long AllowsGet = 0x200000;
constexpr unsigned long AllowsHistory = 0x400000;

/// The state in words. `exists`: the file is on the disk.
std::string InWords(unsigned long flags, bool exists);

} // namespace FileState
