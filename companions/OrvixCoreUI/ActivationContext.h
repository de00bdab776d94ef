#pragma once

#include <windows.h>

/// Puts this library's manifest (common controls version 6) in force on the thread for its lifetime. Where
/// that fails the dialogs come up in the host's own look.
class ActivationContext
{
public:
    ActivationContext();
    ActivationContext(const ActivationContext&) = delete;
    ActivationContext& operator=(const ActivationContext&) = delete;
    ~ActivationContext();

private:
    HANDLE m_context;
    ULONG_PTR m_cookie = 0;
    bool m_active;
};
