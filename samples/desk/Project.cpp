#include "Project.h"

#include "Failure.h"
#include "FolderTree.h"
#include "OrvixDialogOption.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixOperation.h"
#include "OrvixProviderResult.h"

#include <algorithm>
#include <filesystem>

namespace fs = std::filesystem;

namespace
{

constexpr std::size_t FilesPerQuery = 200; // between two steps of the progress

void AddActive(OrvixFileList& list, const FileRow& row)
{
    list.AddActiveEntry(list.CreateEntry(row.path.c_str(), nullptr, 0, 0));
}

/// Adds the files of a folder to `rows`, `name` before their names. False when the user has stopped the work.
bool AddFiles(const fs::path& folder, const std::wstring& name, bool deep, std::vector<FileRow>& rows,
              Progress& progress)
{
    std::error_code error;
    for (fs::directory_iterator item(folder, error), end; !error && item != end; item.increment(error))
    {
        const std::wstring path = item->path().wstring();
        const std::wstring itemName = name + item->path().filename().wstring();
        if (!progress.Step(0, 0))
        {
            return false;
        }
        if (IsHidden(path))
        {
            continue;
        }
        if (item->is_regular_file(error))
        {
            rows.push_back({path, itemName});
        }
        else if (deep && item->is_directory(error) && !AddFiles(item->path(), itemName + L'\\', deep, rows, progress))
        {
            return false;
        }
    }
    return true;
}

bool IsBefore(const FileRow& left, const FileRow& right)
{
    return CompareStringOrdinal(left.name.c_str(), -1, right.name.c_str(), -1, TRUE) == CSTR_LESS_THAN;
}

} // namespace

Project::Project(Library& library, std::uint32_t provider, const std::wstring& folder)
    : m_library(library), m_index(provider), m_provider(library.Services().GetProvider(provider)), m_folder(folder)
{
    const wchar_t* fixedRoot = library.Services().GetProviderFixedProjectRoot(provider);
    if (fixedRoot != nullptr && *fixedRoot != L'\0')
    {
        m_folder = fixedRoot;
    }
    std::error_code ignored;
    if (!fs::is_directory(m_folder, ignored))
    {
        throw Failure{L"There is no folder " + m_folder + L"."};
    }
    if (m_provider == nullptr || m_provider->Initialize(&library.Client()) != OrvixProviderResult::Success)
    {
        throw Failure{L"The provider " + ProviderName() + L" does not start."};
    }
    if (m_provider->OpenProject(m_folder.c_str(), L"") != OrvixProviderResult::Success)
    {
        m_provider->Uninitialize();
        throw Failure{L"The provider " + ProviderName() + L" cannot open the project " + m_folder + L"."};
    }
}

Project::~Project()
{
    m_provider->CloseProject();
    m_provider->Uninitialize();
}

std::vector<FileRow> Project::Files(const std::wstring& folder, bool deep, Progress& progress) const
{
    std::vector<FileRow> rows;
    const bool complete = AddFiles(folder, L"", deep, rows, progress);
    std::sort(rows.begin(), rows.end(), &IsBefore);
    for (FileRow& row : rows)
    {
        row.excluded = m_library.Services().IsFileExcludedByProvider(m_index, row.path.c_str(), nullptr);
    }
    if (complete)
    {
        QueryStates(rows, progress);
    }
    return rows;
}

void Project::QueryStates(std::vector<FileRow>& rows, Progress& progress) const
{
    for (std::size_t begin = 0; begin < rows.size(); begin += FilesPerQuery)
    {
        OrvixFileList list;
        const std::size_t end = std::min(begin + FilesPerQuery, rows.size());
        std::vector<FileRow*> asked;
        for (std::size_t i = begin; i < end; ++i)
        {
            if (!rows[i].excluded)
            {
                AddActive(list, rows[i]);
                asked.push_back(&rows[i]);
            }
        }
        if (list.NumActiveEntries() != asked.size() ||
            (!asked.empty() && m_provider->QueryStatus(&list, 0) != OrvixProviderResult::Success))
        {
            continue; // these states stay unknown
        }
        for (unsigned int i = 0; i < list.NumActiveEntries(); ++i)
        {
            asked[i]->flags = list.GetActiveFileEntry(i)->GetFlagsOut();
        }
        if (!progress.Step(end, rows.size()))
        {
            return;
        }
    }
}

bool Project::Run(const FileCommand& command, const std::vector<const FileRow*>& files, HWND owner) const
{
    OrvixFileList list;
    for (const FileRow* row : files)
    {
        AddActive(list, *row);
    }
    OrvixFileListDialogParams params;
    params.SetTitle(command.name);
    params.SetMessage(command.message);
    params.SetOrvixFileList(&list);
    params.SetOptions(command.dialogOption | OrvixDialogOption::OfferRemember |
                      OrvixDialogOption::ForOperation(command.operation));
    params.SetDialogPromptID(command.dialogPrompt);
    params.SetOptionPromptID(command.optionPrompt);
    return m_library.Services().RunFileListOperation(owner, &params, true, m_provider,
                                                     OrvixOperation::Notify | command.operation,
                                                     command.permission) != OrvixOperationResult::Cancelled;
}

bool Project::ShowHistory(const std::vector<const FileRow*>& files) const
{
    OrvixFileList list;
    for (const FileRow* row : files)
    {
        AddActive(list, *row);
    }
    const int result = m_provider->ShowHistory(&list);
    if (result < OrvixProviderResult::Success)
    {
        throw Failure{ProviderName() + L" cannot show the history."};
    }
    return result == OrvixProviderResult::ReloadFiles;
}

void Project::ShowProperties(const std::vector<const FileRow*>& files) const
{
    OrvixFileList list;
    if (!files.empty())
    {
        AddActive(list, *files.front());
    }
    if (m_provider->ShowProperties(&list) != OrvixProviderResult::Success)
    {
        throw Failure{ProviderName() + L" cannot show the properties."};
    }
}
