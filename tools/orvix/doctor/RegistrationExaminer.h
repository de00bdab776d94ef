#pragma once

#include "DoctorReport.h"
#include "InstalledProviders.h"
#include "LoadAnnouncer.h"
#include "SettingsExaminer.h"

#include <set>
#include <string>

/// Examines the registry's list of MSSCCI libraries.
class RegistrationExaminer
{
public:
    /// Adds to the report. The arguments must outlive this object.
    RegistrationExaminer(DoctorReport& report, SettingsExaminer& settings, const LoadAnnouncer& announcer)
        : m_report(report), m_settings(settings), m_announcer(announcer)
    {
    }

    /// Examines the list of 64-bit processes, and what only the list of 32-bit processes has. Called once.
    void Examine();

private:
    void ExamineList();
    void Examine32BitList();
    void ExamineValue(HKEY list, DWORD index, InstalledProviders::Step step, const std::wstring& keyPath);
    void ExamineKey(DoctorReport::Candidate& candidate, const std::wstring& keyPath);
    void ExamineLibrary(DoctorReport::Candidate& candidate, const InstalledProviders::Candidate& judged);
    void Add32BitCandidate(const std::wstring& keyPath);

    /// Whether a registered library of this name is listed.
    bool IsListed(const std::wstring& name) const;

    DoctorReport& m_report;
    SettingsExaminer& m_settings;
    const LoadAnnouncer& m_announcer;
    std::set<std::wstring> m_keyPaths; // of the list of 64-bit processes, see `PathKey`
};
