#include "InstalledProviders.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "PluginSearch.h"
#include "Text.h"
#include "ValidationProvider.h"
#include "ValidationRules.h"
#include "ValidationScratch.h"

#include <windows.h>

#include <array>
#include <filesystem>
#include <fstream>
#include <functional>
#include <map>
#include <string>
#include <tuple>
#include <vector>

namespace
{

constexpr unsigned long Selected = 0x2; // bit of an entry's FlagsIn

// What no provider sets, so that an entry which it passes over is seen.
constexpr unsigned long Untouched = 0x40000100;

// Bits of an operation's options.
constexpr unsigned long KeepCheckedOut = 0x1;
constexpr unsigned long WithGetLatest = 0x2;
constexpr unsigned long NotAsked = 0x4;

/// What RunFileListOperation passes, to all operations alike.
constexpr unsigned long AllOptions[] = {
    0, KeepCheckedOut, WithGetLatest, NotAsked, NotAsked | KeepCheckedOut, NotAsked | WithGetLatest};

constexpr const wchar_t* Comment = L"validation";

void Demand(bool kept, const std::string& broken)
{
    if (!kept)
    {
        throw RuleBroken(broken);
    }
}

/// A list whose entries are all active.
class Files
{
public:
    explicit Files(const std::vector<std::wstring>& paths)
    {
        for (const std::wstring& path : paths)
        {
            m_list.CreateEntry(path.c_str(), nullptr, Selected, static_cast<long long>(path.size()))
                ->SetFlagsOut(Untouched);
        }
        m_list.BuildActiveList(Selected, false);
    }

    OrvixFileList* List() { return &m_list; }

    std::vector<unsigned long> Flags()
    {
        std::vector<unsigned long> flags;
        for (unsigned int i = 0; i < m_list.NumEntries(); ++i)
        {
            OrvixFileEntry* entry = m_list.GetFileEntry(i);
            flags.push_back(entry->GetFlagsOut());
        }
        return flags;
    }

