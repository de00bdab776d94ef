// orvix doctor.

#include "BuiltFile.h"
#include "Defect.h"
#include "Environment.h"
#include "RegistryToolTest.h"
#include "Text.h"

#include <gmock/gmock.h>
#include <nlohmann/json.hpp>

#include <list>
#include <set>
#include <system_error>

namespace
{

using Json = nlohmann::json;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

using Codes = std::vector<std::string>;

constexpr const wchar_t* ServerName = L"SCCServerName";
constexpr const wchar_t* ServerPath = L"SCCServerPath";
constexpr const wchar_t* List32 = L"Software\\WOW6432Node\\SourceCodeControlProvider\\InstalledSCCProviders";
constexpr std::size_t EndingBytes = 2048;

/// The codes of the findings, with "!" in front of problems.
Codes CodesOf(const Json& place)
{
    Codes codes;
    for (const Json& finding : place["findings"])
    {
        codes.push_back(finding["code"]);
        if (finding["severity"] == "problem")
        {
            codes.back().insert(0, 1, '!');
        }
    }
    return codes;
}

/// The texts of the findings with a code.
std::vector<std::string> TextsOf(const Json& place, const std::string& code)
{
    std::vector<std::string> texts;
    for (const Json& finding : place["findings"])
    {
        if (finding["code"] == code)
        {
            texts.push_back(finding["text"]);
        }
    }
    return texts;
}

/// The text of the first of them; empty when there is none.
std::string TextOf(const Json& place, const std::string& code)
{
    const std::vector<std::string> texts = TextsOf(place, code);
    return texts.empty() ? "" : texts.front();
}

void Replace(std::string& text, const std::string& what, const std::string& by)
{
    for (std::size_t at = 0; (at = text.find(what, at)) != std::string::npos; at += by.size())
    {
        text.replace(at, what.size(), by);
    }
}

/// The system's message for an error, in its language and without its full stop.
std::string SystemMessage(DWORD error)
{
    std::string message = std::system_category().message(static_cast<int>(error));
    return message.substr(0, message.find_last_not_of(" .\r\n") + 1);
}

/// A library with every function of the interface.
std::wstring Complete()
{
    return BuiltFile(L"archive_msscci.dll").make_preferred().wstring();
}

/// A recording library, which starts in a test program alone.
std::wstring Library(const wchar_t* name)
{
    return (std::filesystem::path(ORVIX_RECORDING_MSSCCI) / name).make_preferred().wstring();
}

std::string Bytes(const std::wstring& text, std::size_t size)
{
    std::string bytes(reinterpret_cast<const char*>(text.c_str()), text.size() * sizeof(wchar_t));
    bytes.resize(size);
    return bytes;
}

/// orvix doctor on a machine with no MSSCCI library registered, and with an empty plug-in folder.
class DoctorTest : public RegistryToolTest
{
protected:
    void SetUp() override
    {
        RegistryToolTest::SetUp();
        std::filesystem::create_directories(Plugins());
        std::filesystem::create_directories(Config());
    }

    std::filesystem::path Plugins() const { return m_plugins; }

    /// From here on the plug-in folder is this one, which need not exist.
    void UsePlugins(const std::filesystem::path& folder) { m_plugins = folder; }

    /// The path of a plug-in as the doctor shows it.
    std::filesystem::path Plugin(const std::wstring& name) const { return Plugins() / name; }

    void AddPlugin(const std::wstring& fake, const std::wstring& name = {})
    {
        std::filesystem::copy_file(std::filesystem::path(ORVIX_FAKE_PLUGINS) / (fake + L".dll"),
                                   Plugin(name.empty() ? fake + L".dll" : name));
    }

    void WriteSettings(const std::string& providers)
    {
        WriteBytes(Config() / L"OrvixProviders.xml",
                   "<?xml version=\"1.0\"?><OrvixProviders>" + providers + "</OrvixProviders>");
    }
    void WritePrompts(const std::string& xml) { WriteBytes(Config() / L"OrvixPrompts.xml", xml); }

    /// A provider's own key, which nothing names yet.
    TemporaryRegistryKey& AddKey()
    {
        return m_keys.emplace_back(L"Software\\OrvixTest\\" + std::to_wstring(m_keys.size() + 1));
    }

    /// A registration whose value in the list has this name.
    TemporaryRegistryKey& Install(const std::wstring& valueName, const std::wstring& serverName,
                                  const std::wstring& path)
    {
        TemporaryRegistryKey& key = AddKey();
        key.SetString(ServerName, serverName);
        key.SetString(ServerPath, path);
        List().SetString(valueName, key.Path());
        return key;
    }

    OrvixTool::Result Doctor(const Arguments& more = {})
    {
        Arguments arguments = {L"doctor", L"--plugins", m_plugins.wstring()};
        arguments.insert(arguments.end(), more.begin(), more.end());
        return Run(arguments);
    }

    /// The doctor's report. The exit code says whether there are problems.
    Json Report(const Arguments& more = {})
    {
        Arguments arguments = {L"--json"};
        arguments.insert(arguments.end(), more.begin(), more.end());
        const auto result = Doctor(arguments);
        Json report = Json::parse(result.output, nullptr, false);
        EXPECT_FALSE(report.is_discarded()) << result.output << result.errors;
        EXPECT_EQ(result.code, report["summary"]["problems"] == 0 ? Success : Failed);
        ExpectGuideNamesCodes(report["places"]);
        ExpectGuideNamesCodes(report["candidates"]);
        return report;
    }

    static std::string Guide() { return ReadBytes(ORVIX_DOCTOR_GUIDE); }

    static void ExpectGuideNamesCodes(const Json& places)
    {
        const std::string guide = Guide();
        for (const Json& place : places)
        {
            for (const Json& finding : place["findings"])
            {
                const std::string code = finding["code"];
                EXPECT_NE(guide.find('`' + code + '`'), std::string::npos) << code;
            }
        }
    }

    /// The only candidate whose location ends so.
    static Json Candidate(const Json& report, const std::string& location)
    {
        Json found;
        for (const Json& candidate : report["candidates"])
        {
            if (candidate["location"].get<std::string>().ends_with(location))
            {
                EXPECT_TRUE(found.is_null()) << "more than one " << location;
                found = candidate;
            }
        }
        EXPECT_FALSE(found.is_null()) << "no " << location << " in " << report.dump(1);
        return found;
    }

    static Json Place(const Json& report, const std::string& kind)
    {
        for (const Json& place : report["places"])
        {
            if (place["kind"] == kind)
            {
                return place;
            }
        }
        ADD_FAILURE() << "no " << kind;
        return {};
    }

    /// The report on the only plug-in, a fake.
    Json ReportOnFake(const std::wstring& fake)
    {
        AddPlugin(fake);
        return Candidate(Report(), std::filesystem::path(fake).string() + ".dll");
    }

