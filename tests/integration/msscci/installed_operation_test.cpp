#include "InstalledTest.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"

#include <cstring>
#include <string_view>

using testing::AllOf;
using testing::ElementsAre;
using testing::HasSubstr;

namespace
{

// Operations of RunFileListOperation.
constexpr std::uint32_t CheckIn = 0x2;
constexpr std::uint32_t Add = 0x4;
constexpr std::uint32_t GetLatest = 0x8;
constexpr std::uint32_t CheckOut = 0x10;
constexpr std::uint32_t UndoCheckOut = 0x20;

// What a file allows, in FlagsOut.
constexpr std::uint32_t AllowsCheckIn = 0x10000;
constexpr std::uint32_t AllowsCheckOut = 0x20000;
constexpr std::uint32_t AllowsUndo = 0x40000;
constexpr std::uint32_t AllowsAdd = 0x100000;
constexpr std::uint32_t AllowsGet = 0x200000;

// Bits of the record's options.
constexpr std::uint32_t OptionKeepsCheckedOut = 0x4;
constexpr std::uint32_t OptionGetsLatest = 0x8;

/// A project with three files: a.txt and b.txt in the library's state of the test's choice, new.txt not controlled.
/// Stored answers stand for the user.
class InstalledOperation : public InstalledTest
{
protected:
    static constexpr std::uint32_t DialogPrompt = 7;
    static constexpr std::uint32_t OptionPrompt = 8;

    void SetUp() override
    {
        Install(L"Recorded");
        m_provider = InitializeAndGet();
        ASSERT_NE(m_provider, nullptr);
        m_services->RegisterPrompt(DialogPrompt, L"Go on?", 0x2, 0, true);
        m_services->RegisterPrompt(OptionPrompt, L"The option?", 0x8, 0, true);
        m_params.SetOrvixFileList(&m_files);
        m_params.SetDialogPromptID(DialogPrompt);
        m_params.SetOptionPromptID(OptionPrompt);
        m_params.SetComment(L"a comment");
        for (const wchar_t* name : {L"a.txt", L"new.txt", L"b.txt"})
        {
            WriteBytes(m_project.Path() / name, "local");
            m_files.CreateEntry((m_project.Path() / name).c_str(), nullptr, 0x1, 0);
        }
        ASSERT_EQ(m_files.BuildActiveList(0x1, false), 3u);
        ASSERT_EQ(m_provider->Initialize(&m_info), 0);
        ASSERT_EQ(m_provider->OpenProject(m_project.Text().c_str(), L""), 0);
        m_scc.Take();
    }

    /// Runs with the state of the controlled files; what the library was called with.
    std::vector<std::string> Run(std::uint32_t operations, std::uint32_t mask, LONG status, std::uint32_t options = 0)
    {
        m_scc.queryInfo = [status](LPVOID, LONG count, LPCSTR* names, LPLONG words) {
            for (LONG i = 0; i < count; ++i)
            {
                words[i] = std::string_view(names[i]).ends_with("new.txt") ? 0 : status;
            }
            return SCC_OK;
        };
        m_params.SetOptions(options);
        EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, true, m_provider, operations, mask), 1);
        return m_scc.Take();
    }

    /// The quoted full path of a file.
    std::string File(const char* name) const { return '"' + (m_project.Path() / name).string() + '"'; }
    std::string Controlled() const { return "0x2, [" + File("a.txt") + ", " + File("b.txt") + ']'; }
    std::string Query() const
    {
        return "SccQueryInfo(0x0, 0x3, [" + File("a.txt") + ", " + File("new.txt") + ", " + File("b.txt") +
               "], [0x0, 0x0, 0x0])";
    }

    TempFolder m_project;
    OrvixFileList m_files;
    OrvixFileListDialogParams m_params;
    IOrvixProvider* m_provider = nullptr;
};

} // namespace

TEST_F(InstalledOperation, ChecksOutWhatAllowsIt)
{
    EXPECT_THAT(Run(CheckOut, AllowsCheckOut, SCC_STATUS_CONTROLLED),
                ElementsAre(Query(), "SccCheckout(0x0, 0x0, " + Controlled() + R"(, "a comment", 0x0, 0x0))"));
}

TEST_F(InstalledOperation, ChecksOutBehindAGetThatChangesTheFiles)
{
    m_scc.get = [](LPVOID, HWND, LONG count, LPCSTR* names, LONG, LPCMDOPTS) {
        for (LONG i = 0; i < count; ++i)
        {
            WriteBytes(names[i], "latest");
        }
        return SCC_OK;
    };
    EXPECT_THAT(Run(CheckOut, AllowsCheckOut, SCC_STATUS_CONTROLLED, OptionGetsLatest),
                ElementsAre(Query(), "SccGet(0x0, 0x0, " + Controlled() + ", 0x0, 0x0)",
                            "SccCheckout(0x0, 0x0, " + Controlled() + R"(, "a comment", 0x0, 0x0))"));
    EXPECT_EQ(ReadBytes(m_project.Path() / L"a.txt"), "latest");
    EXPECT_EQ(ReadBytes(m_project.Path() / L"b.txt"), "latest");
    EXPECT_EQ(ReadBytes(m_project.Path() / L"new.txt"), "local");
}

