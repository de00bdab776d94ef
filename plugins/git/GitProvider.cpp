#include "GitProvider.h"

#include "GitFailure.h"
#include "GitProgram.h"
#include "GitText.h"
#include "IOrvixClientAccess.h"
#include "OrvixClientInfo.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixProviderOption.h"
#include "OrvixProviderSettings.h"
#include "OrvixWaitingWindow.h"

#include <exception>
#include <filesystem>

namespace
{

using OrvixProviderResult::Failure;
using OrvixProviderResult::Success;

std::wstring Text(const wchar_t* text)
{
    return text != nullptr ? text : L"";
}

/// The flags of `QueryStatus` for a file of an open project.
unsigned long FlagsOf(const GitFileState& state)
{
    if (!state.isControlled)
    {
        return OrvixFileState::NotControlled | (state.canAdd ? OrvixFilePermission::Add : 0);
    }
    unsigned long flags =
        OrvixFileState::Controlled | OrvixFilePermission::GetLatest | OrvixFilePermission::ShowHistory;
    const auto setWhen = [&flags](bool condition, unsigned long bits) { flags |= condition ? bits : 0; };
    const bool isOurs = state.isCheckedOut && !state.isLockedByOther;
    setWhen(state.isCheckedOut, OrvixFileState::CheckedOut);
    setWhen(isOurs, OrvixFilePermission::UndoCheckOut);
    setWhen(isOurs && !state.isConflicted, OrvixFilePermission::CheckIn); // Git takes no part of a merge
    setWhen(state.isLockedByOther, OrvixFileState::CheckedOutByOther);
    setWhen(state.isOutOfDate, OrvixFileState::OutOfDate);
    setWhen(state.isDeleted, OrvixFileState::Deleted);
    setWhen(state.isModified, OrvixFileState::Modified);
    setWhen(!state.isCheckedOut && !state.isLockedByOther && !state.isOutOfDate, OrvixFilePermission::CheckOut);
    setWhen(state.isCheckedOut || state.isModified, OrvixFilePermission::Compare);
    return flags;
}

} // namespace

/// Runs an operation with a waiting window, and lets no exception out. Shows the lines that `work` returns, or the
/// reason of its failure, when the window is closed.
template <typename Work>
int GitProvider::Run(Work work)
{
    if (m_busy)
    {
        return Failure;
    }
    try
    {
        Lines lines;
        int result = Failure;
        m_busy = true;
        try
        {
            const bool unattended = m_clientAccess == nullptr || m_clientAccess->IsUnattended();
            OrvixWaitingWindow window(unattended ? nullptr : m_parent, Name, L"Cancel");
            m_runner.SetWindow(&window, unattended);
            lines = work();
            result = Success;
        }
        catch (const GitFailure& failure)
        {
            lines = failure.lines;
        }
        catch (const std::exception& e)
        {
            lines = {GitText::FromUtf8(e.what())};
        }
        catch (...)
        {
            lines.clear();
        }
        m_runner.SetWindow(nullptr, true);
        m_busy = false;
        Output(lines);
        return result;
    }
    catch (...)
    {
        return Failure;
    }
}

/// Runs an operation with the paths of the active entries. Without an active entry, and without a project, it fails.
template <typename Work>
int GitProvider::FileOperation(OrvixFileList* list, Work work)
{
    const unsigned int count = list != nullptr ? list->NumActiveEntries() : 0;
    if (count == 0 || !IsProjectOpen())
    {
        return Failure;
    }
    return Run([&] {
        Paths paths;
        paths.reserve(count);
        for (unsigned int i = 0; i < count; ++i)
        {
            paths.push_back(Text(list->GetActiveFileEntry(i)->GetFile()));
        }
        return work(paths);
    });
}

int GitProvider::Initialize(OrvixClientInfo* info)
{
    if (info == nullptr || m_busy)
    {
        return Failure;
    }
    Uninitialize();
    m_clientAccess = info->GetIOrvixClientAccess();
    m_parent = info->GetParentWindow();
    const int result = Run([&] {
        const OrvixProviderSettings settings(info->GetConfigFilePath(), Name);
        const std::wstring program = GitProgram::Find(settings.GetAltProviderExecutable());
        m_runner.SetUp(program);
        m_runner.SetFolder(std::filesystem::path(program).parent_path().wstring());
        GitProgram::CheckVersion(m_runner.RunOrThrow({.arguments = {L"version"}, .task = L"Starting Git"}));
        return Lines();
    });
    m_initialized = result == Success;
    if (!m_initialized)
    {
        m_clientAccess = nullptr;
    }
    return result;
}