    /// What is said of the settings when they hold these provider elements.
    Json ReportOnSettings(const std::string& providers)
    {
        WriteSettings(providers);
        return Place(Report(), "settings file");
    }

    Json ReportOnPrompts(const std::string& xml)
    {
        WritePrompts(xml);
        return Place(Report(), "prompt file");
    }

private:
    std::filesystem::path m_plugins = Scratch() / L"plugins";
    std::list<TemporaryRegistryKey> m_keys;
};

using DoctorOnPlugins = DoctorTest;
using DoctorOnRegistrations = DoctorTest;
using DoctorOnSettings = DoctorTest;
using DoctorOnPrompts = DoctorTest;

constexpr const char* GoodPrompt = "<Prompt><Text>t</Text><ID>7</ID><Locked>false</Locked><ActionOpts>6</ActionOpts>"
                                   "<Action>2</Action></Prompt>";

std::string PromptsXml(const std::string& prompts)
{
    return "<?xml version=\"1.0\"?><OrvixPrompts>" + prompts + "</OrvixPrompts>";
}

} // namespace

TEST_F(DoctorTest, FindsNothingWrongWhereNothingIs)
{
    const auto result = Doctor();
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("\n0 candidates, 0 listed, 0 problems\n"));
}

TEST_F(DoctorTest, PrintsEachCandidateWithItsReasonAndASummary)
{
    AddPlugin(L"good");
    AddPlugin(L"version199");
    const auto result = Doctor();
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.output, HasSubstr("plug-in: " + Plugin(L"good.dll").string() +
                                         "\n  listed as \"Fake Depot\"\n  contract version 200\n"));
    EXPECT_THAT(
        result.output,
        HasSubstr("plug-in: " + Plugin(L"version199.dll").string() +
                  "\n  not listed\n  contract version 199\n  problem: it is made for version 199 of the contract, the "
                  "library for 200 [contract-version]\n"));
    EXPECT_THAT(result.output, testing::EndsWith("\n2 candidates, 1 listed, 1 problem\n"));
}

TEST_F(DoctorTest, CountsInItsSummaryWhatItLists)
{
    AddPlugin(L"good");
    AddPlugin(L"noget");
    Install(L"1", L"Recorded", Complete());
    const Json summary = Report()["summary"];
    EXPECT_EQ(summary, (Json{{"candidates", 3}, {"listed", 2}, {"problems", 1}}));
}

TEST_F(DoctorTest, ListsWhatTheLibraryLists)
{
    for (const wchar_t* fake : {L"good", L"twin", L"other", L"noname", L"nullname", L"version201", L"startfails"})
    {
        AddPlugin(fake);
    }
    Install(L"1", L"Recorded", Complete());
    Install(L"2", L"Switched off", Complete());
    List().SetString(L"3", L"Software\\OrvixTest\\Missing");
    WriteSettings(
        "<a><Name>Other</Name><Enabled>false</Enabled></a><a><Name>switched</Name><Enabled>false</Enabled></a>");
    const Json report = Report();
    std::string expected = "Index  Provider\n";
    int index = 0;
    for (const Json& candidate : report["candidates"])
    {
        if (candidate["listed"] == true)
        {
            expected += std::to_string(index++) + "      " + candidate["name"].get<std::string>() + "\n";
        }
    }
    EXPECT_EQ(index, 4);
    EXPECT_EQ(Run({L"providers", L"--sources", L"plugins,msscci", L"--plugins", Plugins().wstring()}).output, expected);
}

TEST_F(DoctorTest, PrintsJsonOfTheShapeThatTheGuideShows)
{
    const std::string guide = Guide();
    const std::size_t begin = guide.find("```json") + 7;
    Json shown = Json::parse(guide.substr(begin, guide.find("```", begin) - begin));
    AddPlugin(L"version199");
    Json report = Report();
    for (Json* json : {&shown, &report})
    {
        (*json)["candidates"][0].erase("location"); // of the machine
    }
    EXPECT_EQ(report["candidates"], shown["candidates"]);
    EXPECT_EQ(report["summary"], shown["summary"]);
    const Json place = Place(report, "plug-in folder");
    ASSERT_EQ(shown["places"].size(), 1u);
    EXPECT_EQ(place["findings"], shown["places"][0]["findings"]);
    EXPECT_EQ(place["kind"], shown["places"][0]["kind"]);
    EXPECT_EQ(place.size(), shown["places"][0].size());
    EXPECT_EQ(report.size(), shown.size());
}

TEST_F(DoctorTest, PrintsWhatTheGuideShows)
{
    const std::string guide = Guide();
    const std::string beginning = "> orvix doctor\n";
    const std::size_t begin = guide.find(beginning) + beginning.size();
    const std::string shown = guide.substr(begin, guide.find("```", begin) - begin);

    std::filesystem::copy_file(BuiltFile(L"plugins/archive.dll"), Plugin(L"archive.dll"));
    std::string depot = ReadBytes(Library(L"recording_dependent.dll"));
    const std::string needed = "scc_dependency.dll";
    std::string other = "depotnet.dll";
    other.resize(needed.size());
    depot.replace(depot.find(needed), needed.size(), other);
    WriteBytes(Plugin(L"depot.dll"), depot);
    WriteSettings("<Provider><Name>Archive</Name></Provider>"
                  "<Provider><Name>Depot</Name><Enabled>no</Enabled></Provider>");
    WritePrompts(PromptsXml(GoodPrompt));

    std::string printed = Doctor().output;
    Replace(printed, Config().string(), "C:\\Users\\ada\\AppData\\Roaming\\OrvixCore");
    Replace(printed, Plugins().string(), "C:\\Programs\\OrvixCore\\plugins");
    Replace(printed, SystemMessage(ERROR_MOD_NOT_FOUND), "The specified module could not be found");
    EXPECT_EQ(printed, shown);
}

TEST_F(DoctorTest, LooksOnlyWhereItIsTold)
{
    AddPlugin(L"good");
    Install(L"1", L"Recorded", Complete());
    WriteSettings("<a><Name>Recorded</Name></a>");
    const Json plugins = Report({L"--sources", L"plugins"});
    EXPECT_EQ(plugins["candidates"].size(), 1u);
    EXPECT_THAT(CodesOf(Place(plugins, "settings file")), IsEmpty()) << "it may belong to what was not looked at";
    EXPECT_EQ(Report({L"--sources", L"msscci"})["candidates"].size(), 1u);
}

TEST_F(DoctorTest, ChangesNothingAndMakesNoConfigurationFolder)
{
    std::filesystem::remove(Config());
    EXPECT_EQ(Doctor().code, Success);
    EXPECT_FALSE(std::filesystem::exists(Config()));
}

TEST_F(DoctorTest, SaysWhatItLoadsWhenAsked)
{
    AddPlugin(L"good");
    EXPECT_EQ(Doctor().errors, "");
    EXPECT_EQ(Doctor({L"--verbose"}).errors, "orvix: loading " + Plugin(L"good.dll").string() + "\n");
}

