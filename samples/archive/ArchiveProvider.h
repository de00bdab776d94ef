#pragma once

#include "ArchiveReport.h"
#include "ArchiveStore.h"
#include "OrvixKnownFiles.h"
#include "OrvixProviderBase.h"

#include <string>
#include <vector>

class IOrvixClientAccess;

/// The archive as a provider of OrvixCore. It translates file lists, option bits and results, and shows its messages
/// through the client's `OutputText`. What it does not override, the base class answers as "not offered".
///
/// Where the contract leaves a choice: a second `Initialize` starts a new session with the new client. A file operation
/// goes on after a file that fails; it then returns a failure and shows the reason.
class ArchiveProvider final : public OrvixProviderBase
{
public:
    static constexpr wchar_t Name[] = L"Archive";

    const wchar_t* GetName() override { return Name; }
    bool IsInitialized() override { return m_initialized; }
    bool IsProjectOpen() override { return m_store.IsOpen(); }

    /// The user is the one that the client names, otherwise the user of the Windows session.
    int Initialize(OrvixClientInfo* info) override;
    int Uninitialize() override;

    /// The comment is not used: only versions have comments in the archive.
    int OpenProject(const wchar_t* localPath, const wchar_t* comment) override;
    int CloseProject() override;

    int CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int UndoCheckOut(OrvixFileList* list, unsigned long options) override;
    int GetLatest(OrvixFileList* list, unsigned long options) override;
    int Add(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int ShowHistory(OrvixFileList* list) override;
    int ShowProperties(OrvixFileList* list) override;

    /// The archive's own files are not controlled and, unlike others, cannot be added.
    int QueryStatus(OrvixFileList* list, unsigned long options) override;

    /// Names the files of a folder, see `OrvixKnownFilesFunction`.
    int NameKnownFiles(const wchar_t* folder, OrvixKnownFileCallback callback, void* callerData);

private:
    using Paths = std::vector<std::wstring>;

    template <typename Work>
    int FileOperation(OrvixFileList* list, Work work);
    int Report(const ArchiveFailures& failures);
    void Output(const ArchiveReport::Lines& lines);

    ArchiveStore m_store;
    std::wstring m_user;
    IOrvixClientAccess* m_clientAccess = nullptr;
    bool m_initialized = false;
};
