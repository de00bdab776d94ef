#pragma once

#include <windows.h>

#include <cstddef>

// The published Source Code Control Interface (MSSCCI), versions 1.0 to 1.3: the part of it that this project uses, in
// the interface's own names. A provider library exports the functions; a host looks them up by name.
//
// `context` is what the provider stored in SccInitialize, `window` the parent of its dialogs, `names` an array of
// `count` full paths, `block` the provider's own option block or null. All text is narrow, in the ANSI code page.

// NOLINTBEGIN(readability-identifier-naming)

using SCCRTN = long; ///< 0 success, positive information, negative error
using LPCMDOPTS = LPVOID;
using LPTEXTOUTPROC = LONG (*)(LPCSTR text, LONG kind);
using POPLISTFUNC = BOOL (*)(LPVOID callerData, BOOL add, LONG status, LPSTR fileName);

enum SCCCOMMAND : int
{
    SCC_COMMAND_GET = 0,
    SCC_COMMAND_CHECKOUT = 1,
    SCC_COMMAND_CHECKIN = 2,
    SCC_COMMAND_UNCHECKOUT = 3,
    SCC_COMMAND_ADD = 4,
    SCC_COMMAND_HISTORY = 7,
    SCC_COMMAND_PROPERTIES = 9,
    SCC_COMMAND_OPTIONS = 10
};

constexpr SCCRTN SCC_I_SHARESUBPROJOK = 7;
constexpr SCCRTN SCC_I_FILEDIFFERS = 6;
constexpr SCCRTN SCC_I_RELOADFILE = 5;
constexpr SCCRTN SCC_I_OPERATIONCANCELED = 2;
constexpr SCCRTN SCC_I_ADV_SUPPORT = 1;
constexpr SCCRTN SCC_OK = 0;
constexpr SCCRTN SCC_E_INITIALIZEFAILED = -1;
constexpr SCCRTN SCC_E_UNKNOWNPROJECT = -2;
constexpr SCCRTN SCC_E_COULDNOTCREATEPROJECT = -3;
constexpr SCCRTN SCC_E_NOTCHECKEDOUT = -4;
constexpr SCCRTN SCC_E_FILEOUTEXCLUSIVE = -7;
constexpr SCCRTN SCC_E_ACCESSFAILURE = -8;
constexpr SCCRTN SCC_E_FILEALREADYEXISTS = -10;
constexpr SCCRTN SCC_E_FILENOTCONTROLLED = -11;
constexpr SCCRTN SCC_E_OPNOTSUPPORTED = -14;
constexpr SCCRTN SCC_E_NONSPECIFICERROR = -15;
constexpr SCCRTN SCC_E_OPNOTPERFORMED = -16;
constexpr SCCRTN SCC_E_PROJECTALREADYOPEN = -22;
constexpr SCCRTN SCC_E_PROJSYNTAXERR = -23;
constexpr SCCRTN SCC_E_INVALIDFILEPATH = -24;
constexpr SCCRTN SCC_E_PROJNOTOPEN = -25;
constexpr SCCRTN SCC_E_FILENOTEXIST = -28;

// Sizes of the texts that a provider may write, in bytes, terminator included. The local path has Windows' MAX_PATH.
constexpr std::size_t SCC_NAME_SIZE = 32;
constexpr std::size_t SCC_AUXLABEL_SIZE = 32;
constexpr std::size_t SCC_USER_SIZE = 32;
constexpr std::size_t SCC_PRJPATH_SIZE = 301;

// Capabilities.
constexpr LONG SCC_CAP_HISTORY = 0x8;
constexpr LONG SCC_CAP_PROPERTIES = 0x10;
constexpr LONG SCC_CAP_RUNSCC = 0x20;
constexpr LONG SCC_CAP_GETCOMMANDOPTIONS = 0x40;
constexpr LONG SCC_CAP_QUERYINFO = 0x80;
constexpr LONG SCC_CAP_GETPROJPATH = 0x200;
constexpr LONG SCC_CAP_ADDFROMSCC = 0x400;
constexpr LONG SCC_CAP_COMMENTCHECKOUT = 0x800;
constexpr LONG SCC_CAP_COMMENTCHECKIN = 0x1000;
constexpr LONG SCC_CAP_COMMENTADD = 0x2000;
constexpr LONG SCC_CAP_TEXTOUT = 0x8000;
constexpr LONG SCC_CAP_BATCH = 0x40000;
constexpr LONG SCC_CAP_HISTORY_MULTFILE = 0x400000;
constexpr LONG SCC_CAP_POPULATELIST = 0x2000000;

