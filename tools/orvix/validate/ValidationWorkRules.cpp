#include "OrvixFileFlags.h"
#include "OrvixProviderResult.h"
#include "SccFunctions.h"
#include "Text.h"
#include "ValidationFiles.h"
#include "ValidationLibrary.h"
#include "ValidationOperation.h"
#include "ValidationRules.h"

#include <windows.h>

#include <filesystem>
#include <fstream>
#include <initializer_list>
#include <sstream>
#include <string>
#include <system_error>

namespace
{

namespace Scc = SccFunctions;

using OrvixProviderResult::NotOffered;
using OrvixProviderResult::Success;

constexpr const char* OldBytes = "the old text\r\n";
constexpr const char* NewBytes = "the new text, which is longer\r\n";

constexpr unsigned long Out = OrvixFileState::CheckedOut;
constexpr unsigned long In = OrvixFileState::Controlled;
constexpr unsigned long Contradiction = OrvixFileState::Controlled | OrvixFileState::NotControlled;

std::string Bytes(const std::wstring& path)
{
    std::ostringstream bytes;
    bytes << std::ifstream(std::filesystem::path(path), std::ios::binary).rdbuf();
    return bytes.str();
}

bool IsWritable(const std::wstring& path)
{
    const DWORD attributes = GetFileAttributesW(path.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_READONLY) == 0;
}

void Delete(const std::wstring& path)
{
    SetFileAttributesW(path.c_str(), FILE_ATTRIBUTE_NORMAL);
    DeleteFileW(path.c_str());
}

/// A file of an open scratch project.
class WorkedFile
{
public:
    WorkedFile(ValidationSubject& subject, ValidationProvider& provider, std::wstring path)
        : m_subject(subject), m_provider(provider), m_path(std::move(path))
    {
    }

    const std::wstring& Path() const { return m_path; }

    int TryToRun(const ValidationOperation& operation)
    {
        ActiveFiles files({m_path});
        return operation.Run(m_subject, m_provider, files.List());
    }

    /// Runs an operation that must succeed. Throws `RuleSkipped` when it is not offered.
    void Run(const ValidationOperation& operation)
    {
        const int result = TryToRun(operation);
        if (result == NotOffered)
        {
            throw RuleSkipped(std::string(operation.name) + " is not offered");
        }
        Require(result == Success, std::string(operation.name) + " returns " + std::to_string(result));
    }

    /// Runs an operation that another rule judges. Throws `RuleSkipped` when it fails or is not offered.
    void Need(const ValidationOperation& operation)
    {
        if (TryToRun(operation) != Success)
        {
            throw RuleSkipped(std::string(operation.name) + " fails");
        }
    }

    /// Throws `RuleSkipped` when the state is none, which the rule of the status bits reports.
    unsigned long State()
    {
        ActiveFiles files({m_path});
        const int result = ValidationOperation::QueryStatus().Run(m_subject, m_provider, files.List());
        Require(result == Success, "QueryStatus returns " + std::to_string(result));
        const unsigned long flags = files.Flags().front();
        if (flags == ActiveFiles::Unwritten || (flags & Contradiction) == Contradiction)
        {
            throw RuleSkipped("QueryStatus tells no state: " + Hexadecimal(flags));
        }
        return flags;
    }

    /// Throws `RuleBroken` unless the file has all states of `has` and none of `hasNot`.
    void RequireState(unsigned long has, unsigned long hasNot, const std::string& after)
    {
        const unsigned long flags = State();
        Require((flags & has) == has && (flags & hasNot) == 0,
                "after " + after + " QueryStatus says " + Hexadecimal(flags));
    }

    void RequireBytes(const std::string& bytes, const std::string& after) const
    {
        Require(Bytes(m_path) == bytes, "after " + after + " the file has other bytes");
    }

private:
    ValidationSubject& m_subject;
    ValidationProvider& m_provider;
    std::wstring m_path;
};

/// Puts a file under control. Where an added file counts as checked out, the check-in completes it.
void NeedControlled(WorkedFile& file)
{
    file.Need(ValidationOperation::Add());
    if ((file.State() & Out) != 0)
    {
        file.Need(ValidationOperation::CheckIn());
    }
}

/// Throws `RuleSkipped` when an MSSCCI library lacks a function, which the rule of the exports reports.
void NeedExports(ValidationSubject& subject, std::initializer_list<const char*> names)
{
    if (subject.IsMSSCCI())
    {
        const ValidationLibrary library(subject);
        for (const char* name : names)
        {
            library.Need<void()>(name);
        }
    }
}

/// Gets the file in a copy of the project, in a new session of the provider.
void CheckCopy(ValidationSubject& subject, ValidationProvider& provider)
{
    Require(provider.CloseProject() == Success, "CloseProject fails");
    const std::wstring copy = subject.Outside() + L"\\copy";
    std::error_code error;
    std::filesystem::copy(subject.Project(), copy, std::filesystem::copy_options::recursive, error);
    if (error || provider.OpenProject(copy) != Success)
    {
        subject.Remark("a copy of the project cannot be opened, so GetLatest was checked in the project alone");
        return;
    }
    WorkedFile file(subject, provider, copy + L"\\stored.txt");
    Delete(file.Path());
    file.Run(ValidationOperation::GetLatest());
    file.RequireBytes(NewBytes, "GetLatest in a copy of the project");
}

} // namespace

