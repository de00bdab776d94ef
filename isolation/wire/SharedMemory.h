#pragma once

#include "UniqueHandle.h"

#include <windows.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>

/// The memory that a host and the process of an isolated library share. Its layout is the same in 32-bit and 64-bit
/// processes. Each area holds one message at a time; only the process named here writes to it.
namespace Wire
{

/// How a library's process died, written by that process in its last moment.
struct CrashRecord
{
    std::uint32_t code; ///< of the exception; 0 for no crash
    std::uint32_t unused;
    std::uint64_t offset;                 ///< of the failing instruction in the module
    std::array<std::uint16_t, 64> module; ///< its file name in UTF-16, cut to fit; need not be terminated
};
static_assert(sizeof(CrashRecord) == 144 && offsetof(CrashRecord, offset) == 8 && offsetof(CrashRecord, module) == 16);

/// The first bytes of the memory.
struct State
{
    CrashRecord crash;             ///< library's process
    std::int32_t callAnswer;       ///< host: the answer to a callback of the running call
    std::int32_t backgroundAnswer; ///< host: the answer to a callback from another thread or between calls
};
static_assert(sizeof(State) == 152 && offsetof(State, callAnswer) == 144 && offsetof(State, backgroundAnswer) == 148);

constexpr std::size_t StateBytes = 4096;
constexpr std::size_t RequestBytes = std::size_t{32} << 20; ///< 100,000 paths of the greatest length fit
constexpr std::size_t ReplyBytes = std::size_t{31} << 20;   ///< replies, callbacks of the running call; as many paths
constexpr std::size_t BackgroundBytes = std::size_t{64} << 10; ///< callbacks from other threads or between calls
constexpr std::size_t TotalBytes = StateBytes + RequestBytes + ReplyBytes + BackgroundBytes;

/// A mapped view of memory.
struct ViewPolicy
{
    using Handle = std::byte*;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle view) noexcept { UnmapViewOfFile(view); }
};

class SharedMemory
{
public:
    /// Maps the memory; false in `operator bool` when that fails.
    explicit SharedMemory(HANDLE section) noexcept
        : m_view(static_cast<std::byte*>(MapViewOfFile(section, FILE_MAP_READ | FILE_MAP_WRITE, 0, 0, TotalBytes)))
    {
    }

    explicit operator bool() const noexcept { return static_cast<bool>(m_view); }

    State& GetState() const noexcept { return *reinterpret_cast<State*>(m_view.Get()); }
    std::span<std::byte> Request() const noexcept { return {m_view.Get() + StateBytes, RequestBytes}; }
    std::span<std::byte> Reply() const noexcept { return {m_view.Get() + StateBytes + RequestBytes, ReplyBytes}; }
    std::span<std::byte> Background() const noexcept
    {
        return {m_view.Get() + StateBytes + RequestBytes + ReplyBytes, BackgroundBytes};
    }

private:
    UniqueHandle<ViewPolicy> m_view;
};

} // namespace Wire
