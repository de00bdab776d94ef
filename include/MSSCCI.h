#pragma once

#include <windows.h>

#include <cstddef>

/// @file
/// The published Source Code Control Interface (MSSCCI), versions 1.0 to 1.3: the part of it that this project uses, in
/// the interface's own names. A provider library implements and exports the functions; a host looks them up by name.
///
/// In all functions `context` is what the provider stored in `SccInitialize`, `window` the parent of its dialogs,
/// `names` an array of `count` full paths, `block` the provider's own option block or null. All text is narrow, in the
/// ANSI code page, and ends in a null character. What a caller passes is the caller's and lives for the call. The
/// result is `SCC_OK`, or one of the other codes.

// NOLINTBEGIN(readability-identifier-naming)

using SCCRTN = long;      ///< 0 success, positive information, negative error
using LPCMDOPTS = LPVOID; ///< the provider's own option block

/// The host's function for a provider's text, callable from `SccOpenProject` until `SccCloseProject`. `text` has no
/// line end and lives for the call; `kind` is one of `SCC_MSG_*`. Returns `SCC_MSG_RTN_OK` or `SCC_MSG_RTN_CANCEL`.
/// [host]
using LPTEXTOUTPROC = LONG (*)(LPCSTR text, LONG kind);

/// The host's function for `SccPopulateList`, with that function's `callerData`. Adds a file to the host's list, or
/// removes it when `add` is false; `status` has the file's `SCC_STATUS_*` bits. False asks the provider to stop. [host]
using POPLISTFUNC = BOOL (*)(LPVOID callerData, BOOL add, LONG status, LPSTR fileName);

/// A command of the host.
enum SCCCOMMAND : int
{
    SCC_COMMAND_GET = 0,        ///< `SccGet`
    SCC_COMMAND_CHECKOUT = 1,   ///< `SccCheckout`
    SCC_COMMAND_CHECKIN = 2,    ///< `SccCheckin`
    SCC_COMMAND_UNCHECKOUT = 3, ///< `SccUncheckout`
    SCC_COMMAND_ADD = 4,        ///< `SccAdd`
    SCC_COMMAND_HISTORY = 7,    ///< `SccHistory`
    SCC_COMMAND_PROPERTIES = 9, ///< `SccProperties`
    SCC_COMMAND_OPTIONS = 10    ///< the provider's general options
};

constexpr SCCRTN SCC_I_SHARESUBPROJOK = 7;         ///< the host may name the destination folder of `SccAddFromScc`
constexpr SCCRTN SCC_I_FILEDIFFERS = 6;            ///< the file differs from the stored version
constexpr SCCRTN SCC_I_RELOADFILE = 5;             ///< a file on the disk changed, so load it again
constexpr SCCRTN SCC_I_OPERATIONCANCELED = 2;      ///< the user cancelled the operation
constexpr SCCRTN SCC_I_ADV_SUPPORT = 1;            ///< the command has advanced options
constexpr SCCRTN SCC_OK = 0;                       ///< success
constexpr SCCRTN SCC_E_INITIALIZEFAILED = -1;      ///< the provider cannot start
constexpr SCCRTN SCC_E_UNKNOWNPROJECT = -2;        ///< there is no such project
constexpr SCCRTN SCC_E_COULDNOTCREATEPROJECT = -3; ///< the project cannot be created
constexpr SCCRTN SCC_E_NOTCHECKEDOUT = -4;         ///< the file is not checked out
constexpr SCCRTN SCC_E_FILEOUTEXCLUSIVE = -7;      ///< another user has the file checked out exclusively
constexpr SCCRTN SCC_E_ACCESSFAILURE = -8;         ///< the version-control system cannot be reached
constexpr SCCRTN SCC_E_FILEALREADYEXISTS = -10;    ///< the file is already under control
constexpr SCCRTN SCC_E_FILENOTCONTROLLED = -11;    ///< the file is not under control
constexpr SCCRTN SCC_E_OPNOTSUPPORTED = -14;       ///< the provider does not have the operation
constexpr SCCRTN SCC_E_NONSPECIFICERROR = -15;     ///< failure without a code of its own
constexpr SCCRTN SCC_E_OPNOTPERFORMED = -16;       ///< nothing was done
constexpr SCCRTN SCC_E_PROJECTALREADYOPEN = -22;   ///< a project is open already
constexpr SCCRTN SCC_E_PROJSYNTAXERR = -23;        ///< the texts that name the project cannot be used
constexpr SCCRTN SCC_E_INVALIDFILEPATH = -24;      ///< the path cannot be used
constexpr SCCRTN SCC_E_PROJNOTOPEN = -25;          ///< no project is open
constexpr SCCRTN SCC_E_FILENOTEXIST = -28;         ///< the local file does not exist

