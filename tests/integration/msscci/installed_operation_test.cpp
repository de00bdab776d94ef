#include "InstalledTest.h"
#include "OrvixDialogOption.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixOperation.h"

#include <cstring>
#include <string_view>

using testing::AllOf;
using testing::ElementsAre;
using testing::HasSubstr;

namespace DialogOption = OrvixDialogOption;
namespace Operation = OrvixOperation;
namespace Permission = OrvixFilePermission;

namespace
{

/// A project with three files: a.txt and b.txt are in a state that the test chooses, new.txt is not controlled. Stored
/// answers replace the user.
class InstalledOperation : public InstalledTest
{
protected:
    static constexpr std::uint32_t DialogPrompt = 7;
    static constexpr std::uint32_t OptionPrompt = 8;
    static constexpr unsigned long Everything = 0x2; ///< the host's flag for files to work on

    void SetUp() override
    {
        Install(L"Recorded");
        m_provider = InitializeAndGet();
        ASSERT_NE(m_provider, nullptr);
        m_services->RegisterPrompt(DialogPrompt, L"Go on?", Action::Yes, 0, true);
        m_services->RegisterPrompt(OptionPrompt, L"The option?", Action::OptionChecked, 0, true);
        m_params.SetOrvixFileList(&m_files);
        m_params.SetDialogPromptID(DialogPrompt);
        m_params.SetOptionPromptID(OptionPrompt);
        m_params.SetComment(L"a comment");
        for (const wchar_t* name : {L"a.txt", L"new.txt", L"b.txt"})
        {
            WriteBytes(m_project.Path() / name, "local");
            m_files.CreateEntry((m_project.Path() / name).c_str(), nullptr, Everything, 0);
        }
        ASSERT_EQ(m_files.BuildActiveList(Everything, false), 3u);
        ASSERT_EQ(m_provider->Initialize(&m_info), OrvixProviderResult::Success);
        ASSERT_EQ(m_provider->OpenProject(m_project.Text().c_str(), L""), OrvixProviderResult::Success);
        m_scc.Take();
    }

    /// Runs operations while the controlled files have this status; returns the calls of the library.
    std::vector<std::string> Run(std::uint32_t operations, std::uint32_t flagsOutMask, LONG status,
                                 std::uint32_t options = 0)
    {
        m_scc.queryInfo = [status](LPVOID, LONG count, LPCSTR* names, LPLONG words) {
            for (LONG i = 0; i < count; ++i)
            {
                words[i] = std::string_view(names[i]).ends_with("new.txt") ? SCC_STATUS_NOTCONTROLLED : status;
            }
            return SCC_OK;
        };
        m_params.SetOptions(options);
        EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, true, m_provider, operations, flagsOutMask),
                  OrvixOperationResult::Done);
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
    EXPECT_THAT(Run(Operation::CheckOut, Permission::CheckOut, SCC_STATUS_CONTROLLED),
                ElementsAre(Query(), "SccCheckout(0x0, 0x0, " + Controlled() + R"(, "a comment", 0x0, 0x0))"));
}

TEST_F(InstalledOperation, ChecksOutAfterAGetThatChangesTheFiles)
{
    m_scc.get = [](LPVOID, HWND, LONG count, LPCSTR* names, LONG, LPCMDOPTS) {
        for (LONG i = 0; i < count; ++i)
        {
            WriteBytes(names[i], "latest");
        }
        return SCC_OK;
    };
    EXPECT_THAT(Run(Operation::CheckOut, Permission::CheckOut, SCC_STATUS_CONTROLLED, DialogOption::OfferGetLatest),
                ElementsAre(Query(), "SccGet(0x0, 0x0, " + Controlled() + ", 0x0, 0x0)",
                            "SccCheckout(0x0, 0x0, " + Controlled() + R"(, "a comment", 0x0, 0x0))"));
    EXPECT_EQ(ReadBytes(m_project.Path() / L"a.txt"), "latest");
    EXPECT_EQ(ReadBytes(m_project.Path() / L"b.txt"), "latest");
    EXPECT_EQ(ReadBytes(m_project.Path() / L"new.txt"), "local");
}