TEST_F(DoctorTest, ALibraryThatEndsTheProcessOrHangsIsAFindingAndTheOthersAreExamined)
{
    const Environment environment(Defect::Variable, L"crash-at-load exit-at-load");
    AddPlugin(L"good");
    std::filesystem::copy_file(std::filesystem::path(ORVIX_DEFECTIVE_PLUGINS) / L"defective.dll", Plugin(L"crash.dll"));
    std::filesystem::copy_file(std::filesystem::path(ORVIX_WILD_PLUGINS) / L"wild.dll", Plugin(L"exit.dll"));
    const Json report = Report();
    EXPECT_EQ(Candidate(report, "good.dll")["listed"], true);
    EXPECT_THAT(CodesOf(Candidate(report, "crash.dll")), Not(IsEmpty())); // the system may make a failed load of it
    EXPECT_THAT(TextOf(Candidate(report, "exit.dll"), "ends-process"),
                HasSubstr("it ends the process with exit code 0 when it is loaded"));

    const Environment hanging(Defect::Variable, L"hang-at-load");
    const Json late = Report({L"--timeout", L"10"});
    EXPECT_EQ(Candidate(late, "good.dll")["listed"], true);
    EXPECT_THAT(TextOf(Candidate(late, "exit.dll"), "hangs"), HasSubstr("it does not return within 10 s"));
}

TEST_F(DoctorTest, FindsSettingsThatAreReadAndHaveAnotherEffectThanTheySeem)
{
    WriteSettings("\n<a><Name>x</Name><Name>depot</Name>\n<FixedProjectRoot>project</FixedProjectRoot>\n"
                  "<AltProviderExecutable>C:\\gone.exe</AltProviderExecutable>\n"
                  "<MSSCCProjectFile>sub\\file.ini</MSSCCProjectFile>\n"
                  "<MSSCCDllSearchPath>libs</MSSCCDllSearchPath>\n<Filters>\n"
                  "<f><Name>1</Name></f>\n"
                  "<f><Name>2</Name><Type>include</Type><FileType/></f>\n"
                  "<f><Name>3</Name><FileType>.tmp</FileType><FileType>*</FileType><FileType>bak</FileType></f>\n"
                  "<f><Name>4</Name><Folder>C:/a/</Folder><Folder>sub\\</Folder><Folder>C:\\a</Folder>"
                  "<Folder>C:\\a\\</Folder></f>\n"
                  "<f><Name>5</Name><Folder/><Folder>D:</Folder></f>\n"
                  "</Filters></a>");
    const Json place = Place(Report(), "settings file");
    EXPECT_THAT(CodesOf(place),
                ElementsAre("!repeated", "!no-root-folder", "!no-executable", "!no-search-path", "!bad-file-name",
                            "!empty-filter", "!empty-type", "!file-type", "!file-type", "!folder-slash",
                            "!folder-relative", "!folder-end", "!folder-all", "!folder-all", "!matches-nothing"));
    std::vector<int> lines;
    for (const Json& finding : place["findings"])
    {
        lines.push_back(finding["line"]);
        EXPECT_GT(finding["column"], 0);
        EXPECT_NE(finding["remedy"], "") << finding;
    }
    EXPECT_THAT(lines, ElementsAre(2, 3, 4, 6, 5, 8, 9, 10, 10, 11, 11, 11, 12, 12, 2));
    EXPECT_EQ(TextOf(place, "folder-end"), "provider element 1 (\"depot\"), filter 4: Folder \"C:\\a\" also matches "
                                           "neighbours whose names begin like it, such as \"C:\\a2\"");
}

TEST_F(DoctorTest, FindsNumbersOfPromptsThatAreNoneAndEmptyFiles)
{
    WritePrompts("<?xml version=\"1.0\"?>\n<OrvixPrompts><Prompt><Text>x</Text><ID>12a</ID><Locked>true</Locked>"
                 "<ActionOpts/><Action>1</Action><Action>2</Action></Prompt></OrvixPrompts>");
    WriteBytes(Config() / L"OrvixProviders.xml", "");
    const Json report = Report();
    EXPECT_THAT(CodesOf(Place(report, "prompt file")), ElementsAre("!not-a-number", "!not-a-number", "!repeated"));
    EXPECT_THAT(CodesOf(Place(report, "settings file")), ElementsAre("!malformed"));
    WriteSettings("");
    EXPECT_THAT(CodesOf(Place(Report(), "settings file")), ElementsAre("empty-file"));
}

TEST_F(DoctorTest, FindsALibraryThatNeedsTheCurrentFolder)
{
    const std::filesystem::path needed = std::filesystem::path(ORVIX_RECORDING_MSSCCI) / L"needed";
    std::filesystem::copy_file(needed / L"scc_dependency.dll", File(L"scc_dependency.dll"));
    Install(L"1", L"Dependent", Library(L"recording_dependent.dll"));
    Install(L"2", L"Whole", Complete());
    const Json report = Report();
    EXPECT_THAT(TextOf(Candidate(report, "1"), "current-folder"), HasSubstr("it needs scc_dependency.dll"));
    EXPECT_EQ(Candidate(report, "2")["findings"], Json::array());
    EXPECT_EQ(Wide(Candidate(report, "2")["library"].get<std::string>()), Complete());
}

TEST_F(DoctorTest, JsonStaysOneObjectWhateverALibraryPrints)
{
    AddPlugin(L"talkative");
    for (const Arguments& arguments : {Arguments{L"doctor", L"--json", L"--plugins", Plugins().wstring()},
                                       {L"providers", L"--json", L"--plugins", Plugins().wstring()}})
    {
        const auto result = Run(arguments);
        EXPECT_EQ(result.code, Success);
        EXPECT_TRUE(Json::accept(result.output)) << result.output;
        EXPECT_THAT(result.errors, testing::AllOf(HasSubstr("I am loaded\nI am loaded"), HasSubstr("I am unloaded\n")));
    }
    EXPECT_THAT(Doctor().output, HasSubstr("I am loaded"));
}

TEST_F(DoctorTest, MakesTextsFromOutsideSafeToPrint)
{
    Install(L"bell\a", L"esc\x1B[2J", Complete());
    const std::string output = Doctor().output;
    EXPECT_THAT(output, HasSubstr("bell\xEF\xBF\xBD\n"));
    EXPECT_THAT(output, Not(HasSubstr("\x1B")));
    EXPECT_EQ(Candidate(Report(), "bell\a")["name"], "esc\x1B[2J");
}

TEST_F(DoctorOnPlugins, SaysThatThereIsNoFolder)
{
    std::filesystem::remove(Plugins());
    EXPECT_THAT(CodesOf(Place(Report(), "plug-in folder")), ElementsAre("!no-folder"));
}

