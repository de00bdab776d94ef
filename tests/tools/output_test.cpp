// What the tool prints, tested without a process.

#include "JsonOutput.h"
#include "NotificationText.h"
#include "OrvixNotificationID.h"
#include "OrvixPrompt.h"
#include "PromptAnswer.h"
#include "TextOutput.h"

#include <gmock/gmock.h>

#include <nlohmann/json.hpp>

#include <sstream>

namespace
{

using testing::HasSubstr;
using testing::Not;

Listing Files(std::vector<std::wstring> names)
{
    Listing listing{.key = "files", .columns = {{"state", "State"}, {"file", "File"}}, .rows = {}, .summary = {}};
    for (std::wstring& name : names)
    {
        listing.rows.push_back({{std::wstring(L"new"), Listing::Tone::Good}, {std::move(name)}});
    }
    return listing;
}

std::string Shown(const Listing& listing, const OutputStyle& style = {})
{
    std::ostringstream stream;
    TextOutput(stream, style).Show(listing);
    return stream.str();
}

} // namespace

TEST(OutputStyle, ColoursNeedATerminalThatObeysAndAUserWhoWantsThem)
{
    EXPECT_TRUE(OutputStyle::Of(80, true, nullptr, false).colour);
    EXPECT_TRUE(OutputStyle::Of(80, true, L"", false).colour);
    EXPECT_FALSE(OutputStyle::Of(std::nullopt, true, nullptr, false).colour);
    EXPECT_FALSE(OutputStyle::Of(80, false, nullptr, false).colour);
    EXPECT_FALSE(OutputStyle::Of(80, true, L"1", false).colour);
    EXPECT_FALSE(OutputStyle::Of(80, true, nullptr, true).colour);
}

TEST(TextOutput, PadsEveryColumnButTheLast)
{
    EXPECT_EQ(Shown(Files({L"a.txt"})), "State  File\n"
                                        "new    a.txt\n");
}

TEST(TextOutput, AnEmptyListingShowsItsSummaryAlone)
{
    Listing listing = Files({});
    listing.summary = {{"files", "files", 0}, {"failed", "failed", 0}, {"refused", "refused", 2}};
    EXPECT_EQ(Shown(listing), "0 files, 2 refused\n");
}

TEST(TextOutput, WithoutATerminalNothingIsCut)
{
    const std::wstring name(1000, L'n');
    EXPECT_THAT(Shown(Files({name})), HasSubstr(std::string(1000, 'n')));
}

TEST(TextOutput, OnATerminalTheWidestColumnIsShortenedInTheMiddleUntilTheLinesFit)
{
    // One column stays free: a full line would wrap.
    EXPECT_EQ(Shown(Files({L"src\\deep\\file.txt"}), {.width = 20}), "State  File\n"
                                                                     "new    src\\d\xE2\x80\xA6le.txt\n");
    EXPECT_EQ(Shown(Files({L"src\\deep\\file.txt"}), {.width = 25}), "State  File\n"
                                                                     "new    src\\deep\\file.txt\n");
}

TEST(TextOutput, ATerminalNarrowerThanTheTableStillGetsEightColumnsOfAPath)
{
    EXPECT_THAT(Shown(Files({L"src\\deep\\file.txt"}), {.width = 1}), HasSubstr("src\xE2\x80\xA6.txt\n"));
}

TEST(TextOutput, CountsTheColumnsOfWideLettersAndOfMarks)
{
    Listing listing{.key = "files", .columns = {{"file", "File"}, {"state", "State"}}, .rows = {}, .summary = {}};
    listing.rows = {{{std::wstring(L"\u5B57\u5B57\u5B57")}, {std::wstring(L"new")}},
                    {{std::wstring(L"a\u0301bcdef")}, {std::wstring(L"new")}}};
    EXPECT_EQ(Shown(listing), "File    State\n"
                              "\u5B57\u5B57\u5B57  new\n"
                              "a\u0301bcdef  new\n");
}

TEST(TextOutput, AShortenedTextHoldsNoHalfOfAPair)
{
    for (std::size_t width = 8; width < 20; ++width)
    {
        const std::string text =
            Shown(Files({L"\U0001F600\U0001F600\U0001F600\U0001F600\U0001F600\U0001F600"}), {.width = width});
        EXPECT_THAT(text, Not(HasSubstr("\xEF\xBF\xBD"))) << width;
    }
}

