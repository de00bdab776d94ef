#pragma once

#include <windows.h>

#include <filesystem>

/// Saves the picture of a window on the screen as a PNG file. Throws std::runtime_error when that fails.
void SavePicture(HWND window, const std::filesystem::path& file);
