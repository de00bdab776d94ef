#pragma once

#include <optional>
#include <string>
#include <string_view>

/// Conversions of the text that the archive writes, compares and shows. They throw only std::bad_alloc, and
/// std::length_error for a text of 2^31 characters.
namespace ArchiveText
{

/// Converts UTF-16; lone surrogates become U+FFFD.
std::string ToUtf8(std::wstring_view text);

/// Converts UTF-8; nothing when the bytes are not UTF-8.
std::optional<std::wstring> FromUtf8(std::string_view bytes);

/// Converts UTF-16 to the ANSI code page. A character that is not in it becomes another, such as "?".
std::string ToAnsi(std::wstring_view text);

/// Converts text in the ANSI code page.
std::wstring FromAnsi(std::string_view bytes);

/// False when the text has lone surrogates, for which UTF-8 has no form.
bool IsValid(std::wstring_view text);

/// The text in upper case, by the rules of the file system: equal for names that mean the same file to Windows.
std::wstring Fold(std::wstring_view text);

/// Replaces tabs, line ends and backslashes by "\t", "\n", "\r" and "\\", so that a text fits into a field of a line.
std::string Escape(std::string_view text);

/// Reverses `Escape`. Nothing when the text uses a backslash in any other way.
std::optional<std::string> Unescape(std::string_view text);

/// The system's message for an error code of Windows, without a line end.
std::wstring SystemMessage(unsigned long code);

/// The present time as ISO 8601 in UTC, such as "2031-05-17T08:30:00Z".
std::string Now();

} // namespace ArchiveText
