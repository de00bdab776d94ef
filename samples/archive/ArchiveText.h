#pragma once

#include <optional>
#include <string>
#include <string_view>

/// Text as the archive writes, compares and reports it. Memory exhaustion is the only exception.
namespace ArchiveText
{

/// Converts UTF-16; lone surrogates become U+FFFD.
std::string ToUtf8(std::wstring_view text);

/// Converts UTF-8; nothing when the bytes are not UTF-8.
std::optional<std::wstring> FromUtf8(std::string_view bytes);

/// Converts UTF-16 to the ANSI code page; characters that it lacks become others.
std::string ToAnsi(std::wstring_view text);

/// Converts text in the ANSI code page.
std::wstring FromAnsi(std::string_view bytes);

/// False when the text has lone surrogates, which UTF-8 cannot carry.
bool IsValid(std::wstring_view text);

/// The form in which names that Windows takes for the same are equal: upper case by the file system's rules.
std::wstring Fold(std::wstring_view text);

/// Puts "\t", "\n", "\r" and "\\" in place of what would end a field or a line.
std::string Escape(std::string_view text);

/// The opposite of `Escape`; nothing for any other use of a backslash.
std::optional<std::string> Unescape(std::string_view text);

/// The system's message for an error code of Windows, without a line end.
std::wstring SystemMessage(unsigned long code);

/// Now, as ISO 8601 in UTC: "2031-05-17T08:30:00Z".
std::string Now();

} // namespace ArchiveText
