#pragma once

#include <string>
#include <string_view>

/// UTF-16 to UTF-8. What is not valid becomes U+FFFD.
std::string Utf8(std::wstring_view text);

/// UTF-8 to UTF-16. What is not valid becomes U+FFFD.
std::wstring Wide(std::string_view text);

/// Whether the ANSI code page has every character of a text.
bool IsInAnsiCodePage(std::wstring_view text);

/// Text from outside as UTF-8 that is safe on a terminal: each control character becomes U+FFFD.
std::string Printable(std::wstring_view text);

/// The same, but tabs and line ends stay.
std::string PrintableLines(std::wstring_view text);

/// A number as bits and codes are shown: 0x and eight digits.
std::string Hexadecimal(unsigned long number);

/// The system's message for an error code, with the code in brackets. `file` replaces the placeholder for a file name
/// that some messages have.
std::wstring SystemMessage(unsigned long error, std::wstring_view file);
