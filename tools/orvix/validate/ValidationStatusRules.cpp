#include "OrvixFileFlags.h"
#include "OrvixProviderResult.h"
#include "Text.h"
#include "ValidationFiles.h"
#include "ValidationOperation.h"
#include "ValidationRules.h"
#include "ValidationScratch.h"

#include <filesystem>
#include <fstream>
#include <string>
#include <system_error>
#include <vector>

namespace
{

/// Throws `RuleBroken` when a `QueryStatus` that succeeded wrote these flags wrongly.
void CheckFlags(const std::vector<unsigned long>& allFlags)
{
    constexpr unsigned long Documented =
        OrvixFileState::NotControlled | OrvixFileState::Controlled | OrvixFileState::CheckedOut |
        OrvixFileState::CheckedOutByOther | OrvixFileState::OutOfDate | OrvixFileState::Deleted |
        OrvixFileState::Modified | OrvixFilePermission::CheckIn | OrvixFilePermission::CheckOut |
        OrvixFilePermission::UndoCheckOut | OrvixFilePermission::Compare | OrvixFilePermission::Add |
        OrvixFilePermission::GetLatest | OrvixFilePermission::ShowHistory;
    constexpr unsigned long Both = OrvixFileState::NotControlled | OrvixFileState::Controlled;

    for (const unsigned long flags : allFlags)
    {
        Require(flags != ActiveFiles::Unwritten, "QueryStatus does not write an entry's FlagsOut");
        Require((flags & ~Documented) == 0, "QueryStatus sets undocumented bits: " + Hexadecimal(flags));
        Require((flags & Both) != Both, "QueryStatus says controlled and not controlled: " + Hexadecimal(flags));
    }
}

/// Asks for the state of a good file and another one. Throws `RuleBroken` when that fails and changes an entry. Returns
/// whether it failed.
bool CheckFailure(ValidationSubject& subject, ValidationProvider& provider, const std::wstring& good,
                  const std::wstring& path)
{
    const std::string on = ValidationFiles::On(path);
    ActiveFiles files({good, path});
    if (ValidationOperation::QueryStatus().Run(subject, provider, files.List(), on) == OrvixProviderResult::Success)
    {
        return false;
    }
    Require(files.Flags() == std::vector{ActiveFiles::Unwritten, ActiveFiles::Unwritten},
            "QueryStatus fails and changes FlagsOut" + on);
    return true;
}

/// Overwrites every file of a folder. Links are left alone, since their targets are outside the folder.
void DamageFiles(const std::wstring& folder)
{
    std::error_code ignored;
    for (std::filesystem::recursive_directory_iterator entry(folder), end; entry != end; ++entry)
    {
        const std::filesystem::path& path = entry->path();
        if ((GetFileAttributesW(path.c_str()) & FILE_ATTRIBUTE_REPARSE_POINT) != 0)
        {
            entry.disable_recursion_pending();
        }
        else if (entry->is_regular_file(ignored) && std::filesystem::hard_link_count(path, ignored) == 1)
        {
            SetFileAttributesW(path.c_str(), FILE_ATTRIBUTE_NORMAL);
            std::ofstream(path, std::ios::binary) << "damaged";
        }
    }
}

} // namespace

void StatusRules::Bits(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    provider.Begin();
    for (const unsigned long options : ValidationOperation::AllOptions)
    {
        const std::vector<std::wstring> paths = ValidationFiles::MakeGood(subject, options);
        for (const ValidationOperation& operation : ValidationOperation::Scenario(options))
        {
            ActiveFiles files(paths);
            operation.Run(subject, provider, files.List());
            ActiveFiles queried(paths);
            const int result = ValidationOperation::QueryStatus().Run(subject, provider, queried.List());
            if (result != OrvixProviderResult::Success)
            {
                throw RuleSkipped("QueryStatus fails");
            }
            CheckFlags(queried.Flags());
        }
    }
}

void StatusRules::Failure(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    provider.Begin();
    const std::wstring good = ValidationFiles::MakeGood(subject).front();
    bool hasFailed = false;
    const auto query = [&](const std::wstring& path) {
        hasFailed = CheckFailure(subject, provider, good, path) || hasFailed;
    };
    for (const std::wstring& path : ValidationFiles::BadPaths(subject))
    {
        query(path);
    }
    // The provider's own files in the project are damaged, and then removed.
    ActiveFiles added({good});
    ValidationOperation::Add().Run(subject, provider, added.List());
    DamageFiles(subject.Project());
    query(good);
    ValidationScratch::RemoveTree(subject.Project());
    query(good);
    if (!hasFailed)
    {
        throw RuleSkipped("QueryStatus never fails");
    }
}

void StatusRules::Closed(ValidationSubject& subject)
{
    ValidationProvider provider(subject);
    const std::vector<std::wstring> paths = ValidationFiles::MakeGood(subject);
    const auto check = [&](const std::string& when) {
        ActiveFiles files(paths);
        const int result = ValidationOperation::QueryStatus().Run(subject, provider, files.List());
        Require(result == OrvixProviderResult::Success, "QueryStatus returns " + std::to_string(result) + when);
        for (const unsigned long flags : files.Flags())
        {
            Require(flags == OrvixFileState::NotControlled, "QueryStatus writes " + Hexadecimal(flags) + when);
        }
    };
    if (provider.Initialize() != OrvixProviderResult::Success)
    {
        throw RuleSkipped("Initialize fails");
    }
    check(" before OpenProject");
    if (provider.OpenProject() == OrvixProviderResult::Success &&
        provider.CloseProject() == OrvixProviderResult::Success)
    {
        check(" after CloseProject");
    }
}
