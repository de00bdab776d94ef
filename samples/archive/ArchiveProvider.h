#pragma once

#include "ArchiveReport.h"
#include "ArchiveStore.h"
#include "IOrvixProvider.h"

#include <string>
#include <vector>

class IOrvixClientAccess;

/// The archive as a provider of OrvixCore: translates file lists, option bits and results, and shows everything
/// that it has to say through the client's `OutputText`.
///
/// Where the contract leaves the choice: a second `Initialize` begins a new session with the new client; a file
/// operation does what it can and fails when a file failed, with the reason on the output.
class ArchiveProvider final : public IOrvixProvider
{
public:
    static constexpr wchar_t Name[] = L"Archive";

    const wchar_t* GetName() override;
    int ReservedA() override;
    bool IsInitialized() override;
    bool IsProjectOpen() override;

    /// Takes the client's user, or the user of the Windows session when it names none.
    int Initialize(OrvixClientInfo* info) override;
    int Uninitialize() override;

    /// The comment is not used: the archive has comments for versions only.
    int OpenProject(const wchar_t* localPath, const wchar_t* comment) override;
    int CloseProject() override;
    int ReservedB() override;
    int ReservedC() override;
    int CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int UndoCheckOut(OrvixFileList* list, unsigned long options) override;
    int GetLatest(OrvixFileList* list, unsigned long options) override;
    int ReservedD(void* argument, unsigned long* first, unsigned long* second) override;
    int ReservedE() override;
    int Add(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int ShowHistory(OrvixFileList* list) override;
    int ShowProperties(OrvixFileList* list) override;
    int QueryStatus(OrvixFileList* list, unsigned long options) override;
    int ReservedF() override;
    int ReservedG() override;
    int ShowOptions() override;
    int RunProviderClient() override;
    int ReservedH() override;
    bool ReservedI() override;

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
