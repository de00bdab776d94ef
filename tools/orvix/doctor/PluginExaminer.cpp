#include "PluginExaminer.h"

#include "ActivationContext.h"
#include "FilePath.h"
#include "LibraryModule.h"
#include "LoadFindings.h"
#include "OrvixClientInfo.h"
#include "OrvixVersion.h"
#include "PluginSearch.h"
#include "Text.h"

void PluginExaminer::Examine(const std::wstring& folder)
{
    OrvixClientInfo client;
    client.SetProviderPluginPath((folder + L'\\').c_str());
    PluginSearch search(client);
    DoctorReport::Subject& location = m_report.locations.emplace_back("plug-in folder", folder);
    if (search.GetState() == PluginSearch::State::FolderTooLong)
    {
        location.AddProblem("path-too-long", L"the path is too long to be searched: with the search pattern it has "
                                             L"more than " +
                                                 std::to_wstring(PluginSearch::MaxPath) + L" characters");
    }
    else if (!IsFolder(folder))
    {
        location.AddProblem("no-folder", L"there is no such folder");
    }
    for (; search.GetState() == PluginSearch::State::Found; search.Next())
    {
        DoctorReport::Candidate& plugin = m_report.candidates.emplace_back();
        plugin.kind = "plug-in";
        plugin.location = search.Path();
        m_exams.AddPlugin(m_settings.Path(), [this](DoctorReport::Candidate& candidate, const auto& about) {
            candidate.name = about.name;
            candidate.listed = about.listed;
            candidate.contractVersion = about.contractVersion;
            const std::wstring name = about.name.value_or(L"");
            m_settings.Explain(candidate, about.configured ? m_settings.Configs().FindConfig(name.c_str()) : nullptr,
                               about.switchedOff);
        });
    }
}

CandidateExams::About PluginExaminer::ExaminePlugin(const std::wstring& path, const OrvixProviderConfigManager& configs,
                                                    void (*report)(const DoctorReport::Subject& findings))
{
    using Verdict = PluginCandidate::Verdict;

    DoctorReport::Subject headers;
    if (path.size() <= PluginSearch::MaxPath)
    {
        LoadFindings::AddHeaders(headers, path);
    }
    report(headers);
    const UniqueActivationContext context = MakeManifestContext(LibraryModule());
    const PluginCandidate judged = PluginCandidate::Judge(path, context, configs);
    CandidateExams::About about;
    about.listed = judged.verdict == Verdict::Listed;
    about.contractVersion = judged.version;
    about.configured = judged.entry && judged.entry->config != nullptr;
    about.switchedOff = judged.verdict == Verdict::SwitchedOff;
    if (judged.entry && (about.listed || !judged.entry->name.empty()))
    {
        about.name = judged.entry->name;
    }
    DoctorReport::Subject findings;
    AddVerdict(findings, judged, path, context);
    for (const char* function : judged.FindMissingExports())
    {
        findings.AddProblem("missing-export", L"it does not export " + Wide(function));
    }
    if (about.listed && judged.entry->name.empty())
    {
        findings.AddProblem("empty-name", L"its name is empty or null");
    }
    if (judged.verdict != Verdict::DoesNotLoad || judged.loadError != ERROR_MOD_NOT_FOUND)
    {
        LoadFindings::AddCurrentFolder(findings, path, context);
    }
    report(findings);
    return about;
}

void PluginExaminer::AddVerdict(DoctorReport::Subject& findings, const PluginCandidate& judged,
                                const std::wstring& path, const UniqueActivationContext& context)
{
    using Verdict = PluginCandidate::Verdict;

    switch (judged.verdict)
    {
    case Verdict::PathTooLong:
        findings.AddProblem("path-too-long", L"its path has " + std::to_wstring(path.size()) +
                                                 L" characters, and the library takes at most " +
                                                 std::to_wstring(PluginSearch::MaxPath));
        break;
    case Verdict::DoesNotLoad:
        LoadFindings::AddLoadError(findings, path, context, judged.loadError);
        break;
    case Verdict::OtherVersion:
        findings.AddProblem("contract-version", L"it is made for version " + std::to_wstring(*judged.version) +
                                                    L" of the contract, the library for " +
                                                    std::to_wstring(ORVIX_PLUGIN_CONTRACT_VERSION));
        break;
    case Verdict::Throws:
        findings.AddProblem("throws", L"it throws an exception when it is asked for its version or its name");
        break;
    case Verdict::Incomplete:
    case Verdict::SwitchedOff:
    case Verdict::Listed:
        break;
    }
}
