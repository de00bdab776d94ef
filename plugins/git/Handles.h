#pragma once

#include <windows.h>

#include <memory>

/// Closes a handle of the kernel.
struct HandleCloser
{
    using pointer = HANDLE;
    void operator()(HANDLE handle) const noexcept { CloseHandle(handle); }
};

/// A process, an event, a job, a pipe. A function that fails with INVALID_HANDLE_VALUE goes through `OwnFile`.
using OwnedHandle = std::unique_ptr<HANDLE, HandleCloser>;

/// Owns what `CreateFileW` and `CreateNamedPipeW` return; null when they fail.
inline OwnedHandle OwnFile(HANDLE file) noexcept
{
    return OwnedHandle(file != INVALID_HANDLE_VALUE ? file : nullptr);
}
