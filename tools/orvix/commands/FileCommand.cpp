#include "FileCommand.h"

#include "FileMark.h"
#include "FilePath.h"
#include "FileStateText.h"
#include "KnownFiles.h"
#include "OrvixFileFlags.h"
#include "OrvixProviderResult.h"
#include "ParentLink.h"

#include <iostream>
#include <new>
#include <numeric>

namespace
{

/// In the order of the results.
constexpr struct
{
    const char* key; ///< in the summary of the JSON output
    const char* words;
    Listing::Tone tone;
} ResultTexts[] = {
    {"done", "done", Listing::Tone::Good},      {"notTicked", "cleared", Listing::Tone::Quiet},
    {"refused", "refused", Listing::Tone::Bad}, {"cancelled", "cancelled", Listing::Tone::Bad},
    {"failed", "failed", Listing::Tone::Bad},
};

Listing::State StateOf(OrvixFileEntry& entry)
{
    const bool exists = PathExists(entry.GetFile());
    const std::vector<const char*> words = FileStateText::Keys(entry.GetFlagsOut(), exists);
    return {{words.begin(), words.end()}, FileStateText::InWords(entry.GetFlagsOut(), exists)};
}

/// Whether a folder is another one or is below it.
bool IsInFolder(const std::wstring& outer, const std::wstring& folder)
{
    return PathKey(folder) == PathKey(outer) || PathBelow(outer, folder).size() < folder.size();
}

} // namespace

FileCommand::FileCommand(ProjectSession& project, const CommandLine& commandLine, Output& output,
                         ResultColumn resultColumn, Missing missing)
    : m_project(project), m_commandLine(commandLine), m_output(output), m_collector(output),
      m_listing{.key = "files", .columns = {{"state", "State"}, {"file", "File"}}, .rows = {}, .summary = {}},
      m_showsResults(resultColumn == ResultColumn::Shown)
{
    if (m_showsResults)
    {
        m_listing.columns.insert(m_listing.columns.begin(), {"result", "Result"});
    }
    for (const std::wstring& path : commandLine.paths)
    {
        m_collector.Add(path);
    }
    for (const std::wstring& folder : m_collector.NamedFolders())
    {
        if (missing == Missing::Listed && IsInFolder(project.Folder(), folder))
        {
            AddMissingFiles(folder);
        }
    }
    for (std::size_t i = 0; i < m_collector.Files().size(); ++i)
    {
        AddFile(i);
    }
}

void FileCommand::AddMissingFiles(const std::wstring& folder)
{
    m_output.Progress(L"looking for missing files");
    KnownFiles files(folder);
    const int result = m_project.NameKnownFiles(folder, KnownFiles::Take, &files);
    if (result != OrvixProviderResult::Success && result != OrvixProviderResult::NotOffered)
    {
        m_namesAllFiles = false;
        m_output.Progress({});
        std::cerr << "orvix: the provider does not name all its files in " << Printable(folder)
                  << ", so a missing one may be left out\n";
    }
    std::size_t looked = 0;
    for (const auto& [key, path] : files.Paths())
    {
        ParentLink::SendAliveAt(looked++);
        if (IsMissing(path))
        {
            m_collector.AddMissing(folder, path);
        }
    }
}

void FileCommand::AddFile(std::size_t index)
{
    const FileCollector::File& file = m_collector.Files()[index];
    std::wstring filter;
    const bool isExcluded = m_project.IsExcluded(file.path, filter);
    if (!isExcluded && !m_project.Takes(file.path))
    {
        Report(Refused, {{"unknown"}, L"its name has characters that the provider's code page lacks"}, file.path);
    }
    else if (!isExcluded)
    {
        const auto clientPtr = static_cast<long long>(index);
        if (m_list.CreateEntry(file.path.c_str(), nullptr, FileMark::Chosen, clientPtr) == nullptr)
        {
            throw std::bad_alloc();
        }
    }
    else if (file.named)
    {
        Report(Refused, {{"excluded"}, L"excluded by filter " + filter}, file.path);
    }
    else
    {
        ++m_excluded;
    }
}

ExitCode FileCommand::Run()
{
    if (m_list.NumEntries() > 0)
    {
        RunOnFiles();
    }
    m_listing.summary = Summary();
    m_output.Show(m_listing);

    const unsigned int bad = m_counts[Refused] + m_counts[Cancelled] + m_counts[Failed];
    return m_collector.ReportUnreadableFolders() || !m_namesAllFiles || bad > 0 ? ExitCode::Failed : ExitCode::Success;
}

void FileCommand::QueryStatus(unsigned long mark)
{
    m_list.BuildActiveList(mark, false);
    if (m_list.NumActiveEntries() == 0)
    {
        return;
    }
    m_output.Progress(L"asking for the state, files: " + std::to_wstring(m_list.NumActiveEntries()));
    m_project.Provider().QueryStatus(&m_list, 0);
    RequireStatus();
}

void FileCommand::RequireStatus()
{
    if (!m_project.Provider().KnowsStatus())
    {
        throw ToolError(ExitCode::Failed, L"the provider does not tell the state of the files");
    }
}

bool FileCommand::IsNamed(OrvixFileEntry& entry) const
{
    return m_collector.Files()[static_cast<std::size_t>(entry.GetClientPtr())].named;
}

void FileCommand::Report(Result result, OrvixFileEntry& entry)
{
    Report(result, StateOf(entry), entry.GetFile());
}

void FileCommand::Report(Result result, const Listing::State& state, const std::wstring& path)
{
    ++m_counts[result];
    const Listing::Tone tone = ResultTexts[result].tone;
    std::vector<Listing::Cell>& row = m_listing.rows.emplace_back();
    if (m_showsResults)
    {
        row.push_back({Wide(ResultTexts[result].words), tone});
    }
    row.push_back({state, result == Refused ? tone : Listing::Tone::Plain});
    row.push_back({PathBelow(m_project.Folder(), path)});
}

std::vector<Listing::Count> FileCommand::Summary() const
{
    const unsigned int total = std::accumulate(m_counts.begin(), m_counts.end(), 0U);
    std::vector<Listing::Count> counts = {{"files", total == 1 ? "file" : "files", total}};
    for (std::size_t result = 0; result < NumResults; ++result)
    {
        if (m_showsResults || result != Done)
        {
            counts.push_back({ResultTexts[result].key, ResultTexts[result].words, m_counts[result]});
        }
    }
    counts.push_back({"leftOutForState", "left out for their state", m_otherState});
    counts.push_back({"leftOutForChanges", "left out for your changes (--force gets them)", m_protected});
    counts.push_back({"leftOutByFilters", "left out by filters", m_excluded});
    counts.push_back(FileCollector::CountOfSkipped(NumForeignSkippedFolders()));
    return counts;
}

std::size_t FileCommand::NumForeignSkippedFolders() const
{
    OrvixFileList list;
    for (const std::wstring& folder : m_collector.SkippedFolders())
    {
        list.CreateEntry((folder + L"\\file").c_str(), nullptr, FileMark::Chosen, 0);
    }
    list.BuildActiveList(FileMark::Chosen, false);
    std::size_t number = m_collector.SkippedFolders().size();
    if (number > 0 && m_project.Provider().QueryStatus(&list, 0) == OrvixProviderResult::Success)
    {
        for (unsigned int i = 0; i < list.NumEntries(); ++i)
        {
            const unsigned long state = list.GetFileEntry(i)->GetFlagsOut();
            constexpr unsigned long AnyUse = OrvixFileState::Controlled | OrvixFilePermission::Add;
            number -= (state & AnyUse) == 0 ? 1 : 0;
        }
    }
    return number;
}
