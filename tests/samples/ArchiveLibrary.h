#pragma once

#include <filesystem>

/// The archive's MSSCCI library that the tests load: itself, or its proxy when the program runs it isolated.
std::filesystem::path ArchiveLibrary();

/// Whether it is isolated.
bool IsArchiveIsolated();
