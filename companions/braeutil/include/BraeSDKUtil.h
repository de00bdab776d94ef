#pragma once

#include "BraeExport.h"

struct HINSTANCE__;

/// Functions of the host that concern a whole module.
namespace BraeSDK::Util
{

/// Selects the language pack of the host's locale for the resources of `module`, a loaded library. The development
/// build has no language packs: it only stores the handle (see BraeDiagnostics.h). Does not throw.
BRAE_API void UseLanguagePackLocale(HINSTANCE__* module) noexcept;

} // namespace BraeSDK::Util