    /// Everything that a provider must leave alone.
    auto Rest()
    {
        std::vector<std::tuple<OrvixFileEntry*, std::wstring, unsigned long, long long, unsigned int>> rest;
        for (unsigned int i = 0; i < m_list.NumEntries(); ++i)
        {
            OrvixFileEntry* entry = m_list.GetFileEntry(i);
            rest.emplace_back(entry, entry->GetFile(), entry->GetFlagsIn(), entry->GetClientPtr(),
                              entry->NumChildren() + entry->NumAttachments());
        }
        for (unsigned int i = 0; i < m_list.NumActiveEntries(); ++i)
        {
            OrvixFileEntry* entry = m_list.GetActiveFileEntry(i);
            rest.emplace_back(entry, L"", 0, 0, 0);
        }
        return rest;
    }

private:
    OrvixFileList m_list;
};

/// An operation on files, with its options where it has any.
struct Operation
{
    const char* name;
    std::function<int(IOrvixProvider&, OrvixFileList*, const wchar_t* comment)> run;
};

Operation QueryStatus()
{
    return {"QueryStatus", [](auto& provider, auto* list, auto*) { return provider.QueryStatus(list, 0); }};
}

Operation Add(unsigned long options)
{
    return {"Add", [=](auto& provider, auto* list, auto* comment) { return provider.Add(list, comment, options); }};
}

Operation CheckOut(unsigned long options)
{
    return {"CheckOut",
            [=](auto& provider, auto* list, auto* comment) { return provider.CheckOut(list, comment, options); }};
}

Operation CheckIn(unsigned long options)
{
    return {"CheckIn",
            [=](auto& provider, auto* list, auto* comment) { return provider.CheckIn(list, comment, options); }};
}

Operation UndoCheckOut(unsigned long options)
{
    return {"UndoCheckOut", [=](auto& provider, auto* list, auto*) { return provider.UndoCheckOut(list, options); }};
}

Operation GetLatest(unsigned long options)
{
    return {"GetLatest", [=](auto& provider, auto* list, auto*) { return provider.GetLatest(list, options); }};
}

Operation ShowHistory()
{
    return {"ShowHistory", [](auto& provider, auto* list, auto*) { return provider.ShowHistory(list); }};
}

Operation ShowProperties()
{
    return {"ShowProperties", [](auto& provider, auto* list, auto*) { return provider.ShowProperties(list); }};
}

/// A file's way through all states, with the same options everywhere. Nothing in it is made to show windows.
std::vector<Operation> WayOfAFile(unsigned long options)
{
    return {QueryStatus(),     Add(options),          QueryStatus(),      CheckOut(options),
            QueryStatus(),     CheckIn(options),      QueryStatus(),      UndoCheckOut(options),
            CheckOut(options), UndoCheckOut(options), GetLatest(options), QueryStatus()};
}

int Run(ValidationSubject& subject, ValidationProvider& provider, const Operation& operation, OrvixFileList* list,
        const std::string& on = "", const wchar_t* comment = Comment)
{
    return subject.Call(operation.name + on, [&] { return operation.run(provider.Get(), list, comment); });
}

/// Throws `RuleBroken` for a result that means nothing.
void DemandResult(const std::string& what, int result)
{
    Demand(result == 0 || result == -1 || result == -2, what + " gives " + std::to_string(result));
}

/// Files of the project, others for each number.
std::vector<std::wstring> GoodFiles(const ValidationSubject& subject, unsigned long number = 0)
{
    return {subject.Write(L"first" + std::to_wstring(number) + L".txt", "first\r\n"),
            subject.Write(L"with blanks " + std::to_wstring(number) + L".bin", std::string("\0\xFF", 2))};
}

/// Paths that are no files of the project, or of no project at all. All lie in the scratch folder, the current one.
std::vector<std::wstring> BadPaths(const ValidationSubject& subject)
{
    const std::wstring& project = subject.Project();
    return {L"",
            L"relative.txt",
            project,
            project + L"\\missing.txt",
            project + L"\\missing\\missing.txt",
            project + L"\\*.txt",
            project + L"\\what?.txt",
            project + L"\\<>|\".txt",
            project + L"\\..\\outside\\other.txt",
            project + L"\\trailing. ",
            project + L"\\first0.txt:stream",
            project + L"\\\u5009\u5EAB.txt",
            project + L"\\\xD800.txt",
            subject.Outside() + L"\\other.txt",
            project + L'\\' + std::wstring(250, L'x') + L".txt",
            project + L'\\' + std::wstring(40000, L'x')};
}

/// A path as a reason shows it.
std::string On(const std::wstring& path)
{
    constexpr std::size_t Shown = 60;
    return " on \"" + (path.size() > Shown ? "..." + Utf8(path.substr(path.size() - Shown)) : Utf8(path)) + '"';
}

/// A session from start to end, with every bit of the options.
void RunSession(ValidationSubject& subject, ValidationProvider& provider, int round)
{
    const auto inRound = [round](const std::string& what, int result) {
        Demand(result == 0, what + " gives " + std::to_string(result) + " in session " + std::to_string(round));
    };
    inRound("Initialize", provider.Initialize());
    inRound("OpenProject", provider.OpenProject());
    for (const unsigned long options : {NotAsked | KeepCheckedOut, NotAsked | WithGetLatest})
    {
        const std::wstring name = L"round" + std::to_wstring(round) + L'-' + std::to_wstring(options) + L".txt";
        Files files({subject.Write(name, "round")});
        for (const Operation& operation : WayOfAFile(options))
        {
            Run(subject, provider, operation, files.List());
        }
    }
    inRound("CloseProject", provider.CloseProject());
    inRound("Uninitialize", provider.Uninitialize());
}

/// A session with the library loaded before and unloaded afterwards.
void RunLoadedSession(ValidationSubject& subject, int round)
{
    const std::string load = " in load " + std::to_string(round);
    try
    {
        ValidationProvider provider(subject);
        Demand(provider.Initialize() == 0, "Initialize fails" + load);
        Demand(provider.Uninitialize() == 0, "Uninitialize fails" + load);
    }
    catch (const RuleSkipped& skipped)
    {
        throw RuleBroken(skipped.what() + load);
    }
}

/// The handles of this process. Where the system does not count them, values are tried: handles take the lowest free
/// ones.
DWORD OpenHandles()
{
    DWORD count = 0;
    if (GetProcessHandleCount(GetCurrentProcess(), &count) && count != 0)
    {
        return count;
    }
    constexpr unsigned long Step = 4;
    constexpr unsigned long Highest = 4096 * Step;
    for (unsigned long value = Step; value < Highest; value += Step)
    {
        DWORD flags = 0;
        count += GetHandleInformation(ULongToHandle(value), &flags) ? 1 : 0;
    }
    return count;
}

/// Throws `RuleBroken` when every round of `work` leaves a handle open, and `RuleSkipped` when one breaks another rule.
/// What is made once and kept is no leak.
void DemandNoLeak(const std::string& what, const std::function<void(int round)>& work)
{
    constexpr int WarmUp = 3;
    constexpr int Rounds = 10;
    DWORD before = 0;
    for (int round = 1; round <= WarmUp + Rounds; ++round)
    {
        try
        {
            work(round);
        }
        catch (const RuleBroken& broken)
        {
            throw RuleSkipped(broken.what());
        }
        before = round == WarmUp ? OpenHandles() : before;
    }
    const DWORD after = OpenHandles();
    Demand(after < before + Rounds, std::to_string(Rounds) + ' ' + what + " leave " +
                                        std::to_string(static_cast<int>(after - before)) + " handles open");
}

} // namespace

