// orvix validate: what it says of good libraries, and of one with a single defect.

#include "BuiltFile.h"
#include "Defect.h"
#include "Display.h"
#include "Environment.h"
#include "FilePath.h"
#include "ToolTest.h"
#include "UniqueHandle.h"

#include <nlohmann/json.hpp>

#include <gmock/gmock.h>

#include <map>
#include <set>
#include <sstream>

namespace
{

using testing::_;
using testing::AllOf;
using testing::ElementsAre;
using testing::EndsWith;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Pair;
using testing::StartsWith;

const std::filesystem::path Plugins = ORVIX_DEFECTIVE_PLUGINS;
const std::filesystem::path Libraries = ORVIX_DEFECTIVE_MSSCCI;

class Validate : public ToolTest
{
protected:
    using Reasons = std::map<std::string, std::string>; ///< by the names of rules

    /// Runs the tool and expects this exit code.
    OrvixTool::Result ValidatePlugin(const std::filesystem::path& library, unsigned long code, Arguments more = {})
    {
        more.insert(more.begin(), {L"validate", library.wstring()});
        auto result = RunExactly(more);
        EXPECT_EQ(result.code, code) << testing::PrintToString(more) << "\noutput:\n"
                                     << result.output << "\nerrors:\n"
                                     << result.errors;
        return result;
    }

    OrvixTool::Result ValidateLibrary(const std::filesystem::path& library, unsigned long code, Arguments more = {})
    {
        more.insert(more.begin(), L"--msscci");
        return ValidatePlugin(library, code, std::move(more));
    }

    /// The rules with this result, from the lines of a run.
    static Reasons With(const std::string& verdict, const OrvixTool::Result& result)
    {
        Reasons reasons;
        std::istringstream lines(result.output);
        for (std::string word, rule, reason; lines >> word >> rule && std::getline(lines >> std::ws, reason);)
        {
            if (word == verdict)
            {
                reasons[rule] = reason;
            }
        }
        return reasons;
    }

    /// The rules that a plug-in with a defect fails.
    Reasons FailedWith(const std::wstring& defect)
    {
        const Environment environment(Defect::Variable, defect);
        const auto result = ValidatePlugin(Plugins / L"defective.dll", Failed, {L"--dialogs"});
        return With("fail", result);
    }

    /// The rules that an MSSCCI library with a defect fails.
    Reasons LibraryFailedWith(const std::wstring& defect)
    {
        const Environment environment(Defect::Variable, defect);
        const auto result = ValidateLibrary(Libraries / L"defective_scc.dll", Failed, {L"--dialogs"});
        return With("fail", result);
    }
};

/// What a library has against one rule.
struct OneDefect
{
    const wchar_t* name;
    const char* rule;
    const char* reason; ///< part of what the rule says
};

/// Defects that do not get in each other's way, no two against the same rule.
using Defects = std::vector<OneDefect>;

std::wstring NamesOf(const Defects& defects)
{
    std::wstring names;
    for (const OneDefect& defect : defects)
    {
        names += std::wstring(names.empty() ? L"" : L" ") + defect.name;
    }
    return names;
}

class ValidateDefectivePlugin : public Validate, public testing::WithParamInterface<Defects>
{
};

class ValidateDefectiveLibrary : public Validate, public testing::WithParamInterface<Defects>
{
};

void ExpectExactly(const Defects& defects, const std::map<std::string, std::string>& failed)
{
    EXPECT_EQ(failed.size(), defects.size()) << testing::PrintToString(failed);
    for (const auto& [name, rule, reason] : defects)
    {
        EXPECT_THAT(failed, testing::Contains(Pair(rule, HasSubstr(reason)))) << std::filesystem::path(name);
    }
}

} // namespace

TEST_F(Validate, PassesTheSamplePluginInEveryRule)
{
    const auto result = ValidatePlugin(BuiltFile(L"plugins\\archive.dll"), Success, {L"--dialogs"});
    EXPECT_THAT(result.output, EndsWith("\n25 rules, 25 passed, 0 failed, 0 skipped\n"));
}

TEST_F(Validate, PassesTheSampleLibraryInEveryRule)
{
    const auto result = ValidateLibrary(BuiltFile(L"archive_msscci.dll"), Success, {L"--dialogs"});
    EXPECT_THAT(result.output, EndsWith("\n30 rules, 30 passed, 0 failed, 0 skipped\n"));
}

