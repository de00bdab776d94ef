// orvix filters, and the JSON output of every command that lists something.

#include "BuiltFile.h"
#include "ToolTest.h"

#include <gmock/gmock.h>

#include <nlohmann/json.hpp>

namespace
{

using nlohmann::json;
using testing::AllOf;
using testing::HasSubstr;

class ListingTool : public ToolTest
{
protected:
    void Configure(const std::string& xml)
    {
        std::filesystem::create_directories(Config());
        WriteBytes(Config() / L"OrvixProviders.xml", xml);
    }

    /// Settings with one filter of these elements for the providers in whose names the text occurs.
    static std::string Filter(const std::string& provider, const std::string& elements)
    {
        return "<Provider><Name>" + provider + "</Name><Filters><Filter>" + elements + "</Filter></Filters></Provider>";
    }

    void Filters(const std::string& providers)
    {
        Configure("<?xml version=\"1.0\"?><OrvixProviders>" + providers + "</OrvixProviders>");
    }

    /// The plug-ins Archive and Stubborn, in this order.
    std::wstring TwoPlugins() const
    {
        const std::filesystem::path folder = Scratch() / L"two plugins";
        std::filesystem::create_directories(folder);
        const std::filesystem::path archive = BuiltFile(L"plugins\\archive.dll");
        std::filesystem::copy_file(archive, folder / L"archive.dll");
        std::filesystem::copy_file(std::filesystem::path(ORVIX_STUBBORN_PLUGINS) / L"stubborn.dll",
                                   folder / L"stubborn.dll");
        return folder.wstring();
    }

    std::string Full(const std::wstring& name) const { return File(name).string(); }

    /// Runs the tool with --json and gives what it prints.
    json Json(Arguments arguments, unsigned long code = Success)
    {
        arguments.emplace_back(L"--json");
        const auto result = Run(arguments);
        EXPECT_EQ(result.code, code) << result.errors;
        return json::parse(result.output);
    }
};

} // namespace

TEST_F(ListingTool, FiltersTellsFolderFromTypeAndNamesTheFilter)
{
    Filters(Filter("Archive", "<Name>scratch</Name><Type>exclude</Type><Folder>" + Full(L"out") +
                                  "\\</Folder><FileType>tmp</FileType>"));
    Write(L"a.tmp", "x");
    Write(L"a.txt", "x");
    Write(L"out\\b.txt", "x");
    const auto result = Run({L"filters", L".", L"--provider", L"archive"});
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(result.output, "Excluded  Provider  Filter   By      File\n"
                             "yes       Archive   scratch  type    " +
                                 Full(L"a.tmp") +
                                 "\n"
                                 "no        Archive                    " +
                                 Full(L"a.txt") +
                                 "\n"
                                 "yes       Archive   scratch  folder  " +
                                 Full(L"out\\b.txt") +
                                 "\n"
                                 "3 files, 2 excluded\n");
}

TEST_F(ListingTool, FiltersJudgesAFileThatIsNotThereByItsFullPath)
{
    Filters(Filter("Archive", "<Name>mine</Name><Type>include</Type><Folder>" + Full(L"") + "</Folder>"));
    const json files = Json({L"filters", L"nowhere.txt", L"C:\\elsewhere.txt", L"--provider", L"archive"})["files"];
    ASSERT_EQ(files.size(), 2U);
    EXPECT_EQ(files[0]["file"], Full(L"nowhere.txt"));
    EXPECT_EQ(files[0]["excluded"], false);
    EXPECT_EQ(files[1]["excluded"], true);
    EXPECT_EQ(files[1]["by"], "folder");
}

TEST_F(ListingTool, FiltersAsksEveryProviderOrTheNamedOne)
{
    Filters(Filter("Stubborn", "<Name>temporary</Name><FileType>tmp</FileType>"));
    const std::wstring plugins = TwoPlugins();
    const json every = Json({L"filters", L"a.tmp", L"--plugins", plugins});
    EXPECT_EQ(every["files"], json::array({{{"excluded", false},
                                            {"provider", "Archive"},
                                            {"filter", nullptr},
                                            {"by", nullptr},
                                            {"file", Full(L"a.tmp")}},
                                           {{"excluded", true},
                                            {"provider", "Stubborn"},
                                            {"filter", "temporary"},
                                            {"by", "type"},
                                            {"file", Full(L"a.tmp")}}}));
    EXPECT_EQ(every["summary"], json({{"files", 1}, {"excluded", 1}, {"hiddenFolders", 0}}));

    const json one = Json({L"filters", L"a.tmp", L"--plugins", plugins, L"--provider", L"archive"});
    ASSERT_EQ(one["files"].size(), 1U);
    EXPECT_EQ(one["files"][0]["provider"], "Archive");
    const json other = Json({L"filters", L"a.tmp", L"--plugins", plugins, L"--provider", L"1"});
    ASSERT_EQ(other["files"].size(), 1U);
    EXPECT_EQ(other["files"][0]["provider"], "Stubborn");
}

TEST_F(ListingTool, FiltersNeedsNoConfigurationAndThenExcludesNothing)
{
    EXPECT_EQ(Json({L"filters", L"a.tmp"})["files"][0]["excluded"], false);
}

TEST_F(ListingTool, FiltersOfABrokenFileFailsAndNamesTheFile)
{
    for (const char* broken : {"<OrvixProviders><Provider>", "<?xml version=\"1.0\"?><Other/>", ""})
    {
        Configure(broken);
        const auto result = Run({L"filters", L"a.tmp"});
        EXPECT_EQ(result.code, Failed);
        EXPECT_EQ(result.output, "");
        EXPECT_THAT(result.errors, AllOf(HasSubstr("orvix: "), HasSubstr("OrvixProviders.xml")));
    }
}

