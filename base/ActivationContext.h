#pragma once

#include "UniqueHandle.h"

/// The activation context of a library's own manifest (resource 2). Making one reads the manifest: keep it when you
/// load many libraries. Empty when the module has no such manifest.
UniqueActivationContext MakeManifestContext(HMODULE module) noexcept;

/// An activation context that is in force on the thread for a scope; an empty one changes nothing.
class ActivationScope
{
public:
    explicit ActivationScope(const UniqueActivationContext& context) noexcept
        : m_active(context && ActivateActCtx(context.Get(), &m_cookie) != FALSE)
    {
    }
    ActivationScope(const ActivationScope&) = delete;
    ActivationScope& operator=(const ActivationScope&) = delete;
    ~ActivationScope()
    {
        if (m_active)
        {
            DeactivateActCtx(0, m_cookie);
        }
    }

private:
    ULONG_PTR m_cookie = 0;
    bool m_active;
};
