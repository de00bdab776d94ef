#pragma once

#include "OrvixExport.h"

#include <cstdint>
#include <string>

class IOrvixProvider;
class OrvixClientInfo;
class OrvixFileListDialogParams;

/// The library's service object: providers by index, prompts with stored answers, and source-control
/// operations on many files.
///
/// Implemented by: library. Obtained from `GetIOrvixServices`, then `Initialize` once, then any other
/// operation, then `Shutdown`, then `ReleaseIOrvixServices`. Every operation belongs to the host's
/// user-interface thread. Provider indexes run from 0 in order of discovery, plug-ins first; an index not
/// below `GetProviderCount()` gives null, 0 or false. `a`, `b` and `c` are handed to the user-interface
/// library unchanged. When memory is exhausted an operation gives its failure value; only a COM error
/// raised while an XML file is read or written (`_com_error`) leaves `Initialize`, `Shutdown` and
/// `EditPrompts` as an exception.
class IOrvixServices
{
public:
    /// Reads "OrvixProviders.xml" and "OrvixPrompts.xml" from the client's configuration folder and finds
    /// providers: `sources` bit 0x1 plug-ins in the client's plug-in folder, bit 0x2 installed MSSCCI
    /// libraries. `info` lives only for the call; its client access is kept, not owned. True when a plug-in
    /// was added or the registry of MSSCCI libraries could be read. The object is initialised in either case,
    /// save when `info` is null or memory runs out before the configuration folder is known: false, nothing
    /// done. Not idempotent: a second call adds every provider again. [library, main-thread]
    virtual bool Initialize(OrvixClientInfo* info, std::uint32_t sources) = 0;

    /// Saves the stored answers (a failure to save is ignored) and releases every provider. The
    /// user-interface library stays until the object is destroyed. [library, main-thread]
    virtual void Shutdown() = 0;

    /// Number of providers found; 0 before `Initialize` and after `Shutdown`. [library, main-thread]
    virtual std::uint32_t GetProviderCount() = 0;

    /// The provider's name, owned by the services object, valid until `Shutdown`. [library, main-thread]
    virtual const wchar_t* GetProviderName(std::uint32_t index) = 0;

    /// The provider. A plug-in is asked afresh on every call and keeps its object; the object of an MSSCCI
    /// library is the services object's. Valid until `Shutdown` at the latest. [library, main-thread]
    virtual IOrvixProvider* GetProvider(std::uint32_t index) = 0;

    /// Asks a question, or answers it from the stored answer of `promptID` (0xFFFFFFFF: none stored). Returns
    /// 1, 0, 2 or 3. `options` go to the dialog; with bit 0x100 it offers to stop asking, and the answer is
    /// stored when the user takes that offer. `dontAskAgain` may be null; it receives whether the user is not
    /// asked any more. [library, main-thread]
    virtual std::int32_t ShowPrompt(void* a, void* b, void* c, std::uint32_t options, std::uint32_t promptID,
                                    bool* dontAskAgain) = 0;

    /// Shows the file-list dialog and returns its result unchanged. `params` is the host's.
    /// [library, main-thread]
    virtual std::int32_t ShowFileListDialog(void* a, OrvixFileListDialogParams* params) = 0;

    /// Runs source-control operations on the active entries of the record's file list: asks the provider for
    /// their state when `callProviderFirst` is set, drops those whose FlagsOut shares no bit with
    /// `flagsOutMask`, lets listeners veto, confirms by the stored answer or by the dialog, runs the provider
    /// and notifies. `operations`: 0x1 notify, 0x2 check in, 0x4 add, 0x8 get latest, 0x10 check out,
    /// 0x20 undo check-out. Returns 1 when it ran or there was nothing to do, 0 when it was cancelled, any
    /// other value as the dialog gave it; the provider's results are not reported. An exception of a
    /// listener, a provider or the dialog ends the operation with 0. A null record, a record without a list,
    /// and a null provider that would have to be called are cancelled at once. [library, main-thread]
    virtual std::int32_t RunFileListOperation(void* a, OrvixFileListDialogParams* params, bool callProviderFirst,
                                              IOrvixProvider* provider, std::uint32_t operations,
                                              std::uint32_t flagsOutMask) = 0;

    /// The action stored in the first row with this ID; 0 when there is none. Action bits: 0x1 ask, 0x2
    /// answer 1, 0x4 answer 0, 0x8 answer 2, 0x10 answer 3. [library, main-thread]
    virtual std::uint32_t GetPromptAction(std::uint32_t promptID) = 0;

    /// Stores an action in the last row with this ID; false when there is none or it is locked.
    /// [library, main-thread]
    virtual bool SetPromptAction(std::uint32_t promptID, std::uint32_t action) = 0;

    /// Adds a row, unlocked, or replaces the text of the last row with this ID and, with
    /// `overwriteSettings`, its options and action. `text` is copied; a null text adds nothing and leaves an
    /// existing text. Always true; nothing is saved. [library, main-thread]
    virtual bool RegisterPrompt(std::uint32_t promptID, const wchar_t* text, std::uint32_t action,
                                std::uint32_t actionOpts, bool overwriteSettings) = 0;

    /// Lets the user edit the stored answers and saves them when the dialog returns 1. Returns the dialog's
    /// result. [library, main-thread]
    virtual std::int32_t EditPrompts(void* a, void* b) = 0;

    /// The administrator's setting "FixedProjectRoot" for the provider, from "OrvixProviders.xml": the folder of
    /// its projects. The library hands it to the host and does not use it. Null for a provider without
    /// configuration, empty when the setting is absent. Valid until the process ends. [library, main-thread]
    virtual const wchar_t* GetProviderFixedProjectRoot(std::uint32_t index) = 0;

    /// The administrator's setting "AltProviderExecutable" for the provider: a program that the host may start for
    /// it. Everything else as for `GetProviderFixedProjectRoot`. [library, main-thread]
    virtual const wchar_t* GetProviderAltExecutable(std::uint32_t index) = 0;

    /// True when one of the provider's filters excludes the file. `filterName` may be null; it receives the
    /// name of the first such filter and is left alone otherwise. [library, main-thread]
    virtual bool IsFileExcludedByProvider(std::uint32_t index, const wchar_t* fileName, std::wstring* filterName) = 0;

    /// Use `ReleaseIOrvixServices`. Shuts down when initialised, and hands the user-interface library back.
    virtual ~IOrvixServices() = default;
};

extern "C" {
/// Makes a new, independent services object; null when memory is exhausted. Give it back with
/// `ReleaseIOrvixServices`. [library, main-thread]
ORVIX_API IOrvixServices* GetIOrvixServices();

/// Destroys a services object; null does nothing. [library, main-thread]
ORVIX_API void ReleaseIOrvixServices(IOrvixServices* services);
}
