#pragma once

#include "DoctorReport.h"
#include "LoadAnnouncer.h"
#include "PluginCandidate.h"
#include "SettingsExaminer.h"

#include <string>

/// Examines the plug-in folder.
class PluginExaminer
{
public:
    /// Adds to the report. The arguments must outlive this object.
    PluginExaminer(DoctorReport& report, SettingsExaminer& settings, const LoadAnnouncer& announcer)
        : m_report(report), m_settings(settings), m_announcer(announcer)
    {
    }

    /// Examines the folder of this full path and each file in it that may be a plug-in.
    void Examine(const std::wstring& folder);

private:
    void ExaminePlugin(const std::wstring& path, const UniqueActivationContext& context);
    static void AddVerdict(DoctorReport::Candidate& candidate, const PluginCandidate& judged,
                           const UniqueActivationContext& context);

    DoctorReport& m_report;
    SettingsExaminer& m_settings;
    const LoadAnnouncer& m_announcer;
};
