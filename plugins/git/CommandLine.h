#pragma once

#include <string>
#include <vector>

/// The command line that Windows hands to a program, which takes it apart again: each argument arrives unchanged at
/// every program that follows the rules of Microsoft's C library, as Git does. `program` has no quotation marks.
std::wstring MakeCommandLine(const std::wstring& program, const std::vector<std::wstring>& arguments);