constexpr LONG SCC_KEEP_CHECKEDOUT = 0x1000;
constexpr LONG SCC_GET_ALL = 0x1; ///< the names are folders
constexpr LONG SCC_GET_RECURSIVE = 0x2;
constexpr LONG SCC_PL_DIR = 0x1; ///< the names are folders
constexpr LONG SCC_OP_CREATEIFNEW = 0x1;
constexpr LONG SCC_OP_SILENTOPEN = 0x2;
constexpr LONG SCC_OPT_SHARESUBPROJ = 6;

// Bits of a file's status.
constexpr LONG SCC_STATUS_INVALID = -1;
constexpr LONG SCC_STATUS_NOTCONTROLLED = 0;
constexpr LONG SCC_STATUS_CONTROLLED = 0x1;
constexpr LONG SCC_STATUS_CHECKEDOUT = 0x2;
constexpr LONG SCC_STATUS_OUTOTHER = 0x4;
constexpr LONG SCC_STATUS_OUTEXCLUSIVE = 0x8;
constexpr LONG SCC_STATUS_OUTOFDATE = 0x20;
constexpr LONG SCC_STATUS_DELETED = 0x40;
constexpr LONG SCC_STATUS_MODIFIED = 0x800;
constexpr LONG SCC_STATUS_OUTBYUSER = 0x1000;

// Kinds of output text.
constexpr LONG SCC_MSG_INFO = 1;
constexpr LONG SCC_MSG_WARNING = 2;
constexpr LONG SCC_MSG_ERROR = 3;

// Answers of the host to an output text.
constexpr LONG SCC_MSG_RTN_OK = 0;
constexpr LONG SCC_MSG_RTN_CANCEL = -1;

extern "C" {
LONG SccGetVersion();
SCCRTN SccInitialize(LPVOID* context, HWND window, LPCSTR caller, LPSTR sccName, LPLONG capabilities,
                     LPSTR auxPathLabel, LPLONG checkoutCommentLength, LPLONG commentLength);
SCCRTN SccUninitialize(LPVOID context);
SCCRTN SccOpenProject(LPVOID context, HWND window, LPSTR user, LPCSTR projectName, LPCSTR localPath, LPSTR auxPath,
                      LPCSTR comment, LPTEXTOUTPROC output, LONG flags);
SCCRTN SccCloseProject(LPVOID context);
SCCRTN SccGetProjPath(LPVOID context, HWND window, LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath,
                      BOOL allowChangePath, LPBOOL isNew);
SCCRTN SccGet(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block);
SCCRTN SccCheckout(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG options,
                   LPCMDOPTS block);
SCCRTN SccUncheckout(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block);
SCCRTN SccCheckin(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG options,
                  LPCMDOPTS block);
SCCRTN SccAdd(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG* options, LPCMDOPTS block);
SCCRTN SccBeginBatch();
SCCRTN SccEndBatch();
SCCRTN SccHistory(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block);
SCCRTN SccProperties(LPVOID context, HWND window, LPCSTR name);
SCCRTN SccQueryInfo(LPVOID context, LONG count, LPCSTR* names, LPLONG status);
SCCRTN SccPopulateList(LPVOID context, SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback,
                       LPVOID callerData, LPLONG status, LONG options);
SCCRTN SccRunScc(LPVOID context, HWND window, LONG count, LPCSTR* names);
SCCRTN SccGetCommandOptions(LPVOID context, HWND window, SCCCOMMAND command, LPCMDOPTS* block);
SCCRTN SccAddFromScc(LPVOID context, HWND window, LPLONG count, LPCSTR** names);
SCCRTN SccSetOption(LPVOID context, LONG option, LONG value);
}

// NOLINTEND(readability-identifier-naming)