TEST_F(ListingTool, FiltersOfNobodyIsAnError)
{
    EXPECT_EQ(Run({L"filters", L"a.tmp", L"--provider", L"Nobody"}).code, NotFound);
    EXPECT_EQ(Run({L"filters"}).code, BadUsage);
}

TEST_F(ListingTool, ProvidersAsJson)
{
    EXPECT_EQ(Json({L"providers"}),
              json({{"providers", {{{"index", 0}, {"name", "Archive"}}, {{"index", 1}, {"name", "Git"}}}},
                    {"summary", json::object()},
                    {"lines", json::array()},
                    {"messages", json::array()}}));
}

TEST_F(ListingTool, StatusAsJson)
{
    Write(L"a.txt", "x");
    EXPECT_EQ(
        Json({L"status", L"a.txt", L"nowhere.txt"}, Failed),
        json({{"files",
               {{{"state", {"not-controlled"}}, {"stateText", "not controlled"}, {"file", "a.txt"}},
                {{"state", {"not-controlled", "missing"}}, {"stateText", "no such file"}, {"file", "nowhere.txt"}}}},
              {"summary",
               {{"files", 2},
                {"notTicked", 0},
                {"refused", 1},
                {"cancelled", 0},
                {"failed", 0},
                {"leftOutForState", 0},
                {"leftOutForChanges", 0},
                {"leftOutByFilters", 0},
                {"hiddenFolders", 0}}},
              {"lines", json::array()},
              {"messages", json::array()}}));
}

TEST_F(ListingTool, AnOperationAsJson)
{
    Write(L"\u00E4.txt", "x");
    std::filesystem::create_directories(File(L".git"));
    const json added = Json({L"add", L"."});
    EXPECT_EQ(
        added["files"],
        json::array(
            {{{"result", "done"}, {"state", {"checked-in"}}, {"stateText", "checked in"}, {"file", "\u00E4.txt"}}}));
    EXPECT_EQ(added["summary"]["files"], 1);
    EXPECT_EQ(added["summary"]["done"], 1);
    EXPECT_EQ(added["summary"]["hiddenFolders"], 1);
    EXPECT_EQ(Json({L"add", L"\u00E4.txt"}, Failed)["files"][0]["result"], "refused");
}

TEST_F(ListingTool, ANamedFileThatAFilterExcludesHasAStateOfItsOwnInJson)
{
    Filters(Filter("Archive", "<Name>scratch</Name><FileType>tmp</FileType>"));
    const json excluded = Json({L"status", L"a.tmp"}, Failed)["files"][0];
    EXPECT_EQ(excluded["state"], json::array({"excluded"}));
    EXPECT_EQ(excluded["stateText"], "excluded by filter scratch");
}

TEST_F(ListingTool, NotificationsAreLinesOfTheJson)
{
    Write(L"a.txt", "x");
    EXPECT_EQ(Json({L"add", L"a.txt", L"--verbose"})["lines"],
              json::array({"notification 19 (before add), files: 1", "notification 20 (after add), files: 1"}));
}

TEST_F(ListingTool, HistoryIsLinesOfTheJson)
{
    Write(L"a.txt", "x");
    ASSERT_EQ(Run({L"add", L"a.txt", L"-m", L"the first"}).code, Success);
    const json history = Json({L"history", L"a.txt"});
    EXPECT_EQ(history["summary"]["done"], 1);
    ASSERT_EQ(history["lines"].size(), 2U);
    EXPECT_EQ(history["lines"][0], "a.txt");
    EXPECT_THAT(history["lines"][1].get<std::string>(), HasSubstr("the first"));
}

TEST_F(ListingTool, AnErrorPrintsNoJson)
{
    const auto result = Run({L"status", L"a.txt", L"--provider", L"Nobody", L"--json"});
    EXPECT_EQ(result.code, NotFound);
    EXPECT_EQ(result.output, "");
}

TEST_F(ListingTool, CommandsThatListNothingTakeNoJson)
{
    for (const wchar_t* command : {L"open", L"options", L"client"})
    {
        EXPECT_EQ(Run({command, L"--json"}).code, BadUsage);
    }
}

TEST_F(ListingTool, TheHelpOfEveryCommandHasExamplesOfIt)
{
    const std::vector<Arguments> commands = {{L"providers"},
                                             {L"doctor"},
                                             {L"status"},
                                             {L"add"},
                                             {L"checkout"},
                                             {L"checkin"},
                                             {L"undo"},
                                             {L"get"},
                                             {L"history"},
                                             {L"filters"},
                                             {L"prompts"},
                                             {L"open"},
                                             {L"options"},
                                             {L"client"},
                                             {L"properties"},
                                             {L"register"},
                                             {L"unregister"},
                                             {L"prompts", L"list"},
                                             {L"prompts", L"set"},
                                             {L"prompts", L"reset"},
                                             {L"prompts", L"lock"},
                                             {L"prompts", L"unlock"}};
    for (Arguments arguments : commands)
    {
        std::string example = "Examples:\n  orvix";
        for (const std::wstring& word : arguments)
        {
            example += ' ' + std::string(word.begin(), word.end());
        }
        arguments.emplace_back(L"--help");
        const auto result = RunExactly(arguments);
        EXPECT_EQ(result.code, Success);
        EXPECT_THAT(result.output, HasSubstr(example));
    }
}
