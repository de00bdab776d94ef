// Commands that a provider carries out by itself, with an installed MSSCCI library, and where providers come from.

#include "BuiltFile.h"
#include "RegistryToolTest.h"

#include <gmock/gmock.h>

namespace
{

using testing::AllOf;
using testing::HasSubstr;

class InstalledLibrary : public RegistryToolTest
{
protected:
    void SetUp() override
    {
        RegistryToolTest::SetUp();
        ASSERT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Talking").code, Success);
    }

    OrvixTool::Result RunInstalled(Arguments arguments)
    {
        arguments.insert(arguments.begin(), {L"--sources", L"msscci"});
        return Run(std::move(arguments));
    }

    /// Makes the library fail as long as it lives.
    class Failing
    {
    public:
        Failing() { SetEnvironmentVariableW(L"ORVIX_TEST_SCC_FAILS", L"1"); }
        Failing(const Failing&) = delete;
        Failing& operator=(const Failing&) = delete;
        ~Failing() { SetEnvironmentVariableW(L"ORVIX_TEST_SCC_FAILS", nullptr); }
    };
};

} // namespace

TEST_F(InstalledLibrary, IsNotLookedForUnlessAskedFor)
{
    EXPECT_EQ(Run({L"providers"}).output, "Index  Provider\n0      Archive\n1      Git\n");
    EXPECT_EQ(Run({L"providers", L"--sources", L"plugins"}).output, "Index  Provider\n0      Archive\n1      Git\n");
}

TEST_F(InstalledLibrary, FollowsThePluginsInWhateverOrderTheSourcesAreNamed)
{
    for (const wchar_t* both : {L"plugins,msscci", L"msscci,plugins"})
    {
        EXPECT_EQ(Run({L"providers", L"--sources", both}).output,
                  "Index  Provider\n0      Archive\n1      Git\n2      Talking\n");
    }
}

TEST_F(InstalledLibrary, NeedsNoPluginFolder)
{
    const auto result = RunInstalled({L"providers", L"--plugins", L"nowhere"});
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(result.output, "Index  Provider\n0      Talking\n");
    EXPECT_EQ(Run({L"providers", L"--plugins", L"nowhere", L"--sources", L"plugins,msscci"}).code, NotFound);
}

TEST_F(InstalledLibrary, OpensAndClosesAProject)
{
    const auto result = RunInstalled({L"open"});
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(result.output, "opened " + Project().string() + " with Talking\nthe project is closed\n");
}

TEST_F(InstalledLibrary, PrintsWhatItSaysToEveryCommand)
{
    EXPECT_EQ(RunInstalled({L"options"}).output, "the options\nthe project is closed\n");
    EXPECT_EQ(RunInstalled({L"client"}).output, "the client\nthe project is closed\n");
    const auto properties = RunInstalled({L"properties", L"sub/a.txt"});
    EXPECT_EQ(properties.output, "the properties of " + File(L"sub\\a.txt").string() + "\nthe project is closed\n");
    EXPECT_EQ(properties.code, Success);
}

TEST_F(InstalledLibrary, ThatFailsIsNamedAndItsTextStillPrinted)
{
    const Failing failing;
    const std::vector<Arguments> commands = {{L"options"}, {L"client"}, {L"properties", L"a.txt"}};
    for (const Arguments& command : commands)
    {
        const auto result = RunInstalled(command);
        EXPECT_EQ(result.code, Failed);
        EXPECT_THAT(result.output, testing::StartsWith("the "));
        EXPECT_THAT(result.errors, HasSubstr(" failed in the provider Talking\n"));
    }
}

TEST_F(InstalledLibrary, ThatIsGoneIsListedButDoesNotStart)
{
    const std::filesystem::path copy = Scratch() / L"gone.dll";
    std::filesystem::copy_file(ORVIX_TALKING_MSSCCI, copy);
    ASSERT_EQ(Register(copy, L"Talking").code, Success);
    std::filesystem::remove(copy);
    EXPECT_THAT(Providers().output, HasSubstr("Talking"));
    const auto result = RunInstalled({L"open"});
    EXPECT_EQ(result.code, NotFound);
    EXPECT_EQ(result.errors, "orvix: the provider does not start: Talking\n");
}

TEST_F(InstalledLibrary, TakesNamesAndCommentsOfTheAnsiCodePageAndIsNotSpoiledByOthers)
{
    if (GetACP() == CP_UTF8)
    {
        GTEST_SKIP() << "the ANSI code page has every character";
    }
    ASSERT_EQ(Register(BuiltFile(L"archive_msscci.dll").make_preferred().wstring(), L"Files").code, Success);
    Write(L"a.txt", "x");
    Write(L"\u4E2D.txt", "x");
    const auto result = RunInstalled({L"add", L".", L"--provider", L"Files", L"-m", L"\u4E2D"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(
        result.output,
        AllOf(HasSubstr("refused  its name has characters that the provider's code page lacks  \xE4\xB8\xAD.txt\n"),
              HasSubstr("  a.txt\n"), HasSubstr("2 files, 1 done, 1 refused")));
    EXPECT_EQ(result.errors, "The comment has characters that the code page of this system does not have. They are "
                             "replaced.\n");
}

TEST_F(InstalledLibrary, ListsTheFilesThatAreMissingOnTheDisk)
{
    ASSERT_EQ(Register(BuiltFile(L"archive_msscci.dll").make_preferred().wstring(), L"Files").code, Success);
    const auto run = [this](Arguments arguments) {
        arguments.insert(arguments.end(), {L"--provider", L"Files"});
        return RunInstalled(std::move(arguments));
    };
    const auto lose = [this] {
        SetFileAttributesW(File(L"sub\\gone.txt").c_str(), FILE_ATTRIBUTE_NORMAL);
        EXPECT_TRUE(std::filesystem::remove(File(L"sub\\gone.txt")));
    };
    Write(L"here.txt", "x");
    Write(L"sub\\gone.txt", "x");
    ASSERT_EQ(run({L"add", L"."}).code, Success);

    lose();
    const auto status = run({L"status", L"."});
    EXPECT_EQ(status.code, Success) << status.errors;
    EXPECT_THAT(status.output, HasSubstr("missing on disk  sub\\gone.txt\n2 files"));
    EXPECT_THAT(run({L"status", L".", L"--json"}).output, HasSubstr("\"missing\""));
    for (const wchar_t* command : {L"undo", L"get"})
    {
        const auto result = run({command, L"."});
        EXPECT_EQ(result.code, Success) << result.errors;
        EXPECT_THAT(result.output, HasSubstr("done    checked in  sub\\gone.txt\n"));
        EXPECT_EQ(ReadBytes(File(L"sub\\gone.txt")), "x");
        lose();
    }
}

TEST_F(InstalledLibrary, ThatListsNoFilesIsNotOpenedAgain)
{
    EXPECT_EQ(RunInstalled({L"status", L"."}).errors, "the project is closed\n");
}
