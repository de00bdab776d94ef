#include "FileMark.h"
#include "InstalledProviders.h"
#include "OrvixProviderResult.h"
#include "PluginSearch.h"
#include "Text.h"
#include "ValidationFiles.h"
#include "ValidationOperation.h"
#include "ValidationRules.h"

#include <windows.h>

#include <functional>
#include <map>
#include <string>
#include <vector>

namespace
{

using OrvixProviderResult::Failure;
using OrvixProviderResult::NotOffered;
using OrvixProviderResult::Success;

/// Throws `RuleBroken` for a result that an operation must not return.
void RequireResult(const std::string& what, int result)
{
    Require(result == Success || result == Failure || result == NotOffered,
            what + " returns " + std::to_string(result));
}

/// A whole session with all option bits. Throws `RuleBroken` when it does not start and end with success.
void RunSession(ValidationSubject& subject, ValidationProvider& provider, int round)
{
    const auto requireSuccess = [round](const std::string& what, int result) {
        Require(result == Success,
                what + " returns " + std::to_string(result) + " in session " + std::to_string(round));
    };
    requireSuccess("Initialize", provider.Initialize());
    requireSuccess("OpenProject", provider.OpenProject());
    for (const unsigned long options : {OrvixProviderOption::NoDialog | OrvixProviderOption::KeepCheckedOut,
                                        OrvixProviderOption::NoDialog | OrvixProviderOption::GetLatest})
    {
        const std::wstring name = L"round" + std::to_wstring(round) + L'-' + std::to_wstring(options) + L".txt";
        ActiveFiles files({subject.Write(name, "round")});
        for (const ValidationOperation& operation : ValidationOperation::Scenario(options))
        {
            operation.Run(subject, provider, files.List());
        }
    }
    requireSuccess("CloseProject", provider.CloseProject());
    requireSuccess("Uninitialize", provider.Uninitialize());
}

/// Loads the library, starts and ends it, and unloads it.
void RunLoad(ValidationSubject& subject, int round)
{
    const std::string load = " in load " + std::to_string(round);
    try
    {
        ValidationProvider provider(subject);
        Require(provider.Initialize() == Success, "Initialize fails" + load);
        Require(provider.Uninitialize() == Success, "Uninitialize fails" + load);
    }
    catch (const RuleSkipped& skipped)
    {
        throw RuleBroken(skipped.what() + load);
    }
}

/// The number of open handles of this process. Where the system does not count them, each value is tried: handles are
/// the lowest free values.
DWORD CountHandles()
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

/// Throws `RuleBroken` when every round of `work` leaves a handle open, and `RuleSkipped` when a round breaks another
/// rule. A handle that is opened once and kept is no leak.
void RequireNoLeak(const std::string& what, const std::function<void(int round)>& work)
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
        before = round == WarmUp ? CountHandles() : before;
    }
    const DWORD after = CountHandles();
    Require(after < before + Rounds, std::to_string(Rounds) + ' ' + what + " leave " +
                                         std::to_string(static_cast<int>(after - before)) + " handles open");
}

/// Runs every operation on lists with a bad path, and on a list that names a file twice.
void CheckBadPaths(ValidationSubject& subject, ValidationProvider& provider, const std::wstring& good)
{
    std::vector<std::vector<std::wstring>> lists = {{good, good}};
    for (const std::wstring& path : ValidationFiles::BadPaths(subject))
    {
        lists.push_back({good, path});
    }
    for (const std::vector<std::wstring>& paths : lists)
    {
        const std::string on = ValidationFiles::On(paths.back());
        ActiveFiles files(paths);
        for (const ValidationOperation& operation : ValidationOperation::Silent())
        {
            RequireResult(operation.name + on, operation.Run(subject, provider, files.List(), on));
        }
    }
}

void CheckUnusualComments(ValidationSubject& subject, ValidationProvider& provider, const std::wstring& good)
{
    const std::string with = " with an unusual comment";
    ActiveFiles files({good});
    for (const std::wstring& comment :
         {std::wstring(), std::wstring(L"\u5009\u5EAB\r\n\xD800"), std::wstring(100000, L'x')})
    {
        for (const ValidationOperation& operation : {ValidationOperation::CheckOut(), ValidationOperation::CheckIn()})
        {
            RequireResult(operation.name + with, operation.Run(subject, provider, files.List(), with, comment.c_str()));
        }
    }
}

} // namespace

void ProviderRules::Loads(ValidationSubject& subject)
{
    const std::size_t longest = subject.IsMSSCCI() ? InstalledProviders::MaxText - 2 : PluginSearch::MaxPath;
    Require(subject.Library().size() <= longest,
            "its path is longer than " + std::to_string(longest) + " characters, so no host finds it");
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
    Require(result == Success,
            "Initialize returns " + std::to_string(result) + " for a client with name, user and client access");
}

void ProviderRules::State(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    const auto check = [&](const std::string& when, bool initialized, bool open) {
        const bool isInitialized = subject.Call("IsInitialized", [&] { return provider.Get().IsInitialized(); });
        const bool isOpen = subject.Call("IsProjectOpen", [&] { return provider.Get().IsProjectOpen(); });
        Require(isInitialized == initialized,
                std::string("IsInitialized is ") + (isInitialized ? "true " : "false ") + when);
        Require(isOpen == open, std::string("IsProjectOpen is ") + (isOpen ? "true " : "false ") + when);
    };
    check("at first", false, false);
    provider.Begin();
    check("after OpenProject", true, true);
    if (provider.CloseProject() == Success)
    {
        check("after CloseProject", true, false);
    }
    if (provider.OpenProject() == Success && provider.Uninitialize() == Success)
    {
        check("after Uninitialize", false, false);
    }
}

