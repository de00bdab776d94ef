#pragma once

#include <windows.h>

#include <filesystem>

/// Saves what a window shows on the screen as a PNG file; throws std::runtime_error where that fails.
void SavePicture(HWND window, const std::filesystem::path& file);
