#include "AllocationFailure.h"
#include "ArchiveLibrary.h"
#include "ArchiveProject.h"
#include "BuiltFile.h"
#include "SccLibrary.h"

#include "IOrvixClientAccess.h"
#include "IOrvixProvider.h"
#include "OrvixClientInfo.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixProviderResult.h"
#include "UniqueHandle.h"

#include <gtest/gtest.h>

#include <lmcons.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <functional>
#include <initializer_list>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace
{

using Lines = std::vector<std::string>;

std::string Ansi(const std::wstring& text)
{
    std::string bytes(text.size() * 4, '\0');
    const int size = WideCharToMultiByte(CP_ACP, 0, text.data(), static_cast<int>(text.size()), bytes.data(),
                                         static_cast<int>(bytes.size()), nullptr, nullptr);
    bytes.resize(static_cast<std::size_t>(size));
    return bytes;
}

/// A text buffer of the interface, followed by memory that nobody may write to.
template <std::size_t Size>
class TextBuffer
{
public:
    explicit TextBuffer(const std::string& text = "")
    {
        m_bytes.fill(Untouched);
        Set(text);
    }
    ~TextBuffer()
    {
        EXPECT_TRUE(std::all_of(m_bytes.begin() + Size, m_bytes.end(), [](char guard) { return guard == Untouched; }));
    }
    TextBuffer(const TextBuffer&) = delete;
    TextBuffer& operator=(const TextBuffer&) = delete;

    /// A text of the whole size gets no terminator.
    void Set(const std::string& text) { std::copy_n(text.c_str(), std::min(text.size() + 1, Size), m_bytes.begin()); }

    char* Get() { return m_bytes.data(); }
    std::string Text() const { return {m_bytes.data(), strnlen(m_bytes.data(), Size)}; }

private:
    static constexpr char Untouched = '\x5A';
    std::array<char, Size + 64> m_bytes;
};

/// No status that a library writes.
constexpr LONG Unwritten = 0x7777;

/// The status of a file that its user has checked out, and as another user sees it.
constexpr LONG Mine = SCC_STATUS_CONTROLLED | SCC_STATUS_CHECKEDOUT | SCC_STATUS_OUTBYUSER | SCC_STATUS_OUTEXCLUSIVE;
constexpr LONG Others = SCC_STATUS_CONTROLLED | SCC_STATUS_OUTOTHER | SCC_STATUS_OUTEXCLUSIVE;

// What the callback received. It is a plain function, so the test keeps this for it.
Lines infos;
Lines errors;
bool wantsNoMore = false;

LONG Output(LPCSTR text, LONG kind)
{
    EXPECT_TRUE(kind == SCC_MSG_INFO || kind == SCC_MSG_ERROR) << kind;
    EXPECT_EQ(std::strpbrk(text, "\r\n"), nullptr) << text;
    (kind == SCC_MSG_INFO ? infos : errors).emplace_back(text);
    return wantsNoMore ? SCC_MSG_RTN_CANCEL : SCC_MSG_RTN_OK;
}

bool Shows(const Lines& lines, const std::string& text)
{
    return std::any_of(lines.begin(), lines.end(),
                       [&](const std::string& line) { return line.find(text) != std::string::npos; });
}

/// File names as a host hands them to a library.
class Names
{
public:
    Names(std::initializer_list<std::wstring> files)
    {
        std::transform(files.begin(), files.end(), std::back_inserter(m_texts), Ansi);
        for (const std::string& text : m_texts)
        {
            m_pointers.push_back(text.c_str());
        }
    }

    LONG Count() const { return static_cast<LONG>(m_pointers.size()); }
    LPCSTR* Get() { return m_pointers.data(); }

private:
    Lines m_texts;
    std::vector<LPCSTR> m_pointers;
};

/// A session of the library, as one user has it.
class Session
{
public:
    explicit Session(const SccLibrary& library, const std::string& userName = "")
        : user(userName), auxPath("Archive:"), m_library(library)
    {
        TextBuffer<SCC_NAME_SIZE> name;
        TextBuffer<SCC_AUXLABEL_SIZE> label;
        LONG capabilities = 0;
        LONG checkoutComment = 0;
        LONG comment = 0;
        EXPECT_EQ(m_library.initialize(&context, nullptr, "test", name.Get(), &capabilities, label.Get(),
                                       &checkoutComment, &comment),
                  SCC_OK);
        EXPECT_NE(context, nullptr);
    }
    Session(const Session&) = delete;
    Session& operator=(const Session&) = delete;
    ~Session() { m_library.uninitialize(context); }

    SCCRTN Open(const std::wstring& folder, LONG flags = SCC_OP_CREATEIFNEW, LPTEXTOUTPROC output = Output)
    {
        return m_library.openProject(context, nullptr, user.Get(), projectName.Get(), Ansi(folder).c_str(),
                                     auxPath.Get(), "", output, flags);
    }

    SCCRTN Choose(BOOL allowChangePath = TRUE)
    {
        return m_library.getProjPath(context, nullptr, user.Get(), projectName.Get(), localPath.Get(), auxPath.Get(),
                                     allowChangePath, &isNew);
    }

    /// Makes a new project as a host does.
    SCCRTN Make(const std::wstring& folder, LPTEXTOUTPROC output = Output)
    {
        EXPECT_EQ(Open(folder, SCC_OP_CREATEIFNEW, output), SCC_E_PROJSYNTAXERR);
        EXPECT_EQ(Choose(), SCC_OK);
        return Open(folder, SCC_OP_CREATEIFNEW, output);
    }

    SCCRTN Add(Names names, LONG options = 0, LPCSTR comment = "added")
    {
        std::vector<LONG> all(static_cast<std::size_t>(names.Count()), options);
        return m_library.add(context, nullptr, names.Count(), names.Get(), comment, all.data(), nullptr);
    }
    SCCRTN Get(Names names, LONG options = 0)
    {
        return m_library.get(context, nullptr, names.Count(), names.Get(), options, nullptr);
    }
    SCCRTN Checkout(Names names, LONG options = 0)
    {
        return m_library.checkout(context, nullptr, names.Count(), names.Get(), "mine", options, nullptr);
    }
    SCCRTN Uncheckout(Names names)
    {
        return m_library.uncheckout(context, nullptr, names.Count(), names.Get(), 0, nullptr);
    }
    SCCRTN Checkin(Names names, LPCSTR comment, LONG options = 0)
    {
        return m_library.checkin(context, nullptr, names.Count(), names.Get(), comment, options, nullptr);
    }
    SCCRTN History(Names names) { return m_library.history(context, nullptr, names.Count(), names.Get(), 0, nullptr); }
    SCCRTN QueryInfo(Names names, std::vector<LONG>& status)
    {
        status.assign(static_cast<std::size_t>(names.Count()), Unwritten);
        return m_library.queryInfo(context, names.Count(), names.Get(), status.data());
    }

    LONG Status(const std::wstring& file)
    {
        std::vector<LONG> status;
        EXPECT_EQ(QueryInfo({file}, status), SCC_OK);
        return status[0];
    }

    LPVOID context = nullptr;
    TextBuffer<SCC_USER_SIZE> user;
    TextBuffer<SCC_PRJPATH_SIZE> projectName;
    TextBuffer<MAX_PATH> localPath;
    TextBuffer<SCC_PRJPATH_SIZE> auxPath;
    BOOL isNew = TRUE;

private:
    const SccLibrary& m_library;
};

/// A library, and Anna's and Ben's sessions.
class ArchiveSccSessions : public testing::Test
{
protected:
    void SetUp() override
    {
        infos.clear();
        errors.clear();
        wantsNoMore = false;
    }

    bool HasArchive(const ArchiveProject& project) { return std::filesystem::exists(project.Path(L".archive")); }

    SccLibrary m_library{ArchiveLibrary()};
    ArchiveProject m_project;
    Session m_anna{m_library, "anna"};
    Session m_ben{m_library, "ben"};
};

/// The same with a project open in both.
class ArchiveScc : public ArchiveSccSessions
{
protected:
    void SetUp() override
    {
        ArchiveSccSessions::SetUp();
        ASSERT_EQ(m_anna.Make(m_project.Text()), SCC_OK);
        ASSERT_EQ(m_ben.Open(m_project.Text()), SCC_OK);
    }

    std::wstring Added(std::wstring_view name, std::string_view bytes)
    {
        std::wstring file = m_project.Write(name, bytes);
        EXPECT_EQ(m_anna.Add({file}), SCC_OK);
        return file;
    }

    std::wstring CheckedOut(std::wstring_view name, std::string_view bytes)
    {
        std::wstring file = Added(name, bytes);
        EXPECT_EQ(m_anna.Checkout({file}), SCC_OK);
        return file;
    }

    /// Deletes a file of the working folder, read-only or not.
    void Delete(std::wstring_view file)
    {
        SetReadOnly(m_project.Path(file), false);
        ASSERT_TRUE(std::filesystem::remove(m_project.Path(file)));
    }

    void DamageAllRecords()
    {
        for (const auto& entry : std::filesystem::recursive_directory_iterator(m_project.Path(L".archive\\files")))
        {
            if (entry.is_regular_file())
            {
                m_project.Overwrite(entry.path(), "damaged");
            }
        }
    }

    /// The files that SccAddFromScc hands out.
    SCCRTN AddFromScc(LONG& count, LPCSTR*& names)
    {
        return m_library.addFromScc(m_anna.context, nullptr, &count, &names);
    }
};

BOOL WINAPI LongUserName(LPWSTR name, LPDWORD size)
{
    wcscpy(name, L"a-user-of-forty-letters-0123456789012345");
    *size = 41;
    return TRUE;
}

BOOL KeepGoing(LPVOID list, BOOL add, LONG status, LPSTR name)
{
    EXPECT_FALSE(add);
    (*static_cast<std::map<std::string, LONG>*>(list))[name] = status;
    return TRUE;
}

BOOL StopAtOnce(LPVOID list, BOOL add, LONG status, LPSTR name)
{
    KeepGoing(list, add, status, name);
    return FALSE;
}

} // namespace

