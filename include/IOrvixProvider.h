#pragma once

#include "BraeHeapOperators.h"

class OrvixClientInfo;
class OrvixFileList;

/// One version-control system, as the host uses it.
///
/// Implemented by: plug-in (see docs/plugin-contract.md), or by the library for installed MSSCCI libraries.
/// File operations work on the active entries of the list, which is the host's; a provider changes nothing
/// of it but each active entry's FlagsOut. Results: 0 success, -1 failure, -2 not offered.
/// All operations are called on the host's user-interface thread and let no exception out.
///
/// The bits of `options`, where an operation has them:
///
/// | bit | meaning | in |
/// |---|---|---|
/// | 0x1 | keep the files checked out | `CheckIn`, `Add` |
/// | 0x2 | get the latest version too | `CheckOut` (first), `UndoCheckOut` (afterwards) |
/// | 0x4 | the stored answer confirmed it, no dialog was shown | all |
///
/// `IOrvixServices::RunFileListOperation` passes 0, 0x1, 0x2, 0x4, 0x5 or 0x6, the same to every operation that it
/// calls, and a host that calls a provider itself may pass others: a provider ignores the bits that it does not know.
///
/// The reserved operations keep their slots; a provider returns what is listed with them.
class IOrvixProvider : public BraeHeapOperators
{
public:
    IOrvixProvider() = default;
    IOrvixProvider(const IOrvixProvider&) = delete;
    IOrvixProvider& operator=(const IOrvixProvider&) = delete;
    virtual ~IOrvixProvider() = default;

    /// Display name, valid as long as the provider. [plug-in, main-thread]
    virtual const wchar_t* GetName() = 0;

    /// Reserved. Returns 0. [plug-in, main-thread]
    virtual int ReservedA() = 0;

    /// True after a successful `Initialize`, until `Uninitialize`. [plug-in, main-thread]
    virtual bool IsInitialized() = 0;

    /// True after a successful `OpenProject`, until `CloseProject` or `Uninitialize`. [plug-in, main-thread]
    virtual bool IsProjectOpen() = 0;

    /// Starts the provider for a client. `info` lives only for the call; the `IOrvixClientAccess` that it
    /// names stays valid until `Uninitialize`. [plug-in, main-thread]
    virtual int Initialize(OrvixClientInfo* info) = 0;

    /// Ends the session; closes an open project. [plug-in, main-thread, initialized]
    virtual int Uninitialize() = 0;

    /// Opens (or makes) the project of a local folder. Both texts live only for the call.
    /// [plug-in, main-thread, initialized]
    virtual int OpenProject(const wchar_t* localPath, const wchar_t* comment) = 0;

    /// Closes the open project. [plug-in, main-thread, project-open]
    virtual int CloseProject() = 0;

    /// Reserved. Returns 0. [plug-in, main-thread]
    virtual int ReservedB() = 0;

    /// Reserved. Returns -2. [plug-in, main-thread]
    virtual int ReservedC() = 0;

    /// Stores new versions. Bit 0x1 of `options`: keep the files checked out. An empty active list fails, as
    /// in every file operation. [plug-in, main-thread, project-open]
    virtual int CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options) = 0;

    /// Takes files for editing. Bit 0x2 of `options`: get the latest version first.
    /// [plug-in, main-thread, project-open]
    virtual int CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options) = 0;

    /// Gives checked-out files back unchanged. Bit 0x2 of `options`: get the latest version afterwards.
    /// [plug-in, main-thread, project-open]
    virtual int UndoCheckOut(OrvixFileList* list, unsigned long options) = 0;

    /// Brings the latest version. [plug-in, main-thread, project-open]
    virtual int GetLatest(OrvixFileList* list, unsigned long options) = 0;

    /// Reserved. Stores 0 through both pointers and returns -2. [plug-in, main-thread]
    virtual int ReservedD(void* argument, unsigned long* first, unsigned long* second) = 0;

    /// Reserved. Returns -2. [plug-in, main-thread]
    virtual int ReservedE() = 0;

    /// Puts files under control. Bit 0x1 of `options`: keep them checked out.
    /// [plug-in, main-thread, project-open]
    virtual int Add(OrvixFileList* list, const wchar_t* comment, unsigned long options) = 0;

    /// Shows the history of the files; 1 means that a file on disk changed and is to be reloaded.
    /// [plug-in, main-thread, project-open]
    virtual int ShowHistory(OrvixFileList* list) = 0;

    /// Shows the properties of the first active file. [plug-in, main-thread, project-open]
    virtual int ShowProperties(OrvixFileList* list) = 0;

    /// Writes every active entry's FlagsOut; on failure changes none. With no project open every entry gets
    /// 0x1. The bits:
    ///
    /// | bit | state | | bit | what the file allows |
    /// |---|---|---|---|---|
    /// | 0x1 | not controlled | | 0x10000 | check in (checked out by this user alone) |
    /// | 0x2 | controlled | | 0x20000 | check out (not checked out, not out of date) |
    /// | 0x4 | checked out by this user | | 0x40000 | undo check-out (as 0x10000) |
    /// | 0x8 | checked out by another user | | 0x80000 | compare (checked out or modified) |
    /// | 0x10 | out of date | | 0x100000 | add (not controlled, project open) |
    /// | 0x20 | deleted in the project | | 0x200000 | get latest (controlled) |
    /// | 0x80 | modified locally | | 0x400000 | history (controlled) |
    ///
    /// `options` is 0 from the library. [plug-in, main-thread]
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