void ProviderRules::Reserved(ValidationSubject& subject)
{
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
        Require(result == expected, std::string(name) + " returns " + std::to_string(result));
    }
    unsigned long first = 1;
    unsigned long second = 1;
    const int result = subject.Call("ReservedD", [&] { return provider.Get().ReservedD(nullptr, &first, &second); });
    Require(result == NotOffered, "ReservedD returns " + std::to_string(result));
    Require(first == 0 && second == 0, "ReservedD does not store 0 through both pointers");
    Require(subject.Call("ReservedI", [&] { return provider.Get().ReservedI(); }), "ReservedI returns false");
}

void ProviderRules::Results(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    RequireResult("Initialize", provider.Initialize());
    RequireResult("OpenProject", provider.OpenProject());
    if (!provider.Get().IsProjectOpen())
    {
        throw RuleSkipped("no project is open");
    }
    std::map<unsigned long, std::vector<int>> results; // by options
    for (const unsigned long options : ValidationOperation::AllOptions)
    {
        const unsigned long otherOptions = options & ~OrvixProviderOption::NoDialog;
        const std::string with = " with options " + Hexadecimal(options);
        ActiveFiles files(ValidationFiles::MakeGood(subject, options));
        for (const ValidationOperation& operation : ValidationOperation::Scenario(options))
        {
            const int result = operation.Run(subject, provider, files.List(), with);
            const std::string what = operation.name + with;
            RequireResult(what, result);
            results[options].push_back(result);
            const int otherResult = results[otherOptions].at(results[options].size() - 1);
            Require(result == otherResult, what + " returns " + std::to_string(result) + ", and " +
                                               std::to_string(otherResult) + " with " + Hexadecimal(otherOptions));
        }
    }
    RequireResult("CloseProject", provider.CloseProject());
    RequireResult("Uninitialize", provider.Uninitialize());
}

void ProviderRules::BadInput(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    provider.Begin();
    const std::wstring good = ValidationFiles::MakeGood(subject).front();
    CheckBadPaths(subject, provider, good);
    CheckUnusualComments(subject, provider, good);
    for (const std::wstring& path : ValidationFiles::BadPaths(subject))
    {
        const std::string what = "OpenProject" + ValidationFiles::On(path);
        RequireResult(what, subject.Call(what, [&] {
            return provider.Get().OpenProject(path.c_str(), ValidationOperation::UsualComment);
        }));
    }
}

void ProviderRules::EmptyList(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    provider.Begin();
    const std::wstring good = ValidationFiles::MakeGood(subject).front();
    OrvixFileList empty;
    empty.CreateEntry(good.c_str(), nullptr, FileMark::Chosen, 0); // in the list, but not active
    std::vector<ValidationOperation> operations = ValidationOperation::Silent();
    operations.push_back(ValidationOperation::ShowHistory());
    operations.push_back(ValidationOperation::ShowProperties());
    for (const ValidationOperation& operation : operations)
    {
        const int result = operation.Run(subject, provider, &empty);
        const std::string returns = operation.name + (" returns " + std::to_string(result));
        if (result != NotOffered)
        {
            Require(result == Failure, returns);
            continue;
        }
        ActiveFiles files({good});
        const int fileResult = operation.Run(subject, provider, files.List(), " on a file");
        Require(fileResult == NotOffered, returns + ", and " + std::to_string(fileResult) + " on a file");
    }
}

void ProviderRules::ListUntouched(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    provider.Begin();
    for (const unsigned long options : ValidationOperation::AllOptions)
    {
        ActiveFiles files(ValidationFiles::MakeGood(subject, options));
        const auto before = files.HostParts();
        for (const ValidationOperation& operation : ValidationOperation::Scenario(options))
        {
            operation.Run(subject, provider, files.List());
            Require(files.HostParts() == before,
                    std::string(operation.name) + " changes more of the list than FlagsOut");
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
        if (provider.Initialize() != Success)
        {
            throw RuleSkipped("Initialize fails");
        }
    }
    for (int round = 2; round <= Rounds; ++round)
    {
        RunLoad(subject, round);
    }
}

void ProviderRules::Handles(ValidationSubject& subject)
{
    {
        ValidationProvider provider(subject);
        provider.Begin();
        provider.CloseProject();
        provider.Uninitialize();
        RequireNoLeak("sessions", [&](int round) { RunSession(subject, provider, round); });
    }
    RequireNoLeak("loads and unloads", [&](int round) { RunLoad(subject, round); });
}

void ProviderRules::Dialogs(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    provider.Begin();
    ActiveFiles files(ValidationFiles::MakeGood(subject));
    ValidationOperation::Add().Run(subject, provider, files.List());
    const int history = ValidationOperation::ShowHistory().Run(subject, provider, files.List());
    if (history != OrvixProviderResult::ReloadFiles)
    {
        RequireResult("ShowHistory", history);
    }
    RequireResult("ShowProperties", ValidationOperation::ShowProperties().Run(subject, provider, files.List()));
    RequireResult("ShowOptions", subject.Call("ShowOptions", [&] { return provider.Get().ShowOptions(); }));
    RequireResult("RunProviderClient",
                  subject.Call("RunProviderClient", [&] { return provider.Get().RunProviderClient(); }));
}
