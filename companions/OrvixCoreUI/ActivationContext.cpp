#include "ActivationContext.h"

#include "Module.h"

namespace
{

constexpr std::uintptr_t ManifestOfALibrary = 2;

HANDLE CreateContext()
{
    ACTCTXW request{};
    request.cbSize = sizeof request;
    request.dwFlags = ACTCTX_FLAG_HMODULE_VALID | ACTCTX_FLAG_RESOURCE_NAME_VALID;
    request.hModule = ThisModule();
    request.lpResourceName = ResourceName(ManifestOfALibrary);
    return CreateActCtxW(&request);
}

} // namespace

ActivationContext::ActivationContext()
    : m_context(CreateContext()),
      m_active(m_context != INVALID_HANDLE_VALUE && (ActivateActCtx(m_context, &m_cookie) != 0))
{
}

ActivationContext::~ActivationContext()
{
    if (m_active)
    {
        DeactivateActCtx(0, m_cookie);
    }
    if (m_context != INVALID_HANDLE_VALUE)
    {
        ReleaseActCtx(m_context);
    }
}
