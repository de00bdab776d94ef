#pragma once

#include "ArchiveReport.h"
#include "ArchiveStore.h"
#include "MSSCCI.h"

#include <optional>
#include <string>
#include <vector>

/// The archive as an MSSCCI library: one session of a host, which the context pointer identifies. Each operation
/// implements the exported function of its name. It translates names, option words and results, and shows its messages
/// through the callback of `OpenProject`, which it uses until `CloseProject`.
///
/// When an argument that an operation needs is null, or a list has no files, the operation does nothing and returns
/// SCC_E_NONSPECIFICERROR. A file operation goes on after a file that fails; its result is that of the first such
/// file.
///
/// Where the interface leaves a choice:
/// - There are no dialogs. A check-in or an add without a comment stores an empty one.
/// - A new project is made by the second `OpenProject` with SCC_OP_CREATEIFNEW, after `GetProjPath` has chosen it.
/// - `Checkout` takes the file as it is on disk; a host that wants the latest version gets it first.
/// - Option blocks are not used, nor are file types.
class ArchiveScc
{
public:
    static constexpr char Name[] = "Archive (MSSCCI)";
    static constexpr char AuxPathLabel[] = "Archive:";
    static constexpr LONG Capabilities =
        SCC_CAP_HISTORY | SCC_CAP_PROPERTIES | SCC_CAP_GETCOMMANDOPTIONS | SCC_CAP_QUERYINFO | SCC_CAP_GETPROJPATH |
        SCC_CAP_ADDFROMSCC | SCC_CAP_COMMENTCHECKOUT | SCC_CAP_COMMENTCHECKIN | SCC_CAP_COMMENTADD | SCC_CAP_TEXTOUT |
        SCC_CAP_BATCH | SCC_CAP_HISTORY_MULTFILE | SCC_CAP_POPULATELIST;

    /// The length of comments, in bytes, that hosts are told to offer. The archive stores longer ones as well.
    static constexpr LONG CommentLength = 4096;

    /// Opens the archive of the folder. When the host names no user, it gets the name of the Windows user, if that
    /// fits into its buffer. The project name and the auxiliary path are not read; the auxiliary path is written as by
    /// `GetProjPath`.
    SCCRTN OpenProject(LPSTR user, LPCSTR projectName, LPCSTR localPath, LPSTR auxPath, LPTEXTOUTPROC output,
                       LONG flags);
    SCCRTN CloseProject();

    /// Chooses the folder that `OpenProject` refused last, if the path may be changed, otherwise the local path. The
    /// project name becomes the name of the folder, and the auxiliary path the name of the archive in it. Both are
    /// only shown.
    SCCRTN GetProjPath(LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath, BOOL allowChangePath,
                       LPBOOL isNew);

    SCCRTN Get(LONG count, LPCSTR* names, LONG options);
    SCCRTN Checkout(LONG count, LPCSTR* names, LPCSTR comment, LONG options);
    SCCRTN Uncheckout(LONG count, LPCSTR* names);
    SCCRTN Checkin(LONG count, LPCSTR* names, LPCSTR comment, LONG options);
    SCCRTN Add(LONG count, LPCSTR* names, LPCSTR comment, const LONG* options);

    /// Ends with SCC_I_OPERATIONCANCELED when the host wants no more lines.
    SCCRTN History(LONG count, LPCSTR* names);
    SCCRTN Properties(LPCSTR name);

    /// All or nothing: after a failure every status is SCC_STATUS_INVALID.
    SCCRTN QueryInfo(LONG count, LPCSTR* names, LPLONG status);

    /// Calls `QueryInfo`, then tells the host to remove the files from its list that the command is not for. With
    /// SCC_PL_DIR it adds the controlled files in and below the folders that the command is for, on the disk or not; a
    /// folder has no status, so `status` is then SCC_STATUS_INVALID. Ends with SCC_I_OPERATIONCANCELED when the host
    /// returns FALSE.
    SCCRTN PopulateList(SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback, LPVOID callerData,
                        LPLONG status, LONG options);

    /// Not offered: the archive has no program of its own.
    SCCRTN RunScc();

    /// The options show the archive's folder and the user; there is nothing to change.
    SCCRTN GetCommandOptions(SCCCOMMAND command, LPCMDOPTS* block);

    /// Gets the files of the archive that are missing on the disk, in the project folder or in the folder that the
    /// host names. The array is valid until the next call. It names the files that were written, also when others
    /// failed.
    SCCRTN AddFromScc(LPLONG count, LPCSTR** names);

    /// Only SCC_OPT_SHARESUBPROJ is supported.
    SCCRTN SetOption(LONG option);

private:
    using Paths = std::vector<std::wstring>;

    template <typename Work>
    SCCRTN FileOperation(LONG count, LPCSTR* names, Work work);
    SCCRTN PopulateFromFolders(SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback, LPVOID callerData);
    ArchiveFailures Expand(Paths& paths, LONG options) const;
    Paths FindMissing(const std::wstring& folder, ArchiveFailures& failures) const;
    ArchiveFailures GetAndName(const Paths& files);
    SCCRTN Report(const ArchiveFailures& failures) const;
    bool Output(const ArchiveReport::Lines& lines, LONG kind) const;

    ArchiveStore m_store;
    LPTEXTOUTPROC m_output = nullptr;
    std::wstring m_user;
    std::wstring m_folder;
    std::wstring m_refusedFolder; ///< the last `OpenProject` refused it, since it is no project
    std::wstring m_newFolder;     ///< `GetProjPath` chose it for a new project

    // The array that `AddFromScc` returned, and the texts that it points to.
    std::vector<std::string> m_addedFiles;
    std::vector<LPCSTR> m_addedNames;
};