TEST_F(Validate, PassesWhatTheDefectsAreMadeOf)
{
    const auto plugin = ValidatePlugin(Plugins / L"defective.dll", Success, {L"--dialogs"});
    EXPECT_THAT(With("skip", plugin), IsEmpty());
    // The wrapper leaves names out that the code page does not have, and the library fails for no other.
    const auto library = ValidateLibrary(Libraries / L"defective_scc.dll", Success, {L"--dialogs"});
    EXPECT_THAT(With("skip", library), ElementsAre(Pair("status-failure", _)));
}

TEST_P(ValidateDefectivePlugin, FailsTheRulesThatItBreaksAndNoOthers)
{
    ExpectExactly(GetParam(), FailedWith(NamesOf(GetParam())));
}

INSTANTIATE_TEST_SUITE_P(
    All, ValidateDefectivePlugin,
    testing::Values(
        Defects{{L"version", "version", "GetOrvixVersion returns 201, not 200"},
                {L"name", "name", "GetOrvixProviderName returns no name"},
                {L"objects", "objects", "GetIOrvixProvider returns null"},
                {L"state", "state", "IsProjectOpen is true after CloseProject"},
                {L"reserved", "reserved", "ReservedC returns 0"},
                {L"results", "results", "UndoCheckOut with options 0x00000001 returns 7"},
                {L"bad-input", "bad-input", "what?.txt\" returns 3"},
                {L"empty-list", "empty-list", "GetLatest returns 0"},
                {L"status-bits", "status-bits", "QueryStatus sets undocumented bits: 0x00000046"},
                {L"status-failure", "status-failure", "QueryStatus fails and changes FlagsOut"},
                {L"status-closed", "status-closed", "QueryStatus writes 0x00100001 before OpenProject"},
                {L"list-untouched", "list-untouched", "CheckIn changes more of the list than FlagsOut"},
                {L"handles", "handles", "10 sessions leave 10 handles open"},
                {L"dialogs", "dialogs", "ShowOptions returns 9"}},
        Defects{{L"name-that-turns", "name", "returns another name on a later call"},
                {L"reserved-pointers", "reserved", "ReservedD does not store 0 through both pointers"},
                {L"status-left-out", "status-bits", "QueryStatus does not write an entry's FlagsOut"},
                {L"option-bit", "results", "CheckOut with options 0x00000004 returns -1, and 0 with 0x00000000"},
                {L"sessions", "sessions", "Initialize returns -1 in session 3"}},
        Defects{{L"reserved-false", "reserved", "ReservedI returns false"},
                {L"status-contradiction", "status-bits", "QueryStatus says controlled and not controlled: 0x00000003"},
                {L"reload", "reload", "it does not load: "}},
        Defects{{L"stores-nothing", "stores", "after GetLatest of a deleted file the file has other bytes"},
                {L"undoes-nothing", "checks-out", "after UndoCheckOut the file has other bytes"},
                {L"status-lies", "status-truth", "after making a new file QueryStatus says 0x00000011"},
                {L"destroys", "failures", "after a failed CheckIn the file has other bytes"},
                {L"prints-late", "process", "CloseProject prints from another thread than that of the call"},
                {L"leaks", "memory", "10 queries of the state take 20 MiB that are not freed"}},
        Defects{{L"starts", "starts", "Initialize returns -1"}},
        Defects{{L"exception", "reserved", "ReservedC throws an exception"},
                {L"checkin-fails", "stores", "CheckIn returns -1"},
                {L"prints-from-thread", "process", "CheckOut prints from another thread than that of the call"}},
        Defects{{L"changes-folder", "process", "CheckOut changes the current folder"}},
        Defects{{L"crash", "reserved", "ReservedE crashes the process with exception 0xC0000005 in "}},
        Defects{{L"exit", "reserved", "ReservedG ends the process with exit code 7"}}));

TEST_P(ValidateDefectiveLibrary, FailsTheRulesThatItBreaksAndNoOthers)
{
    ExpectExactly(GetParam(), LibraryFailedWith(NamesOf(GetParam())));
}

