#include "OrvixProviderSettings.h"

#include "ExceptionBarrier.h"
#include "OrvixProviderConfig.h"
#include "OrvixProviderConfigManager.h"

#include <string>

OrvixProviderSettings::OrvixProviderSettings(const wchar_t* configFolder, const wchar_t* providerName) noexcept
{
    m_config = WithBarrier<const OrvixProviderConfig*>(nullptr, [&] {
        const std::wstring folder = configFolder != nullptr ? configFolder + std::wstring(L"\\") : L"";
        OrvixProviderConfigManager manager;
        manager.LoadConfig((folder + OrvixProviderConfigManager::FileName).c_str());
        return manager.FindConfig(providerName); // lives until the process ends
    });
}

bool OrvixProviderSettings::IsEnabled() const noexcept
{
    return m_config == nullptr || m_config->m_enabled;
}

const wchar_t* OrvixProviderSettings::GetFixedProjectRoot() const noexcept
{
    return m_config != nullptr ? m_config->m_fixedProjectRoot.c_str() : L"";
}

const wchar_t* OrvixProviderSettings::GetAltProviderExecutable() const noexcept
{
    return m_config != nullptr ? m_config->m_altProviderExecutable.c_str() : L"";
}

bool OrvixProviderSettings::IsFileExcluded(const wchar_t* path) const noexcept
{
    return m_config != nullptr && m_config->IsFileExcluded(path, nullptr);
}