TEST_F(InstalledOperation, ChecksInAndKeepsCheckedOut)
{
    EXPECT_THAT(Run(CheckIn, AllowsCheckIn, SCC_STATUS_CONTROLLED | SCC_STATUS_CHECKEDOUT, OptionKeepsCheckedOut),
                ElementsAre(Query(), "SccCheckin(0x0, 0x0, " + Controlled() + R"(, "a comment", 0x1000, 0x0))"));
    EXPECT_THAT(Run(CheckIn, AllowsCheckIn, SCC_STATUS_CONTROLLED | SCC_STATUS_CHECKEDOUT).back(),
                "SccCheckin(0x0, 0x0, " + Controlled() + R"(, "a comment", 0x0, 0x0))");
}

TEST_F(InstalledOperation, GivesBackAndGetsTheLatest)
{
    EXPECT_THAT(Run(UndoCheckOut, AllowsUndo, SCC_STATUS_CONTROLLED | SCC_STATUS_CHECKEDOUT, OptionGetsLatest),
                ElementsAre(Query(), "SccUncheckout(0x0, 0x0, " + Controlled() + ", 0x0, 0x0)",
                            "SccGet(0x0, 0x0, " + Controlled() + ", 0x0, 0x0)"));
}

TEST_F(InstalledOperation, GetsWhatIsControlled)
{
    EXPECT_THAT(Run(GetLatest, AllowsGet, SCC_STATUS_CONTROLLED | SCC_STATUS_OUTOFDATE),
                ElementsAre(Query(), "SccGet(0x0, 0x0, " + Controlled() + ", 0x0, 0x0)"));
}

TEST_F(InstalledOperation, AddsWhatIsNotControlled)
{
    EXPECT_THAT(
        Run(Add, AllowsAdd, SCC_STATUS_CONTROLLED, OptionKeepsCheckedOut),
        ElementsAre(Query(), "SccAdd(0x0, 0x0, 0x1, [" + File("new.txt") + R"(], "a comment", [0x1000], 0x0))"));
}

TEST_F(InstalledOperation, HasNothingToDoWhereNoFileAllowsIt)
{
    EXPECT_THAT(Run(CheckOut, AllowsCheckOut, SCC_STATUS_CONTROLLED | SCC_STATUS_OUTOTHER), ElementsAre(Query()));
    EXPECT_EQ(m_files.NumActiveEntries(), 3u);
}

TEST_F(InstalledOperation, WorksOnAProjectThatItsSettingsFileNames)
{
    m_services->Shutdown();
    WriteProviders("<a><Name>Recorded</Name><MSSCCProjectFile>project.xml</MSSCCProjectFile></a>");
    WriteBytes(m_project.Path() / L"project.xml",
               "<MSSCCProjectSettings><AuxPath>server:1</AuxPath><ProjectName>$/song</ProjectName>"
               "</MSSCCProjectSettings>");
    m_provider = InitializeAndGet();
    ASSERT_NE(m_provider, nullptr);
    ASSERT_EQ(m_provider->Initialize(&m_info), 0);
    m_scc.Take();
    m_scc.openProject = [](LPVOID, HWND, LPSTR, LPCSTR, LPCSTR, LPSTR auxPath, LPCSTR, LPTEXTOUTPROC, LONG) {
        std::strcpy(auxPath, "server:2");
        return SCC_OK;
    };
    ASSERT_EQ(m_provider->OpenProject(m_project.Text().c_str(), L""), 0);
    EXPECT_THAT(m_scc.Take(), ElementsAre("SccOpenProject(0x0, 0x0, \"\", \"$/song\", \"" + m_project.Path().string() +
                                          "\", \"server:1\", \"\", 0x1)"));

    EXPECT_THAT(Run(CheckOut, AllowsCheckOut, SCC_STATUS_CONTROLLED),
                ElementsAre(Query(), "SccCheckout(0x0, 0x0, " + Controlled() + R"(, "a comment", 0x0, 0x0))"));
    EXPECT_THAT(ReadBytes(m_project.Path() / L"project.xml"),
                AllOf(HasSubstr("<AuxPath>server:2</AuxPath>"), HasSubstr("<ProjectName>$/song</ProjectName>")));
}
