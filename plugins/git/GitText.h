#pragma once

#include <string>
#include <string_view>
#include <vector>

/// Conversions of text. Git speaks UTF-8, and the host UTF-16.
namespace GitText
{

/// Converts UTF-16; lone surrogates become U+FFFD.
std::string ToUtf8(std::wstring_view text);

/// Converts UTF-8; bytes that are not UTF-8 become U+FFFD.
std::wstring FromUtf8(std::string_view bytes);

/// The text in upper case, by the rules of the file system: equal for names that mean the same file to Windows.
std::wstring Fold(std::wstring_view text);

/// The parts of a text between separators. A separator at the end starts no part.
std::vector<std::string_view> Split(std::string_view text, char separator);

/// What a program printed, as lines for the user: without empty lines and without progress, which is what a carriage
/// return overwrites.
std::vector<std::wstring> Lines(std::string_view printed);

/// The system's message for an error code of Windows, without a line end.
std::wstring SystemMessage(unsigned long code);

} // namespace GitText
