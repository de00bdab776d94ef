#include "ActivationContext.h"

UniqueActivationContext MakeManifestContext(HMODULE module) noexcept
{
    ACTCTXW description = {};
    description.cbSize = sizeof(description);
    description.dwFlags = ACTCTX_FLAG_HMODULE_VALID | ACTCTX_FLAG_RESOURCE_NAME_VALID;
    description.hModule = module;
    description.lpResourceName = ISOLATIONAWARE_MANIFEST_RESOURCE_ID;
    return UniqueActivationContext(CreateActCtxW(&description));
}