void WorkRules::Stores(ValidationSubject& subject)
{
    NeedExports(subject, {Scc::Add.name, Scc::Checkout.name, Scc::Checkin.name, Scc::Get.name, Scc::QueryInfo.name});
    ValidationProvider provider(subject);
    provider.Begin();
    WorkedFile file(subject, provider, subject.Write(L"stored.txt", OldBytes));
    file.Run(ValidationOperation::Add());
    file.RequireState(In, OrvixFileState::NotControlled, "Add");
    file.RequireBytes(OldBytes, "Add");
    file.Need(ValidationOperation::CheckOut());
    subject.Write(L"stored.txt", NewBytes);
    file.Run(ValidationOperation::CheckIn());
    file.RequireState(In, Out | OrvixFileState::Modified, "CheckIn");
    file.RequireBytes(NewBytes, "CheckIn");
    Delete(file.Path());
    file.Run(ValidationOperation::GetLatest());
    file.RequireBytes(NewBytes, "GetLatest of a deleted file");
    CheckCopy(subject, provider);
}

void WorkRules::ChecksOut(ValidationSubject& subject)
{
    NeedExports(subject, {Scc::Add.name, Scc::Checkout.name, Scc::Uncheckout.name, Scc::QueryInfo.name});
    ValidationProvider provider(subject);
    provider.Begin();
    WorkedFile file(subject, provider, subject.Write(L"taken.txt", OldBytes));
    NeedControlled(file);
    file.Run(ValidationOperation::CheckOut());
    file.RequireState(In | Out, OrvixFileState::NotControlled, "CheckOut");
    Require(IsWritable(file.Path()), "after CheckOut the file is read-only");
    file.RequireBytes(OldBytes, "CheckOut");
    subject.Write(L"taken.txt", NewBytes);
    file.Run(ValidationOperation::UndoCheckOut());
    file.RequireState(In, Out | OrvixFileState::Modified, "UndoCheckOut");
    file.RequireBytes(OldBytes, "UndoCheckOut");
}

void WorkRules::StatusTruth(ValidationSubject& subject)
{
    constexpr unsigned long OfControlled = In | Out | OrvixFileState::CheckedOutByOther | OrvixFileState::OutOfDate |
                                           OrvixFileState::Modified | OrvixFilePermission::CheckIn |
                                           OrvixFilePermission::CheckOut | OrvixFilePermission::UndoCheckOut;
    constexpr unsigned long Changed = OrvixFileState::Modified | OrvixFileState::OutOfDate | OrvixFileState::Deleted;

    NeedExports(subject, {Scc::Add.name, Scc::Checkout.name, Scc::QueryInfo.name});
    ValidationProvider provider(subject);
    provider.Begin();
    WorkedFile file(subject, provider, subject.Write(L"asked.txt", OldBytes));
    file.RequireState(0, OfControlled, "making a new file");
    file.Need(ValidationOperation::Add());
    file.RequireState(In, Changed | OrvixFileState::NotControlled | OrvixFilePermission::Add, "Add");
    file.Need(ValidationOperation::CheckOut());
    file.RequireState(In, Changed | OrvixFileState::NotControlled | OrvixFilePermission::Add, "CheckOut");
    WorkedFile missing(subject, provider, subject.Project() + L"\\never there.txt");
    missing.RequireState(0, OfControlled, "nothing, of a file that never existed,");
}

void WorkRules::Failures(ValidationSubject& subject)
{
    NeedExports(subject, {Scc::QueryInfo.name});
    ValidationProvider provider(subject);
    provider.Begin();
    for (const ValidationOperation& operation : {ValidationOperation::CheckOut(), ValidationOperation::CheckIn(),
                                                 ValidationOperation::UndoCheckOut(), ValidationOperation::GetLatest()})
    {
        WorkedFile file(subject, provider, subject.Write(L"kept by " + Wide(operation.name) + L".txt", OldBytes));
        const unsigned long before = file.State();
        const std::string bytes = Bytes(file.Path());
        if (file.TryToRun(operation) != Success)
        {
            const std::string after = std::string("a failed ") + operation.name;
            file.RequireBytes(bytes, after);
            const unsigned long state = file.State();
            Require(state == before, "after " + after + " QueryStatus says " + Hexadecimal(state) + " instead of " +
                                         Hexadecimal(before));
        }
    }
}