INSTANTIATE_TEST_SUITE_P(
    All, ValidateDefectiveLibrary,
    testing::Values(
        Defects{{L"version", "version", "SccGetVersion returns 0x00030001"},
                {L"capabilities", "capabilities", "the bits 0x02000080 promise SccPopulateList"},
                {L"texts", "texts", "the library's name is written beyond its 32 bytes"},
                {L"input-names", "input-texts", "SccCheckin writes to the file names"},
                {L"codes", "codes", "SccGet returns 42"},
                {L"null-arguments", "null-arguments", "SccQueryInfo crashes the process with exception 0xC0000005"},
                {L"info-bits", "info-bits", "SccQueryInfo sets unknown bits: 0x00004003"},
                {L"text-output", "text-output", "a line contains a line end"},
                {L"handles", "handles", "10 sessions leave 10 handles open"}},
        Defects{{L"no-terminator", "texts", "the label of the auxiliary path has no terminator in its 32 bytes"},
                {L"input-texts", "input-texts", "SccOpenProject writes to the local path"},
                {L"codes-kept", "codes", "SccAdd returns 42"},
                {L"info-left-out", "info-bits", "SccQueryInfo does not write the word of a file"},
                {L"text-without-kind", "text-output", "the kind 99 is unknown"}},
        Defects{{L"codes-given-back", "codes", "SccCheckin returns 42"},
                {L"info-overrun", "info-bits", "SccQueryInfo writes more words than there are files"},
                {L"text-null", "text-output", "a line of kind 1 has no text"}},
        Defects{{L"starts", "starts", "Initialize returns -1"}}));

TEST_F(Validate, GivesEveryOperationAllOptionsThatHostsDo)
{
    const std::filesystem::path file = Scratch() / L"options.txt";
    const Environment environment(Defect::Variable, L"report-options");
    const Environment where(L"ORVIX_DEFECT_FILE", file.wstring());
    ValidatePlugin(Plugins / L"defective.dll", Success);
    std::map<std::string, std::set<unsigned long>> given;
    std::istringstream lines(ReadBytes(file));
    unsigned long options = 0;
    for (std::string operation; lines >> operation >> options;)
    {
        given[operation].insert(options);
    }
    const auto all = ElementsAre(0, 1, 2, 4, 5, 6);
    EXPECT_THAT(given, ElementsAre(Pair("Add", all), Pair("CheckIn", all), Pair("CheckOut", all),
                                   Pair("GetLatest", all), Pair("UndoCheckOut", all)));
}

TEST_F(Validate, NamesTheMissingExportOfAPlugin)
{
    for (const wchar_t* name :
         {L"GetOrvixVersion", L"GetIOrvixProvider", L"ReleaseIOrvixProvider", L"GetOrvixProviderName"})
    {
        const auto result = ValidatePlugin(Plugins / (std::wstring(L"defective_without_") + name + L".dll"), Failed);
        EXPECT_THAT(With("fail", result),
                    ElementsAre(Pair("exports", "it does not export " + std::filesystem::path(name).string())));
    }
}

TEST_F(Validate, FailsALibraryForAFunctionThatIsNeededAndRemarksOneThatIsNot)
{
    const auto result = ValidateLibrary(Libraries / L"defective_scc_without_SccCheckin.dll", Failed);
    EXPECT_THAT(With("fail", result), ElementsAre(Pair("exports", "it does not export SccCheckin")));
    const auto passed = With("pass", ValidateLibrary(Libraries / L"defective_scc.dll", Success));
    ASSERT_TRUE(passed.contains("exports"));
    EXPECT_THAT(passed.at("exports"), AllOf(StartsWith("without SccGetProjPath "), HasSubstr(" SccRunScc ")));
}

TEST_F(Validate, EndsAHangingOperationAtTheLimitAndGoesOn)
{
    const Environment environment(Defect::Variable, L"hang");
    const auto plugin = ValidatePlugin(Plugins / L"defective.dll", Failed, {L"--timeout", L"10"});
    EXPECT_THAT(With("fail", plugin), ElementsAre(Pair("reserved", "ReservedF hangs: ended after 10 s")));
    EXPECT_THAT(plugin.output, HasSubstr("\npass  handles "));
    const auto library = ValidateLibrary(Libraries / L"defective_scc.dll", Failed, {L"--timeout", L"10"});
    EXPECT_THAT(With("fail", library),
                ElementsAre(Pair("null-arguments", "SccGetCommandOptions hangs: ended after 10 s")));
}

TEST_F(Validate, NamesTheWindowThatAnOperationWaitsFor)
{
    if (!HasDisplay())
    {
        GTEST_SKIP() << "no display";
    }
    const Environment environment(Defect::Variable, L"window");
    const auto result = ValidatePlugin(Plugins / L"defective.dll", Failed, {L"--timeout", L"10"});
    EXPECT_THAT(With("fail", result),
                ElementsAre(Pair("reserved", "ReservedF shows the window \"Defective Provider\" (Who are you?) and "
                                             "waits: ended after 10 s")));
}

