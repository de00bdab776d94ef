#pragma once

#include "CommandLine.h"
#include "DoctorReport.h"
#include "InstalledProviders.h"
#include "IsolatedLoad.h"
#include "OrvixProviderConfigManager.h"
#include "Output.h"
#include "FileDiagnostics.h"

#include <map>
#include <set>
#include <string>

/// Says of everything that could be a provider whether the library lists it and why, and of both XML files what in them
/// has no effect. It judges with the library's own code: plug-ins are loaded and asked for their version and name.
/// MSSCCI libraries are loaded as on first use, and none of their functions is called.
class Doctor
{
public:
    /// What is being examined goes to `output`. The arguments must outlive this object.
    Doctor(const CommandLine& commandLine, Output& output);

    /// Looks at everything; called once. Throws `ToolError` with `ExitCode::NoProject` when there is no configuration
    /// folder to look at by default, and `_com_error` when memory is exhausted.
    DoctorReport Examine();

private:
    void ReadSettings(const std::wstring& folder);
    void ReadPrompts(const std::wstring& folder);
    void ExaminePlugins();
    void ExaminePlugin(const std::wstring& path, const UniqueActivationContext& context);
    void ExamineInstalled();
    void ExamineRegistration(HKEY list, DWORD index, InstalledProviders::Step step, const std::wstring& keyPath);
    void ExamineKey(DoctorReport::Candidate& candidate, const std::wstring& keyPath);
    void ExamineLibrary(DoctorReport::Candidate& candidate, const InstalledProviders::Candidate& judged);
    void Examine32BitView();

    /// Whether a registered library of this name is listed.
    bool IsInstalled(const std::wstring& name) const;

    void ExplainConfiguration(DoctorReport::Candidate& candidate, const OrvixProviderConfig* config, bool switchedOff);
    void FindUnusedSettings();

    void Announce(const std::wstring& library);
    std::wstring SettingsElement(const OrvixProviderConfig* config) const;

    const CommandLine& m_commandLine;
    Output& m_output;
    DoctorReport m_report;
    OrvixProviderConfigManager m_configs;
    FileDiagnostics m_settings;
    std::set<const OrvixProviderConfig*> m_used;
    std::map<const OrvixProviderConfig*, const OrvixProviderConfig*> m_hiddenBy;
    std::set<std::wstring> m_keyPaths; // of the 64-bit list, as `PathKey` gives them
};
