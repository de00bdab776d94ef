#include "GitProgram.h"
#include "IOrvixProvider.h"
#include "Measure.h"
#include "ModulePath.h"
#include "OrvixClientInfo.h"
#include "OrvixFileList.h"
#include "OrvixProviderResult.h"
#include "Process.h"
#include "TempFolder.h"
#include "UniqueHandle.h"

#include <windows.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

namespace
{

constexpr int Many = 20000;
constexpr int Some = 2000;

/// Stops when something has failed: its time means nothing.
void Require(bool success, const std::string& what)
{
    if (!success)
    {
        std::printf("Git: not measured, since this failed: %s\n", what.c_str());
        std::exit(1);
    }
}

/// A repository with many files, and Git by hand.
class BenchRepository
{
public:
    explicit BenchRepository(int count)
    {
        Git({L"init", L"--quiet"});
        Git({L"config", L"user.name", L"Bench"});
        Git({L"config", L"user.email", L"bench@example.org"});
        Git({L"config", L"gc.auto", L"0"});
        Change(count);
        Git({L"add", L"."});
        Git({L"commit", L"--quiet", L"-m", L"Bench"});
    }

    /// Writes the first files anew. The shell that comes with Git is quicker at that.
    void Change(int count) const
    {
        Git({L"-c",
             L"alias.fill=!for i in $(seq " + std::to_wstring(count) +
                 L"); do d=$((i / 100)); [ -d $d ] || mkdir $d; echo " + std::to_wstring(++m_version) +
                 L" $i > $d/$i; done",
             L"fill"});
    }

    void Git(const std::vector<std::wstring>& arguments, const std::string& input = {}) const
    {
        ProcessCommand command;
        command.program = GitProgram::Find(L"");
        command.arguments = arguments;
        command.folder = m_folder.Text();
        command.input = input;
        command.silence = std::chrono::minutes(5);
        const ProcessResult result = Process::Run(std::move(command), nullptr);
        Require(result.Succeeded(), "git by hand: " + result.errors + result.output);
    }

    std::unique_ptr<OrvixFileList> List(int count) const
    {
        std::unique_ptr<OrvixFileList> list(new OrvixFileList);
        for (int i = 1; i <= count; ++i)
        {
            const std::wstring file = m_folder.Text() + L'\\' + std::to_wstring(i / 100) + L'\\' + std::to_wstring(i);
            list->AddActiveEntry(list->CreateEntry(file.c_str(), nullptr, 0, 0));
        }
        return list;
    }

    static std::string PathList(int count)
    {
        std::string list;
        for (int i = 1; i <= count; ++i)
        {
            list += std::to_string(i / 100) + '/' + std::to_string(i) + '\0';
        }
        return list;
    }

    std::wstring Folder() const { return m_folder.Text(); }

private:
    TempFolder m_folder;
    mutable int m_version = 0;
};

/// The plug-in, as a host has it loaded.
class GitPlugin
{
public:
    GitPlugin()
    {
        const auto get = reinterpret_cast<IOrvixProvider* (*)()>(
            reinterpret_cast<void*>(GetProcAddress(m_module.Get(), "GetIOrvixProvider")));
        m_provider = get != nullptr ? get() : nullptr;
        OrvixClientInfo info;
        m_works = m_provider != nullptr && m_provider->Initialize(&info) == OrvixProviderResult::Success;
    }

    bool Works() const { return m_works; }
    IOrvixProvider& Open(const BenchRepository& repository) const
    {
        Require(m_provider->OpenProject(repository.Folder().c_str(), L"") == OrvixProviderResult::Success,
                "OpenProject");
        return *m_provider;
    }

private:
    UniqueModule m_module{
        LoadLibraryW((std::filesystem::path(ModulePath(nullptr)).parent_path() / L"plugins" / L"git.dll").c_str())};
    IOrvixProvider* m_provider = nullptr;
    bool m_works = false;
};

void Query(IOrvixProvider& provider, OrvixFileList& list)
{
    Require(provider.QueryStatus(&list, 0) == OrvixProviderResult::Success, "QueryStatus");
}

/// Milliseconds of a query per file.
double QueryCostPerFile(const GitPlugin& plugin, const BenchRepository& repository, int count)
{
    IOrvixProvider& provider = plugin.Open(repository);
    const auto list = repository.List(count);
    return BestTime([&] { Query(provider, *list); }) / count;
}

/// The folder of git.exe for this process: under Wine the bridge of the tests.
void FindBridge()
{
    const std::filesystem::path bridge = GIT_BRIDGE_FOLDER;
    if (!bridge.empty())
    {
        wchar_t path[32767] = L"";
        GetEnvironmentVariableW(L"PATH", path, static_cast<DWORD>(std::size(path)));
        SetEnvironmentVariableW(L"PATH", (bridge.wstring() + L';' + path).c_str());
    }
}

} // namespace

void BenchGit(MeasureTable& table)
{
    FindBridge();
    const GitPlugin plugin;
    if (!plugin.Works())
    {
        std::printf("Git: not measured, since there is none\n");
        return;
    }
    const BenchRepository many(Many);
    const BenchRepository some(Some);
    {
        IOrvixProvider& provider = plugin.Open(many);
        const auto list = many.List(Many);
        table.Print(Compare(
            "Git: QueryStatus, 20,000 files, against git status", 1.15, [&] { Query(provider, *list); },
            [&] {
                many.Git({L"status", L"--porcelain=v2", L"-z", L"--branch", L"--untracked-files=all", L"--no-renames"});
            }));
    }
    table.Print({"Git: QueryStatus, cost per file at 20,000 against 2,000", QueryCostPerFile(plugin, many, Many),
                 QueryCostPerFile(plugin, some, Some), 1.0});
    IOrvixProvider& provider = plugin.Open(some);
    const auto list = some.List(Some);
    const std::string paths = BenchRepository::PathList(Some);
    table.Print(Compare(
        "Git: CheckIn, 2,000 files, against git commit", 1.15,
        [&] { Require(provider.CheckIn(list.get(), L"Bench", 0) == OrvixProviderResult::Success, "CheckIn"); },
        [&] {
            some.Git(
                {L"commit", L"--quiet", L"--only", L"-m", L"Bench", L"--pathspec-from-file=-", L"--pathspec-file-nul"},
                paths);
        },
        [&] { some.Change(Some); }));
}