TEST_F(Validate, CopiesAProjectForAProviderThatMakesNone)
{
    const Environment environment(Defect::Variable, L"needs-marker");
    Write(L"template\\marker.txt", "x");
    const auto result =
        ValidatePlugin(Plugins / L"defective.dll", Success, {L"--project", File(L"template").wstring()});
    EXPECT_TRUE(With("pass", result).contains("stores"));
    EXPECT_THAT(ValidatePlugin(Plugins / L"defective.dll", NotFound, {L"--project", L"nowhere"}).errors,
                StartsWith("orvix: no such project folder: "));
}

TEST_F(Validate, FailsALibraryThatCrashesWhenItIsLoaded)
{
    const Environment environment(Defect::Variable, L"crash-at-load");
    const auto result = ValidatePlugin(Plugins / L"defective.dll", Failed);
    EXPECT_TRUE(With("fail", result).contains("loads")); // the system may make a failed load of it
    EXPECT_THAT(With("pass", result), IsEmpty());
}

TEST_F(Validate, LeavesNoProcessBehindThatTheLibraryStarted)
{
    const std::filesystem::path file = Scratch() / L"descendant.txt";
    const Environment environment(Defect::Variable, L"descendant");
    const Environment where(L"ORVIX_DEFECT_FILE", file.wstring());
    ValidatePlugin(Plugins / L"defective.dll", Success);
    const std::string number = ReadBytes(file);
    ASSERT_NE(number, "");
    const UniqueKernelHandle process(OpenProcess(SYNCHRONIZE, FALSE, std::stoul(number)));
    EXPECT_TRUE(!process || WaitForSingleObject(process.Get(), 10000) == WAIT_OBJECT_0);
}

TEST_F(Validate, FailsOneRuleForWhatIsNoLibraryAndSkipsTheOthers)
{
    WriteBytes(File(L"text.dll"), "no library");
    const auto result = ValidatePlugin(L"text.dll", Failed);
    EXPECT_THAT(With("fail", result),
                ElementsAre(Pair("loads", AllOf(StartsWith("it does not load: "), EndsWith("(error 193)")))));
    EXPECT_THAT(With("pass", result), IsEmpty());
    EXPECT_THAT(result.output, EndsWith("\n25 rules, 0 passed, 1 failed, 24 skipped\n"));
}

TEST_F(Validate, FailsAPluginWhosePathNoHostFinds)
{
    const std::wstring name(MAX_PATH - 5 - Project().wstring().size(), L'x'); // a separator and .dll are added
    const auto copy = [this](const std::wstring& file) {
        std::filesystem::path path = File(file + L".dll");
        std::filesystem::copy_file(Plugins / L"defective.dll", L"\\\\?\\" + path.wstring());
        return path;
    };
    EXPECT_THAT(With("fail", ValidatePlugin(copy(name), Failed)),
                testing::Contains(Pair("loads", HasSubstr("longer than 259"))));
    EXPECT_THAT(With("fail", ValidatePlugin(copy(name.substr(1)), Success)), IsEmpty());
}

TEST_F(Validate, RunsWhatMayShowWindowsOnlyWhenAskedTo)
{
    const Environment environment(Defect::Variable, L"dialogs");
    const auto result = ValidatePlugin(Plugins / L"defective.dll", Success);
    EXPECT_THAT(With("skip", result), ElementsAre(Pair("dialogs", HasSubstr("--dialogs"))));
}

TEST_F(Validate, LeavesNothingOnTheDiskAndInTheRegistry)
{
    const std::filesystem::path temp = Scratch() / L"temp";
    std::filesystem::create_directory(temp);
    const Environment environment(L"TMP", temp.wstring());
    ValidateLibrary(BuiltFile(L"archive_msscci.dll"), Success);
    EXPECT_TRUE(std::filesystem::is_empty(temp));
    EXPECT_TRUE(std::filesystem::is_empty(Project()));
    UniqueRegistryKey key;
    ASSERT_EQ(RegOpenKeyExW(HKEY_CURRENT_USER, L"Software\\OrvixCore", 0, KEY_READ, key.Out()), ERROR_SUCCESS);
    DWORD keys = 1;
    RegQueryInfoKeyW(key.Get(), nullptr, nullptr, nullptr, &keys, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                     nullptr);
    EXPECT_EQ(keys, 0u);
}