// The library

TEST(ArchiveSccLibrary, LeavesLittleMemoryWhenItIsUnloaded)
{
    EXPECT_LT(LeftByLoading(BuiltFile(L"archive_msscci.dll").c_str()), 10000u);
}

TEST(ArchiveSccLibrary, ExportsThe21FunctionsAndNothingElse)
{
    const SccLibrary library(ArchiveLibrary());
    ASSERT_NE(library.library.Module(), nullptr);

    EXPECT_EQ(library.library.ExportedNames(),
              (Lines{"SccAdd",          "SccAddFromScc", "SccBeginBatch", "SccCheckin",           "SccCheckout",
                     "SccCloseProject", "SccEndBatch",   "SccGet",        "SccGetCommandOptions", "SccGetProjPath",
                     "SccGetVersion",   "SccHistory",    "SccInitialize", "SccOpenProject",       "SccPopulateList",
                     "SccProperties",   "SccQueryInfo",  "SccRunScc",     "SccSetOption",         "SccUncheckout",
                     "SccUninitialize"}));
    EXPECT_EQ(library.getVersion(), 0x00010003) << "1.3";
}

TEST(ArchiveSccLibrary, ReturnsItsNameAndItsCapabilities)
{
    const SccLibrary library(ArchiveLibrary());
    LPVOID context = nullptr;
    TextBuffer<SCC_NAME_SIZE> name("the name under which it is regi");
    TextBuffer<SCC_AUXLABEL_SIZE> label;
    LONG capabilities = 0;
    LONG checkoutComment = 0;
    LONG comment = 0;

    ASSERT_EQ(library.initialize(&context, nullptr, nullptr, name.Get(), &capabilities, label.Get(), &checkoutComment,
                                 &comment),
              SCC_OK);

    EXPECT_EQ(name.Text(), "Archive (MSSCCI)");
    EXPECT_EQ(label.Text(), "Archive:");
    EXPECT_EQ(capabilities, SCC_CAP_HISTORY | SCC_CAP_PROPERTIES | SCC_CAP_GETCOMMANDOPTIONS | SCC_CAP_QUERYINFO |
                                SCC_CAP_GETPROJPATH | SCC_CAP_ADDFROMSCC | SCC_CAP_COMMENTCHECKOUT |
                                SCC_CAP_COMMENTCHECKIN | SCC_CAP_COMMENTADD | SCC_CAP_TEXTOUT | SCC_CAP_BATCH |
                                SCC_CAP_HISTORY_MULTFILE | SCC_CAP_POPULATELIST);
    EXPECT_EQ(checkoutComment, 4096);
    EXPECT_EQ(comment, 4096);
    EXPECT_EQ(library.uninitialize(context), SCC_OK);
}

TEST(ArchiveSccLibrary, DoesNotStartWithoutAPlaceForEachResult)
{
    const SccLibrary library(ArchiveLibrary());
    TextBuffer<SCC_NAME_SIZE> name;
    TextBuffer<SCC_AUXLABEL_SIZE> label;
    LONG number = 0;
    for (int missing = 0; missing < 6; ++missing)
    {
        LPVOID context = nullptr;
        EXPECT_EQ(library.initialize(missing == 0 ? nullptr : &context, nullptr, "test",
                                     missing == 1 ? nullptr : name.Get(), missing == 2 ? nullptr : &number,
                                     missing == 3 ? nullptr : label.Get(), missing == 4 ? nullptr : &number,
                                     missing == 5 ? nullptr : &number),
                  SCC_E_INITIALIZEFAILED)
            << missing;
        EXPECT_EQ(context, nullptr);
    }
}

