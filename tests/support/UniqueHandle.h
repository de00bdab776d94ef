#pragma once

#include <windows.h>

#include <memory>

struct HandleDeleter
{
    using pointer = HANDLE;
    void operator()(HANDLE handle) const noexcept { CloseHandle(handle); }
};

/// A handle of the system that closes itself.
using UniqueHandle = std::unique_ptr<HANDLE, HandleDeleter>;
