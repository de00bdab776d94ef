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
    const UniqueActivationContext context = MakeManifestContext(LibraryModule());
    for (; search.GetState() == PluginSearch::State::Found; search.Next())
    {
        ExaminePlugin(search.Path(), context);
    }
}

void PluginExaminer::ExaminePlugin(const std::wstring& path, const UniqueActivationContext& context)
{
    using Verdict = PluginCandidate::Verdict;

    DoctorReport::Candidate& candidate = m_report.candidates.emplace_back();
    candidate.kind = "plug-in";
    candidate.location = path;
    if (path.size() <= PluginSearch::MaxPath)
    {
        m_announcer.Announce(path);
        LoadFindings::AddHeaders(candidate, path);
    }
    const PluginCandidate judged = PluginCandidate::Judge(path, context, m_settings.Configs());
    candidate.listed = judged.verdict == Verdict::Listed;
    candidate.contractVersion = judged.version;
    if (judged.entry && (candidate.listed || !judged.entry->name.empty()))
    {
        candidate.name = judged.entry->name;
    }
    AddVerdict(candidate, judged, context);
    for (const char* function : judged.FindMissingExports())
    {
        candidate.AddProblem("missing-export", L"it does not export " + Wide(function));
    }
    if (candidate.listed && judged.entry->name.empty())
    {
        candidate.AddProblem("empty-name", L"its name is empty or null");
    }
    m_settings.Explain(candidate, judged.entry ? judged.entry->config : nullptr,
                       judged.verdict == Verdict::SwitchedOff);
}

void PluginExaminer::AddVerdict(DoctorReport::Candidate& candidate, const PluginCandidate& judged,
                                const UniqueActivationContext& context)
{
    using Verdict = PluginCandidate::Verdict;

    switch (judged.verdict)
    {
    case Verdict::PathTooLong:
        candidate.AddProblem("path-too-long", L"its path has " + std::to_wstring(candidate.location.size()) +
                                                  L" characters, and the library takes at most " +
                                                  std::to_wstring(PluginSearch::MaxPath));
        break;
    case Verdict::DoesNotLoad:
        LoadFindings::AddLoadError(candidate, candidate.location, context, judged.loadError);
        break;
    case Verdict::OtherVersion:
        candidate.AddProblem("contract-version", L"it is made for version " + std::to_wstring(*judged.version) +
                                                     L" of the contract, the library for " +
                                                     std::to_wstring(ORVIX_PLUGIN_CONTRACT_VERSION));
        break;
    case Verdict::Throws:
        candidate.AddProblem("throws", L"it throws an exception when it is asked for its version or its name");
        break;
    case Verdict::Incomplete:
    case Verdict::SwitchedOff:
    case Verdict::Listed:
        break;
    }
}