void ProviderRules::Loads(ValidationSubject& subject)
{
    const std::size_t longest = subject.IsMSSCCI() ? InstalledProviders::MaxText - 2 : PluginSearch::MaxPath;
    Demand(subject.Library().size() <= longest,
           "its path is longer than " + std::to_string(longest) + " characters, which no host finds");
    try
    {
        const ValidationLibrary library(subject);
    }
    catch (const RuleSkipped& reason)
    {
        throw RuleBroken(reason.what());
    }
}

void ProviderRules::Starts(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    const int result = provider.Initialize();
    Demand(result == 0,
           "Initialize gives " + std::to_string(result) + " to a client with name, user and client access");
}

void ProviderRules::State(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    const auto demand = [&](const std::string& when, bool initialized, bool open) {
        const bool isInitialized = subject.Call("IsInitialized", [&] { return provider.Get().IsInitialized(); });
        const bool isOpen = subject.Call("IsProjectOpen", [&] { return provider.Get().IsProjectOpen(); });
        Demand(isInitialized == initialized,
               std::string("IsInitialized is ") + (isInitialized ? "true " : "false ") + when);
        Demand(isOpen == open, std::string("IsProjectOpen is ") + (isOpen ? "true " : "false ") + when);
    };
    demand("at first", false, false);
    provider.Begin();
    demand("after OpenProject", true, true);
    if (provider.CloseProject() == 0)
    {
        demand("after CloseProject", true, false);
    }
    if (provider.OpenProject() == 0 && provider.Uninitialize() == 0)
    {
        demand("after Uninitialize", false, false);
    }
}

void ProviderRules::Reserved(ValidationSubject& subject)
{
    constexpr int Success = 0;
    constexpr int NotOffered = -2;
    ValidationProvider provider(subject);
    const struct
    {
        const char* name;
        int (IOrvixProvider::*operation)();
        int result;
    } operations[] = {
        {"ReservedA", &IOrvixProvider::ReservedA, Success},    {"ReservedB", &IOrvixProvider::ReservedB, Success},
        {"ReservedC", &IOrvixProvider::ReservedC, NotOffered}, {"ReservedE", &IOrvixProvider::ReservedE, NotOffered},
        {"ReservedF", &IOrvixProvider::ReservedF, NotOffered}, {"ReservedG", &IOrvixProvider::ReservedG, NotOffered},
        {"ReservedH", &IOrvixProvider::ReservedH, NotOffered},
    };
    for (const auto& [name, operation, expected] : operations)
    {
        const int result = subject.Call(name, [&] { return (provider.Get().*operation)(); });
        Demand(result == expected, std::string(name) + " gives " + std::to_string(result));
    }
    unsigned long first = 1;
    unsigned long second = 1;
    const int result = subject.Call("ReservedD", [&] { return provider.Get().ReservedD(nullptr, &first, &second); });
    Demand(result == NotOffered, "ReservedD gives " + std::to_string(result));
    Demand(first == 0 && second == 0, "ReservedD does not store 0 through both pointers");
    Demand(subject.Call("ReservedI", [&] { return provider.Get().ReservedI(); }), "ReservedI gives false");
}

void ProviderRules::Results(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    DemandResult("Initialize", provider.Initialize());
    DemandResult("OpenProject", provider.OpenProject());
    if (!provider.Get().IsProjectOpen())
    {
        throw RuleSkipped("no project is open");
    }
    std::map<unsigned long, std::vector<int>> results; // by the options
    for (const unsigned long options : AllOptions)
    {
        Files files(GoodFiles(subject, options));
        const std::string on = " with options " + Hexadecimal(options);
        for (const Operation& operation : WayOfAFile(options))
        {
            const int result = Run(subject, provider, operation, files.List(), on);
            const std::string what = operation.name + on;
            DemandResult(what, result);
            results[options].push_back(result);
            const int asked = results[options & ~NotAsked].at(results[options].size() - 1);
            Demand(result == asked, what + " gives " + std::to_string(result) + ", and " + std::to_string(asked) +
                                        " with " + Hexadecimal(options & ~NotAsked));
        }
    }
    DemandResult("CloseProject", provider.CloseProject());
    DemandResult("Uninitialize", provider.Uninitialize());
}

