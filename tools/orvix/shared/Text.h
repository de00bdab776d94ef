#pragma once

#include <string>
#include <string_view>

/// UTF-16 to UTF-8; what is not valid becomes U+FFFD.
std::string Utf8(std::wstring_view text);

/// UTF-8 to UTF-16; what is not valid becomes U+FFFD.
std::wstring Wide(std::string_view text);

/// Text from outside as UTF-8 that is safe on a terminal: control characters become U+FFFD.
std::string Printable(std::wstring_view text);

/// As above, with tabs and line ends kept.
std::string PrintableLines(std::wstring_view text);

/// A number as people read bits and codes: 0x and eight digits.
std::string Hexadecimal(unsigned long number);

/// The system's message for an error, with its number; `file` stands in the place that some messages leave for one.
std::wstring SystemMessage(unsigned long error, std::wstring_view file);