TEST_F(ArchiveSccSessions, RefuseAContextThatIsNoSession)
{
    LPVOID ended = nullptr;
    {
        const Session session(m_library);
        ended = session.context;
    }
    int foreign = 0;
    Names names{m_project.Write(L"a.txt", "x")};
    TextBuffer<SCC_PRJPATH_SIZE> text;
    LONG status = Unwritten;
    BOOL isNew = TRUE;
    LPCSTR* files = nullptr;
    LPCMDOPTS block = nullptr;
    for (const LPVOID context : {LPVOID(nullptr), LPVOID(&foreign), ended})
    {
        EXPECT_EQ(m_library.openProject(context, nullptr, text.Get(), "", Ansi(m_project.Text()).c_str(), text.Get(),
                                        "", Output, 0),
                  SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.closeProject(context), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.getProjPath(context, nullptr, text.Get(), text.Get(), text.Get(), text.Get(), TRUE, &isNew),
                  SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.get(context, nullptr, 1, names.Get(), 0, nullptr), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.checkout(context, nullptr, 1, names.Get(), "", 0, nullptr), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.uncheckout(context, nullptr, 1, names.Get(), 0, nullptr), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.checkin(context, nullptr, 1, names.Get(), "", 0, nullptr), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.add(context, nullptr, 1, names.Get(), "", &status, nullptr), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.history(context, nullptr, 1, names.Get(), 0, nullptr), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.properties(context, nullptr, *names.Get()), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.queryInfo(context, 1, names.Get(), &status), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.populateList(context, SCC_COMMAND_GET, 1, names.Get(), KeepGoing, nullptr, &status, 0),
                  SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.runScc(context, nullptr, 0, nullptr), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.getCommandOptions(context, nullptr, SCC_COMMAND_OPTIONS, &block), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.addFromScc(context, nullptr, &status, &files), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.setOption(context, SCC_OPT_SHARESUBPROJ, 1), SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(m_library.uninitialize(context), SCC_E_INITIALIZEFAILED);
    }
}

TEST_F(ArchiveSccSessions, HaveProjectsAndUsersOfTheirOwn)
{
    const ArchiveProject other;
    ASSERT_EQ(m_anna.Make(m_project.Text()), SCC_OK);
    ASSERT_EQ(m_ben.Make(other.Text()), SCC_OK);
    const std::wstring annas = m_project.Write(L"a.txt", "x");
    const std::wstring bens = other.Write(L"b.txt", "x");

    EXPECT_EQ(m_anna.Add({annas}), SCC_OK);
    EXPECT_EQ(m_ben.Add({bens}), SCC_OK);
    EXPECT_EQ(m_ben.Add({annas}), SCC_E_INVALIDFILEPATH);
    EXPECT_EQ(m_library.closeProject(m_anna.context), SCC_OK);

    EXPECT_EQ(m_ben.History({bens}), SCC_OK);
    EXPECT_TRUE(Shows(infos, "  ben  added"));
}

TEST_F(ArchiveSccSessions, FinishACallWhoseHostEndsThemFromTheCallback)
{
    static const SccLibrary* library;
    static LPVOID context;
    static std::vector<std::unique_ptr<Session>>* later;
    std::vector<std::unique_ptr<Session>> sessions;
    library = &m_library;
    context = m_anna.context;
    later = &sessions;
    // If the ended session were freed at once, the new ones would overwrite its memory.
    const LPTEXTOUTPROC endAll = [](LPCSTR text, LONG kind) {
        if (library->uninitialize(context) == SCC_OK)
        {
            std::generate_n(std::back_inserter(*later), 10, [] { return std::make_unique<Session>(*library); });
        }
        return Output(text, kind);
    };
    const std::wstring file = m_project.Write(L"a.txt", "x");
    ASSERT_EQ(m_anna.Make(m_project.Text(), endAll), SCC_OK);
    ASSERT_EQ(m_anna.Add({file}), SCC_OK);

    EXPECT_EQ(m_anna.History({file}), SCC_OK);

    EXPECT_EQ(infos.size(), 2u);
    EXPECT_EQ(m_anna.History({file}), SCC_E_INITIALIZEFAILED);
}

// Opening a project

TEST_F(ArchiveSccSessions, MakeAProjectOnlyWhenItWasChosen)
{
    const std::wstring folder = m_project.Text();
    ASSERT_EQ(m_anna.Open(folder), SCC_E_PROJSYNTAXERR);
    EXPECT_FALSE(HasArchive(m_project));

    ASSERT_EQ(m_anna.Choose(), SCC_OK);
    EXPECT_FALSE(HasArchive(m_project));
    EXPECT_EQ(m_anna.user.Text(), "anna");
    EXPECT_EQ(m_anna.projectName.Text(), Ansi(std::filesystem::path(folder).filename()));
    EXPECT_EQ(m_anna.localPath.Text(), Ansi(folder));
    EXPECT_EQ(m_anna.auxPath.Text(), ".archive");
    EXPECT_EQ(m_anna.isNew, TRUE);

    m_anna.projectName.Set("");
    m_anna.auxPath.Set("Archive:");
    ASSERT_EQ(m_anna.Open(folder), SCC_OK); // with the texts of the first time
    EXPECT_TRUE(HasArchive(m_project));
    EXPECT_EQ(m_anna.auxPath.Text(), ".archive");
    EXPECT_EQ(m_anna.Add({m_project.Write(L"a.txt", "x")}), SCC_OK);
}

TEST_F(ArchiveSccSessions, NeverMakeAProjectSilentlyOrUnasked)
{
    EXPECT_EQ(m_anna.Open(m_project.Text(), SCC_OP_CREATEIFNEW | SCC_OP_SILENTOPEN), SCC_E_UNKNOWNPROJECT);
    ASSERT_EQ(m_anna.Choose(), SCC_OK);
    EXPECT_EQ(m_anna.Open(m_project.Text(), 0), SCC_E_UNKNOWNPROJECT);

    const ArchiveProject other;
    EXPECT_EQ(m_anna.Open(other.Text()), SCC_E_PROJSYNTAXERR);
    EXPECT_FALSE(HasArchive(m_project));
    EXPECT_FALSE(HasArchive(other));
}

TEST_F(ArchiveSccSessions, ChooseTheFolderThatWasRefusedBeforeAnOlderLocalPath)
{
    const ArchiveProject older;
    ASSERT_EQ(m_anna.Make(older.Text()), SCC_OK);
    ASSERT_EQ(m_library.closeProject(m_anna.context), SCC_OK);
    ASSERT_EQ(m_anna.localPath.Text(), Ansi(older.Text()));

    EXPECT_EQ(m_anna.Make(m_project.Text()), SCC_OK);
    EXPECT_EQ(m_anna.localPath.Text(), Ansi(m_project.Text()));
    EXPECT_TRUE(HasArchive(m_project));
}

TEST_F(ArchiveSccSessions, ChooseTheLocalPathWhenItMayNotBeChanged)
{
    const ArchiveProject refused;
    ASSERT_EQ(m_anna.Open(refused.Text()), SCC_E_PROJSYNTAXERR);
    const std::string path = Ansi(m_project.Text()) + "\\";
    m_anna.localPath.Set(path);

    ASSERT_EQ(m_anna.Choose(FALSE), SCC_OK);

    EXPECT_EQ(m_anna.localPath.Text(), path);
    EXPECT_EQ(m_anna.projectName.Text(), Ansi(std::filesystem::path(m_project.Text()).filename()));
    EXPECT_EQ(m_anna.Open(m_project.Text() + L"\\"), SCC_OK);
}

TEST_F(ArchiveSccSessions, ChooseNothingWithoutAFolder)
{
    EXPECT_EQ(m_anna.Choose(TRUE), SCC_E_OPNOTPERFORMED);
    ASSERT_EQ(m_anna.Open(m_project.Text()), SCC_E_PROJSYNTAXERR);
    EXPECT_EQ(m_anna.Choose(FALSE), SCC_E_OPNOTPERFORMED);
    m_anna.localPath.Set(Ansi(m_project.File(L"missing")));
    EXPECT_EQ(m_anna.Choose(FALSE), SCC_E_ACCESSFAILURE);
}

TEST_F(ArchiveSccSessions, ChooseAKnownProjectAsNotNewAndNoNewOneWhenTheHostWantsNone)
{
    m_anna.localPath.Set(Ansi(m_project.Text()));
    m_anna.isNew = FALSE;
    EXPECT_EQ(m_anna.Choose(), SCC_E_UNKNOWNPROJECT);
    EXPECT_EQ(m_anna.Open(m_project.Text()), SCC_E_PROJSYNTAXERR);

    ASSERT_EQ(m_ben.Make(m_project.Text()), SCC_OK);
    m_anna.isNew = TRUE;
    EXPECT_EQ(m_anna.Choose(), SCC_OK);
    EXPECT_EQ(m_anna.isNew, FALSE);
}

TEST_F(ArchiveSccSessions, EmptyALocalPathThatTheirFolderDoesNotFitInto)
{
    const std::wstring folder = m_project.File(std::wstring(200, L'x') + L'\\' + std::wstring(200, L'y'));
    ASSERT_TRUE(std::filesystem::create_directories(L"\\\\?\\" + folder));
    m_anna.localPath.Set("C:\\older");

    EXPECT_EQ(m_anna.Make(folder), SCC_OK);

    EXPECT_EQ(m_anna.localPath.Text(), "");
    EXPECT_EQ(m_anna.projectName.Text(), std::string(200, 'y'));
}

TEST_F(ArchiveSccSessions, OpenAKnownProjectWhateverNamesTheHostHasForIt)
{
    ASSERT_EQ(m_ben.Make(m_project.Text()), SCC_OK);
    m_anna.projectName.Set(std::string(SCC_PRJPATH_SIZE - 1, 'p'));
    m_anna.auxPath.Set(std::string(31, 'q'));

    EXPECT_EQ(m_anna.Open(m_project.Text(), SCC_OP_SILENTOPEN), SCC_OK);
    EXPECT_EQ(m_anna.auxPath.Text(), ".archive");
}

TEST_F(ArchiveSccSessions, OpenAProjectWithALinkToAnArchive)
{
    ASSERT_EQ(m_ben.Make(m_project.Text()), SCC_OK);
    const ArchiveProject other;
    const std::filesystem::path archive = m_project.Path(L".archive");
    other.Write(L".archive", "orvix-archive-link 1\n" + archive.string() + "\n");
    ASSERT_EQ(m_ben.Add({m_project.Write(L"a.txt", "x")}), SCC_OK);

    EXPECT_EQ(m_anna.Open(other.Text(), 0), SCC_OK);
    EXPECT_EQ(m_anna.Get({other.File(L"a.txt")}), SCC_OK);
    EXPECT_EQ(other.Read(L"a.txt"), "x");
}

TEST_F(ArchiveSccSessions, OpenOneProjectAtATimeAndCloseItOnce)
{
    EXPECT_EQ(m_library.closeProject(m_anna.context), SCC_E_PROJNOTOPEN);
    ASSERT_EQ(m_anna.Make(m_project.Text()), SCC_OK);
    EXPECT_EQ(m_anna.Open(m_project.Text()), SCC_E_PROJECTALREADYOPEN);

    EXPECT_EQ(m_library.closeProject(m_anna.context), SCC_OK);
    EXPECT_EQ(m_library.closeProject(m_anna.context), SCC_E_PROJNOTOPEN);
    EXPECT_EQ(m_anna.Open(m_project.Text()), SCC_OK);
}

TEST_F(ArchiveSccSessions, GiveTheReasonWhyAFolderIsNotOpened)
{
    EXPECT_EQ(m_anna.Open(m_project.File(L"missing")), SCC_E_ACCESSFAILURE);
    EXPECT_EQ(m_anna.Open(L"relative"), SCC_E_INVALIDFILEPATH);

    ASSERT_EQ(errors.size(), 2u);
    EXPECT_TRUE(Shows(errors, "The folder cannot be opened"));
    EXPECT_TRUE(Shows(errors, "Not a full path"));
}

TEST_F(ArchiveSccSessions, FailWhenATextOfTheInterfaceIsNull)
{
    ASSERT_EQ(m_ben.Make(m_project.Text()), SCC_OK);
    TextBuffer<SCC_PRJPATH_SIZE> text(Ansi(m_project.Text()));
    for (int missing = 0; missing < 4; ++missing)
    {
        const auto unless = [&](int number) { return missing == number ? nullptr : text.Get(); };
        EXPECT_EQ(m_library.openProject(m_anna.context, nullptr, unless(0), unless(1), unless(2), unless(3), nullptr,
                                        Output, 0),
                  SCC_E_NONSPECIFICERROR)
            << missing;
        EXPECT_EQ(m_library.getProjPath(m_anna.context, nullptr, unless(0), unless(1), unless(2), unless(3), TRUE,
                                        &m_anna.isNew),
                  SCC_E_NONSPECIFICERROR)
            << missing;
    }
    EXPECT_EQ(
        m_library.getProjPath(m_anna.context, nullptr, text.Get(), text.Get(), text.Get(), text.Get(), TRUE, nullptr),
        SCC_E_NONSPECIFICERROR);
}

TEST_F(ArchiveSccSessions, UseTheWindowsUserWhenTheHostNamesNone)
{
    wchar_t name[UNLEN + 1];
    DWORD size = static_cast<DWORD>(std::size(name));
    ASSERT_TRUE(::GetUserNameW(name, &size));
    m_anna.user.Set("");

    ASSERT_EQ(m_anna.Make(m_project.Text()), SCC_OK);
    EXPECT_EQ(m_anna.user.Text(), Ansi(name));
    const std::wstring file = m_project.Write(L"a.txt", "x");
    ASSERT_EQ(m_anna.Add({file}), SCC_OK);
    ASSERT_EQ(m_anna.History({file}), SCC_OK);
    EXPECT_TRUE(Shows(infos, "  " + Ansi(name) + "  added"));
}

TEST_F(ArchiveSccSessions, DoNotReturnAUserNameThatDoesNotFit)
{
    if (IsArchiveIsolated())
    {
        GTEST_SKIP() << "the other process's user name cannot be changed";
    }
    const ImportHook hook(m_library.library.Module(), "GetUserNameW", reinterpret_cast<void*>(&LongUserName));
    ASSERT_TRUE(hook.IsActive());
    m_anna.user.Set("");

    ASSERT_EQ(m_anna.Make(m_project.Text()), SCC_OK);
    EXPECT_EQ(m_anna.user.Text(), "");
    const std::wstring file = m_project.Write(L"a.txt", "x");
    ASSERT_EQ(m_anna.Add({file}), SCC_OK);
    ASSERT_EQ(m_anna.History({file}), SCC_OK);
    EXPECT_TRUE(Shows(infos, "  a-user-of-forty-letters-0123456789012345  added"));
}

TEST_F(ArchiveSccSessions, ReadAUserNameWithoutATerminatorToTheEndOfItsBuffer)
{
    const std::string user(SCC_USER_SIZE, 'u');
    m_anna.user.Set(user);

    ASSERT_EQ(m_anna.Make(m_project.Text()), SCC_OK);
    const std::wstring file = m_project.Write(L"a.txt", "x");
    ASSERT_EQ(m_anna.Add({file}), SCC_OK);
    ASSERT_EQ(m_anna.History({file}), SCC_OK);
    EXPECT_TRUE(Shows(infos, "  " + user + "  added"));
}

TEST_F(ArchiveSccSessions, WorkForAHostWithoutOutput)
{
    ASSERT_EQ(m_anna.Make(m_project.Text(), nullptr), SCC_OK);
    const std::wstring file = m_project.Write(L"a.txt", "x");

    EXPECT_EQ(m_anna.Add({file}), SCC_OK);
    EXPECT_EQ(m_anna.History({file}), SCC_OK);
    EXPECT_EQ(m_anna.Checkin({file}, ""), SCC_E_NOTCHECKEDOUT);
}

// Files

TEST_F(ArchiveScc, RefusesAListThatIsEmptyOrHasANull)
{
    const std::string file = Ansi(Added(L"a.txt", "x"));
    LPCSTR names[] = {file.c_str(), nullptr};
    LONG words[2] = {};
    const std::vector<std::function<SCCRTN(LONG, LPCSTR*)>> operations = {
        [&](LONG n, LPCSTR* all) { return m_library.get(m_anna.context, nullptr, n, all, 0, nullptr); },
        [&](LONG n, LPCSTR* all) { return m_library.checkout(m_anna.context, nullptr, n, all, "", 0, nullptr); },
        [&](LONG n, LPCSTR* all) { return m_library.uncheckout(m_anna.context, nullptr, n, all, 0, nullptr); },
        [&](LONG n, LPCSTR* all) { return m_library.checkin(m_anna.context, nullptr, n, all, "", 0, nullptr); },
        [&](LONG n, LPCSTR* all) { return m_library.add(m_anna.context, nullptr, n, all, "", words, nullptr); },
        [&](LONG n, LPCSTR* all) { return m_library.history(m_anna.context, nullptr, n, all, 0, nullptr); },
        [&](LONG n, LPCSTR* all) { return m_library.queryInfo(m_anna.context, n, all, words); },
        [&](LONG n, LPCSTR* all) {
            return m_library.populateList(m_anna.context, SCC_COMMAND_GET, n, all, KeepGoing, nullptr, words, 0);
        },
    };
    for (std::size_t i = 0; i < operations.size(); ++i)
    {
        EXPECT_EQ(operations[i](0, names), SCC_E_NONSPECIFICERROR) << i;
        EXPECT_EQ(operations[i](-1, names), SCC_E_NONSPECIFICERROR) << i;
        EXPECT_EQ(operations[i](1, nullptr), SCC_E_NONSPECIFICERROR) << i;
        EXPECT_EQ(operations[i](2, names), SCC_E_NONSPECIFICERROR) << i;
    }
    EXPECT_EQ(m_library.add(m_anna.context, nullptr, 1, names, "", nullptr, nullptr), SCC_E_NONSPECIFICERROR);
    EXPECT_EQ(m_library.queryInfo(m_anna.context, 1, names, nullptr), SCC_E_NONSPECIFICERROR);
    EXPECT_EQ(m_library.populateList(m_anna.context, SCC_COMMAND_GET, 1, names, nullptr, nullptr, words, 0),
              SCC_E_NONSPECIFICERROR);
    EXPECT_EQ(
        m_library.populateList(m_anna.context, SCC_COMMAND_GET, 1, names, KeepGoing, nullptr, nullptr, SCC_PL_DIR),
        SCC_E_NONSPECIFICERROR);
    EXPECT_EQ(m_library.properties(m_anna.context, nullptr, nullptr), SCC_E_NONSPECIFICERROR);
    EXPECT_EQ(m_anna.Status(m_project.File(L"a.txt")), SCC_STATUS_CONTROLLED);
}

TEST_F(ArchiveScc, DoesNothingToFilesWithoutAProject)
{
    const std::wstring file = m_project.Write(L"a.txt", "x");
    ASSERT_EQ(m_library.closeProject(m_anna.context), SCC_OK);
    std::vector<LONG> status;
    LONG count = 0;
    LPCSTR* names = nullptr;
    LPCMDOPTS block = nullptr;

    EXPECT_EQ(m_anna.Add({file}), SCC_E_PROJNOTOPEN);
    EXPECT_EQ(m_anna.Get({file}), SCC_E_PROJNOTOPEN);
    EXPECT_EQ(m_anna.Checkout({file}), SCC_E_PROJNOTOPEN);
    EXPECT_EQ(m_anna.Uncheckout({file}), SCC_E_PROJNOTOPEN);
    EXPECT_EQ(m_anna.Checkin({file}, ""), SCC_E_PROJNOTOPEN);
    EXPECT_EQ(m_anna.History({file}), SCC_E_PROJNOTOPEN);
    EXPECT_EQ(m_anna.QueryInfo({file}, status), SCC_E_PROJNOTOPEN);
    EXPECT_EQ(status[0], SCC_STATUS_INVALID);
    EXPECT_EQ(AddFromScc(count, names), SCC_E_PROJNOTOPEN);
    EXPECT_EQ(m_library.getCommandOptions(m_anna.context, nullptr, SCC_COMMAND_OPTIONS, &block), SCC_E_PROJNOTOPEN);
    EXPECT_TRUE(errors.empty());
}

TEST_F(ArchiveScc, AddsEachFileByItsOwnOptionWord)
{
    Names names{m_project.Write(L"a.txt", "a"), m_project.Write(L"b.txt", "b"), m_project.Write(L"c.txt", "c")};
    constexpr LONG BinaryFile = 0x2; // a file type; the archive ignores it
    LONG options[] = {0, SCC_KEEP_CHECKEDOUT, BinaryFile};

    EXPECT_EQ(m_library.add(m_anna.context, nullptr, 3, names.Get(), nullptr, options, nullptr), SCC_OK);

    EXPECT_EQ(m_anna.Status(m_project.File(L"a.txt")) & SCC_STATUS_CHECKEDOUT, 0);
    EXPECT_EQ(m_anna.Status(m_project.File(L"b.txt")) & SCC_STATUS_CHECKEDOUT, SCC_STATUS_CHECKEDOUT);
    EXPECT_EQ(m_anna.Status(m_project.File(L"c.txt")) & SCC_STATUS_CHECKEDOUT, 0);
    EXPECT_TRUE(IsReadOnly(m_project.Path(L"a.txt")));
    EXPECT_FALSE(IsReadOnly(m_project.Path(L"b.txt")));
    EXPECT_TRUE(IsReadOnly(m_project.Path(L"c.txt")));
}

TEST_F(ArchiveScc, ChecksOutAndIn)
{
    const std::wstring file = Added(L"a.txt", "one");

    EXPECT_EQ(m_anna.Checkout({file}), SCC_OK);
    EXPECT_FALSE(IsReadOnly(m_project.Path(L"a.txt")));
    m_project.Write(L"a.txt", "two");
    EXPECT_EQ(m_anna.Checkin({file}, "second", SCC_KEEP_CHECKEDOUT), SCC_OK);
    EXPECT_FALSE(IsReadOnly(m_project.Path(L"a.txt")));
    EXPECT_EQ(m_anna.Checkin({file}, nullptr), SCC_OK);
    EXPECT_TRUE(IsReadOnly(m_project.Path(L"a.txt")));
    EXPECT_EQ(m_anna.Status(file), SCC_STATUS_CONTROLLED);
}

TEST_F(ArchiveScc, UndoesACheckOut)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    m_project.Write(L"a.txt", "changed");

    EXPECT_EQ(m_anna.Uncheckout({file}), SCC_OK);

    EXPECT_EQ(m_project.Read(L"a.txt"), "one");
    EXPECT_EQ(m_anna.Status(file), SCC_STATUS_CONTROLLED);
}

