#pragma once

#include "IOrvixProvider.h"

#include <memory>

class IOrvixClientAccess;
class OrvixMSSCC;

/// An installed MSSCCI library as a provider: turns the active entries of a list into narrow paths, calls the bridge,
/// and turns its result into 0 (the library answered 0) or -1.
///
/// An operation fails with -1 before anything is sent: for a null or empty list, for a list of 2^31 files or more, for
/// a null path, when memory runs out, and for a path that the ANSI code page does not carry exactly, since it would
/// name another file. The host is told of the last two, and of a comment that loses characters or is too long, through
/// `OutputText`. A null comment counts as empty. An exception of the library or the host fails the operation.
///
/// `QueryStatus` does not fail for such a path: it leaves the file out of the call and writes
/// `OrvixFileState::NotControlled` alone. With no project open it converts nothing.
///
/// The library's text output goes to the client access of the last `Initialize` of any wrapper, until the last wrapper
/// that was initialised with that access is gone.
class OrvixProviderWrapper : public IOrvixProvider
{
public:
    OrvixProviderWrapper();
    OrvixProviderWrapper(const OrvixProviderWrapper&) = delete;
    OrvixProviderWrapper& operator=(const OrvixProviderWrapper&) = delete;
    ~OrvixProviderWrapper() override;

    /// Takes the bridge that every operation needs; called right after construction.
    void SetMSSCC(std::unique_ptr<OrvixMSSCC> bridge);

    const wchar_t* GetName() override;
    int ReservedA() override;
    bool IsInitialized() override;
    bool IsProjectOpen() override;
    int Initialize(OrvixClientInfo* info) override;
    int Uninitialize() override;
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
    friend class ClientAccessUsers;

    std::unique_ptr<OrvixMSSCC> m_bridge;
    IOrvixClientAccess* m_clientAccess = nullptr;  ///< of the last `Initialize`
    OrvixProviderWrapper* m_nextWrapper = nullptr; ///< in the list of all wrappers
};
