#pragma once

#include "BraeHeapOperators.h"

class OrvixClientInfo;
class OrvixFileList;

/// One version-control system, as the host uses it.
///
/// Implemented by: plug-in (derive from `OrvixProviderBase`; docs/plugin-contract.md is the guide), or by the library
/// for installed MSSCCI libraries. All operations are called on the host's user-interface thread and let no exception
/// out. Each returns an `OrvixProviderResult` unless it says otherwise.
///
/// File operations work on the active entries of the list. The list belongs to the host: a provider changes nothing in
/// it except each active entry's FlagsOut. An empty active list is a failure.
///
/// `options` are bits of `OrvixProviderOption`. `IOrvixServices::RunFileListOperation` passes none, `KeepCheckedOut` or
/// `GetLatest`, each without or with `NoDialog`, and the same bits to every operation that it calls. A host that calls
/// a provider itself may pass others: a provider ignores the bits that it does not know.
///
/// The reserved operations keep their slots; a provider returns what is listed with them.
class IOrvixProvider : public BraeHeapOperators
{
public:
    /// Makes the interface part of a provider; has no effect.
    IOrvixProvider() = default;
    IOrvixProvider(const IOrvixProvider&) = delete;
    IOrvixProvider& operator=(const IOrvixProvider&) = delete;
    /// Destroys the provider. Only the module that made it does so.
    virtual ~IOrvixProvider() = default;

    /// Display name, valid as long as the provider. [plug-in, main-thread]
    virtual const wchar_t* GetName() = 0;

    /// Reserved. Returns 0. [plug-in, main-thread]
    virtual int ReservedA() = 0;

    /// True after a successful `Initialize`, until `Uninitialize`. [plug-in, main-thread]
    virtual bool IsInitialized() = 0;

    /// True after a successful `OpenProject`, until `CloseProject` or `Uninitialize`. [plug-in, main-thread]
    virtual bool IsProjectOpen() = 0;

    /// Starts the provider for a client. `info` lives only for the call; its `IOrvixClientAccess` stays valid until
    /// `Uninitialize`. [plug-in, main-thread]
    virtual int Initialize(OrvixClientInfo* info) = 0;

    /// Ends the session; closes an open project. [plug-in, main-thread, initialized]
    virtual int Uninitialize() = 0;

    /// Opens (or creates) the project of a local folder. Both texts live only for the call.
    /// [plug-in, main-thread, initialized]
    virtual int OpenProject(const wchar_t* localPath, const wchar_t* comment) = 0;

    /// Closes the open project. [plug-in, main-thread, project-open]
    virtual int CloseProject() = 0;

    /// Reserved. Returns 0. [plug-in, main-thread]
    virtual int ReservedB() = 0;

    /// Reserved. Returns -2. [plug-in, main-thread]
    virtual int ReservedC() = 0;

    /// Stores new versions. With `KeepCheckedOut` the files stay checked out. [plug-in, main-thread, project-open]
    virtual int CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options) = 0;

    /// Checks files out. With `GetLatest` it gets the latest version first. [plug-in, main-thread, project-open]
    virtual int CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options) = 0;

    /// Ends the check-out and discards the changes. With `GetLatest` it gets the latest version afterwards.
    /// [plug-in, main-thread, project-open]
    virtual int UndoCheckOut(OrvixFileList* list, unsigned long options) = 0;

    /// Gets the latest version. [plug-in, main-thread, project-open]
    virtual int GetLatest(OrvixFileList* list, unsigned long options) = 0;

    /// Reserved. Stores 0 through both pointers and returns -2. [plug-in, main-thread]
    virtual int ReservedD(void* argument, unsigned long* first, unsigned long* second) = 0;

    /// Reserved. Returns -2. [plug-in, main-thread]
    virtual int ReservedE() = 0;

    /// Puts files under source control. With `KeepCheckedOut` they stay checked out. [plug-in, main-thread,
    /// project-open]
    virtual int Add(OrvixFileList* list, const wchar_t* comment, unsigned long options) = 0;

    /// Shows the history of the files. `OrvixProviderResult::ReloadFiles` means that a file on the disk changed.
    /// [plug-in, main-thread, project-open]
    virtual int ShowHistory(OrvixFileList* list) = 0;

    /// Shows the properties of the first active file. [plug-in, main-thread, project-open]
    virtual int ShowProperties(OrvixFileList* list) = 0;

    /// Writes every active entry's FlagsOut: bits of `OrvixFileState` and `OrvixFilePermission`. On failure it changes
    /// none. With no project open every entry gets `OrvixFileState::NotControlled` alone. `options` is 0 from the
    /// library. [plug-in, main-thread]
    virtual int QueryStatus(OrvixFileList* list, unsigned long options) = 0;

    /// Reserved. Returns -2. [plug-in, main-thread]
    virtual int ReservedF() = 0;

    /// Reserved. Returns -2. [plug-in, main-thread]
    virtual int ReservedG() = 0;

    /// Shows the provider's own options dialog. [plug-in, main-thread, initialized]
    virtual int ShowOptions() = 0;

    /// Starts the provider's own program. [plug-in, main-thread, initialized]
    virtual int RunProviderClient() = 0;

    /// Reserved. Returns -2. [plug-in, main-thread]
    virtual int ReservedH() = 0;

    /// Reserved. Returns true. [plug-in, main-thread]
    virtual bool ReservedI() = 0;
};