TEST_F(ArchiveScc, HasAResultAndAMessageForEachKindOfFailure)
{
    const std::wstring held = CheckedOut(L"held.txt", "x");
    const std::wstring added = Added(L"added.txt", "x");
    const std::wstring changed = Added(L"changed.txt", "x");
    m_project.Overwrite(m_project.Path(L"changed.txt"), "y");

    EXPECT_EQ(m_ben.Checkout({held}), SCC_E_FILEOUTEXCLUSIVE);
    EXPECT_EQ(m_ben.Checkin({added}, ""), SCC_E_NOTCHECKEDOUT);
    EXPECT_EQ(m_ben.Get({changed}), SCC_E_OPNOTPERFORMED);
    EXPECT_EQ(m_ben.Get({m_project.Write(L"new.txt", "x")}), SCC_E_FILENOTCONTROLLED);
    EXPECT_EQ(m_ben.Add({added}), SCC_E_FILEALREADYEXISTS);
    EXPECT_EQ(m_ben.Add({m_project.File(L"missing.txt")}), SCC_E_FILENOTEXIST);
    EXPECT_EQ(m_ben.Add({m_project.File(L"..\\a.txt")}), SCC_E_INVALIDFILEPATH);
    Delete(L"added.txt");
    EXPECT_EQ(m_ben.Checkout({added}), SCC_E_OPNOTPERFORMED);
    DamageAllRecords();
    EXPECT_EQ(m_ben.Get({added}), SCC_E_NONSPECIFICERROR);

    ASSERT_EQ(errors.size(), 9u);
    EXPECT_EQ(errors[0], Ansi(held) + ": Checked out by anna");
    EXPECT_TRUE(infos.empty());
}

