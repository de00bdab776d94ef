// Files that a provider knows and the disk lacks, below a named folder.

#include "Defect.h"
#include "Environment.h"
#include "ToolTest.h"

#include <gmock/gmock.h>

namespace
{

using testing::AllOf;
using testing::HasSubstr;
using testing::Not;

/// A project with the archive plug-in.
class MissingFiles : public ToolTest
{
protected:
    static constexpr unsigned long TimedOut = 6;

    void Control(const std::wstring& name)
    {
        Write(name, "one\n");
        ASSERT_EQ(Run({L"add", name}).code, Success);
    }

    void Lose(const std::wstring& name)
    {
        SetFileAttributesW(File(name).c_str(), FILE_ATTRIBUTE_NORMAL);
        ASSERT_TRUE(std::filesystem::remove(File(name)));
    }
};

/// The same with a provider that names what it should not.
class FilesOfWildProvider : public MissingFiles
{
protected:
    void SetUp() override
    {
        MissingFiles::SetUp();
        Write(L"gone.txt", "one\n");
        Write(L"here.txt", "one\n");
        ASSERT_EQ(RunWith(L"", {L"add", L"gone.txt", L"here.txt"}).code, Success);
        Lose(L"gone.txt");
    }

    OrvixTool::Result RunWith(const std::wstring& defect, Arguments arguments)
    {
        const Environment environment(Defect::Variable, defect);
        arguments.insert(arguments.end(), {L"--plugins", ORVIX_WILD_PLUGINS});
        return Run(std::move(arguments));
    }
};

} // namespace

TEST_F(MissingFiles, AreShownByTheStatusOfAFolder)
{
    Control(L"a.txt");
    Control(L"sub\\gone.txt");
    Lose(L"sub\\gone.txt");
    const auto whole = Run({L"status", L"."});
    EXPECT_EQ(whole.code, Success) << whole.errors;
    EXPECT_EQ(whole.output, "State                                     File\n"
                            "checked in                                a.txt\n"
                            "checked in, out of date, missing on disk  sub\\gone.txt\n"
                            "2 files\n");
    EXPECT_THAT(Run({L"status", L"SUB"}).output, HasSubstr("missing on disk  sub\\gone.txt\n1 file\n"));
    EXPECT_THAT(Run({L"status", L".", L"--json"}).output, HasSubstr("\"missing\""));

    std::filesystem::remove(File(L"sub"));
    EXPECT_THAT(Run({L"status", L"."}).output, HasSubstr("missing on disk  sub\\gone.txt\n2 files\n"));
}

TEST_F(MissingFiles, AreShownOnceWhenTheyAreNamedToo)
{
    Control(L"gone.txt");
    Lose(L"gone.txt");
    EXPECT_THAT(Run({L"status", L".", L"gone.txt", L"."}).output, HasSubstr("gone.txt\n1 file\n"));
}

TEST_F(MissingFiles, ComeBackWithGetAndWithUndo)
{
    Control(L"edited.txt");
    Control(L"plain.txt");
    Control(L"sub\\plain.txt");
    for (const wchar_t* command : {L"get", L"undo"})
    {
        ASSERT_EQ(Run({L"checkout", L"edited.txt"}).code, Success);
        for (const wchar_t* name : {L"edited.txt", L"plain.txt", L"sub\\plain.txt"})
        {
            Lose(name);
        }
        std::filesystem::remove(File(L"sub"));
        const auto result = Run({command, L"."});
        EXPECT_EQ(result.code, Success) << result.errors;
        EXPECT_THAT(result.output, HasSubstr("3 files, 3 done\n"));
        for (const wchar_t* name : {L"edited.txt", L"plain.txt", L"sub\\plain.txt"})
        {
            EXPECT_EQ(ReadBytes(File(name)), "one\n");
        }
        Run({L"undo", L"edited.txt"});
    }
}

TEST_F(MissingFiles, DoNotConcernOtherCommands)
{
    Control(L"here.txt");
    Control(L"gone.txt");
    Lose(L"gone.txt");
    for (const wchar_t* command : {L"checkout", L"checkin", L"add", L"history"})
    {
        EXPECT_THAT(Run({command, L"."}).output, Not(HasSubstr("gone.txt"))) << command;
    }
}