void ProviderRules::BadInput(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    provider.Begin();
    const auto demand = [&](const Operation& operation, Files& files, const std::string& on, const wchar_t* comment) {
        DemandResult(operation.name + on, Run(subject, provider, operation, files.List(), on, comment));
    };
    const std::wstring good = GoodFiles(subject).front();
    std::vector<std::vector<std::wstring>> lists = {{good, good}};
    for (const std::wstring& path : BadPaths(subject))
    {
        lists.push_back({good, path});
    }
    for (const std::vector<std::wstring>& paths : lists)
    {
        Files files(paths);
        for (const Operation& operation :
             {QueryStatus(), Add(0), CheckOut(0), UndoCheckOut(0), CheckIn(0), GetLatest(0)})
        {
            demand(operation, files, On(paths.back()), Comment);
        }
    }
    Files files({good});
    for (const std::wstring& comment :
         {std::wstring(), std::wstring(L"\u5009\u5EAB\r\n\xD800"), std::wstring(100000, L'x')})
    {
        demand(CheckOut(0), files, " with an odd comment", comment.c_str());
        demand(CheckIn(0), files, " with an odd comment", comment.c_str());
    }
    for (const std::wstring& path : BadPaths(subject))
    {
        const std::string what = "OpenProject" + On(path);
        DemandResult(what, subject.Call(what, [&] { return provider.Get().OpenProject(path.c_str(), Comment); }));
    }
}

void ProviderRules::EmptyList(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    provider.Begin();
    OrvixFileList list;
    list.CreateEntry(GoodFiles(subject).front().c_str(), nullptr, Selected, 0); // in the list, but not active
    for (const Operation& operation : {QueryStatus(), Add(0), CheckOut(0), UndoCheckOut(0), CheckIn(0), GetLatest(0),
                                       ShowHistory(), ShowProperties()})
    {
        const int result = Run(subject, provider, operation, &list);
        Demand(result == -1, std::string(operation.name) + " gives " + std::to_string(result));
    }
}

void ProviderRules::StatusBits(ValidationSubject& subject)
{
    constexpr unsigned long Documented =
        OrvixFileState::NotControlled | OrvixFileState::Controlled | OrvixFileState::CheckedOut |
        OrvixFileState::CheckedOutByOther | OrvixFileState::OutOfDate | OrvixFileState::Deleted |
        OrvixFileState::Modified | OrvixFilePermission::CheckIn | OrvixFilePermission::CheckOut |
        OrvixFilePermission::UndoCheckOut | OrvixFilePermission::Compare | OrvixFilePermission::Add |
        OrvixFilePermission::GetLatest | OrvixFilePermission::ShowHistory;
    constexpr unsigned long Either = OrvixFileState::NotControlled | OrvixFileState::Controlled;

    ValidationProvider provider(subject);
    provider.Begin();
    for (const unsigned long options : AllOptions)
    {
        const std::vector<std::wstring> paths = GoodFiles(subject, options);
        for (const Operation& operation : WayOfAFile(options))
        {
            Files files(paths);
            Run(subject, provider, operation, files.List());
            Files asked(paths);
            if (Run(subject, provider, QueryStatus(), asked.List()) != 0)
            {
                throw RuleSkipped("QueryStatus fails");
            }
            for (const unsigned long flags : asked.Flags())
            {
                Demand(flags != Untouched, "QueryStatus does not write an entry's FlagsOut");
                Demand((flags & ~Documented) == 0, "QueryStatus sets bits that mean nothing: " + Hexadecimal(flags));
                Demand((flags & Either) != Either,
                       "QueryStatus says controlled and not controlled: " + Hexadecimal(flags));
            }
        }
    }
}

