#pragma once

#include "CandidateExam.h"
#include "DoctorReport.h"
#include "PluginCandidate.h"
#include "SettingsExaminer.h"

#include <string>

/// Examines the plug-in folder.
class PluginExaminer
{
public:
    /// Adds to the report, and to the examinations what is to be loaded. The arguments must outlive this object.
    PluginExaminer(DoctorReport& report, SettingsExaminer& settings, CandidateExams& exams)
        : m_report(report), m_settings(settings), m_exams(exams)
    {
    }

    /// Examines the folder of this full path and plans an examination of each file in it that may be a plug-in.
    void Examine(const std::wstring& folder);

    /// Called in a child: loads the plug-in and asks for its version and its name. `report` is called with new findings
    /// before the plug-in is loaded and afterwards.
    static CandidateExams::About ExaminePlugin(const std::wstring& path, const OrvixProviderConfigManager& configs,
                                               void (*report)(const DoctorReport::Subject& findings));

private:
    static void AddVerdict(DoctorReport::Subject& findings, const PluginCandidate& judged, const std::wstring& path,
                           const UniqueActivationContext& context);

    DoctorReport& m_report;
    SettingsExaminer& m_settings;
    CandidateExams& m_exams;
};