TEST_F(Validate, SkipsWhatNeedsAPrivateRegistrationWhereTheSystemRefusesIt)
{
    for (const wchar_t* defect : {L"no-override", L"no-value"})
    {
        const Environment environment(Defect::Variable, defect);
        const auto result = ValidateLibrary(Libraries / L"defective_scc.dll", Success, {L"--dialogs"});
        const auto skipped = With("skip", result);
        ASSERT_TRUE(skipped.contains("starts"));
        EXPECT_THAT(skipped.at("starts"),
                    AllOf(StartsWith("it cannot be registered for this process alone: "), EndsWith("(error 5)")));
        EXPECT_THAT(result.output, HasSubstr("\n30 rules, 10 passed, 0 failed, 20 skipped\n"));
    }
}

TEST_F(Validate, SaysWhyTheProcessOfARuleDoesNotStart)
{
    UseCopy({L"OrvixCore.dll", L"OrvixCoreUI.dll", L"braeutil.dll"});
    const Environment environment(Defect::Variable, L"program-moves");
    const auto result = ValidatePlugin(Plugins / L"defective.dll", Failed);
    EXPECT_THAT(result.output, StartsWith("pass  loads "));
    EXPECT_THAT(result.errors, AllOf(StartsWith("orvix: no rule can be checked, a process cannot be made: "),
                                     EndsWith("(error 2)\n")));
}

TEST_F(Validate, SaysWhyThereIsNoScratchProject)
{
    const Environment environment(L"TMP", (Scratch() / L"nowhere").wstring());
    EXPECT_THAT(ValidatePlugin(Plugins / L"defective.dll", Failed).errors,
                AllOf(StartsWith("orvix: no scratch project can be made in the folder of temporary files: "),
                      EndsWith("(error 3)\n")));
}

TEST(LongPath, OfAShareAndOfADrive)
{
    EXPECT_EQ(LongPath(L"C:\\temp"), L"\\\\?\\C:\\temp");
    EXPECT_EQ(LongPath(L"\\\\server\\share\\temp"), L"\\\\?\\UNC\\server\\share\\temp");
    EXPECT_EQ(LongPath(L"\\\\?\\C:\\temp"), L"\\\\?\\C:\\temp");
}

TEST_F(Validate, PrintsAJsonDocumentWithTheSameResults)
{
    const Environment environment(Defect::Variable, L"reserved");
    const auto result = ValidatePlugin(Plugins / L"defective.dll", Failed, {L"--json"});
    const auto document = nlohmann::json::parse(result.output);
    EXPECT_EQ(document["library"], (Plugins / L"defective.dll").make_preferred().string());
    EXPECT_EQ(document["kind"], "plugin");
    EXPECT_EQ(document["failed"], 1);
    EXPECT_EQ(document["skipped"], 1);
    EXPECT_EQ(document["passed"].get<std::size_t>() + 2, document["rules"].size());
    const auto& rules = document["rules"];
    const auto found =
        std::find_if(rules.begin(), rules.end(), [](const auto& rule) { return rule["name"] == "reserved"; });
    ASSERT_NE(found, rules.end());
    EXPECT_EQ((*found)["result"], "fail");
    EXPECT_EQ((*found)["reason"], "ReservedC returns 0");
    EXPECT_THAT((*found)["demand"].get<std::string>(), HasSubstr("reserved operations"));
    EXPECT_EQ(document["kind"], "plugin");
}

TEST_F(Validate, OfAFileThatIsNotThereEndsWithThree)
{
    for (const wchar_t* path : {L"nowhere.dll", L"."})
    {
        const auto result = ValidatePlugin(path, NotFound);
        EXPECT_THAT(result.errors, StartsWith("orvix: no such library: "));
        EXPECT_EQ(result.output, "");
    }
}

TEST_F(Validate, BadUsageEndsWithTwo)
{
    const std::vector<Arguments> bad = {{L"validate"},
                                        {L"validate", L""},
                                        {L"validate", L"a.dll", L"b.dll"},
                                        {L"validate", L"a.dll", L"--timeout", L"0"},
                                        {L"validate", L"a.dll", L"--timeout", L"soon"},
                                        {L"validate", L"a.dll", L"--timeout", L"3601"},
                                        {L"validate", L"a.dll", L"--rule"}};
    for (const Arguments& arguments : bad)
    {
        const auto result = RunExactly(arguments);
        EXPECT_EQ(result.code, BadUsage) << testing::PrintToString(arguments) << '\n' << result.errors;
    }
}
