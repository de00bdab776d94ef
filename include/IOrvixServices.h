#pragma once

#include "OrvixExport.h"

#include <cstdint>
#include <string>

class IOrvixProvider;
class OrvixClientInfo;
class OrvixFileListDialogParams;

/// The library's service object: providers by index, prompts with stored answers, and source-control operations on many
/// files.
///
/// Implemented by: library. Call `GetIOrvixServices`, then `Initialize` once, then any other operation, then
/// `Shutdown`, then `ReleaseIOrvixServices`; `OrvixServicesPointer.h` has an owning pointer. Every operation belongs to
/// the host's user-interface thread.
///
/// Provider indexes run from 0 in order of discovery, plug-ins first; an index not below `GetProviderCount()` gives
/// null, 0 or false. `a`, `b` and `c` are handed to the user-interface library unchanged; docs/ui-contract.md says what
/// the reference library makes of them. When memory runs out an operation gives its failure value. Only a COM error
/// raised while an XML file is read or written (`_com_error`) leaves `Initialize`, `Shutdown` and `EditPrompts` as an
/// exception.
class IOrvixServices
{
public:
    /// Reads "OrvixProviders.xml" and "OrvixPrompts.xml" from the client's configuration folder and finds providers.
    ///
    /// `info` lives only for the call; its client access is kept, not owned. `sources` is a set of bits of
    /// `OrvixProviderSource`. True when a plug-in was added or the registry of MSSCCI libraries could be read. The
    /// object is initialised in either case, except when `info` is null or memory runs out before the configuration
    /// folder is known: false, and nothing is done. A second call adds every provider again. While another operation of
    /// the object runs foreign code (`RunFileListOperation`, a dialog, `Initialize`, `Shutdown`) and that code calls
    /// back: false, and nothing is done. [library, main-thread]
    virtual bool Initialize(OrvixClientInfo* info, std::uint32_t sources) = 0;

    /// Saves the stored answers (a failure to save is ignored) and releases every provider. The user-interface library
    /// stays until the object is destroyed. In a call-back of such an operation, this and `ReleaseIOrvixServices` are
    /// remembered and happen when the outermost operation returns. [library, main-thread]
    virtual void Shutdown() = 0;

    /// Number of providers found. [library, main-thread]
    virtual std::uint32_t GetProviderCount() = 0;

    /// The provider's name, owned by the services object, valid until `Shutdown`; null for an index out of range.
    /// [library, main-thread]
    virtual const wchar_t* GetProviderName(std::uint32_t index) = 0;

    /// The provider; null for an index out of range. A plug-in is asked anew on every call and owns the object. The
    /// object of an MSSCCI library belongs to the services object. Valid until `Shutdown` at the latest. [library,
    /// main-thread]
    virtual IOrvixProvider* GetProvider(std::uint32_t index) = 0;

    /// Asks a question, or answers it from the stored answer of `promptID` (`OrvixPromptID::None`: none is stored).
    ///
    /// `options` are bits of `OrvixPromptOption` for the dialog. With `OfferStopAsking` the dialog offers to stop
    /// asking; when the user takes the offer the answer is stored, unless the prompt is locked. `dontAskAgain` may be
    /// null; it receives whether the user is not asked any more. Returns an `OrvixPromptAnswer`. [library, main-thread]
    virtual std::int32_t ShowPrompt(void* a, void* b, void* c, std::uint32_t options, std::uint32_t promptID,
                                    bool* dontAskAgain) = 0;

    /// Shows the file-list dialog and returns its result (`OrvixDialogResult`) unchanged. `params` belongs to the host.
    /// [library, main-thread]
    virtual std::int32_t ShowFileListDialog(void* a, OrvixFileListDialogParams* params) = 0;

    /// Runs source-control operations on the active entries of the record's file list.
    ///
    /// The steps: the provider writes the state of the entries (when `callProviderFirst` is set); entries whose
    /// FlagsOut shares no bit with `flagsOutMask` (usually a bit of `OrvixFilePermission`) leave the active list;
    /// listeners may veto; the stored answer or the dialog confirms; the provider runs; listeners are told. No filter
    /// of the administrator is applied: see `IsFileExcludedByProvider`.
    ///
    /// `operations` is a set of bits of `OrvixOperation`. Returns an `OrvixOperationResult`, or another value that the
    /// dialog gave; the provider's results are not reported. An exception of a listener, the provider or the dialog
    /// ends the operation: cancelled. A null record, a record without a list, and a null provider that would have to be
    /// called are cancelled at once. [library, main-thread]
    virtual std::int32_t RunFileListOperation(void* a, OrvixFileListDialogParams* params, bool callProviderFirst,
                                              IOrvixProvider* provider, std::uint32_t operations,
                                              std::uint32_t flagsOutMask) = 0;

    /// The action stored in the first row with this ID, bits of `OrvixPromptAction`; 0 when there is none.
    /// [library, main-thread]
    virtual std::uint32_t GetPromptAction(std::uint32_t promptID) = 0;

    /// Stores an action, bits of `OrvixPromptAction`, in the last row with this ID; false when there is none or it is
    /// locked. Nothing is saved yet. [library, main-thread]
    virtual bool SetPromptAction(std::uint32_t promptID, std::uint32_t action) = 0;

    /// Adds an unlocked row, or replaces the text of the last row with this ID and, with `overwriteSettings`, its
    /// options and action.
    ///
    /// `text` is copied; a null text adds nothing and leaves an existing text. `action` has bits of
    /// `OrvixPromptAction`, `actionOpts` bits of `OrvixPromptOption`. Always true; nothing is saved yet. [library,
    /// main-thread]
    virtual bool RegisterPrompt(std::uint32_t promptID, const wchar_t* text, std::uint32_t action,
                                std::uint32_t actionOpts, bool overwriteSettings) = 0;

    /// Lets the user edit the stored answers, and saves them when the dialog returns
    /// `OrvixPromptEditorResult::Changed`. Returns the dialog's result. [library, main-thread]
    virtual std::int32_t EditPrompts(void* a, void* b) = 0;

    /// The provider's fixed project root from "OrvixProviders.xml": null without configuration, empty when the setting
    /// is absent. The host opens the project there. Valid until the process ends. [library, main-thread]
    virtual const wchar_t* GetProviderFixedProjectRoot(std::uint32_t index) = 0;

    /// The provider's alternative executable from "OrvixProviders.xml": null without configuration, empty when the
    /// setting is absent. Valid until the process ends. [library, main-thread]
    virtual const wchar_t* GetProviderAltExecutable(std::uint32_t index) = 0;

    /// True when one of the administrator's filters for the provider excludes the file. The host asks before it puts a
    /// file into a list; `RunFileListOperation` does not ask.
    ///
    /// `filterName` may be null; it receives the name of the first such filter and is left alone otherwise. It is the
    /// one standard-library type in these interfaces: host and library have to be built by one compiler with the same
    /// run-time configuration for this argument. A host built otherwise (a debug build, say) passes null.
    /// [library, main-thread]
    virtual bool IsFileExcludedByProvider(std::uint32_t index, const wchar_t* fileName, std::wstring* filterName) = 0;

    /// Called by `ReleaseIOrvixServices`. Shuts down when initialised, and releases the user-interface library.
    virtual ~IOrvixServices() = default;
};

extern "C" {
/// Makes a new, independent services object; null when memory runs out. Release it with `ReleaseIOrvixServices`.
/// [library, main-thread]
ORVIX_API IOrvixServices* GetIOrvixServices();

/// Destroys a services object; null does nothing. [library, main-thread]
ORVIX_API void ReleaseIOrvixServices(IOrvixServices* services);
}