TEST_F(ArchiveScc, SaysThatAFileCannotBeReadWhileAnotherProgramHasItOpen)
{
    const std::wstring file = m_project.Write(L"a.txt", "x");
    const UniqueFile writer(
        CreateFileW(file.c_str(), GENERIC_WRITE, FILE_SHARE_READ, nullptr, OPEN_EXISTING, 0, nullptr));
    ASSERT_TRUE(writer);
    EXPECT_EQ(m_anna.Add({file}), SCC_E_ACCESSFAILURE);
}

TEST_F(ArchiveScc, GoesOnAfterAFileThatFailsAndReturnsItsResult)
{
    const std::wstring good = m_project.Write(L"good.txt", "x");

    EXPECT_EQ(m_anna.Add({m_project.File(L"missing.txt"), good, m_project.File(L".archive\\x")}), SCC_E_FILENOTEXIST);

    EXPECT_EQ(m_anna.Status(good), SCC_STATUS_CONTROLLED);
    EXPECT_EQ(errors.size(), 2u);
}

TEST_F(ArchiveScc, RefusesToAddItsOwnFiles)
{
    const std::wstring own = m_project.File(L".archive\\archive.txt");
    const std::wstring leftOver = m_project.Write(L".archive.tmp", "x");

    EXPECT_EQ(m_anna.Status(own), SCC_STATUS_NOTCONTROLLED);
    EXPECT_EQ(m_anna.Status(leftOver), SCC_STATUS_NOTCONTROLLED);
    EXPECT_EQ(m_anna.Add({own, leftOver}), SCC_E_INVALIDFILEPATH);

    EXPECT_EQ(errors, (Lines{Ansi(own) + ": The file belongs to the archive itself",
                             Ansi(leftOver) + ": The file belongs to the archive itself"}));
}

