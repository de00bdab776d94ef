#include "BraeSDKUtil.h"

#include "BraeDiagnostics.h"

namespace
{

HINSTANCE__* languagePackModule = nullptr;

} // namespace

void BraeSDK::Util::UseLanguagePackLocale(HINSTANCE__* module) noexcept
{
    languagePackModule = module;
}

HINSTANCE__* BraeDiagnostics::LanguagePackModule() noexcept
{
    return languagePackModule;
}
