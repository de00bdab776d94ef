// orvix prompts, on files as the library writes them and on files that it would not.

#include "ToolTest.h"

#include <gmock/gmock.h>

#include <nlohmann/json.hpp>

namespace
{

using nlohmann::json;
using testing::AllOf;
using testing::HasSubstr;

std::string Row(const std::string& id, const std::string& action, const std::string& options = "0",
                const std::string& locked = "false", const std::string& text = "Sure?")
{
    return "<Prompt><Text>" + text + "</Text><ID>" + id + "</ID><Locked>" + locked + "</Locked><ActionOpts>" + options +
           "</ActionOpts><Action>" + action + "</Action></Prompt>";
}

/// A file as the library writes it, with lines that end in LF.
std::string FileOf(const std::string& rows)
{
    return "<?xml version=\"1.0\" standalone=\"yes\"?>\n<OrvixPrompts version=\"1.0\">" + rows + "</OrvixPrompts>\n";
}

class PromptsTool : public ToolTest
{
protected:
    std::filesystem::path PromptFile() const { return Config() / L"OrvixPrompts.xml"; }

    void Store(const std::string& file)
    {
        std::filesystem::create_directories(Config());
        WriteBytes(PromptFile(), file);
    }

    /// The file, with lines that end in LF.
    std::string Stored() const
    {
        std::string bytes = ReadBytes(PromptFile());
        std::erase(bytes, '\r');
        return bytes;
    }

    OrvixTool::Result Prompts(Arguments arguments)
    {
        arguments.insert(arguments.begin(), L"prompts");
        return Run(std::move(arguments));
    }

    /// Runs a change that is refused, says why, and leaves the file and its folder as they were.
    void ExpectRefusal(const Arguments& arguments, unsigned long code, const std::string& reason)
    {
        const std::string before = Stored();
        const auto result = Prompts(arguments);
        EXPECT_EQ(result.code, code) << testing::PrintToString(arguments);
        EXPECT_THAT(result.errors, AllOf(HasSubstr("orvix: "), HasSubstr(reason)));
        EXPECT_EQ(result.output, "");
        EXPECT_EQ(Stored(), before);
        EXPECT_EQ(std::distance(std::filesystem::directory_iterator(Config()), {}), 1);
    }
};

} // namespace

TEST_F(PromptsTool, ListShowsEveryRowInWords)
{
    Store(FileOf(Row("7", "2") + Row("-8", "9", "258", "true", "Go on?")));
    const auto result = Prompts({L"list"});
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(result.output, "ID  Answer  Options                               Locked  Prompt\n"
                             "7   yes     yes, no                               no      Sure?\n"
                             "-8  ask     yes, no, yes-to-all, can stop asking  yes     Go on?\n"
                             "2 prompts\n");
}

TEST_F(PromptsTool, ListAsJson)
{
    Store(FileOf(Row("7", "16", "4")));
    const auto result = Prompts({L"list", L"--json"});
    EXPECT_EQ(json::parse(result.output), json({{"prompts",
                                                 {{{"id", 7},
                                                   {"answer", "no-to-all"},
                                                   {"options", "yes, no, no-to-all"},
                                                   {"locked", false},
                                                   {"text", "Sure?"}}}},
                                                {"summary", {{"prompts", 1}, {"leftLocked", 0}}},
                                                {"lines", json::array()},
                                                {"messages", json::array()}}));
}

TEST_F(PromptsTool, ListOfAFolderWithoutAFileIsEmpty)
{
    std::filesystem::create_directories(Config());
    const auto result = Prompts({L"list"});
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(result.output, "0 prompts\n");
    EXPECT_FALSE(std::filesystem::exists(PromptFile()));
}

TEST_F(PromptsTool, AFolderThatIsNotThereIsNotMade)
{
    EXPECT_EQ(Prompts({L"list"}).code, NotFound);
    EXPECT_FALSE(std::filesystem::exists(Config()));
}