TEST_F(ArchiveScc, GetsFilesAndWholeFolders)
{
    for (const wchar_t* name : {L"a.txt", L"sub\\b.txt", L"sub\\deep\\c.txt", L"subway\\d.txt"})
    {
        Added(name, "x");
    }
    for (const wchar_t* name : {L"a.txt", L"sub\\b.txt", L"sub\\deep\\c.txt", L"subway\\d.txt"})
    {
        Delete(name);
    }
    const auto isThere = [&](const wchar_t* name) { return std::filesystem::exists(m_project.Path(name)); };

    EXPECT_EQ(m_anna.Get({m_project.File(L"a.txt")}), SCC_OK);
    EXPECT_TRUE(isThere(L"a.txt"));
    EXPECT_EQ(m_anna.Get({m_project.File(L"SUB\\")}, SCC_GET_ALL), SCC_OK);
    EXPECT_TRUE(isThere(L"sub\\b.txt"));
    EXPECT_FALSE(isThere(L"sub\\deep\\c.txt"));
    EXPECT_EQ(m_anna.Get({m_project.File(L"sub")}, SCC_GET_ALL | SCC_GET_RECURSIVE), SCC_OK);
    EXPECT_TRUE(isThere(L"sub\\deep\\c.txt"));
    EXPECT_FALSE(isThere(L"subway\\d.txt"));
    EXPECT_EQ(m_anna.Get({m_project.Text()}, SCC_GET_ALL | SCC_GET_RECURSIVE), SCC_OK);
    EXPECT_TRUE(isThere(L"subway\\d.txt"));
    EXPECT_EQ(m_anna.Get({m_project.File(L"..")}, SCC_GET_ALL), SCC_E_INVALIDFILEPATH);
}

TEST_F(ArchiveScc, ChecksOutWholeFolders)
{
    const std::wstring direct = Added(L"sub\\a.txt", "x");
    const std::wstring deep = Added(L"sub\\deep\\b.txt", "x");

    EXPECT_EQ(m_anna.Checkout({m_project.File(L"sub")}, SCC_GET_ALL), SCC_OK);

    EXPECT_NE(m_anna.Status(direct) & SCC_STATUS_CHECKEDOUT, 0);
    EXPECT_EQ(m_anna.Status(deep) & SCC_STATUS_CHECKEDOUT, 0);
}

TEST_F(ArchiveScc, UsesTextInTheAnsiCodePage)
{
    const std::wstring file = m_project.Write(L"Stück.txt", "x");
    ASSERT_EQ(m_anna.Add({file}, 0, Ansi(L"für später").c_str()), SCC_OK);

    ASSERT_EQ(m_anna.History({file}), SCC_OK);

    EXPECT_EQ(infos.at(0), Ansi(L"Stück.txt"));
    EXPECT_TRUE(Shows(infos, Ansi(L"  für später")));
}

// Status

TEST_F(ArchiveScc, GivesEveryStateItsStatusBits)
{
    const std::wstring held = CheckedOut(L"held.txt", "x");
    const std::wstring changed = CheckedOut(L"changed.txt", "x");
    m_project.Write(L"changed.txt", "other");
    const std::wstring missing = Added(L"missing.txt", "x");
    Delete(L"missing.txt");
    const std::wstring plain = Added(L"plain.txt", "x");
    const std::wstring unknown = m_project.Write(L"unknown.txt", "x");
    const std::wstring outside = L"C:\\outside.txt";

    std::vector<LONG> status;
    ASSERT_EQ(m_anna.QueryInfo({held, changed, missing, plain, unknown, outside}, status), SCC_OK);
    EXPECT_EQ(status, (std::vector<LONG>{Mine, Mine | SCC_STATUS_MODIFIED, SCC_STATUS_CONTROLLED | SCC_STATUS_OUTOFDATE,
                                         SCC_STATUS_CONTROLLED, SCC_STATUS_NOTCONTROLLED, SCC_STATUS_NOTCONTROLLED}));
    EXPECT_EQ(status[0] & (SCC_STATUS_CHECKEDOUT | SCC_STATUS_OUTOTHER), SCC_STATUS_CHECKEDOUT);
    ASSERT_EQ(m_ben.QueryInfo({held, changed}, status), SCC_OK);
    EXPECT_EQ(status, (std::vector<LONG>{Others, Others | SCC_STATUS_MODIFIED}));
}

TEST_F(ArchiveScc, MarksEveryStatusAsUnknownWhenOneFails)
{
    const std::wstring damaged = Added(L"a.txt", "x");
    DamageAllRecords();
    std::vector<LONG> status;

    EXPECT_EQ(m_anna.QueryInfo({m_project.Write(L"good.txt", "x"), damaged}, status), SCC_E_NONSPECIFICERROR);

    EXPECT_EQ(status, (std::vector<LONG>{SCC_STATUS_INVALID, SCC_STATUS_INVALID}));
    EXPECT_TRUE(Shows(errors, Ansi(damaged)));
}

TEST_F(ArchiveScc, RemovesFilesFromTheListThatACommandIsNotFor)
{
    const std::string held = Ansi(CheckedOut(L"held.txt", "x"));
    const std::string plain = Ansi(Added(L"plain.txt", "x"));
    const std::string unknown = Ansi(m_project.Write(L"unknown.txt", "x"));
    using Removed = std::map<std::string, LONG>;
    constexpr auto Remove = static_cast<SCCCOMMAND>(5); // which the archive does not offer
    const auto removedFor = [&](SCCCOMMAND command) {
        Names names{m_project.File(L"held.txt"), m_project.File(L"plain.txt"), m_project.File(L"unknown.txt")};
        std::vector<LONG> status(3);
        Removed removed;
        EXPECT_EQ(
            m_library.populateList(m_anna.context, command, 3, names.Get(), KeepGoing, &removed, status.data(), 0),
            SCC_OK);
        EXPECT_EQ(status, (std::vector<LONG>{Mine, SCC_STATUS_CONTROLLED, SCC_STATUS_NOTCONTROLLED}));
        return removed;
    };

    EXPECT_EQ(removedFor(SCC_COMMAND_GET), (Removed{{unknown, SCC_STATUS_NOTCONTROLLED}}));
    EXPECT_EQ(removedFor(SCC_COMMAND_HISTORY), (Removed{{unknown, SCC_STATUS_NOTCONTROLLED}}));
    EXPECT_EQ(removedFor(SCC_COMMAND_PROPERTIES), (Removed{{unknown, SCC_STATUS_NOTCONTROLLED}}));
    EXPECT_EQ(removedFor(SCC_COMMAND_CHECKOUT), (Removed{{unknown, SCC_STATUS_NOTCONTROLLED}, {held, Mine}}));
    EXPECT_EQ(removedFor(SCC_COMMAND_CHECKIN),
              (Removed{{unknown, SCC_STATUS_NOTCONTROLLED}, {plain, SCC_STATUS_CONTROLLED}}));
    EXPECT_EQ(removedFor(SCC_COMMAND_UNCHECKOUT),
              (Removed{{unknown, SCC_STATUS_NOTCONTROLLED}, {plain, SCC_STATUS_CONTROLLED}}));
    EXPECT_EQ(removedFor(SCC_COMMAND_ADD), (Removed{{held, Mine}, {plain, SCC_STATUS_CONTROLLED}}));
    EXPECT_EQ(removedFor(Remove),
              (Removed{{unknown, SCC_STATUS_NOTCONTROLLED}, {held, Mine}, {plain, SCC_STATUS_CONTROLLED}}));
}

