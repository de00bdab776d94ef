#pragma once

#include "MSSCCI.h"

/// One installed MSSCCI library, as the provider wrapper uses it.
///
/// Texts are narrow, in the ANSI code page, and live for the call only. The results are those of the library's
/// functions (MSSCCI.h), unchanged. The bridge's own are SCC_E_INITIALIZEFAILED (the library or the function is
/// missing, or threw), SCC_E_OPNOTSUPPORTED and SCC_E_PROJNOTOPEN. Operations let no exception out. One thread at a
/// time.
class IOrvixMSSCC
{
public:
    IOrvixMSSCC() = default;
    IOrvixMSSCC(const IOrvixMSSCC&) = delete;
    IOrvixMSSCC& operator=(const IOrvixMSSCC&) = delete;
    virtual ~IOrvixMSSCC() = default;

    /// The name under which the provider is installed; owned by the bridge.
    virtual const wchar_t* GetProviderName() = 0;

    /// Path of the library; owned by the bridge.
    virtual const wchar_t* GetDllPath() = 0;

    virtual bool IsInitialized() = 0;
    virtual bool IsProjectOpen() = 0;

    /// The interface's version, major in the high word; 0 when it cannot be asked.
    virtual LONG GetVersion() = 0;

    /// Starts the library for a host of this name; 0 at once when it has been started.
    virtual SCCRTN Initialize(LPCSTR callerName) = 0;

    /// Closes an open project and ends the library, also one that was never started.
    virtual SCCRTN Uninitialize() = 0;

    /// Opens the project of a local folder, after closing the open one. Reads the project settings file there first and
    /// writes it afterwards. When the library refuses its project strings (SCC_E_PROJSYNTAXERR), it is asked for new
    /// ones and then to open the project once more.
    virtual SCCRTN OpenProject(LPCSTR localPath, LPCSTR comment, LPTEXTOUTPROC output) = 0;

    virtual SCCRTN CloseProject() = 0;

    /// Lets the library choose a project, which may be a new one. The bridge keeps the choice; the first four
    /// arguments are not used.
    virtual SCCRTN GetProjPath(LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath, BOOL allowChangePath) = 0;

    virtual SCCRTN Get(LONG count, LPCSTR* names, LONG options, LPCMDOPTS block) = 0;
    virtual SCCRTN Checkout(LONG count, LPCSTR* names, LPCSTR comment, LONG options, LPCMDOPTS block) = 0;
    virtual SCCRTN Uncheckout(LONG count, LPCSTR* names, LONG options, LPCMDOPTS block) = 0;
    virtual SCCRTN Checkin(LONG count, LPCSTR* names, LPCSTR comment, LONG options, LPCMDOPTS block) = 0;

    /// `options` has one word per file.
    virtual SCCRTN Add(LONG count, LPCSTR* names, LPCSTR comment, LONG* options, LPCMDOPTS block) = 0;

    // The reserved operations keep their slots. They do nothing and return 0.
    virtual SCCRTN Reserved1() = 0;
    virtual SCCRTN BeginBatch() = 0;
    virtual SCCRTN EndBatch() = 0;
    virtual SCCRTN Reserved2() = 0;
    virtual SCCRTN Reserved3() = 0;
    virtual SCCRTN Reserved4() = 0;
    virtual SCCRTN History(LONG count, LPCSTR* names, LONG options, LPCMDOPTS block) = 0;
    virtual SCCRTN Properties(LPCSTR name) = 0;

    /// `status` has one word per file, filled by the library.
    virtual SCCRTN QueryInfo(LONG count, LPCSTR* names, LPLONG status) = 0;

    virtual SCCRTN Reserved5() = 0;
    virtual SCCRTN PopulateList(SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback, LPVOID callerData,
                                LPLONG status, LONG options) = 0;
    virtual SCCRTN Reserved6() = 0;
    virtual SCCRTN RunScc(LONG count, LPCSTR* names) = 0;

    /// Shows the library's options; SCC_E_OPNOTSUPPORTED when it has none.
    virtual SCCRTN GetCommandOptions() = 0;

    /// Adds files from the library's projects; SCC_E_OPNOTSUPPORTED when it cannot.
    virtual SCCRTN AddFromScc(LPLONG count, LPCSTR** names) = 0;

    virtual SCCRTN SetOption(LONG option, LONG value) = 0;
    virtual SCCRTN Reserved7() = 0;
    virtual SCCRTN Reserved8() = 0;
    virtual SCCRTN Reserved9() = 0;
    virtual SCCRTN Reserved10() = 0;
};
