#pragma once

#include <windows.h>

#include <utility>

/// Owns a handle of the system and closes it. A policy names the handle's type, the value that means "none" and the
/// function that closes it. Closing keeps the thread's last error.
template <typename Policy>
class UniqueHandle
{
public:
    using Handle = typename Policy::Handle;

    UniqueHandle() noexcept = default;
    explicit UniqueHandle(Handle handle) noexcept : m_handle(handle) {}
    UniqueHandle(UniqueHandle&& other) noexcept : m_handle(other.Release()) {}
    UniqueHandle& operator=(UniqueHandle&& other) noexcept
    {
        Reset(other.Release());
        return *this;
    }
    UniqueHandle(const UniqueHandle&) = delete;
    UniqueHandle& operator=(const UniqueHandle&) = delete;
    ~UniqueHandle() { Reset(); }

    explicit operator bool() const noexcept { return m_handle != Policy::None(); }
    Handle Get() const noexcept { return m_handle; }

    /// Hands the ownership to the caller.
    Handle Release() noexcept { return std::exchange(m_handle, Policy::None()); }

    /// Closes the handle and takes another one.
    void Reset(Handle handle = Policy::None()) noexcept
    {
        const Handle previous = std::exchange(m_handle, handle);
        if (previous != Policy::None())
        {
            const DWORD error = GetLastError();
            Policy::Close(previous);
            SetLastError(error);
        }
    }

    /// Closes the handle and returns the address where a function stores the next one.
    Handle* Out() noexcept
    {
        Reset();
        return &m_handle;
    }

private:
    Handle m_handle = Policy::None();
};

/// A handle of the kernel: a process, an event, a mapping.
struct KernelHandlePolicy
{
    using Handle = HANDLE;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle handle) noexcept { CloseHandle(handle); }
};
using UniqueKernelHandle = UniqueHandle<KernelHandlePolicy>;

/// A file, a pipe, a mail slot: what `CreateFileW` opens.
struct FileHandlePolicy
{
    using Handle = HANDLE;
    static Handle None() noexcept { return INVALID_HANDLE_VALUE; }
    static void Close(Handle handle) noexcept { CloseHandle(handle); }
};
using UniqueFile = UniqueHandle<FileHandlePolicy>;

/// A search for files.
struct FindHandlePolicy
{
    using Handle = HANDLE;
    static Handle None() noexcept { return INVALID_HANDLE_VALUE; }
    static void Close(Handle handle) noexcept { FindClose(handle); }
};
using UniqueFind = UniqueHandle<FindHandlePolicy>;

/// A loaded library.
struct ModulePolicy
{
    using Handle = HMODULE;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle handle) noexcept { FreeLibrary(handle); }
};
using UniqueModule = UniqueHandle<ModulePolicy>;

/// An open key of the registry.
struct RegistryKeyPolicy
{
    using Handle = HKEY;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle handle) noexcept { RegCloseKey(handle); }
};
using UniqueRegistryKey = UniqueHandle<RegistryKeyPolicy>;

/// An activation context.
struct ActivationContextPolicy
{
    using Handle = HANDLE;
    static Handle None() noexcept { return INVALID_HANDLE_VALUE; }
    static void Close(Handle handle) noexcept { ReleaseActCtx(handle); }
};
using UniqueActivationContext = UniqueHandle<ActivationContextPolicy>;

/// Memory that a function of Windows allocated with `LocalAlloc`.
struct LocalMemoryPolicy
{
    using Handle = HLOCAL;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle handle) noexcept { LocalFree(handle); }
};
using UniqueLocalMemory = UniqueHandle<LocalMemoryPolicy>;
