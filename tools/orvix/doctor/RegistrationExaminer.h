#pragma once

#include "CandidateExam.h"
#include "DoctorReport.h"
#include "InstalledProviders.h"
#include "SettingsExaminer.h"

#include <set>
#include <string>

/// Examines the registry's list of MSSCCI libraries.
class RegistrationExaminer
{
public:
    /// Adds to the report, and to the examinations what is to be loaded. The arguments must outlive this object.
    RegistrationExaminer(DoctorReport& report, SettingsExaminer& settings, CandidateExams& exams)
        : m_report(report), m_settings(settings), m_exams(exams)
    {
    }

    /// Examines the list of 64-bit processes, and what only the list of 32-bit processes has. Called once.
    void Examine();

    /// Called in a child: loads the library as hosts do on first use. Both arguments as `CandidateExams::AddLibrary`
    /// takes them. `report` is called with new findings before the library is loaded and afterwards.
    static CandidateExams::About ExamineLibrary(const std::wstring& serverPath, const std::wstring& searchPath,
                                                void (*report)(const DoctorReport::Subject& findings));

private:
    void ExamineList();
    void Examine32BitList();
    void ExamineValue(HKEY list, DWORD index, InstalledProviders::Step step, const std::wstring& keyPath);
    void ExamineKey(DoctorReport::Candidate& candidate, const std::wstring& keyPath);
    void Add32BitCandidate(const std::wstring& keyPath);

    /// Whether a registered library of this name is listed.
    bool IsListed(const std::wstring& name) const;

    DoctorReport& m_report;
    SettingsExaminer& m_settings;
    CandidateExams& m_exams;
    std::set<std::wstring> m_keyPaths; // of the list of 64-bit processes, see `PathKey`
};
