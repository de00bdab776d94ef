#pragma once

#include <windows.h>

/// The system's lock, which needs no handle: GCC's std::mutex leaves handles open when a library is unloaded. For
/// std::lock_guard and std::shared_lock.
class SystemLock
{
public:
    // NOLINTBEGIN(readability-identifier-naming)
    void lock() noexcept { AcquireSRWLockExclusive(&m_lock); }
    bool try_lock() noexcept { return TryAcquireSRWLockExclusive(&m_lock) != FALSE; }
    void unlock() noexcept { ReleaseSRWLockExclusive(&m_lock); }
    void lock_shared() noexcept { AcquireSRWLockShared(&m_lock); }
    void unlock_shared() noexcept { ReleaseSRWLockShared(&m_lock); }
    // NOLINTEND(readability-identifier-naming)

private:
    SRWLOCK m_lock = SRWLOCK_INIT;
};