TEST_F(PromptsTool, SetStoresEveryAnswerAndTouchesNothingElse)
{
    const std::pair<const wchar_t*, const char*> answers[] = {
        {L"ask", "1"}, {L"yes", "2"}, {L"no", "4"}, {L"yes-to-all", "8"}, {L"no-to-all", "16"}};
    for (const auto& [answer, action] : answers)
    {
        Store(FileOf(Row("6", "2") + Row("7", "3", "6")));
        const auto result = Prompts({L"set", L"7", answer});
        EXPECT_EQ(result.code, Success);
        EXPECT_THAT(result.output, HasSubstr("7   "));
        EXPECT_EQ(Stored(), FileOf(Row("6", "2") + Row("7", action, "6")));
    }
}

TEST_F(PromptsTool, TheLibraryReadsWhatSetStored)
{
    Write(L"a.txt", "x");
    ASSERT_EQ(Run({L"add", L"a.txt"}).code, Success);
    ASSERT_EQ(Run({L"checkout", L"a.txt"}).code, Success);
    ASSERT_EQ(Prompts({L"set", L"1330796549", L"no"}).code, NotFound);
    ASSERT_EQ(Run({L"undo", L"a.txt"}).code, Success);
    ASSERT_EQ(Prompts({L"set", L"1330796549", L"no"}).code, Success);
    ASSERT_EQ(Prompts({L"lock", L"1330796549"}).code, Success);
    ASSERT_EQ(Run({L"checkout", L"a.txt"}).code, Success);
    EXPECT_THAT(Run({L"undo", L"a.txt"}).output, HasSubstr("cancelled"));
}

TEST_F(PromptsTool, EveryRowOfAnIDIsMeant)
{
    Store(FileOf(Row("7", "1") + Row("8", "1") + Row("7", "4")));
    EXPECT_EQ(Prompts({L"set", L"7", L"yes"}).code, Success);
    EXPECT_EQ(Stored(), FileOf(Row("7", "2") + Row("8", "1") + Row("7", "2")));
}

TEST_F(PromptsTool, AnIDMayBeGivenWithAndWithoutASign)
{
    Store(FileOf(Row("-8", "1")));
    EXPECT_EQ(Prompts({L"set", L"4294967288", L"yes"}).code, Success);
    EXPECT_EQ(Prompts({L"lock", L"--", L"-8"}).code, Success);
    EXPECT_EQ(Stored(), FileOf(Row("-8", "2", "0", "true")));
}

TEST_F(PromptsTool, ResetMakesAPromptAskAgain)
{
    Store(FileOf(Row("7", "4") + Row("8", "4")));
    EXPECT_EQ(Prompts({L"reset", L"7"}).code, Success);
    EXPECT_EQ(Stored(), FileOf(Row("7", "1") + Row("8", "4")));
}

