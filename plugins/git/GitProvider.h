#pragma once

#include "GitRepository.h"
#include "GitRunner.h"
#include "OrvixKnownFiles.h"
#include "OrvixProviderBase.h"

#include <string>
#include <vector>

class IOrvixClientAccess;

/// The user's own Git as a provider of OrvixCore. It translates file lists, option bits and results, and shows messages
/// through the client's `OutputText`; `GitRepository` does the work. While Git runs, a waiting window paints the host.
///
/// Where the contract leaves a choice: a second `Initialize` starts a new session with the new client. An operation
/// that the host calls while another one runs fails.
class GitProvider final : public OrvixProviderBase
{
public:
    static constexpr wchar_t Name[] = L"Git";

    const wchar_t* GetName() override { return Name; }
    bool IsInitialized() override { return m_initialized; }
    bool IsProjectOpen() override { return m_repository.IsOpen(); }

    /// Fails when there is no Git, or only one that is too old.
    int Initialize(OrvixClientInfo* info) override;
    int Uninitialize() override;

    /// The folder may be any one of the repository. The comment is not used.
    int OpenProject(const wchar_t* localPath, const wchar_t* comment) override;
    int CloseProject() override;

    int CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int UndoCheckOut(OrvixFileList* list, unsigned long options) override;

    /// Git moves the whole branch: the files outside of the list come along.
    int GetLatest(OrvixFileList* list, unsigned long options) override;

    /// Puts the files into the index. The commit is the check-in, so comment and options are not used.
    int Add(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int ShowHistory(OrvixFileList* list) override;
    int ShowProperties(OrvixFileList* list) override;
    int QueryStatus(OrvixFileList* list, unsigned long options) override;
    int RunProviderClient() override;

    /// Names the files of a folder, see `OrvixKnownFilesFunction`.
    int NameKnownFiles(const wchar_t* folder, OrvixKnownFileCallback callback, void* callerData);

private:
    using Paths = GitRepository::Paths;
    using Lines = GitRepository::Lines;

    template <typename Work>
    int Run(Work work);
    template <typename Work>
    int FileOperation(OrvixFileList* list, Work work);
    void Output(const Lines& lines);

    GitRunner m_runner;
    GitRepository m_repository{m_runner};
    IOrvixClientAccess* m_clientAccess = nullptr;
    struct HWND__* m_parent = nullptr;
    bool m_initialized = false;
    bool m_busy = false; ///< an operation runs, and the host calls another one
};
