#pragma once

#include "ArchiveReport.h"
#include "ArchiveStore.h"
#include "MSSCCI.h"

#include <optional>
#include <string>
#include <vector>

/// The archive as an MSSCCI library: one session of a host, to which the context pointer leads. Each operation is the
/// exported function of its name. It translates names, option words and results, and shows everything that it has to
/// say through the callback of `OpenProject`, which is kept until `CloseProject`.
///
/// A null in place of something that an operation needs, or a list without files, is SCC_E_NONSPECIFICERROR, and
/// nothing is done. A file operation does what it can; the result is that of the first file that failed.
///
/// Where the interface leaves the choice:
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

    /// How long a comment a host should let people write. The archive keeps longer ones too.
    static constexpr LONG CommentLength = 4096;

    /// Opens the archive of the folder. A user whose name fits is told to a host that gives none. The project name is
    /// not read, and neither is the auxiliary path, which becomes what `GetProjPath` makes it.
    SCCRTN OpenProject(LPSTR user, LPCSTR projectName, LPCSTR localPath, LPSTR auxPath, LPTEXTOUTPROC output,
                       LONG flags);
    SCCRTN CloseProject();

    /// Chooses the folder that `OpenProject` refused last, if the path may be changed, or else the local path. The
    /// project is named after its folder; the auxiliary path is the archive's place in it. Both are for people only.
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

    /// As `QueryInfo`, and then has the host take the files off its list that the command is not for. Ends with
    /// SCC_I_OPERATIONCANCELED when the host answers FALSE. Folders are not taken.
    SCCRTN PopulateList(SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback, LPVOID callerData,
                        LPLONG status, LONG options);

    /// Not offered: the archive has no program of its own.
    SCCRTN RunScc();

    /// The options show the archive's folder and the user; there is nothing to change.
    SCCRTN GetCommandOptions(SCCCOMMAND command, LPCMDOPTS* block);

    /// Brings what the archive holds and the project's folder, or the folder named, lacks. The array is valid until
    /// the next call and names the files that were brought, also when others failed.
    SCCRTN AddFromScc(LPLONG count, LPCSTR** names);

    /// Only SCC_OPT_SHARESUBPROJ is known.
    SCCRTN SetOption(LONG option);

private:
    using Paths = std::vector<std::wstring>;

    template <typename Work>
    SCCRTN FileOperation(LONG count, LPCSTR* names, Work work);
    ArchiveFailures Expand(Paths& paths, LONG options) const;
    Paths FindMissing(const std::wstring& folder, ArchiveFailures& failures) const;
    ArchiveFailures GetAndName(const Paths& files);
    SCCRTN Report(const ArchiveFailures& failures) const;
    bool Output(const ArchiveReport::Lines& lines, LONG kind) const;

    ArchiveStore m_store;
    LPTEXTOUTPROC m_output = nullptr;
    std::wstring m_user;
    std::wstring m_folder;
    std::wstring m_refusedFolder; ///< by the last `OpenProject`, as no project
    std::wstring m_newFolder;     ///< chosen by `GetProjPath` to become a project

    // The array that `AddFromScc` returned, and the texts that it points to.
    std::vector<std::string> m_addedFiles;
    std::vector<LPCSTR> m_addedNames;
};