TEST_F(PromptsTool, ResetOfAllLeavesLockedRowsAndCountsThem)
{
    Store(FileOf(Row("7", "4") + Row("8", "4", "0", "true") + Row("9", "2")));
    const auto result = Prompts({L"reset", L"--all"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("2 prompts, 1 left as they are, locked\n"));
    EXPECT_EQ(Stored(), FileOf(Row("7", "1") + Row("8", "4", "0", "true") + Row("9", "1")));
}

TEST_F(PromptsTool, LockAndUnlockChangeTheLockAlone)
{
    Store(FileOf(Row("7", "4", "6")));
    EXPECT_EQ(Prompts({L"lock", L"7"}).code, Success);
    EXPECT_EQ(Stored(), FileOf(Row("7", "4", "6", "true")));
    EXPECT_EQ(Prompts({L"unlock", L"7"}).code, Success);
    EXPECT_EQ(Stored(), FileOf(Row("7", "4", "6")));
}

TEST_F(PromptsTool, ALockedAnswerIsNotChanged)
{
    Store(FileOf(Row("7", "4") + Row("7", "4", "0", "true")));
    ExpectRefusal({L"set", L"7", L"yes"}, Failed, "prompt 7 is locked");
    ExpectRefusal({L"reset", L"7"}, Failed, "prompt 7 is locked");
}

TEST_F(PromptsTool, AnAnswerThatTheOptionsDoNotOfferIsNotStored)
{
    Store(FileOf(Row("7", "1", "2") + Row("8", "1", "1")));
    ExpectRefusal({L"set", L"7", L"no-to-all"}, Failed, "does not offer no-to-all but yes, no, yes-to-all");
    ExpectRefusal({L"set", L"8", L"no"}, Failed, "does not offer no but yes");
}

TEST_F(PromptsTool, TheAnswerThatARowHasMayBeSetInAnyCase)
{
    Store(FileOf(Row("7", "16")));
    EXPECT_EQ(Prompts({L"set", L"7", L"no-to-all"}).code, Success);
    EXPECT_EQ(Stored(), FileOf(Row("7", "16")));
}

TEST_F(PromptsTool, TheAnswerToKeepFilesCheckedOutCanBeSet)
{
    Write(L"a.txt", "x");
    ASSERT_EQ(Run({L"add", L"a.txt"}).code, Success);
    EXPECT_EQ(Prompts({L"set", L"1330796545", L"yes-to-all"}).code, Success);
    EXPECT_EQ(Prompts({L"set", L"1330796545", L"no-to-all"}).code, Success);
}

TEST_F(PromptsTool, WhatIsNoPromptOrNoAnswerIsRefused)
{
    Store(FileOf(Row("7", "1")));
    ExpectRefusal({L"set", L"8", L"yes"}, NotFound, "no such prompt: 8");
    ExpectRefusal({L"set", L"7", L"maybe"}, BadUsage, "maybe");
    for (const wchar_t* id : {L"", L"seven", L"7x", L"4294967296", L"99999999999", L"0x7"})
    {
        ExpectRefusal({L"lock", id}, BadUsage, "a prompt's ID is a number of 32 bits");
    }
    for (const Arguments& arguments :
         {Arguments{}, {L"frobnicate"}, {L"set", L"7"}, {L"reset"}, {L"reset", L"7", L"--all"}, {L"list", L"7"}})
    {
        ExpectRefusal(arguments, BadUsage, "--help");
    }
}

TEST_F(PromptsTool, ABrokenFileIsNeitherListedNorOverwritten)
{
    for (const char* broken : {"<?xml version=\"1.0\"?><OrvixPrompts><Prompt>", "", "no XML at all"})
    {
        Store(broken);
        ExpectRefusal({L"list"}, Failed, "cannot be read");
        ExpectRefusal({L"set", L"7", L"yes"}, Failed, "cannot be read");
        ExpectRefusal({L"reset", L"--all"}, Failed, "cannot be read");
    }
}

TEST_F(PromptsTool, AFileWithRowsThatWouldBeLostIsListedAndNotChanged)
{
    const std::string noAction =
        "<Prompt><Text>x</Text><ID>8</ID><Locked>false</Locked><ActionOpts>0</ActionOpts></Prompt>";
    const std::string unknown = Row("8", "1", "0", "false", "x</Text><Note>why</Note><Text>y");
    for (const std::string& lost : {noAction, unknown, Row("8", "1", "0", "false", std::string(1025, 'x'))})
    {
        Store(FileOf(Row("7", "1") + lost));
        EXPECT_EQ(Prompts({L"list"}).code, Success);
        ExpectRefusal({L"set", L"7", L"yes"}, Failed, "would be lost");
        ExpectRefusal({L"reset", L"--all"}, Failed, "would be lost");
        ExpectRefusal({L"lock", L"7"}, Failed, "would be lost");
    }
}

TEST_F(PromptsTool, AFileThatCannotBeReplacedKeepsItsContent)
{
    Store(FileOf(Row("7", "1")));
    SetFileAttributesW(PromptFile().c_str(), FILE_ATTRIBUTE_READONLY);
    ExpectRefusal({L"set", L"7", L"yes"}, Failed, "cannot be saved");
}
