#pragma once

#include "DoctorReport.h"
#include "FileDiagnostics.h"
#include "OrvixProviderConfig.h"
#include "OrvixProviderConfigManager.h"
#include "XmlOutline.h"

#include <map>
#include <optional>
#include <set>
#include <string>

/// Reads OrvixProviders.xml, and explains which of its provider elements applies to a candidate.
class SettingsExaminer
{
public:
    /// Reads the file of this path; called once. Returns what in it the library ignores.
    DoctorReport::Subject Examine(const std::wstring& path);

    /// Why the library reads nothing of the file of this path, although it is there; empty when it reads it.
    static std::wstring WhyUnread(const std::wstring& path);

    /// Of the file that was read.
    const std::wstring& Path() const { return m_path; }

    const OrvixProviderConfigManager& Configs() const { return m_configs; }

    /// Adds to the candidate which provider element applies to it, and which others would. `config` is the one that
    /// applies; null for none. `switchedOff`: it switches the candidate off.
    void Explain(DoctorReport::Candidate& candidate, const OrvixProviderConfig* config, bool switchedOff);

    /// Adds the provider elements that apply to no candidate. Called after all candidates were explained.
    void FindUnused(DoctorReport::Subject& file) const;

private:
    /// The provider element as messages name it.
    std::wstring ElementOf(const OrvixProviderConfig* config) const;

    std::wstring m_path;
    OrvixProviderConfigManager m_configs;
    FileDiagnostics m_diagnostics;
    std::optional<XmlElement> m_outline; // of a file that is read
    std::set<const OrvixProviderConfig*> m_used;
    std::map<const OrvixProviderConfig*, const OrvixProviderConfig*> m_hiddenBy;
};
