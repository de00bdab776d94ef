#pragma once

#include <windows.h>

#include <filesystem>
#include <string>

/// Saves the picture of a window on the screen as a PNG file. Throws std::runtime_error when that fails.
void SavePicture(HWND window, const std::filesystem::path& file);

/// Saves the picture of a window when it is completely drawn, as `name` in the folder that ORVIX_PICTURES in the
/// environment names, otherwise in `folder`. Returns the bytes of the file. Throws as `SavePicture`.
std::string TakePicture(HWND window, const wchar_t* name, const std::filesystem::path& folder);
