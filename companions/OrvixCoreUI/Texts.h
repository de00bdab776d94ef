#pragma once

#include <windows.h>

#include <string>

/// A text of the string table; empty when there is none with this number.
std::wstring Text(UINT id);

/// A text of the string table with its inserts filled in (%1, %2!u! and so on, as FormatMessageW reads them). An insert
/// is a number of up to 32 bits or a pointer to a null-terminated text.
std::wstring FormatText(UINT id, std::initializer_list<DWORD_PTR> inserts);

/// The text on one line: each line end and tab becomes a space.
std::wstring OneLine(std::wstring text);

/// The text with the line ends that an edit control needs: a line feed without a carriage return gets one.
std::wstring WithFieldLineEnds(const std::wstring& text);