// Sizes of the texts that a provider may write, in bytes, terminator included. The local path has Windows' MAX_PATH.
constexpr std::size_t SCC_NAME_SIZE = 32;     ///< `sccName` of `SccInitialize`
constexpr std::size_t SCC_AUXLABEL_SIZE = 32; ///< `auxPathLabel` of `SccInitialize`
constexpr std::size_t SCC_USER_SIZE = 32;     ///< each `user`
constexpr std::size_t SCC_PRJPATH_SIZE = 301; ///< each `projectName` and `auxPath` that a provider writes

// What a provider can do: bits of `capabilities` in `SccInitialize`.
constexpr LONG SCC_CAP_HISTORY = 0x8;               ///< has `SccHistory`
constexpr LONG SCC_CAP_PROPERTIES = 0x10;           ///< has `SccProperties`
constexpr LONG SCC_CAP_RUNSCC = 0x20;               ///< has `SccRunScc`
constexpr LONG SCC_CAP_GETCOMMANDOPTIONS = 0x40;    ///< has `SccGetCommandOptions`
constexpr LONG SCC_CAP_QUERYINFO = 0x80;            ///< has `SccQueryInfo`
constexpr LONG SCC_CAP_GETPROJPATH = 0x200;         ///< has `SccGetProjPath`
constexpr LONG SCC_CAP_ADDFROMSCC = 0x400;          ///< has `SccAddFromScc`
constexpr LONG SCC_CAP_COMMENTCHECKOUT = 0x800;     ///< keeps the comment of a check-out
constexpr LONG SCC_CAP_COMMENTCHECKIN = 0x1000;     ///< keeps the comment of a check-in
constexpr LONG SCC_CAP_COMMENTADD = 0x2000;         ///< keeps the comment of an addition
constexpr LONG SCC_CAP_TEXTOUT = 0x8000;            ///< sends text to the callback of `SccOpenProject`
constexpr LONG SCC_CAP_BATCH = 0x40000;             ///< has `SccBeginBatch` and `SccEndBatch`
constexpr LONG SCC_CAP_HISTORY_MULTFILE = 0x400000; ///< `SccHistory` takes several files
constexpr LONG SCC_CAP_POPULATELIST = 0x2000000;    ///< has `SccPopulateList`

constexpr LONG SCC_KEEP_CHECKEDOUT = 0x1000; ///< `SccCheckin`, `SccAdd`: keep the files checked out
constexpr LONG SCC_GET_ALL = 0x1;            ///< `SccGet`, `SccCheckout`: the names are folders
constexpr LONG SCC_GET_RECURSIVE = 0x2;      ///< with `SCC_GET_ALL`: subfolders too
constexpr LONG SCC_PL_DIR = 0x1;             ///< `SccPopulateList`: the names are folders
constexpr LONG SCC_OP_CREATEIFNEW = 0x1;     ///< `SccOpenProject`: make the project when it is unknown
constexpr LONG SCC_OP_SILENTOPEN =
    0x2; ///< `SccOpenProject`: ask nothing; `SCC_E_UNKNOWNPROJECT` for an unknown project
constexpr LONG SCC_OPT_SHARESUBPROJ =
    6; ///< `SccSetOption`: may the host name the destination folder of `SccAddFromScc`?

// Bits of a file's status.
constexpr LONG SCC_STATUS_INVALID = -1;       ///< not a set of bits: the status is unknown
constexpr LONG SCC_STATUS_NOTCONTROLLED = 0;  ///< no bit: not under source control
constexpr LONG SCC_STATUS_CONTROLLED = 0x1;   ///< under source control
constexpr LONG SCC_STATUS_CHECKEDOUT = 0x2;   ///< checked out by this user into this folder
constexpr LONG SCC_STATUS_OUTOTHER = 0x4;     ///< checked out by another user
constexpr LONG SCC_STATUS_OUTEXCLUSIVE = 0x8; ///< checked out exclusively
constexpr LONG SCC_STATUS_OUTOFDATE = 0x20;   ///< a newer version exists
constexpr LONG SCC_STATUS_DELETED = 0x40;     ///< deleted in the project
constexpr LONG SCC_STATUS_MODIFIED = 0x800;   ///< changed on the disk
constexpr LONG SCC_STATUS_OUTBYUSER = 0x1000; ///< checked out by this user into any folder

// Kinds of output text.
constexpr LONG SCC_MSG_INFO = 1;    ///< information
constexpr LONG SCC_MSG_WARNING = 2; ///< warning
constexpr LONG SCC_MSG_ERROR = 3;   ///< error

// Answers of the host to an output text.
constexpr LONG SCC_MSG_RTN_OK = 0;      ///< go on
constexpr LONG SCC_MSG_RTN_CANCEL = -1; ///< the user cancelled the operation