TEST_F(ArchiveScc, AddsTheFilesOfFoldersToTheList)
{
    const std::string held = Ansi(CheckedOut(L"sub\\held.txt", "x"));
    const std::string gone = Ansi(Added(L"sub\\deep\\gone.txt", "x"));
    Added(L"outside.txt", "x");
    m_project.Write(L"sub\\unknown.txt", "x");
    SetFileAttributesA(gone.c_str(), FILE_ATTRIBUTE_NORMAL);
    ASSERT_TRUE(std::filesystem::remove(gone));
    using Added = std::map<std::string, LONG>;
    const auto addedFor = [&](SCCCOMMAND command) {
        constexpr auto add = [](LPVOID data, BOOL isAdded, LONG status, LPSTR name) -> BOOL {
            EXPECT_TRUE(isAdded);
            static_cast<Added*>(data)->emplace(name, status);
            return TRUE;
        };
        Names names{m_project.File(L"sub")};
        LONG status = 0;
        Added added;
        EXPECT_EQ(m_library.populateList(m_anna.context, command, 1, names.Get(), add, &added, &status, SCC_PL_DIR),
                  SCC_OK);
        EXPECT_EQ(status, SCC_STATUS_INVALID);
        return added;
    };

    constexpr LONG Missing = SCC_STATUS_CONTROLLED | SCC_STATUS_OUTOFDATE;
    EXPECT_EQ(addedFor(SCC_COMMAND_GET), (Added{{held, Mine}, {gone, Missing}}));
    EXPECT_EQ(addedFor(SCC_COMMAND_CHECKIN), (Added{{held, Mine}}));
    EXPECT_EQ(addedFor(SCC_COMMAND_ADD), Added());
}

TEST_F(ArchiveScc, StopsListingWhenTheHostSaysSo)
{
    Names names{m_project.Write(L"a.txt", "x"), m_project.Write(L"b.txt", "x")};
    LONG status[2] = {};
    std::map<std::string, LONG> removed;

    EXPECT_EQ(m_library.populateList(m_anna.context, SCC_COMMAND_GET, 2, names.Get(), StopAtOnce, &removed, status, 0),
              SCC_I_OPERATIONCANCELED);
    EXPECT_EQ(removed.size(), 1u);

    Added(L"sub\\a.txt", "x");
    Added(L"sub\\b.txt", "x");
    Names folder{m_project.File(L"sub")};
    int added = 0;
    constexpr auto stop = [](LPVOID count, BOOL, LONG, LPSTR) -> BOOL {
        ++*static_cast<int*>(count);
        return FALSE;
    };
    EXPECT_EQ(
        m_library.populateList(m_anna.context, SCC_COMMAND_GET, 1, folder.Get(), stop, &added, status, SCC_PL_DIR),
        SCC_I_OPERATIONCANCELED);
    EXPECT_EQ(added, 1);
}

// Texts

TEST_F(ArchiveScc, ShowsTheHistoryOfManyFilesLineByLineNewestFirst)
{
    const std::wstring file = CheckedOut(L"sub\\a.txt", "one");
    ASSERT_EQ(m_anna.Checkin({file}, "first line\r\nsecond line"), SCC_OK);
    const std::wstring other = Added(L"b.txt", "x");

    EXPECT_EQ(m_ben.History({file, other}), SCC_OK);

    ASSERT_EQ(infos.size(), 6u);
    EXPECT_EQ(infos[0], "sub/a.txt");
    EXPECT_EQ(infos[1].substr(0, 5), "  2  ");
    EXPECT_EQ(infos[1].substr(25), "  anna  first line");
    EXPECT_EQ(infos[2], "     second line");
    EXPECT_EQ(infos[3].substr(0, 5), "  1  ");
    EXPECT_EQ(infos[4], "b.txt");
    EXPECT_EQ(infos[5].substr(25), "  anna  added");
}

TEST_F(ArchiveScc, StopsTheHistoryWhenTheHostWantsNoMore)
{
    const std::wstring file = Added(L"a.txt", "x");
    wantsNoMore = true;

    EXPECT_EQ(m_anna.History({file, Added(L"b.txt", "x")}), SCC_I_OPERATIONCANCELED);
    EXPECT_EQ(infos, (Lines{"a.txt"}));
}

TEST_F(ArchiveScc, FailsInTheHistoryOfAnUnknownFileAndShowsTheOthers)
{
    const std::wstring file = Added(L"a.txt", "x");

    EXPECT_EQ(m_anna.History({m_project.File(L"unknown.txt"), file}), SCC_E_FILENOTCONTROLLED);
    EXPECT_TRUE(Shows(infos, "a.txt"));
    EXPECT_EQ(errors.size(), 1u);
}

TEST_F(ArchiveScc, ShowsTheProperties)
{
    const std::wstring file = CheckedOut(L"a.txt", "three");

    EXPECT_EQ(m_library.properties(m_ben.context, nullptr, Ansi(file).c_str()), SCC_OK);

    EXPECT_EQ(infos.at(0), "a.txt");
    EXPECT_TRUE(Shows(infos, "  size         5 bytes"));
    EXPECT_TRUE(Shows(infos, "  anna"));
    EXPECT_EQ(m_library.properties(m_ben.context, nullptr, Ansi(m_project.File(L"b.txt")).c_str()),
              SCC_E_FILENOTCONTROLLED);
}

TEST_F(ArchiveScc, ShowsTheArchiveAndTheUserAsItsOptions)
{
    LPCMDOPTS block = nullptr;
    EXPECT_EQ(m_library.getCommandOptions(m_ben.context, nullptr, SCC_COMMAND_OPTIONS, nullptr), SCC_I_ADV_SUPPORT);
    EXPECT_TRUE(infos.empty());

    EXPECT_EQ(m_library.getCommandOptions(m_ben.context, nullptr, SCC_COMMAND_OPTIONS, &block), SCC_OK);

    ASSERT_EQ(infos.size(), 2u);
    EXPECT_TRUE(std::filesystem::equivalent(infos[0].substr(9), m_project.Path(L".archive"))) << infos[0];
    EXPECT_EQ(infos[0].substr(0, 9), "archive  ");
    EXPECT_EQ(infos[0].find('?'), std::string::npos);
    EXPECT_EQ(infos[1], "user     ben");
    EXPECT_EQ(block, nullptr);
    EXPECT_EQ(m_library.getCommandOptions(m_ben.context, nullptr, SCC_COMMAND_GET, nullptr), SCC_E_OPNOTSUPPORTED);
}

TEST_F(ArchiveScc, HasNoProgramOfItsOwn)
{
    EXPECT_EQ(m_library.runScc(m_anna.context, nullptr, 0, nullptr), SCC_E_OPNOTSUPPORTED);
    EXPECT_EQ(errors.size(), 1u);
}

TEST_F(ArchiveScc, IsSilentAfterTheProjectIsClosed)
{
    ASSERT_EQ(m_library.closeProject(m_anna.context), SCC_OK);
    EXPECT_EQ(m_library.runScc(m_anna.context, nullptr, 0, nullptr), SCC_E_OPNOTSUPPORTED);
    EXPECT_TRUE(errors.empty());
}

TEST_F(ArchiveScc, EndsEachBatchOnceAndNestsNone)
{
    EXPECT_EQ(m_library.endBatch(), SCC_E_OPNOTPERFORMED);
    EXPECT_EQ(m_library.beginBatch(), SCC_OK);
    EXPECT_EQ(m_library.beginBatch(), SCC_E_OPNOTPERFORMED);
    EXPECT_EQ(m_library.endBatch(), SCC_OK);
    EXPECT_EQ(m_library.endBatch(), SCC_E_OPNOTPERFORMED);
}

// Files from the archive