int GitProvider::Uninitialize()
{
    if (!m_initialized || m_busy)
    {
        return Failure;
    }
    m_repository.Close();
    m_clientAccess = nullptr;
    m_parent = nullptr;
    m_initialized = false;
    return Success;
}

int GitProvider::OpenProject(const wchar_t* localPath, const wchar_t*)
{
    if (!m_initialized || localPath == nullptr)
    {
        return Failure;
    }
    return Run([&] {
        m_repository.Open(localPath);
        return Lines();
    });
}

int GitProvider::CloseProject()
{
    if (!IsProjectOpen() || m_busy)
    {
        return Failure;
    }
    m_repository.Close();
    return Success;
}

int GitProvider::CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return FileOperation(list, [&](const Paths& paths) {
        return m_repository.CheckIn(paths, Text(comment), (options & OrvixProviderOption::KeepCheckedOut) != 0);
    });
}

int GitProvider::CheckOut(OrvixFileList* list, const wchar_t*, unsigned long options)
{
    return FileOperation(list, [&](const Paths& paths) {
        if ((options & OrvixProviderOption::GetLatest) != 0)
        {
            m_repository.GetLatest(paths);
        }
        m_repository.CheckOut(paths);
        return Lines();
    });
}

int GitProvider::UndoCheckOut(OrvixFileList* list, unsigned long options)
{
    return FileOperation(list, [&](const Paths& paths) {
        m_repository.UndoCheckOut(paths);
        if ((options & OrvixProviderOption::GetLatest) != 0)
        {
            m_repository.GetLatest(paths);
        }
        return Lines();
    });
}

int GitProvider::GetLatest(OrvixFileList* list, unsigned long)
{
    return FileOperation(list, [&](const Paths& paths) {
        m_repository.GetLatest(paths);
        return Lines();
    });
}

int GitProvider::Add(OrvixFileList* list, const wchar_t*, unsigned long)
{
    return FileOperation(list, [&](const Paths& paths) {
        m_repository.Add(paths);
        return Lines();
    });
}

int GitProvider::ShowHistory(OrvixFileList* list)
{
    return FileOperation(list, [&](const Paths& paths) { return m_repository.History(paths); });
}

int GitProvider::ShowProperties(OrvixFileList* list)
{
    return FileOperation(list, [&](const Paths& paths) { return m_repository.Properties(paths.front()); });
}

int GitProvider::QueryStatus(OrvixFileList* list, unsigned long)
{
    if (!IsProjectOpen())
    {
        const unsigned int count = list != nullptr ? list->NumActiveEntries() : 0;
        for (unsigned int i = 0; i < count; ++i)
        {
            list->GetActiveFileEntry(i)->SetFlagsOut(OrvixFileState::NotControlled);
        }
        return count != 0 ? Success : Failure;
    }
    return FileOperation(list, [&](const Paths& paths) {
        const std::vector<GitFileState> states = m_repository.Status(paths);
        for (unsigned int i = 0; i < states.size(); ++i)
        {
            list->GetActiveFileEntry(i)->SetFlagsOut(FlagsOf(states[i]));
        }
        return Lines();
    });
}

int GitProvider::NameKnownFiles(const wchar_t* folder, OrvixKnownFileCallback callback, void* callerData)
{
    if (folder == nullptr || callback == nullptr || !IsProjectOpen())
    {
        return Failure;
    }
    return Run([&] {
        for (const std::wstring& file : m_repository.Files(folder))
        {
            callback(callerData, file.c_str());
        }
        return Lines();
    });
}

int GitProvider::RunProviderClient()
{
    if (!IsProjectOpen())
    {
        return Failure;
    }
    return Run([&] {
        m_repository.RunClient();
        return Lines();
    });
}

void GitProvider::Output(const Lines& lines)
{
    for (const std::wstring& line : lines)
    {
        if (m_clientAccess != nullptr)
        {
            m_clientAccess->OutputText(line.c_str(), 0);
        }
    }
}