TEST(TextOutput, ControlCharactersDoNotReachATerminal)
{
    EXPECT_THAT(Shown(Files({L"a\x1b[2Jb"})), HasSubstr("a\xEF\xBF\xBD[2Jb"));
}

TEST(TextOutput, ALineEndInACellIsABlank)
{
    EXPECT_EQ(Shown(Files({L"one\ntwo\r\nthree\rfour\n\nfive"})), "State  File\n"
                                                                  "new    one two three four  five\n");
}

TEST(TextOutput, ColoursSurroundTheTextAndNotItsPadding)
{
    EXPECT_EQ(Shown(Files({L"a"}), {.width = 80, .colour = true}), "\x1b[1mState\x1b[0m  \x1b[1mFile\x1b[0m\n"
                                                                   "\x1b[32mnew\x1b[0m    a\n");
}

TEST(TextOutput, ProgressIsOneLineThatTheNextOutputTakesAway)
{
    std::ostringstream stream;
    TextOutput output(stream, {.width = 10});
    output.Progress(L"12345");
    EXPECT_EQ(stream.str(), "\r12345    \r");
    stream.str("");
    output.Print(L"hello");
    EXPECT_EQ(stream.str(), "\r         \rhello\n");
    stream.str("");
    output.Print(L"again");
    EXPECT_EQ(stream.str(), "again\n");
    output.Progress(L"longer than the terminal");
    EXPECT_THAT(stream.str(), HasSubstr("\rlong\xE2\x80\xA6inal\r"));
}

TEST(TextOutput, ProgressThatIsLeftGoesWithTheOutput)
{
    std::ostringstream stream;
    TextOutput(stream, {.width = 10}).Progress(L"12345");
    EXPECT_EQ(stream.str(), "\r12345    \r\r         \r");
}

TEST(TextOutput, WithoutATerminalThereIsNoProgress)
{
    std::ostringstream stream;
    TextOutput output(stream, {});
    output.Progress(L"12345");
    output.Print(L"hello");
    EXPECT_EQ(stream.str(), "hello\n");
}

TEST(JsonOutput, AStateIsAnArrayOfWordsWithATextBesideIt)
{
    Listing listing = Files({});
    listing.rows = {{{Listing::State{{"checked-out", "modified"}, L"checked out, modified"}}, {std::wstring(L"a")}}};
    std::ostringstream stream;
    JsonOutput(stream).Show(listing);
    EXPECT_EQ(nlohmann::json::parse(stream.str())["files"],
              nlohmann::json::parse(
                  R"([{"state": ["checked-out", "modified"], "stateText": "checked out, modified", "file": "a"}])"));
    EXPECT_EQ(Shown(listing), "State                  File\n"
                              "checked out, modified  a\n");
}

TEST(JsonOutput, TextsStayWholeAndBecomeUnicode)
{
    std::ostringstream stream;
    JsonOutput output(stream);
    output.Progress(L"12345");
    output.Print(L"first\nsecond");
    output.Show(Files({L"a\"b\\\u00E4\x1b\xD800"}));
    EXPECT_THAT(stream.str(), HasSubstr("\"a\\\"b\\\\\u00E4\\u001b\xEF\xBF\xBD\""));
    EXPECT_THAT(stream.str(), HasSubstr("\"first\\nsecond\""));
}

TEST(PromptAnswer, AnActionReadsAsTheLibraryTakesIt)
{
    namespace Action = OrvixPromptAction;
    EXPECT_EQ(PromptAnswer::InWords(Action::Ask), L"ask");
    EXPECT_EQ(PromptAnswer::InWords(Action::Ask | Action::Yes), L"ask");
    EXPECT_EQ(PromptAnswer::InWords(Action::Yes | Action::No | Action::YesToAll), L"yes");
    EXPECT_EQ(PromptAnswer::InWords(Action::No), L"no");
    EXPECT_EQ(PromptAnswer::InWords(Action::YesToAll | Action::NoToAll), L"yes-to-all");
    EXPECT_EQ(PromptAnswer::InWords(Action::NoToAll), L"no-to-all");
    EXPECT_EQ(PromptAnswer::InWords(0), L"no");
}