TEST_F(MissingFiles, InFoldersThatAreSkippedAreLeftOut)
{
    for (const wchar_t* name : {L".dot\\gone.txt", L"hidden\\gone.txt", L".gone"})
    {
        Control(name);
        Lose(name);
    }
    SetFileAttributesW(File(L"hidden").c_str(), FILE_ATTRIBUTE_HIDDEN);
    EXPECT_THAT(Run({L"status", L"."}).output,
                AllOf(HasSubstr("missing on disk  .gone\n1 file, "), Not(HasSubstr("gone.txt"))));
    EXPECT_THAT(Run({L"status", L".dot"}).output, HasSubstr("missing on disk  .dot\\gone.txt\n1 file\n"));
}

TEST_F(MissingFiles, ThatFiltersExcludeAreLeftOut)
{
    Control(L"gone.key");
    Lose(L"gone.key");
    std::filesystem::create_directories(Config());
    WriteBytes(Config() / L"OrvixProviders.xml",
               "<?xml version=\"1.0\"?><OrvixProviders><P><Name>Archive</Name><Filters><F><Name>keys</Name>"
               "<Type>exclude</Type><FileType>key</FileType></F></Filters></P></OrvixProviders>");
    EXPECT_THAT(Run({L"get", L"."}).output, HasSubstr("0 files, 1 left out by filters"));
    EXPECT_FALSE(std::filesystem::exists(File(L"gone.key")));
}

TEST_F(MissingFiles, OutsideOfTheProjectAreNotAskedFor)
{
    Control(L"gone.txt");
    Lose(L"gone.txt");
    std::filesystem::create_directories(Scratch() / L"project2");
    for (const wchar_t* folder : {L"..", L"..\\project2"})
    {
        const auto result = Run({L"status", folder, L"--project", L"."});
        EXPECT_EQ(result.code, Success) << result.errors;
        EXPECT_THAT(result.output, Not(HasSubstr("gone.txt")));
    }
}

TEST_F(FilesOfWildProvider, AreTakenOnlyWhenTheyAreBelowTheFolder)
{
    const auto status = RunWith(L"names-nonsense", {L"status", L"."});
    EXPECT_EQ(status.code, Success) << status.errors;
    EXPECT_THAT(status.output, AllOf(HasSubstr("missing on disk  gone.txt\n2 files, 1 left out for their state"),
                                     HasSubstr("  here.txt\n")));
    const auto got = RunWith(L"names-nonsense", {L"get", L"."});
    EXPECT_EQ(got.code, Success) << got.errors;
    EXPECT_THAT(got.output, HasSubstr("done    checked in  gone.txt\n2 files, 2 done, 1 left out for their state"));
    EXPECT_EQ(ReadBytes(File(L"gone.txt")), "one\n");
    EXPECT_FALSE(std::filesystem::exists(File(L"never.txt")));
    EXPECT_FALSE(std::filesystem::exists(Scratch() / L"gone.txt"));
}

TEST_F(FilesOfWildProvider, AreAnnouncedAsIncompleteWhenTheExportThrows)
{
    const auto result = RunWith(L"throws-names", {L"status", L"."});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.output, AllOf(HasSubstr("missing on disk  gone.txt\n"), HasSubstr("  here.txt\n")));
    EXPECT_THAT(result.errors, HasSubstr("orvix: the provider does not name all its files in " + Project().string()));
}

TEST_F(FilesOfWildProvider, EndWithTheTimeLimitWhenTheExportDoesNot)
{
    const auto result = RunWith(L"names-endlessly", {L"status", L".", L"--timeout", L"10"});
    EXPECT_EQ(result.code, TimedOut);
    EXPECT_THAT(result.errors, HasSubstr("GetOrvixKnownFiles of Wild"));
}

TEST_F(FilesOfWildProvider, AreNamedWithoutAChangeOfTheProcess)
{
    const auto result = RunWith(L"changes-process", {L"status", L"."});
    EXPECT_EQ(result.code, Success) << result.errors;
    EXPECT_THAT(result.output, HasSubstr("  here.txt\n1 file"));
}