TEST_F(DoctorOnPlugins, SaysThatTheFolderIsTooLongToBeSearched)
{
    const std::wstring folder = L"C:\\" + std::wstring(250, L'x');
    UsePlugins(folder);
    EXPECT_THAT(CodesOf(Place(Report(), "plug-in folder")), ElementsAre("!no-folder")) << "259 characters are searched";
    UsePlugins(folder + L"x");
    EXPECT_THAT(CodesOf(Place(Report(), "plug-in folder")), ElementsAre("!path-too-long"));
}

TEST_F(DoctorOnPlugins, SayThatTheirFolderIsNamedByARelativePath)
{
    std::filesystem::create_directories(File(L"providers"));
    UsePlugins(L"providers");
    const Json place = Place(Report(), "plug-in folder");
    EXPECT_EQ(std::filesystem::path(std::string(place["location"])), File(L"providers"));
    ASSERT_EQ(CodesOf(place), Codes{"relative-folder"});
    EXPECT_NE(place["findings"][0]["remedy"], "");
}

TEST_F(DoctorOnPlugins, NamesTheLimitThatAPathExceeds)
{
    const std::size_t longest = 259 - (Plugins().wstring().size() + 1);
    const auto put = [this](wchar_t letter, std::size_t length) {
        std::filesystem::path path = L"\\\\?\\" + Plugin(std::wstring(length - 4, letter) + L".dll").wstring();
        std::filesystem::copy_file(std::filesystem::path(ORVIX_FAKE_PLUGINS) / L"good.dll", path);
        return path;
    };
    put(L'a', longest);
    const std::filesystem::path unreachable = put(L'b', longest + 1);
    const Json report = Report();
    std::filesystem::remove(unreachable); // here rather than with the folder, which knows no such paths
    EXPECT_THAT(CodesOf(Candidate(report, "aaa.dll")), IsEmpty());
    const Json tooLong = Candidate(report, "bbb.dll");
    EXPECT_EQ(tooLong["listed"], false);
    EXPECT_EQ(CodesOf(tooLong), Codes{"!path-too-long"});
    EXPECT_EQ(TextOf(tooLong, "path-too-long"), "its path has 260 characters, and the library takes at most 259");
}

TEST_F(DoctorOnPlugins, KnowsAFileThatIsNoLibrary)
{
    WriteBytes(Plugin(L"notes.dll"), "These are notes, not a library.");
    WriteBytes(Plugin(L"empty.dll"), "");
    std::filesystem::create_directory(Plugin(L"folder.dll"));
    const Json report = Report();
    for (const char* name : {"notes.dll", "empty.dll", "folder.dll"})
    {
        const Json candidate = Candidate(report, name);
        EXPECT_EQ(candidate["listed"], false);
        EXPECT_EQ(CodesOf(candidate), (Codes{"not-a-library", "!does-not-load"})) << name;
    }
    EXPECT_THAT(TextOf(Candidate(report, "notes.dll"), "does-not-load"), HasSubstr("(error 193)"));
}

TEST_F(DoctorOnPlugins, KnowsA32BitFileByItsHeader)
{
    if (!std::filesystem::exists(std::filesystem::path(ORVIX_FAKE_PLUGINS) / L"wrongbitness.dll"))
    {
        GTEST_SKIP() << "built without a 32-bit compiler";
    }
    const Json candidate = ReportOnFake(L"wrongbitness");
    EXPECT_EQ(CodesOf(candidate), (Codes{"other-machine", "!does-not-load"}));
    EXPECT_EQ(TextOf(candidate, "other-machine"),
              "it is a 32-bit file (x86), which a 64-bit (x64) process cannot load");
}

TEST_F(DoctorOnPlugins, NamesTheLibraryThatIsMissing)
{
    std::filesystem::copy_file(Library(L"recording_dependent.dll"), Plugin(L"dependent.dll"));
    const Json candidate = Candidate(Report(), "dependent.dll");
    EXPECT_EQ(CodesOf(candidate), (Codes{"!does-not-load", "missing-dependency"}));
    EXPECT_THAT(TextOf(candidate, "does-not-load"), HasSubstr("(error 126)"));
    EXPECT_THAT(TextOf(candidate, "missing-dependency"),
                testing::StartsWith("dependent.dll needs scc_dependency.dll, "));
}

TEST_F(DoctorOnPlugins, NamesTheLibraryThatIsMissingForAnotherOne)
{
    // The current folder is searched for what a library needs.
    std::filesystem::copy_file(Library(L"recording_dependent.dll"), File(L"scc_dependency.dll"));
    std::filesystem::copy_file(Library(L"recording_dependent.dll"), Plugin(L"dependent.dll"));
    std::string bytes = ReadBytes(File(L"scc_dependency.dll"));
    const std::size_t name = bytes.find("scc_dependency.dll");
    ASSERT_NE(name, std::string::npos);
    bytes[name] = 'X';
    WriteBytes(File(L"scc_dependency.dll"), bytes);
    const Json candidate = Candidate(Report(), "dependent.dll");
    EXPECT_EQ(CodesOf(candidate), (Codes{"!does-not-load", "missing-dependency"}));
    EXPECT_THAT(TextOf(candidate, "missing-dependency"),
                testing::StartsWith("scc_dependency.dll needs Xcc_dependency.dll, "));
}

TEST_F(DoctorOnPlugins, SaysThatTheStartUpCodeFails)
{
    EXPECT_EQ(CodesOf(ReportOnFake(L"startfails")), Codes{"!does-not-load"});
}

TEST_F(DoctorOnPlugins, NamesTheMissingFunction)
{
    for (const auto& [fake, function] : {std::pair{L"noversion", "GetOrvixVersion"},
                                         {L"noget", "GetIOrvixProvider"},
                                         {L"norelease", "ReleaseIOrvixProvider"},
                                         {L"noname", "GetOrvixProviderName"}})
    {
        const Json candidate = ReportOnFake(fake);
        EXPECT_EQ(candidate["listed"], false);
        EXPECT_EQ(CodesOf(candidate), Codes{"!missing-export"});
        EXPECT_EQ(TextOf(candidate, "missing-export"), std::string("it does not export ") + function);
    }
}

TEST_F(DoctorOnPlugins, NamesEveryMissingFunction)
{
    AddPlugin(L"noexports");
    AddPlugin(L"noobjects");
    const Json report = Report();
    EXPECT_THAT(TextsOf(Candidate(report, "noexports.dll"), "missing-export"),
                ElementsAre("it does not export GetOrvixVersion", "it does not export GetIOrvixProvider",
                            "it does not export ReleaseIOrvixProvider", "it does not export GetOrvixProviderName"));
    EXPECT_THAT(TextsOf(Candidate(report, "noobjects.dll"), "missing-export"),
                ElementsAre("it does not export GetIOrvixProvider", "it does not export ReleaseIOrvixProvider"));
    EXPECT_THAT(Doctor().output, HasSubstr("  problem: it does not export GetIOrvixProvider [missing-export]\n"
                                           "  problem: it does not export ReleaseIOrvixProvider [missing-export]\n"));
}

