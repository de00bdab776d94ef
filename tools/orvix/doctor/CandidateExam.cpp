#include "CandidateExam.h"

#include "ChildProcess.h"
#include "LibraryModule.h"
#include "OrvixProviderConfigManager.h"
#include "ParentLink.h"
#include "PluginExaminer.h"
#include "RegistrationExaminer.h"
#include "Text.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <memory>
#include <thread>

namespace
{

using Clock = std::chrono::steady_clock;
using Json = nlohmann::json;

constexpr wchar_t PluginArgument[] = L"--examine-plugin";   // PATH SETTINGS
constexpr wchar_t LibraryArgument[] = L"--examine-library"; // PATH SEARCHPATH
constexpr int NumArguments = 4;

// Words of the lines to the examining process.
constexpr std::string_view Found = "found"; // a finding
constexpr std::string_view Done = "done";   // the last line

constexpr std::chrono::milliseconds Poll(20); // between two looks at the children
constexpr std::size_t MaxChildren = 4;        // at the same time

/// How many libraries are examined at the same time.
std::size_t NumChildren()
{
    return std::clamp<std::size_t>(std::thread::hardware_concurrency(), 1, MaxChildren);
}

void SendFindings(const DoctorReport::Subject& subject)
{
    for (const DoctorReport::Finding& finding : subject.findings)
    {
        const Json line = {{"problem", finding.isProblem}, {"code", finding.code}, {"text", Utf8(finding.text)}};
        ParentLink::Send(Found, line.dump());
    }
}

void SendAbout(const CandidateExams::About& about)
{
    Json line = {{"listed", about.listed}, {"configured", about.configured}, {"switchedOff", about.switchedOff}};
    if (about.name)
    {
        line["name"] = Utf8(*about.name);
    }
    if (about.library)
    {
        line["library"] = Utf8(*about.library);
    }
    if (about.contractVersion)
    {
        line["contractVersion"] = *about.contractVersion;
    }
    ParentLink::Send(Done, line.dump());
}

CandidateExams::About ReadAbout(const std::string& text)
{
    const Json line = Json::parse(text);
    CandidateExams::About about{.name = std::nullopt,
                                .listed = line["listed"],
                                .contractVersion = std::nullopt,
                                .library = std::nullopt,
                                .configured = line["configured"],
                                .switchedOff = line["switchedOff"]};
    if (line.contains("name"))
    {
        about.name = Wide(line["name"].get<std::string>());
    }
    if (line.contains("library"))
    {
        about.library = Wide(line["library"].get<std::string>());
    }
    if (line.contains("contractVersion"))
    {
        about.contractVersion = line["contractVersion"].get<std::int32_t>();
    }
    return about;
}

} // namespace

/// One running child.
class CandidateExams::Exam
{
public:
    Exam(const Planned& planned, std::chrono::seconds limit)
        : m_limit(limit), m_child(planned.arguments, L"", ChildProcess::Streams::Shared)
    {
    }

    /// Takes what has arrived. True when the examination is over.
    bool Look()
    {
        const bool ended = m_child.Wait(std::chrono::milliseconds(0));
        m_text += m_child.Read();
        for (std::size_t end = 0; (end = m_text.find('\n')) != std::string::npos; m_text.erase(0, end + 1))
        {
            TakeLine(m_text.substr(0, end));
        }
        if (m_about)
        {
            return true;
        }
        if (ended)
        {
            m_findings.AddProblem("ends-process", Wide("it " + (m_crash.empty() ? DescribeProcessEnd(m_child.ExitCode())
                                                                                : "crashes in " + m_crash)) +
                                                      L" when it is loaded: every host that looks for providers ends");
        }
        else if (Clock::now() - m_start > m_limit)
        {
            m_findings.AddProblem("hangs", L"it does not return within " + std::to_wstring(m_limit.count()) +
                                               L" s when it is loaded: every host that looks for providers hangs");
        }
        else
        {
            return false;
        }
        m_about.emplace();
        return true;
    }

    const std::vector<DoctorReport::Finding>& Findings() const { return m_findings.findings; }
    const About& Result() const { return *m_about; }

private:
    void TakeLine(const std::string& line)
    {
        const std::string word = line.substr(0, line.find(' '));
        const std::string rest = line.size() > word.size() ? line.substr(word.size() + 1) : "";
        if (word == Found)
        {
            const Json finding = Json::parse(rest);
            m_findings.findings.push_back({.isProblem = finding["problem"],
                                           .code = finding["code"],
                                           .text = Wide(finding["text"].get<std::string>())});
        }
        else if (word == Done)
        {
            m_about = ReadAbout(rest);
        }
        else if (word == ParentLink::Crash)
        {
            m_crash = rest;
        }
    }

    std::chrono::seconds m_limit;
    ChildProcess m_child;
    Clock::time_point m_start = Clock::now();
    std::string m_text;  // a line that has not arrived in full
    std::string m_crash; // where
    DoctorReport::Subject m_findings;
    std::optional<About> m_about; // when the examination is over
};

void CandidateExams::AddPlugin(const std::wstring& settings,
                               std::function<void(DoctorReport::Candidate&, const About&)> finish)
{
    const std::wstring& path = m_report.candidates.back().location;
    m_planned.push_back({m_report.candidates.size() - 1, path,
                         PluginArgument + (L' ' + QuotedArgument(path)) + L' ' + QuotedArgument(settings),
                         std::move(finish)});
}

void CandidateExams::AddLibrary(const std::wstring& serverPath, const std::wstring& searchPath)
{
    m_planned.push_back({m_report.candidates.size() - 1,
                         serverPath,
                         LibraryArgument + (L' ' + QuotedArgument(serverPath)) + L' ' + QuotedArgument(searchPath),
                         {}});
}

void CandidateExams::Run()
{
    std::vector<std::unique_ptr<Exam>> exams(m_planned.size());
    std::vector<bool> over(m_planned.size());
    std::size_t next = 0;
    for (std::size_t running = 0; next < exams.size() || running > 0;)
    {
        for (; next < exams.size() && running < NumChildren(); ++next, ++running)
        {
            m_announcer.Announce(m_planned[next].library);
            exams[next] = std::make_unique<Exam>(m_planned[next], m_limit);
        }
        for (std::size_t i = 0; i < next; ++i)
        {
            if (!over[i] && exams[i]->Look())
            {
                over[i] = true;
                --running;
            }
        }
        std::this_thread::sleep_for(Poll);
    }
    for (std::size_t i = 0; i < exams.size(); ++i)
    {
        DoctorReport::Candidate& candidate = m_report.candidates[m_planned[i].candidate];
        candidate.findings.insert(candidate.findings.end(), exams[i]->Findings().begin(), exams[i]->Findings().end());
        candidate.library = exams[i]->Result().library;
        if (m_planned[i].finish)
        {
            m_planned[i].finish(candidate, exams[i]->Result());
        }
    }
}

bool CandidateExams::RunAsChild(int count, wchar_t** arguments)
{
    const std::wstring_view kind = count == NumArguments ? arguments[1] : L"";
    if (kind != PluginArgument && kind != LibraryArgument)
    {
        return false;
    }
    RememberLibraryModule(GetModuleHandleW(L"OrvixCore.dll")); // the library gets the manifest of this module
    if (kind == PluginArgument)
    {
        OrvixProviderConfigManager configs;
        configs.LoadConfig(arguments[3]);
        SendAbout(PluginExaminer::ExaminePlugin(arguments[2], configs, SendFindings));
    }
    else
    {
        SendAbout(RegistrationExaminer::ExamineLibrary(arguments[2], arguments[3], SendFindings));
    }
    return true;
}