TEST(PromptAnswer, WordsAndActionsGoBothWays)
{
    for (const wchar_t* words : {L"ask", L"yes", L"no", L"yes-to-all", L"no-to-all"})
    {
        ASSERT_TRUE(PromptAnswer::Action(words).has_value());
        EXPECT_EQ(PromptAnswer::InWords(*PromptAnswer::Action(words)), words);
    }
    EXPECT_FALSE(PromptAnswer::Action(L"maybe").has_value());
    EXPECT_FALSE(PromptAnswer::Action(L"").has_value());
}

TEST(PromptAnswer, OptionsNameTheAnswersThatTheyOffer)
{
    namespace Option = OrvixPromptOption;
    EXPECT_EQ(PromptAnswer::OptionsInWords(0), L"yes, no");
    EXPECT_EQ(PromptAnswer::OptionsInWords(Option::OnlyOK), L"yes");
    EXPECT_EQ(PromptAnswer::OptionsInWords(Option::OnlyOK | Option::OfferYesToAll | Option::OfferNoToAll), L"yes");
    EXPECT_EQ(PromptAnswer::OptionsInWords(Option::OfferYesToAll), L"yes, no, yes-to-all");
    EXPECT_EQ(PromptAnswer::OptionsInWords(Option::OfferNoToAll), L"yes, no, no-to-all");
    EXPECT_EQ(PromptAnswer::OptionsInWords(Option::OfferStopAsking), L"yes, no, can stop asking");
}

TEST(PromptAnswer, AskingIsOfferedByEveryOptions)
{
    for (std::uint32_t options = 0; options < 8; ++options)
    {
        EXPECT_TRUE(PromptAnswer::IsOffered(options, OrvixPromptAction::Ask));
    }
}

TEST(NotificationText, HasWordsForEveryNotificationOfTheLibrary)
{
    EXPECT_STREQ(NotificationText::InWords(OrvixNotificationID::BeforeCheckIn), "before check-in");
    EXPECT_STREQ(NotificationText::InWords(OrvixNotificationID::AfterCheckIn), "after check-in");
    EXPECT_STREQ(NotificationText::InWords(OrvixNotificationID::BeforeCheckOut), "before check-out");
    EXPECT_STREQ(NotificationText::InWords(OrvixNotificationID::AfterCheckOut), "after check-out");
    EXPECT_STREQ(NotificationText::InWords(OrvixNotificationID::BeforeUndoCheckOut), "before undo check-out");
    EXPECT_STREQ(NotificationText::InWords(OrvixNotificationID::AfterUndoCheckOut), "after undo check-out");
    EXPECT_STREQ(NotificationText::InWords(OrvixNotificationID::BeforeAdd), "before add");
    EXPECT_STREQ(NotificationText::InWords(OrvixNotificationID::AfterAdd), "after add");
    EXPECT_STREQ(NotificationText::InWords(OrvixNotificationID::BeforeGetLatest), "before get latest");
    EXPECT_STREQ(NotificationText::InWords(OrvixNotificationID::AfterGetLatest), "after get latest");
    EXPECT_STREQ(NotificationText::InWords(OrvixNotificationID::FilesConfirmed), "files confirmed");
    EXPECT_STREQ(NotificationText::InWords(1000), "unknown");
}

TEST(NotificationText, KnowsWhichNotificationsComeBeforeAnOperation)
{
    for (const std::uint32_t id : {OrvixNotificationID::BeforeCheckIn, OrvixNotificationID::BeforeCheckOut,
                                   OrvixNotificationID::BeforeUndoCheckOut, OrvixNotificationID::BeforeAdd,
                                   OrvixNotificationID::BeforeGetLatest})
    {
        EXPECT_TRUE(NotificationText::IsBeforeOperation(id)) << id;
    }
    for (const std::uint32_t id : {OrvixNotificationID::AfterCheckIn, OrvixNotificationID::AfterCheckOut,
                                   OrvixNotificationID::AfterUndoCheckOut, OrvixNotificationID::AfterAdd,
                                   OrvixNotificationID::AfterGetLatest, OrvixNotificationID::FilesConfirmed, 1000U})
    {
        EXPECT_FALSE(NotificationText::IsBeforeOperation(id)) << id;
    }
}
