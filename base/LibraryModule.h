#pragma once

#include <windows.h>

/// This library's module handle, as the start-up code was given it; null where the object files are linked
/// into another program.
HMODULE LibraryModule();

/// Called once by the start-up code.
void RememberLibraryModule(HMODULE module);
