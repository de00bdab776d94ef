#pragma once

#include <initializer_list>
#include <string>
#include <vector>

class OrvixFileList;

/// What happened, in order, one line for each call that the library made.
using Lines = std::vector<std::string>;

/// The names of the active entries: "[a b]"; "no list" for null.
std::string ActiveNames(OrvixFileList* list);

/// The text of a test, which is plain ASCII.
std::string Narrow(const wchar_t* text);

/// A published bit and its name.
struct NamedBit
{
    unsigned long bit;
    const char* name;
};

/// The names of the bits that are set, each with a blank before it, and what remains as a number: " GetLatest 0x100".
std::string BitNames(unsigned long bits, std::initializer_list<NamedBit> names);
