#pragma once

#include <windows.h>

#include <string>

/// A text of the string table.
std::wstring Text(UINT id);

/// A text of the string table with its inserts (%1, %2!u!, as FormatMessageW has them) filled in: numbers up to
/// 32 bits and null-terminated texts.
std::wstring FormatText(UINT id, std::initializer_list<DWORD_PTR> inserts);

/// A text of several lines on one.
std::wstring OneLine(std::wstring text);

/// A text with its line ends as a field of several lines has them: a line feed gets the carriage return that it lacks.
std::wstring WithFieldLineEnds(const std::wstring& text);
