#pragma once

#include <windows.h>

#include <cstddef>
#include <string>

/// The file of the manifest that is active on this thread; empty when none is.
inline std::wstring ActiveManifest()
{
    alignas(ACTIVATION_CONTEXT_DETAILED_INFORMATION) std::byte buffer[4096];
    SIZE_T written = 0;
    if (!QueryActCtxW(QUERY_ACTCTX_FLAG_USE_ACTIVE_ACTCTX, nullptr, nullptr, ActivationContextDetailedInformation,
                      buffer, sizeof buffer, &written))
    {
        return {};
    }
    const auto* context = reinterpret_cast<const ACTIVATION_CONTEXT_DETAILED_INFORMATION*>(buffer);
    return context->lpRootManifestPath != nullptr ? context->lpRootManifestPath : L"";
}