TEST_F(DoctorOnPlugins, NamesTheMissingFunctionOfAnotherVersionToo)
{
    const Json candidate = ReportOnFake(L"oldnoname");
    EXPECT_EQ(CodesOf(candidate), (Codes{"!contract-version", "!missing-export"}));
    EXPECT_EQ(TextOf(candidate, "missing-export"), "it does not export GetOrvixProviderName");
}

TEST_F(DoctorOnPlugins, GivesAVersionOfZero)
{
    const Json candidate = ReportOnFake(L"version0");
    EXPECT_EQ(candidate["contractVersion"], 0);
    EXPECT_EQ(CodesOf(candidate), Codes{"!contract-version"});
    EXPECT_EQ(ReportOnFake(L"noversion")["contractVersion"], Json()) << "it could not be asked";
}

TEST_F(DoctorOnPlugins, SaysThatAPluginThrows)
{
    EXPECT_EQ(CodesOf(ReportOnFake(L"namethrows")), Codes{"!throws"});
    EXPECT_EQ(CodesOf(ReportOnFake(L"namethrowscom")), Codes{"!throws"});
}

TEST_F(DoctorOnPlugins, SaysThatAListedOneHasNoName)
{
    const Json candidate = ReportOnFake(L"nullname");
    EXPECT_EQ(candidate["listed"], true);
    EXPECT_EQ(CodesOf(candidate), Codes{"!empty-name"});
}

TEST_F(DoctorOnPlugins, GivesThemTheLibrarysOwnManifest)
{
    // The same code as in the library, but linked into the program: it must not fall back to the program's context.
    AddPlugin(L"good");
    ASSERT_TRUE(SetEnvironmentVariableW(L"ORVIX_FAKE_MANIFEST_FILE", File(L"manifest").c_str()));
    Report();
    SetEnvironmentVariableW(L"ORVIX_FAKE_MANIFEST_FILE", nullptr);
    EXPECT_THAT(ReadBytes(File(L"manifest")), testing::EndsWith("OrvixCore.dll"));
}

TEST_F(DoctorOnRegistrations, SayNothingOfAGoodOne)
{
    Install(L"value", L"Recorded", Complete());
    const Json candidate = Candidate(Report(), "value");
    EXPECT_EQ(candidate["kind"], "MSSCCI library");
    EXPECT_EQ(candidate["name"], "Recorded");
    EXPECT_EQ(candidate["listed"], true);
    EXPECT_THAT(CodesOf(candidate), IsEmpty());
}

TEST_F(DoctorOnRegistrations, SayThatThereIsNoList)
{
    List().Remove();
    EXPECT_EQ(CodesOf(Place(Report(), "registry list")), Codes{"no-list"});
}

TEST_F(DoctorOnRegistrations, SayThatTheListCannotBeOpened)
{
    SetAccess(List().Path(), Nothing);
    const Json report = Report();
    SetAccess(List().Path(), Everything);
    const Json list = Place(report, "registry list");
    EXPECT_EQ(CodesOf(list), Codes{"!unreadable-key"});
    EXPECT_THAT(TextOf(list, "unreadable-key"), HasSubstr("(error 5)"));
}

TEST_F(DoctorOnRegistrations, NameTheReasonWhyAValueIsPassedOver)
{
    const std::wstring key = Install(L"good", L"Recorded", Complete()).Path();
    List().SetDword(L"number", 1);
    List().SetBytes(L"expand", REG_EXPAND_SZ, key.c_str(), (key.size() + 1) * sizeof(wchar_t));
    List().SetBytes(L"long", REG_SZ, Bytes(key, EndingBytes + 2).data(), EndingBytes + 2);
    List().SetString(L"missing", L"Software\\OrvixTest\\Missing");
    List().SetString(std::wstring(1023, L'a'), key);
    List().SetString(std::wstring(1024, L'b'), key);
    const Json report = Report();
    EXPECT_EQ(CodesOf(Candidate(report, "number")), Codes{"!not-a-string"});
    EXPECT_EQ(CodesOf(Candidate(report, "expand")), Codes{"!not-a-string"});
    EXPECT_EQ(TextOf(Candidate(report, "long"), "text-too-long"),
              "the text of the value has 2050 bytes; the library reads at most 2047");
    EXPECT_EQ(CodesOf(Candidate(report, "missing")), Codes{"!no-key"});
    EXPECT_THAT(CodesOf(Candidate(report, std::string(1023, 'a'))), IsEmpty());
    EXPECT_EQ(TextOf(Candidate(report, std::string(1024, 'b')), "name-too-long"),
              "the name of the value has 1024 characters; the library reads at most 1023");
    EXPECT_EQ(report["summary"]["listed"], 2);
}

TEST_F(DoctorOnRegistrations, NameTheTextThatTheOwnKeyLacks)
{
    AddKey().SetString(ServerPath, Complete());
    List().SetString(L"nameless", L"Software\\OrvixTest\\1");
    AddKey().SetString(ServerName, L"Pathless");
    List().SetString(L"pathless", L"Software\\OrvixTest\\2");
    TemporaryRegistryKey& longName = Install(L"long name", L"replaced", Complete());
    longName.SetBytes(ServerName, REG_SZ, Bytes(L"n", 3000).data(), 3000);
    TemporaryRegistryKey& longPath = Install(L"long path", L"Long", L"replaced");
    longPath.SetBytes(ServerPath, REG_SZ, Bytes(L"n", 2049).data(), 2049);
    const Json report = Report();
    EXPECT_EQ(CodesOf(Candidate(report, "nameless")), Codes{"!no-server-name"});
    EXPECT_EQ(CodesOf(Candidate(report, "pathless")), Codes{"!no-server-path"});
    EXPECT_EQ(TextOf(Candidate(report, "long name"), "text-too-long"),
              "SCCServerName has 3000 bytes; the library reads at most 2047");
    EXPECT_EQ(TextOf(Candidate(report, "long path"), "text-too-long"),
              "SCCServerPath has 2049 bytes; the library reads at most 2047");
    EXPECT_EQ(report["summary"]["listed"], 0);
}

