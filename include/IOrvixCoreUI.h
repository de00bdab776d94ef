#pragma once

#include <cstdint>

class IOrvixCoreUIClientAccess;
class OrvixFileListDialogParams;
class OrvixPromptTable;

/// The dialogs. The services object obtains this interface when it shows the first dialog and keeps it until it is
/// destroyed.
///
/// Implemented by: user-interface library (OrvixCoreUI.dll). The arguments `a`, `b` and `c` come from the host
/// unchanged; host and user-interface library agree about them.
class IOrvixCoreUI
{
public:
    /// Called once, right after `GetIOrvixCoreUI`. `access` stays valid until `ReleaseIOrvixCoreUI` and is
    /// not owned. [ui-library, main-thread]
    virtual void SetClientAccess(IOrvixCoreUIClientAccess* access) = 0;

    /// Asks a question. `options` are bits of `OrvixPromptOption`. With `OfferStopAsking` the dialog offers to stop
    /// asking, and the user's choice goes to `*dontAskAgain` (never null; false on entry). Returns an
    /// `OrvixPromptAnswer`. [ui-library, main-thread]
    virtual std::int32_t ShowPrompt(void* a, void* b, void* c, std::uint32_t options, bool* dontAskAgain) = 0;

    /// Shows the active entries of the record's file list and returns an `OrvixDialogResult`. The user's choices come
    /// back in the record's options and in the bit `OrvixFileSelection::Confirmed` of each active entry's FlagsOut. The
    /// record belongs to the host. [ui-library, main-thread]
    virtual std::int32_t ShowFileListDialog(void* a, OrvixFileListDialogParams* params) = 0;

    /// Edits the stored answers in place and returns an `OrvixPromptEditorResult`. The table belongs to the services
    /// object. [ui-library, main-thread]
    virtual std::int32_t EditPrompts(void* a, void* b, OrvixPromptTable* prompts) = 0;

protected:
    /// Not public: nobody deletes the object through this interface.
    ~IOrvixCoreUI() = default;
};

/// Marks what OrvixCoreUI.dll exports. The user-interface library defines ORVIXCOREUI_BUILD; everybody else imports.
#if defined(ORVIXCOREUI_BUILD)
#define ORVIXCOREUI_API __declspec(dllexport)
#else
#define ORVIXCOREUI_API __declspec(dllimport)
#endif

extern "C" {
/// Obtains the user-interface library's interface; never null, since it is used without a test.
/// Each call is matched by one `ReleaseIOrvixCoreUI`. [ui-library, main-thread]
ORVIXCOREUI_API IOrvixCoreUI* GetIOrvixCoreUI();

/// Releases the interface in the library that made it. [ui-library, main-thread]
ORVIXCOREUI_API void ReleaseIOrvixCoreUI(IOrvixCoreUI* coreUI);
}