TEST_F(ArchiveScc, GetsTheFilesThatAreMissingInTheWorkingFolder)
{
    Added(L"there.txt", "x");
    Added(L"sub\\a.txt", "a");
    Added(L"b.txt", "b");
    Delete(L"sub\\a.txt");
    Delete(L"b.txt");
    LONG count = 7;
    LPCSTR* names = nullptr;

    ASSERT_EQ(m_library.setOption(m_anna.context, SCC_OPT_SHARESUBPROJ, 1), SCC_I_SHARESUBPROJOK);
    ASSERT_EQ(AddFromScc(count, names), SCC_OK);

    ASSERT_EQ(count, 2);
    EXPECT_EQ(names[0], Ansi(m_project.File(L"b.txt")));
    EXPECT_EQ(names[1], Ansi(m_project.File(L"sub\\a.txt")));
    EXPECT_EQ(m_project.Read(L"sub\\a.txt"), "a");
    EXPECT_EQ(m_library.addFromScc(m_anna.context, nullptr, nullptr, &names), SCC_OK);
    EXPECT_EQ(m_library.addFromScc(m_anna.context, nullptr, nullptr, nullptr), SCC_OK);

    count = 0;
    EXPECT_EQ(AddFromScc(count, names), SCC_OK);
    EXPECT_EQ(count, 0);
    EXPECT_EQ(names, nullptr);
}

TEST_F(ArchiveScc, GetsTheFilesOfTheFolderThatTheHostNames)
{
    for (const wchar_t* name : {L"a.txt", L"sub\\b.txt", L"sub\\deep\\c.txt"})
    {
        Added(name, "x");
        Delete(name);
    }
    Names folder{m_project.File(L"sub")};
    LONG count = 1;
    LPCSTR* names = folder.Get();

    ASSERT_EQ(AddFromScc(count, names), SCC_OK);

    ASSERT_EQ(count, 2);
    EXPECT_EQ(names[0], Ansi(m_project.File(L"sub\\b.txt")));
    EXPECT_EQ(names[1], Ansi(m_project.File(L"sub\\deep\\c.txt")));
    EXPECT_FALSE(std::filesystem::exists(m_project.Path(L"a.txt")));

    Names elsewhere{L"C:\\"};
    count = 1;
    names = elsewhere.Get();
    EXPECT_EQ(AddFromScc(count, names), SCC_E_INVALIDFILEPATH);
    EXPECT_EQ(count, 0);
    EXPECT_EQ(m_library.addFromScc(m_anna.context, nullptr, &count, nullptr), SCC_E_NONSPECIFICERROR);
}

TEST_F(ArchiveScc, GetsTheOthersWhenAFileFails)
{
    Added(L"lost.txt", "lost");
    for (const auto& entry : std::filesystem::recursive_directory_iterator(m_project.Path(L".archive\\contents")))
    {
        if (entry.is_regular_file())
        {
            m_project.Overwrite(entry.path(), "damaged");
        }
    }
    Added(L"good.txt", "good");
    Delete(L"lost.txt");
    Delete(L"good.txt");
    LONG count = 0;
    LPCSTR* names = nullptr;

    EXPECT_EQ(AddFromScc(count, names), SCC_E_NONSPECIFICERROR);

    ASSERT_EQ(count, 1);
    EXPECT_EQ(names[0], Ansi(m_project.File(L"good.txt")));
    EXPECT_TRUE(Shows(errors, "lost.txt"));
    EXPECT_FALSE(std::filesystem::exists(m_project.Path(L"lost.txt")));
}

TEST_F(ArchiveScc, KnowsNoOtherOption)
{
    EXPECT_EQ(m_library.setOption(m_anna.context, 1, 1), SCC_E_OPNOTSUPPORTED);
}

// Both fronts

namespace
{

/// A host of the plug-in that records the lines of output.
class PluginHost final : public IOrvixClientAccess
{
public:
    PluginHost(const wchar_t* user, const ArchiveProject& project)
        : m_library(BuiltFile(L"plugins/archive.dll").c_str()),
          provider(m_library.Export<IOrvixProvider*()>("GetIOrvixProvider")())
    {
        m_info.SetUserName(user);
        m_info.SetIOrvixClientAccess(this);
        EXPECT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
        EXPECT_EQ(provider->OpenProject(project.Text().c_str(), L""), OrvixProviderResult::Success);
    }
    PluginHost(const PluginHost&) = delete;
    PluginHost& operator=(const PluginHost&) = delete;
    ~PluginHost() { m_library.Export<void(IOrvixProvider*)>("ReleaseIOrvixProvider")(provider); }

    void OutputText(const wchar_t* text, int) override { lines.push_back(Ansi(text)); }
    std::intptr_t RelayA(void*, void*, void*, void*) override { return 0; }
    std::uint32_t GetColor(std::int32_t) override { return 0; }
    bool IsUnattended() override { return true; }
    std::intptr_t RelayB(void*, void*, void*, void*) override { return 0; }

    Lines lines;

private:
    LoadedLibrary m_library;
    OrvixClientInfo m_info;

public:
    IOrvixProvider* provider;
};

} // namespace

TEST_F(ArchiveScc, SharesItsVersionsWithThePlugIn)
{
    const std::wstring file = Added(L"a.txt", "one");
    PluginHost carl(L"carl", m_project);
    OrvixFileList list;
    list.CreateEntry(file.c_str(), nullptr, OrvixFileSelection::Selected, 0);
    list.BuildActiveList(OrvixFileSelection::Selected, false);

    ASSERT_EQ(carl.provider->CheckOut(&list, L"carl's turn", 0), OrvixProviderResult::Success);
    EXPECT_EQ(m_anna.Status(file), SCC_STATUS_CONTROLLED | SCC_STATUS_OUTOTHER | SCC_STATUS_OUTEXCLUSIVE);
    EXPECT_EQ(m_anna.Checkout({file}), SCC_E_FILEOUTEXCLUSIVE);
    m_project.Write(L"a.txt", "two");
    ASSERT_EQ(carl.provider->CheckIn(&list, L"by the plug-in", 0), OrvixProviderResult::Success);
    ASSERT_EQ(m_anna.Checkout({file}), SCC_OK);
    ASSERT_EQ(m_anna.Checkin({file}, "by MSSCCI"), SCC_OK);

    ASSERT_EQ(m_anna.History({file}), SCC_OK);
    carl.lines.clear();
    ASSERT_EQ(carl.provider->ShowHistory(&list), OrvixProviderResult::Success);
    EXPECT_EQ(carl.lines, infos);
    EXPECT_EQ(infos.size(), 4u);

    infos.clear();
    carl.lines.clear();
    ASSERT_EQ(m_library.properties(m_anna.context, nullptr, Ansi(file).c_str()), SCC_OK);
    ASSERT_EQ(carl.provider->ShowProperties(&list), OrvixProviderResult::Success);
    EXPECT_EQ(carl.lines, infos);
    EXPECT_TRUE(Shows(infos, "by MSSCCI"));
}

TEST_F(ArchiveScc, DoesNotGetAFileWhoseNameIsNotInTheAnsiCodePage)
{
    const std::wstring file = m_project.Write(L"\x65E5\x0439.txt", "x");
    if (GetACP() == CP_UTF8)
    {
        GTEST_SKIP() << "this code page has every character";
    }
    PluginHost carl(L"carl", m_project);
    OrvixFileList list;
    list.CreateEntry(file.c_str(), nullptr, OrvixFileSelection::Selected, 0);
    list.BuildActiveList(OrvixFileSelection::Selected, false);
    ASSERT_EQ(carl.provider->Add(&list, L"", 0), OrvixProviderResult::Success);
    Delete(L"\x65E5\x0439.txt");
    LONG count = 0;
    LPCSTR* names = nullptr;

    EXPECT_EQ(AddFromScc(count, names), SCC_E_INVALIDFILEPATH);

    EXPECT_EQ(count, 0);
    EXPECT_EQ(errors.size(), 1u);
    EXPECT_FALSE(std::filesystem::exists(file));
}
