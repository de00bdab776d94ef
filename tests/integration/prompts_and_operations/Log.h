#pragma once

#include <string>
#include <vector>

class OrvixFileList;

/// What happened, in order, one line for each call that the library made.
using Lines = std::vector<std::string>;

/// The names of the active entries: "[a b]"; "no list" for null.
std::string ActiveNames(OrvixFileList* list);

/// The text of a test, which is plain ASCII.
std::string Narrow(const wchar_t* text);