TEST_F(InstalledOperation, ChecksInAndKeepsCheckedOut)
{
    EXPECT_THAT(Run(Operation::CheckIn, Permission::CheckIn, SCC_STATUS_CONTROLLED | SCC_STATUS_CHECKEDOUT,
                    DialogOption::OfferKeepCheckedOut),
                ElementsAre(Query(), "SccCheckin(0x0, 0x0, " + Controlled() + R"(, "a comment", 0x1000, 0x0))"));
    EXPECT_THAT(Run(Operation::CheckIn, Permission::CheckIn, SCC_STATUS_CONTROLLED | SCC_STATUS_CHECKEDOUT).back(),
                "SccCheckin(0x0, 0x0, " + Controlled() + R"(, "a comment", 0x0, 0x0))");
}

TEST_F(InstalledOperation, UndoesTheCheckOutAndGetsTheLatest)
{
    EXPECT_THAT(Run(Operation::UndoCheckOut, Permission::UndoCheckOut, SCC_STATUS_CONTROLLED | SCC_STATUS_CHECKEDOUT,
                    DialogOption::OfferGetLatest),
                ElementsAre(Query(), "SccUncheckout(0x0, 0x0, " + Controlled() + ", 0x0, 0x0)",
                            "SccGet(0x0, 0x0, " + Controlled() + ", 0x0, 0x0)"));
}

TEST_F(InstalledOperation, GetsWhatIsControlled)
{
    EXPECT_THAT(Run(Operation::GetLatest, Permission::GetLatest, SCC_STATUS_CONTROLLED | SCC_STATUS_OUTOFDATE),
                ElementsAre(Query(), "SccGet(0x0, 0x0, " + Controlled() + ", 0x0, 0x0)"));
}

TEST_F(InstalledOperation, AddsWhatIsNotControlled)
{
    EXPECT_THAT(
        Run(Operation::Add, Permission::Add, SCC_STATUS_CONTROLLED, DialogOption::OfferKeepCheckedOut),
        ElementsAre(Query(), "SccAdd(0x0, 0x0, 0x1, [" + File("new.txt") + R"(], "a comment", [0x1000], 0x0))"));
}

TEST_F(InstalledOperation, HasNothingToDoWhenNoFileAllowsIt)
{
    EXPECT_THAT(Run(Operation::CheckOut, Permission::CheckOut, SCC_STATUS_CONTROLLED | SCC_STATUS_OUTOTHER),
                ElementsAre(Query()));
    EXPECT_EQ(m_files.NumActiveEntries(), 3u);
}

TEST_F(InstalledOperation, WorksOnTheProjectOfASettingsFile)
{
    m_services->Shutdown();
    WriteProviders("<a><Name>Recorded</Name><MSSCCProjectFile>project.xml</MSSCCProjectFile></a>");
    WriteBytes(m_project.Path() / L"project.xml",
               "<MSSCCProjectSettings><AuxPath>server:1</AuxPath><ProjectName>$/song</ProjectName>"
               "</MSSCCProjectSettings>");
    m_provider = InitializeAndGet();
    ASSERT_NE(m_provider, nullptr);
    ASSERT_EQ(m_provider->Initialize(&m_info), OrvixProviderResult::Success);
    m_scc.Take();
    m_scc.openProject = [](LPVOID, HWND, LPSTR, LPCSTR, LPCSTR, LPSTR auxPath, LPCSTR, LPTEXTOUTPROC, LONG) {
        std::strcpy(auxPath, "server:2");
        return SCC_OK;
    };
    ASSERT_EQ(m_provider->OpenProject(m_project.Text().c_str(), L""), OrvixProviderResult::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre("SccOpenProject(0x0, 0x0, \"\", \"$/song\", \"" + m_project.Path().string() +
                                          "\", \"server:1\", \"\", 0x1)"));

    EXPECT_THAT(Run(Operation::CheckOut, Permission::CheckOut, SCC_STATUS_CONTROLLED),
                ElementsAre(Query(), "SccCheckout(0x0, 0x0, " + Controlled() + R"(, "a comment", 0x0, 0x0))"));
    EXPECT_THAT(ReadBytes(m_project.Path() / L"project.xml"),
                AllOf(HasSubstr("<AuxPath>server:2</AuxPath>"), HasSubstr("<ProjectName>$/song</ProjectName>")));
}
