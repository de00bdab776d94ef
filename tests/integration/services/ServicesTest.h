#pragma once

#include "FakeJournal.h"
#include "Files.h"
#include "OrvixClientInfo.h"
#include "OrvixPrompt.h"
#include "OrvixProviderSource.h"
#include "OrvixServicesPointer.h"
#include "TempFolder.h"

#include <gtest/gtest.h>
#include <windows.h>

#include <algorithm>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

namespace Action = OrvixPromptAction;

/// Bits of the sources that have no published name.
inline constexpr std::uint32_t OtherSources = ~(OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI);

/// A number as the prompt file has it: decimal and signed.
inline std::string InFile(std::uint32_t number)
{
    return std::to_string(static_cast<std::int32_t>(number));
}

/// A stored prompt with the texts that are in the file.
struct StoredPrompt
{
    std::string text = "text";
    std::string id = "1";
    std::string locked = "false";
    std::string options = "0";
    std::string action = "0";
};

/// The whole prompt file in the form that the library writes.
inline std::string PromptsXml(const std::vector<StoredPrompt>& prompts)
{
    std::string xml = R"(<?xml version="1.0" standalone="yes"?><OrvixPrompts version="1.0">)";
    for (const StoredPrompt& prompt : prompts)
    {
        xml += "<Prompt><Text>" + prompt.text + "</Text><ID>" + prompt.id + "</ID><Locked>" + prompt.locked +
               "</Locked><ActionOpts>" + prompt.options + "</ActionOpts><Action>" + prompt.action +
               "</Action></Prompt>";
    }
    return xml + "</OrvixPrompts>";
}

/// A services object with a configuration folder and a plug-in folder of its own, both empty.
class ServicesTest : public testing::Test
{
protected:
    ServicesTest()
    {
        m_info.SetConfigFilePath(m_config.Text().c_str());
        m_info.SetProviderPluginPath((m_plugins.Text() + L"\\").c_str());
        FakeJournal::Clear();
    }

    bool Initialize(std::uint32_t sources = OrvixProviderSource::Plugins)
    {
        return m_services->Initialize(&m_info, sources);
    }

    /// Copies a fake plug-in into the plug-in folder, under its own file name or another one.
    std::filesystem::path AddPlugin(const std::wstring& fake, const std::wstring& fileName = {})
    {
        std::filesystem::path target = m_plugins.Path() / (fileName.empty() ? fake + L".dll" : fileName);
        std::filesystem::copy_file(std::filesystem::path(ORVIX_FAKE_PLUGINS) / (fake + L".dll"), target);
        return target;
    }

    void WriteProviders(const std::string& providers) const
    {
        WriteBytes(m_config.Path() / L"OrvixProviders.xml",
                   "<?xml version=\"1.0\"?><OrvixProviders>" + providers + "</OrvixProviders>");
    }

    std::filesystem::path PromptsFile() const { return m_config.Path() / L"OrvixPrompts.xml"; }
    void WritePrompts(const std::vector<StoredPrompt>& prompts) const
    {
        WriteBytes(PromptsFile(), PromptsXml(prompts));
    }

    /// The prompt file without line ends, which the XML service chooses.
    std::string SavedPrompts() const
    {
        std::string xml = ReadBytes(PromptsFile());
        std::erase_if(xml, [](char c) { return c == '\r' || c == '\n'; });
        return xml;
    }

    std::vector<std::wstring> ProviderNames() const
    {
        std::vector<std::wstring> names;
        for (std::uint32_t i = 0; i < m_services->GetProviderCount(); ++i)
        {
            names.emplace_back(m_services->GetProviderName(i));
        }
        return names;
    }

    static bool IsLoaded(const std::filesystem::path& library) { return GetModuleHandleW(library.c_str()) != nullptr; }

    TempFolder m_config;
    TempFolder m_plugins;
    OrvixClientInfo m_info;
    OrvixServicesPointer m_services = MakeOrvixServices();
};

using Names = std::vector<std::wstring>;