void ProviderRules::StatusFailure(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    provider.Begin();
    const std::wstring good = GoodFiles(subject).front();
    bool hasFailed = false;
    const auto query = [&](const std::wstring& path) {
        Files files({good, path});
        if (Run(subject, provider, QueryStatus(), files.List(), On(path)) != 0)
        {
            hasFailed = true;
            Demand(files.Flags() == std::vector{Untouched, Untouched},
                   "QueryStatus fails and changes FlagsOut" + On(path));
        }
    };
    for (const std::wstring& path : BadPaths(subject))
    {
        query(path);
    }
    // What the provider keeps in the project is damaged, and then gone.
    Files added({good});
    Run(subject, provider, Add(0), added.List());
    std::error_code ignored;
    for (std::filesystem::recursive_directory_iterator entry(subject.Project()), end; entry != end; ++entry)
    {
        const std::filesystem::path& path = entry->path();
        if ((GetFileAttributesW(path.c_str()) & FILE_ATTRIBUTE_REPARSE_POINT) != 0)
        {
            entry.disable_recursion_pending(); // what a link leads to is not the project's
        }
        else if (entry->is_regular_file(ignored) && std::filesystem::hard_link_count(path, ignored) == 1)
        {
            SetFileAttributesW(path.c_str(), FILE_ATTRIBUTE_NORMAL);
            std::ofstream(path, std::ios::binary) << "damaged";
        }
    }
    query(good);
    ValidationScratch::RemoveTree(subject.Project());
    query(good);
    if (!hasFailed)
    {
        throw RuleSkipped("QueryStatus never fails");
    }
}

void ProviderRules::StatusClosed(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    const std::vector<std::wstring> paths = GoodFiles(subject);
    const auto demand = [&](const std::string& when) {
        Files files(paths);
        const int result = Run(subject, provider, QueryStatus(), files.List());
        Demand(result == 0, "QueryStatus gives " + std::to_string(result) + when);
        for (const unsigned long flags : files.Flags())
        {
            Demand(flags == OrvixFileState::NotControlled, "QueryStatus writes " + Hexadecimal(flags) + when);
        }
    };
    if (provider.Initialize() != 0)
    {
        throw RuleSkipped("Initialize fails");
    }
    demand(" before OpenProject");
    if (provider.OpenProject() == 0 && provider.CloseProject() == 0)
    {
        demand(" after CloseProject");
    }
}

void ProviderRules::ListUntouched(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    provider.Begin();
    for (const unsigned long options : AllOptions)
    {
        Files files(GoodFiles(subject, options));
        const auto before = files.Rest();
        for (const Operation& operation : WayOfAFile(options))
        {
            Run(subject, provider, operation, files.List());
            Demand(files.Rest() == before, std::string(operation.name) + " changes more of the list than FlagsOut");
        }
    }
}

void ProviderRules::Sessions(ValidationSubject& subject)
{
    constexpr int Rounds = 10;
    ValidationProvider provider(subject);
    provider.Begin();
    provider.CloseProject();
    provider.Uninitialize();
    for (int round = 1; round <= Rounds; ++round)
    {
        RunSession(subject, provider, round);
    }
}

void ProviderRules::Reload(ValidationSubject& subject)
{
    constexpr int Rounds = 10;
    {
        ValidationProvider provider(subject);
        if (provider.Initialize() != 0)
        {
            throw RuleSkipped("Initialize fails");
        }
    }
    for (int round = 2; round <= Rounds; ++round)
    {
        RunLoadedSession(subject, round);
    }
}

void ProviderRules::Handles(ValidationSubject& subject)
{
    {
        ValidationProvider provider(subject);
        provider.Begin();
        provider.CloseProject();
        provider.Uninitialize();
        DemandNoLeak("sessions", [&](int round) { RunSession(subject, provider, round); });
    }
    DemandNoLeak("loads and unloads", [&](int round) { RunLoadedSession(subject, round); });
}

void ProviderRules::Dialogs(ValidationSubject& subject)
{
    constexpr int ReloadFile = 1; // of ShowHistory
    ValidationProvider provider(subject);
    provider.Begin();
    Files files(GoodFiles(subject));
    Run(subject, provider, Add(0), files.List());
    if (const int result = Run(subject, provider, ShowHistory(), files.List()); result != ReloadFile)
    {
        DemandResult("ShowHistory", result);
    }
    DemandResult("ShowProperties", Run(subject, provider, ShowProperties(), files.List()));
    DemandResult("ShowOptions", subject.Call("ShowOptions", [&] { return provider.Get().ShowOptions(); }));
    DemandResult("RunProviderClient",
                 subject.Call("RunProviderClient", [&] { return provider.Get().RunProviderClient(); }));
}