TEST_F(DoctorOnRegistrations, WarnOfATextThatEndsEveryHostAndLiveOn)
{
    const std::string ending = Bytes(L"n", EndingBytes);
    List().SetBytes(L"1 list", REG_SZ, ending.data(), ending.size());
    Install(L"2 name", L"replaced", L"x").SetBytes(ServerName, REG_SZ, ending.data(), ending.size());
    Install(L"3 path", L"Path", L"x").SetBytes(ServerPath, REG_SZ, ending.data(), ending.size());
    Install(L"4 good", L"Recorded", Complete());
    const Json report = Report();
    for (const auto& [location, what] :
         {std::pair{"1 list", "the text of the value"}, {"2 name", "SCCServerName"}, {"3 path", "SCCServerPath"}})
    {
        const Json candidate = Candidate(report, location);
        EXPECT_EQ(candidate["listed"], false);
        EXPECT_EQ(CodesOf(candidate), Codes{"!ends-host"});
        EXPECT_THAT(TextOf(candidate, "ends-host"), testing::StartsWith(std::string(what) + " has exactly 2048 bytes"));
    }
    EXPECT_EQ(Candidate(report, "4 good")["listed"], true);
    EXPECT_NE(Run({L"providers", L"--sources", L"msscci"}).code, Success) << "the danger is real";
}

TEST_F(DoctorOnRegistrations, SayThatALibraryThatIsListedIsNotThere)
{
    Install(L"value", L"Gone", L"C:\\gone\\scc.dll");
    const Json candidate = Candidate(Report(), "value");
    EXPECT_EQ(candidate["listed"], true);
    EXPECT_EQ(CodesOf(candidate), Codes{"!no-library"});
    EXPECT_THAT(TextOf(candidate, "no-library"), HasSubstr("\"C:\\gone\\scc.dll\""));
}

TEST_F(DoctorOnRegistrations, SayWhyALibraryDoesNotLoad)
{
    Install(L"dependent", L"Dependent", Library(L"recording_dependent.dll"));
    WriteBytes(File(L"text.dll"), "no library");
    Install(L"text", L"Text", File(L"text.dll").wstring());
    const Json report = Report();
    EXPECT_EQ(CodesOf(Candidate(report, "dependent")), (Codes{"!does-not-load", "missing-dependency"}));
    EXPECT_EQ(CodesOf(Candidate(report, "text")), (Codes{"not-a-library", "!does-not-load"}));
}

TEST_F(DoctorOnRegistrations, LookForWhatALibraryNeedsWhereTheSettingsSay)
{
    Install(L"value", L"Dependent", Library(L"recording_dependent.dll"));
    const std::string folder = std::filesystem::path(Library(L"needed")).string();
    WriteSettings("<a><Name>Dependent</Name><MSSCCDllSearchPath>" + folder + "</MSSCCDllSearchPath></a>");
    const Json candidate = Candidate(Report(), "value");
    EXPECT_EQ(CodesOf(candidate), (Codes{"configured", "!does-not-load"}));
    EXPECT_THAT(TextOf(candidate, "does-not-load"), Not(HasSubstr("(error 126)"))) << "it is found and does not start";
    WriteSettings("<a><Name>Dependent</Name><MSSCCDllSearchPath>C:\\gone</MSSCCDllSearchPath></a>");
    EXPECT_EQ(CodesOf(Candidate(Report(), "value")),
              (Codes{"configured", "!no-search-folder", "!does-not-load", "missing-dependency"}));
}

TEST_F(DoctorOnRegistrations, LookForALibraryOfABareNameWhereTheSettingsSay)
{
    std::filesystem::create_directories(Scratch() / L"libraries");
    WriteBytes(Scratch() / L"libraries" / L"broken.dll", "no library");
    Install(L"value", L"Bare", L"replaced by the settings");
    WriteSettings("<a><Name>Bare</Name><MSSCCDllFullPath>broken.dll</MSSCCDllFullPath><MSSCCDllSearchPath>" +
                  (Scratch() / L"libraries").string() + "</MSSCCDllSearchPath></a>");
    EXPECT_EQ(CodesOf(Candidate(Report(), "value")), (Codes{"configured", "not-a-library", "!does-not-load"}));
}

TEST_F(DoctorOnRegistrations, SayThatAPathNamesNoFolder)
{
    Install(L"bare", L"Bare", L"orvix no such library.dll");
    EXPECT_EQ(CodesOf(Candidate(Report(), "bare")), (Codes{"!no-path-folder", "!no-library"}));
}

TEST_F(DoctorOnRegistrations, SayThatASettingIsCut)
{
    AddKey().SetString(ServerName, L"Recorded");
    List().SetString(L"value", L"Software\\OrvixTest\\1");
    const auto settings = [](std::size_t path, std::size_t searchPath) {
        return "<a><Name>Recorded</Name><MSSCCDllFullPath>" + std::string(path, 'p') +
               "</MSSCCDllFullPath><MSSCCDllSearchPath>" + std::string(searchPath, 's') + "</MSSCCDllSearchPath></a>";
    };
    WriteSettings(settings(1024, 260));
    EXPECT_EQ(CodesOf(Candidate(Report(), "value")), (Codes{"configured", "!no-search-folder", "!no-library"}));
    WriteSettings(settings(1025, 261));
    EXPECT_EQ(CodesOf(Candidate(Report(), "value")),
              (Codes{"configured", "!setting-cut", "!setting-cut", "!no-search-folder", "!no-library"}));
}

TEST_F(DoctorOnRegistrations, NameTheFunctionsThatALibraryLacks)
{
    std::filesystem::copy_file(std::filesystem::path(ORVIX_FAKE_PLUGINS) / L"good.dll", File(L"none.dll"));
    Install(L"none", L"No version", File(L"none.dll").wstring());
    Install(L"some", L"No history", ORVIX_TALKING_MSSCCI);
    const Json report = Report();
    const Json none = Candidate(report, "none");
    EXPECT_EQ(CodesOf(none).front(), "!missing-export");
    EXPECT_EQ(TextOf(none, "missing-export"), "it does not export SccGetVersion, without which no operation starts");
    std::set<std::string> missing;
    const Json some = Candidate(report, "some");
    for (const Json& finding : some["findings"])
    {
        EXPECT_EQ(finding["code"], "not-offered");
        missing.insert(finding["text"]);
    }
    EXPECT_EQ(missing.size(), 21u - 8u);
    EXPECT_EQ(missing.count("it does not export SccHistory, so showing the history fails"), 1u);
}

TEST_F(DoctorOnRegistrations, AskAnIsolatedLibraryWhetherItLoads)
{
    const TempFolder folder;
    for (const wchar_t* file : {L"scc_proxy.dll", L"scc_host64.exe"})
    {
        std::filesystem::copy_file(BuiltFile(file), folder.Path() / file);
    }
    const std::filesystem::path settings = folder.Path() / L"scc_proxy.ini";
    const std::string section = "[Isolation]\nName=Isolated\nLibrary=";
    Install(L"value", L"Isolated", (folder.Path() / L"scc_proxy.dll").wstring());

    WriteBytes(settings, section + std::filesystem::path(ORVIX_TALKING_MSSCCI).string());
    EXPECT_EQ(CodesOf(Candidate(Report(), "value")), Codes{"isolated"});

    WriteBytes(settings, section + "C:\\gone.dll");
    EXPECT_EQ(CodesOf(Candidate(Report(), "value")), (Codes{"isolated", "!isolated-library-fails"}));

    // What it needs is found where the settings say.
    WriteBytes(settings, section + std::filesystem::path(Library(L"recording_dependent.dll")).string());
    EXPECT_THAT(TextOf(Candidate(Report(), "value"), "isolated-library-fails"), HasSubstr("does not load: error 126 "));
    WriteSettings("<a><Name>Isolated</Name><MSSCCDllSearchPath>" + std::filesystem::path(Library(L"needed")).string() +
                  "</MSSCCDllSearchPath></a>");
    EXPECT_THAT(TextOf(Candidate(Report(), "value"), "isolated-library-fails"), Not(HasSubstr("error 126")))
        << "it is found and does not start";
}