extern "C" {
/// The version of the interface: major number in the high word, minor in the low word. [provider]
LONG SccGetVersion();

/// Starts a session. `*context` is null on entry and may receive the provider's data, which it frees in
/// `SccUninitialize`. `caller` is the host's name. The provider writes its name, its capabilities (`SCC_CAP_*`), the
/// label of its auxiliary path, and how long comments may be. Each text has room for its `SCC_*_SIZE`.
/// [provider]
SCCRTN SccInitialize(LPVOID* context, HWND window, LPCSTR caller, LPSTR sccName, LPLONG capabilities,
                     LPSTR auxPathLabel, LPLONG checkoutCommentLength, LPLONG commentLength);

/// Ends the session; the provider frees its context. [provider, initialized]
SCCRTN SccUninitialize(LPVOID context);

/// Opens the project that the four texts name. `user` and `auxPath` are read and may be written, up to `SCC_USER_SIZE`
/// and `SCC_PRJPATH_SIZE` bytes. `output` takes the provider's text from now on and may be null; `flags` are
/// `SCC_OP_*`. `SCC_E_PROJSYNTAXERR` asks the host to get new texts by `SccGetProjPath`. [provider, initialized]
SCCRTN SccOpenProject(LPVOID context, HWND window, LPSTR user, LPCSTR projectName, LPCSTR localPath, LPSTR auxPath,
                      LPCSTR comment, LPTEXTOUTPROC output, LONG flags);

/// Closes the project. [provider, project-open]
SCCRTN SccCloseProject(LPVOID context);

/// Lets the user choose a project. All four texts are read and may be written: `user` up to `SCC_USER_SIZE` bytes,
/// `projectName` and `auxPath` up to `SCC_PRJPATH_SIZE`, `localPath` up to `MAX_PATH`, and this only when
/// `allowChangePath` is true. `*isNew` on entry: may a new project be made; afterwards: was one chosen.
/// [provider, initialized]
SCCRTN SccGetProjPath(LPVOID context, HWND window, LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath,
                      BOOL allowChangePath, LPBOOL isNew);

/// Gets the latest version of files. `options`: `SCC_GET_*`. [provider, project-open]
SCCRTN SccGet(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block);

/// Checks files out. `options`: `SCC_GET_*`. [provider, project-open]
SCCRTN SccCheckout(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG options,
                   LPCMDOPTS block);

/// Undoes the check-out of files. `options` is 0. [provider, project-open]
SCCRTN SccUncheckout(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block);

/// Checks files in. `comment` null: the provider asks for it. `options`: 0 or `SCC_KEEP_CHECKEDOUT`.
/// [provider, project-open]
SCCRTN SccCheckin(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG options,
                  LPCMDOPTS block);

/// Puts files under control. `options` has one word for each file, with bits such as `SCC_KEEP_CHECKEDOUT`. [provider,
/// project-open]
SCCRTN SccAdd(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG* options, LPCMDOPTS block);

/// Begins a batch of operations. Batches do not nest. [provider, project-open]
SCCRTN SccBeginBatch();

/// Ends the batch. [provider, project-open]
SCCRTN SccEndBatch();

/// Shows the history of files. `SCC_I_RELOADFILE` when a file on the disk changed meanwhile. [provider, project-open]
SCCRTN SccHistory(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block);

/// Shows the properties of the file `name`. [provider, project-open]
SCCRTN SccProperties(LPVOID context, HWND window, LPCSTR name);

/// Writes `count` words of `SCC_STATUS_*` bits to `status`, one for each file. Shows nothing. [provider, project-open]
SCCRTN SccQueryInfo(LPVOID context, LONG count, LPCSTR* names, LPLONG status);

/// Tells which files fit the command, out of those that `names` and `status` give, by calls of `callback`, which gets
/// `callerData`. `status` receives the files' bits, as in `SccQueryInfo`. `options`: 0 or `SCC_PL_DIR`. Shows nothing.
/// [provider, project-open]
SCCRTN SccPopulateList(LPVOID context, SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback,
                       LPVOID callerData, LPLONG status, LONG options);

/// Starts the provider's own program; the files are those that the user has selected and may be none.
/// [provider, initialized]
SCCRTN SccRunScc(LPVOID context, HWND window, LONG count, LPCSTR* names);

/// With a null `block`: does the command have advanced options? `SCC_I_ADV_SUPPORT` means yes. Otherwise shows them;
/// `*block` is null the first time, and later what the provider stored there. [provider, initialized]
SCCRTN SccGetCommandOptions(LPVOID context, HWND window, SCCCOMMAND command, LPCMDOPTS* block);

/// Lets the user choose files of the version-control system, which are added to the host's project. Writes their number
/// and an array of their names, which the provider owns until the call with a null `count` frees it. With `*count` 1
/// and names given on entry, the first name is the destination folder. [provider, project-open]
SCCRTN SccAddFromScc(LPVOID context, HWND window, LPLONG count, LPCSTR** names);

/// Sets an option of the session (`SCC_OPT_*`). Shows nothing. [provider, initialized]
SCCRTN SccSetOption(LPVOID context, LONG option, LONG value);
}

// NOLINTEND(readability-identifier-naming)
