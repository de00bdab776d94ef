#pragma once

#include "DoctorReport.h"
#include "LoadAnnouncer.h"

#include <chrono>
#include <functional>
#include <optional>
#include <string>
#include <vector>

/// The examinations for which a library is loaded. Each runs in a child process, some at the same time: a library that
/// crashes, hangs or ends its process is a finding about this library and harms no other.
class CandidateExams
{
public:
    /// What a child found out besides its findings. All but the path is about a plug-in.
    struct About
    {
        std::optional<std::wstring> name;
        bool listed = false;
        std::optional<std::int32_t> contractVersion;
        std::optional<std::wstring> library; ///< path of an MSSCCI library that was loaded
        bool configured = false;             ///< a provider element applies to it
        bool switchedOff = false;            ///< and switches it off
    };

    /// `limit`: for each library. The arguments must outlive this object.
    CandidateExams(DoctorReport& report, const LoadAnnouncer& announcer, std::chrono::seconds limit)
        : m_report(report), m_announcer(announcer), m_limit(limit)
    {
    }

    /// Adds the last candidate of the report. `settings`: path of OrvixProviders.xml. `finish` is called when the
    /// child's findings are in the report.
    void AddPlugin(const std::wstring& settings,
                   std::function<void(DoctorReport::Candidate& candidate, const About& about)> finish);

    /// Adds the last candidate of the report, an MSSCCI library. `searchPath`: the folder that is searched first; may
    /// be empty.
    void AddLibrary(const std::wstring& serverPath, const std::wstring& searchPath);

    /// Runs what was added. The findings come in the order of the candidates. Throws `ToolError` when no child can be
    /// started.
    void Run();

    /// Called in a child: examines what the arguments of `wmain` name. False when they name nothing.
    static bool RunAsChild(int count, wchar_t** arguments);

private:
    class Exam;

    struct Planned
    {
        std::size_t candidate; ///< index in the report
        std::wstring library;
        std::wstring arguments;
        std::function<void(DoctorReport::Candidate& candidate, const About& about)> finish; ///< may be empty
    };

    DoctorReport& m_report;
    const LoadAnnouncer& m_announcer;
    std::chrono::seconds m_limit;
    std::vector<Planned> m_planned;
};