TEST_F(DoctorOnRegistrations, FindWhatIsOnlyInThe32BitView)
{
    TemporaryRegistryKey list32(List32);
    TemporaryRegistryKey key32(L"Software\\WOW6432Node\\OrvixTest32");
    key32.SetString(ServerName, L"Only 32");
    list32.SetString(L"1", L"Software\\OrvixTest32");
    list32.SetString(L"2", Install(L"both", L"Both", Complete()).Path());
    const Json report = Report();
    EXPECT_EQ(report["candidates"].size(), 2u) << report.dump(1);
    const Json candidate = Candidate(report, "OrvixTest32");
    EXPECT_EQ(candidate["name"], "Only 32");
    EXPECT_EQ(candidate["listed"], false);
    EXPECT_EQ(CodesOf(candidate), Codes{"!only-32-bit"});
    EXPECT_THAT(CodesOf(Candidate(report, "both")), IsEmpty());
}

TEST_F(DoctorOnRegistrations, TakeA32BitOneForHarmlessBesideA64BitOneOfItsName)
{
    TemporaryRegistryKey list32(List32);
    TemporaryRegistryKey key32(L"Software\\WOW6432Node\\OrvixTest32");
    key32.SetString(ServerName, L"recorded");
    list32.SetString(L"1", L"Software\\OrvixTest32");
    TemporaryRegistryKey& key = Install(L"64", L"Recorded", Complete());
    EXPECT_EQ(CodesOf(Candidate(Report(), "OrvixTest32")), Codes{"only-32-bit"});
    RegDeleteKeyValueW(HKEY_LOCAL_MACHINE, key.Path().c_str(), ServerPath);
    EXPECT_EQ(CodesOf(Candidate(Report(), "OrvixTest32")), Codes{"!only-32-bit"}) << "the 64-bit one is not listed";
}

TEST_F(DoctorOnSettings, SayWhichElementSwitchesAProviderOff)
{
    AddPlugin(L"good");
    Install(L"value", L"Recorded", L"C:\\gone.dll");
    WriteSettings("<!-- no element --><a><Name>depot</Name><Enabled>FALSE</Enabled></a>"
                  "<b><Name>Record</Name><Enabled>false</Enabled></b>");
    const Json report = Report();
    EXPECT_EQ(report["summary"]["listed"], 0);
    for (const auto& [location, element] : {std::pair{"good.dll", "1 (\"depot\")"}, {"value", "2 (\"Record\")"}})
    {
        const Json candidate = Candidate(report, location);
        EXPECT_EQ(CodesOf(candidate), Codes{"switched-off"})
            << "a note: the administrator wants it, and the library is not examined";
        EXPECT_EQ(TextOf(candidate, "switched-off"),
                  std::string("provider element ") + element + " of OrvixProviders.xml switches it off");
    }
}

TEST_F(DoctorOnSettings, SayWhichElementAppliesAndWhichItHides)
{
    AddPlugin(L"good");
    WriteSettings("<a><Name>Other</Name></a><a><Name>FAKE</Name></a><a><Name>Fake Depot</Name></a><a><Name/></a>");
    const Json report = Report();
    const Json candidate = Candidate(report, "good.dll");
    EXPECT_EQ(CodesOf(candidate), (Codes{"configured", "hidden", "hidden"}));
    EXPECT_THAT(TextOf(candidate, "configured"), testing::StartsWith("provider element 2 (\"FAKE\") of "));
    EXPECT_THAT(TextOf(candidate, "hidden"), testing::StartsWith("provider element 3 (\"Fake Depot\") of "));
    const Json settings = Place(report, "settings file");
    EXPECT_EQ(CodesOf(settings), (Codes{"!matches-nothing", "!always-hidden", "!always-hidden"}));
    EXPECT_THAT(TextOf(settings, "matches-nothing"), testing::StartsWith("provider element 1 (\"Other\") "));
}

TEST_F(DoctorOnSettings, DoNotBlameAnElementThatIsHiddenOnlySomewhere)
{
    AddPlugin(L"good");
    AddPlugin(L"other");
    WriteSettings("<a><Name>Fake</Name></a><a><Name/></a>");
    EXPECT_THAT(CodesOf(Place(Report(), "settings file")), IsEmpty());
}

TEST_F(DoctorOnSettings, NameWhatIsIgnoredAndWhy)
{
    AddPlugin(L"good");
    const Json settings = ReportOnSettings(
        "<a><Enabled>false</Enabled></a>"
        "<a><Name>Fake</Name><Enable>false</Enable><Filters><f/><f><Type>exclude</Type><Name>late</Name></f>"
        "<f><Name>n</Name><Folders>x</Folders></f></Filters><Colour>red</Colour></a>");
    Codes texts;
    for (const Json& finding : settings["findings"])
    {
        EXPECT_EQ(finding["severity"], "problem");
        texts.push_back(finding["code"].get<std::string>() + ": " + finding["text"].get<std::string>());
    }
    EXPECT_THAT(texts,
                ElementsAre("no-name: provider element 1 is ignored: it has no Name",
                            "unknown-element: provider element 2 (\"Fake\"): Enable is ignored: no such element "
                            "is known",
                            "no-name: provider element 2 (\"Fake\"), filter 1 is ignored: it has no Name",
                            "name-not-first: provider element 2 (\"Fake\"), filter 2 is ignored: Name is not its "
                            "first element",
                            "unknown-element: provider element 2 (\"Fake\"), filter 3: Folders is ignored: no "
                            "such element is known",
                            "unknown-element: provider element 2 (\"Fake\"): Colour is ignored: no such element "
                            "is known"));
}

TEST_F(DoctorOnSettings, SayWhatAnUnknownValueCountsAs)
{
    AddPlugin(L"good");
    const Json settings = ReportOnSettings("<a><Name>Fake</Name><Enabled>no</Enabled><Filters><f><Name>n</Name>"
                                           "<Type>skip</Type><FileType>tmp</FileType></f></Filters></a>");
    EXPECT_EQ(CodesOf(settings), (Codes{"!unknown-value", "!unknown-value"}));
    EXPECT_EQ(settings["findings"][0]["text"],
              "provider element 1 (\"Fake\"): Enabled is \"no\", which counts as \"true\"");
    EXPECT_EQ(settings["findings"][1]["text"],
              "provider element 1 (\"Fake\"), filter 1: Type is \"skip\", which counts as \"include\"");
    EXPECT_THAT(CodesOf(ReportOnSettings("<a><Name>Fake</Name><Enabled>True</Enabled><Filters><f><Name>n</Name>"
                                         "<Type>INCLUDE</Type><FileType>tmp</FileType></f></Filters></a>")),
                IsEmpty());
}

