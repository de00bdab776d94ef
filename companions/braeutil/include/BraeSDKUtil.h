#pragma once

#include "BraeExport.h"

struct HINSTANCE__;

namespace BraeSDK::Util
{

/// Selects the language pack of the host's locale for the resources of `module`. The development build has
/// no language packs: it only remembers the module (see BraeDiagnostics.h).
BRAE_API void UseLanguagePackLocale(HINSTANCE__* module) noexcept;

} // namespace BraeSDK::Util
