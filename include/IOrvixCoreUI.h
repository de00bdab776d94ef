#pragma once

#include <cstdint>

class IOrvixCoreUIClientAccess;
class OrvixFileListDialogParams;
class OrvixPromptTable;

/// The dialogs of the feature. The services object obtains this interface on first need and keeps it until
/// it is destroyed.
///
/// Implemented by: user-interface library (OrvixCoreUI.dll). The arguments `a`, `b` and `c` come from the
/// host unchanged; their meaning lies between the host and the user-interface library.
class IOrvixCoreUI
{
public:
    /// Called once, right after `GetIOrvixCoreUI`. `access` stays valid until `ReleaseIOrvixCoreUI` and is
    /// not owned. [ui-library, main-thread]
    virtual void SetClientAccess(IOrvixCoreUIClientAccess* access) = 0;

    /// Asks a question. With bit 0x100 of `options` the dialog offers a choice to stop asking, whose state
    /// goes to `*dontAskAgain` (never null; false on entry). Returns the answer: 1, 0, 2 or 3.
    /// [ui-library, main-thread]
    virtual std::int32_t ShowPrompt(void* a, void* b, void* c, std::uint32_t options, bool* dontAskAgain) = 0;

    /// Shows the active entries of the record's file list. 1 means confirmed, 0 cancelled. The user's
    /// choices come back in the record's options and in bit 0x2 of each active entry's FlagsOut (set:
    /// ticked). The record is the host's. [ui-library, main-thread]
    virtual std::int32_t ShowFileListDialog(void* a, OrvixFileListDialogParams* params) = 0;

    /// Edits the stored answers in place. 1 means the table was changed and is to be saved. The table is
    /// the services object's. [ui-library, main-thread]
    virtual std::int32_t EditPrompts(void* a, void* b, OrvixPromptTable* prompts) = 0;

protected:
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

/// Hands the interface back to the library that made it. [ui-library, main-thread]
ORVIXCOREUI_API void ReleaseIOrvixCoreUI(IOrvixCoreUI* coreUI);
}