TEST_F(DoctorOnSettings, SayThatAnElementOfADataTypeHasNoText)
{
    AddPlugin(L"good");
    const Json settings = ReportOnSettings("<a xmlns:dt=\"urn:schemas-microsoft-com:datatypes\"><Name>Fake</Name>"
                                           "<FixedProjectRoot dt:dt=\"i4\">5</FixedProjectRoot></a>");
    EXPECT_EQ(CodesOf(settings), Codes{"!no-text"});
    EXPECT_THAT(TextOf(settings, "no-text"), HasSubstr("(\"Fake\"): FixedProjectRoot is ignored"));
}

TEST_F(DoctorOnSettings, GiveLineColumnAndReasonOfAFault)
{
    WriteBytes(Config() / L"OrvixProviders.xml", "<?xml version=\"1.0\"?>\n<OrvixProviders>\n  <a></b>\n");
    const Json settings = Place(Report(), "settings file");
    EXPECT_EQ(CodesOf(settings), Codes{"!malformed"});
    EXPECT_THAT(TextOf(settings, "malformed"), testing::ContainsRegex(": line 3, column \\d+: ."));
}

TEST_F(DoctorOnSettings, SayWhyAWholeFileCountsAsEmpty)
{
    const std::filesystem::path file = Config() / L"OrvixProviders.xml";
    WriteBytes(file, "");
    EXPECT_EQ(CodesOf(Place(Report(), "settings file")), Codes{"!malformed"});
    WriteBytes(file, "<?xml version=\"1.0\"?><Providers><a><Name>x</Name></a></Providers>");
    EXPECT_EQ(TextOf(Place(Report(), "settings file"), "no-root"),
              "the root element is \"Providers\", not \"OrvixProviders\", so nothing in the file is read");
    WriteBytes(file, "<?xml version=\"1.0\"?><!DOCTYPE OrvixProviders [<!ENTITY e 'x'>]>"
                     "<OrvixProviders><a><Name>&e;</Name></a></OrvixProviders>");
    EXPECT_EQ(CodesOf(Place(Report(), "settings file")), Codes{"!entities"});
    std::filesystem::remove(file);
    EXPECT_EQ(CodesOf(Place(Report(), "settings file")), Codes{"no-file"});
}

TEST_F(DoctorOnSettings, SayThatTheXmlServiceDoesNotStart)
{
    // A manifest beside the program names a library for the service's class that is not there.
    const std::filesystem::path folder = UseCopy({L"OrvixCore.dll", L"OrvixCoreUI.dll", L"braeutil.dll"});
    WriteBytes(
        folder / L"orvix.exe.manifest",
        "<assembly xmlns=\"urn:schemas-microsoft-com:asm.v1\" manifestVersion=\"1.0\">"
        "<assemblyIdentity type=\"win32\" name=\"orvix\" version=\"1.0.0.0\"/><file name=\"gone.dll\">"
        "<comClass clsid=\"{F6D90F11-9C73-11D3-B32E-00C04F990BB4}\" threadingModel=\"Both\"/></file></assembly>");
    WriteSettings("");
    const Json settings = Place(Report(), "settings file");
    EXPECT_EQ(CodesOf(settings), Codes{"!no-xml-service"});
}

TEST_F(DoctorOnSettings, SayThatAFileCannotBeOpened)
{
    std::filesystem::create_directory(Config() / L"OrvixProviders.xml");
    const Json settings = Place(Report(), "settings file");
    EXPECT_EQ(CodesOf(settings), Codes{"!unreadable-file"});
    EXPECT_THAT(TextOf(settings, "unreadable-file"), HasSubstr("(error 5)"));
}

TEST_F(DoctorOnPrompts, SayNothingOfAGoodFile)
{
    EXPECT_THAT(CodesOf(ReportOnPrompts(PromptsXml(std::string("<!-- no prompt -->") + GoodPrompt))), IsEmpty());
}

TEST_F(DoctorOnPrompts, NameTheElementThatAPromptLacks)
{
    const Json prompts = ReportOnPrompts(PromptsXml(
        std::string(GoodPrompt) + "<Prompt><Text>t</Text><ID>7</ID><LOCKED>false</LOCKED><Action>2</Action></Prompt>"));
    Codes texts;
    for (const Json& finding : prompts["findings"])
    {
        texts.push_back(finding["text"]);
    }
    EXPECT_THAT(texts, ElementsAre("prompt 2 is ignored: it has no Locked", "prompt 2 is ignored: it has no ActionOpts",
                                   "prompt 2: LOCKED is ignored: no such element is known"));
}

TEST_F(DoctorOnPrompts, SayThatATextIsCutAndWhatAnUnknownLockCountsAs)
{
    const auto prompt = [](std::size_t length, const std::string& locked) {
        return PromptsXml("<Prompt><Text>" + std::string(length, 't') + "</Text><ID>7</ID><Locked>" + locked +
                          "</Locked><ActionOpts>6</ActionOpts><Action>2</Action></Prompt>");
    };
    EXPECT_THAT(CodesOf(ReportOnPrompts(prompt(1024, "TRUE"))), IsEmpty());
    const Json prompts = ReportOnPrompts(prompt(1025, "no"));
    EXPECT_EQ(CodesOf(prompts), (Codes{"!text-cut", "!unknown-value"}));
    EXPECT_EQ(TextOf(prompts, "unknown-value"), "prompt 1: Locked is \"no\", which counts as \"true\"");
}

TEST_F(DoctorOnPrompts, SayWhyAWholeFileCountsAsEmpty)
{
    EXPECT_EQ(CodesOf(ReportOnPrompts("<?xml version=\"1.0\"?><!-- c --><OrvixPrompts/>")), Codes{"!root-not-second"});
    EXPECT_EQ(CodesOf(ReportOnPrompts(std::string("<OrvixPrompts>") + GoodPrompt + "</OrvixPrompts>")),
              Codes{"!root-not-second"});
    EXPECT_EQ(CodesOf(ReportOnPrompts("<?xml version=\"1.0\"?><OrvixPrompts><Prompt></OrvixPrompts>")),
              Codes{"!malformed"});
}

TEST_F(DoctorOnPrompts, SayThatARootOfAnotherNameIsReadAllTheSame)
{
    EXPECT_EQ(CodesOf(ReportOnPrompts(std::string("<?xml version=\"1.0\"?><Prompts>") + GoodPrompt + "</Prompts>")),
              Codes{"other-root"});
}
