#pragma once

#include "UniqueHandle.h"

/// Loads a library with an activation context in force, so that it binds to the same side-by-side components as the
/// context's owner, and without the system's error boxes. An empty context leaves the host's in force. `flags` are
/// those of LoadLibraryExW. Empty when the library does not load; the thread's last error then says why.
UniqueModule LoadLibraryIsolated(const wchar_t* path, const UniqueActivationContext& context, DWORD flags = 0) noexcept;
