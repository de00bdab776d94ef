#include "SccFunctions.h"
#include "Text.h"
#include "ValidationRules.h"
#include "ValidationScc.h"

#include <algorithm>
#include <cstring>
#include <iterator>
#include <string>
#include <string_view>
#include <vector>

namespace
{

/// A function that a library need not export, or that a capability bit promises. Every other function is needed and has
/// no bit.
struct FunctionDetail
{
    const char* name;
    LONG capability; ///< 0 for none
    bool isNeeded;   ///< OrvixCore cannot work on files without it
};

constexpr FunctionDetail FunctionDetails[] = {
    {SccFunctions::GetProjPath.name, SCC_CAP_GETPROJPATH, false},
    {SccFunctions::BeginBatch.name, SCC_CAP_BATCH, false},
    {SccFunctions::EndBatch.name, SCC_CAP_BATCH, false},
    {SccFunctions::History.name, SCC_CAP_HISTORY, false},
    {SccFunctions::Properties.name, SCC_CAP_PROPERTIES, false},
    {SccFunctions::QueryInfo.name, SCC_CAP_QUERYINFO, true},
    {SccFunctions::PopulateList.name, SCC_CAP_POPULATELIST, false},
    {SccFunctions::RunScc.name, SCC_CAP_RUNSCC, false},
    {SccFunctions::GetCommandOptions.name, SCC_CAP_GETCOMMANDOPTIONS, false},
    {SccFunctions::AddFromScc.name, SCC_CAP_ADDFROMSCC, false},
    {SccFunctions::SetOption.name, 0, false},
};

FunctionDetail DetailOf(const char* name)
{
    const auto* found =
        std::find_if(std::begin(FunctionDetails), std::end(FunctionDetails),
                     [name = std::string_view(name)](const FunctionDetail& detail) { return detail.name == name; });
    return found == std::end(FunctionDetails) ? FunctionDetail{name, 0, true} : *found;
}

constexpr LPCSTR Comment = "validation";

/// File names as they are passed to a library, with a copy to see whether the library writes to them.
class Names
{
public:
    explicit Names(std::vector<std::string> names) : m_names(std::move(names)), m_passed(m_names)
    {
        for (const std::string& name : m_passed)
        {
            m_pointers.push_back(name.c_str());
        }
        m_passedPointers = m_pointers;
    }
    Names(const Names&) = delete;
    Names& operator=(const Names&) = delete;
    ~Names() = default;

    LONG Count() const { return static_cast<LONG>(m_passedPointers.size()); }
    LPCSTR* Get() { return m_passedPointers.data(); }

    bool AreUnchanged() const { return m_passed == m_names && m_passedPointers == m_pointers; }

private:
    std::vector<std::string> m_names;
    std::vector<std::string> m_passed;
    std::vector<LPCSTR> m_pointers;
    std::vector<LPCSTR> m_passedPointers;
};

std::vector<std::string> GoodNames(const ValidationSubject& subject)
{
    return {ValidationScc::Narrow(subject.Write(L"first.txt", "first\r\n")),
            ValidationScc::Narrow(subject.Write(L"with blanks.bin", std::string("\0\xFF", 2)))};
}

/// The good names, and names of no file of the project. All are in the scratch folder, which is the current folder.
std::vector<std::string> AllNames(const ValidationSubject& subject)
{
    std::vector<std::string> names = GoodNames(subject);
    const std::string project = ValidationScc::Narrow(subject.Project());
    for (const std::string& name : {std::string(), std::string("relative.txt"), project, project + "\\missing.txt",
                                    project + "\\what?.txt", project + "\\<>|\".txt", project + "\\..\\outside\\x.txt",
                                    project + '\\' + std::string(250, 'x'), project + '\\' + std::string(5000, 'x')})
    {
        names.push_back(name);
    }
    return names;
}

/// A call on files that shows no windows.
struct Step
{
    const char* name;
    SCCRTN (*run)(ValidationScc& scc, LONG count, LPCSTR* names);
};

SCCRTN QueryInfo(ValidationScc& scc, LONG count, LPCSTR* names)
{
    std::vector<LONG> status(static_cast<std::size_t>(count) + 1);
    return scc.Call(SccFunctions::QueryInfo, scc.Context(), count, names, status.data());
}

template <LONG Options>
SCCRTN Add(ValidationScc& scc, LONG count, LPCSTR* names)
{
    std::vector<LONG> options(static_cast<std::size_t>(count) + 1, Options);
    return scc.Call(SccFunctions::Add, scc.Context(), nullptr, count, names, Comment, options.data(), nullptr);
}

SCCRTN Checkout(ValidationScc& scc, LONG count, LPCSTR* names)
{
    return scc.Call(SccFunctions::Checkout, scc.Context(), nullptr, count, names, Comment, 0, nullptr);
}

template <LONG Options>
SCCRTN Checkin(ValidationScc& scc, LONG count, LPCSTR* names)
{
    return scc.Call(SccFunctions::Checkin, scc.Context(), nullptr, count, names, Comment, Options, nullptr);
}

SCCRTN Uncheckout(ValidationScc& scc, LONG count, LPCSTR* names)
{
    return scc.Call(SccFunctions::Uncheckout, scc.Context(), nullptr, count, names, 0, nullptr);
}

SCCRTN Get(ValidationScc& scc, LONG count, LPCSTR* names)
{
    return scc.Call(SccFunctions::Get, scc.Context(), nullptr, count, names, 0, nullptr);
}

/// The calls that take a file through all states, with the options that OrvixCore passes.
constexpr Step Scenario[] = {
    {SccFunctions::QueryInfo.name, QueryInfo},
    {SccFunctions::Add.name, Add<0>},
    {SccFunctions::QueryInfo.name, QueryInfo},
    {SccFunctions::Checkout.name, Checkout},
    {SccFunctions::Checkin.name, Checkin<SCC_KEEP_CHECKEDOUT>},
    {SccFunctions::Uncheckout.name, Uncheckout},
    {SccFunctions::Checkout.name, Checkout},
    {SccFunctions::Checkin.name, Checkin<0>},
    {SccFunctions::Get.name, Get},
    {SccFunctions::Add.name, Add<SCC_KEEP_CHECKEDOUT>},
    {SccFunctions::QueryInfo.name, QueryInfo},
};

void RunScenario(ValidationScc& scc, Names& names)
{
    for (const Step& step : Scenario)
    {
        step.run(scc, names.Count(), names.Get());
    }
}

/// Checks what a library prints. The callback is a plain function, so its data is static.
class OutputCheck
{
public:
    static inline std::string problem; ///< of the last line with one; empty for none
    static inline int lines = 0;

    static LONG Receive(LPCSTR text, LONG kind)
    {
        constexpr LONG LastKind = 11; // SCC_MSG_BACKGROUND_ON_MESSAGE
        constexpr LONG DoCancel = 5;  // SCC_MSG_DOCANCEL, which has no text
        ++lines;
        if (kind < SCC_MSG_INFO || kind > LastKind)
        {
            problem = "the kind " + std::to_string(kind) + " is unknown";
        }
        else if (kind <= SCC_MSG_ERROR && text == nullptr)
        {
            problem = "a line of kind " + std::to_string(kind) + " has no text";
        }
        else if (kind < DoCancel && text != nullptr && std::strpbrk(text, "\r\n") != nullptr)
        {
            problem = "a line contains a line end";
        }
        return SCC_MSG_RTN_OK;
    }
};

/// Throws `RuleBroken` when the status words of a query are wrong. `status` has more words than `count`, which were all
/// `guard` before.
void CheckStatusWords(const std::vector<LONG>& status, std::size_t count, LONG guard, bool succeeded)
{
    constexpr LONG KnownBits = 0x3FFF; // SCC_STATUS_...

    const auto end = status.begin() + static_cast<std::ptrdiff_t>(count);
    if (std::any_of(end, status.end(), [guard](LONG word) { return word != guard; }))
    {
        throw RuleBroken("SccQueryInfo writes more words than there are files");
    }
    for (auto word = status.begin(); succeeded && word != end; ++word)
    {
        if (*word == guard)
        {
            throw RuleBroken("SccQueryInfo does not write the word of a file");
        }
        if (*word != SCC_STATUS_INVALID && (*word & ~KnownBits) != 0)
        {
            throw RuleBroken("SccQueryInfo sets unknown bits: " + Hexadecimal(static_cast<unsigned long>(*word)));
        }
    }
}

} // namespace

void SccRules::Exports(ValidationSubject& subject)
{
    const ValidationLibrary library(subject);
    std::string missing;
    std::string without;
    for (const char* name : SccFunctions::Names)
    {
        if (!library.Has(name))
        {
            (DetailOf(name).isNeeded ? missing : without) += std::string(" ") + name;
        }
    }
    if (!missing.empty())
    {
        throw RuleBroken("it does not export" + missing);
    }
    if (!without.empty())
    {
        subject.Remark("without" + without + ": the operations that need these fail");
    }
}

void SccRules::Version(ValidationSubject& subject)
{
    const ValidationLibrary library(subject);
    const LONG version = subject.Call(SccFunctions::GetVersion.name,
                                      library.Need<decltype(SccGetVersion)>(SccFunctions::GetVersion.name));
    if (HIWORD(version) != 1 || LOWORD(version) > 3)
    {
        throw RuleBroken("SccGetVersion returns " + Hexadecimal(static_cast<unsigned long>(version)) +
                         ", not 0x00010000 to 0x00010003");
    }
}

void SccRules::Capabilities(ValidationSubject& subject)
{
    ValidationScc scc(subject);
    scc.Initialize();
    std::string missing;
    for (const char* name : SccFunctions::Names)
    {
        if ((scc.Capabilities() & DetailOf(name).capability) != 0 && !scc.Library().Has(name))
        {
            missing += std::string(" ") + name;
        }
    }
    if (!missing.empty())
    {
        throw RuleBroken("the bits " + Hexadecimal(static_cast<unsigned long>(scc.Capabilities())) + " promise" +
                         missing);
    }
}

void SccRules::Texts(ValidationSubject& subject)
{
    ValidationScc scc(subject);
    scc.Initialize();
    scc.CheckTexts();
    scc.Open(nullptr);
    scc.CheckTexts();
}

void SccRules::InputTexts(ValidationSubject& subject)
{
    ValidationScc scc(subject);
    scc.Begin(nullptr);
    scc.CheckInputTexts();
    Names names(GoodNames(subject));
    for (const Step& step : Scenario)
    {
        step.run(scc, names.Count(), names.Get());
        if (!names.AreUnchanged())
        {
            throw RuleBroken(std::string(step.name) + " writes to the file names");
        }
    }
}

void SccRules::Codes(ValidationSubject& subject)
{
    ValidationScc scc(subject);
    scc.Begin(nullptr);
    Names good(GoodNames(subject));
    RunScenario(scc, good);
    for (const std::string& name : AllNames(subject))
    {
        Names one({name});
        RunScenario(scc, one);
    }
    scc.End();
    scc.CheckCodes();
}

void SccRules::NullArguments(ValidationSubject& subject)
{
    ValidationScc scc(subject);
    scc.Begin(nullptr);
    for (const Step& step : Scenario)
    {
        LPCSTR none = nullptr;
        step.run(scc, 0, &none);
    }
    if (scc.Library().Has(SccFunctions::GetCommandOptions.name))
    {
        scc.Call(SccFunctions::GetCommandOptions, scc.Context(), nullptr, SCC_COMMAND_OPTIONS, nullptr);
    }
    if (scc.Library().Has(SccFunctions::AddFromScc.name))
    {
        scc.Call(SccFunctions::AddFromScc, scc.Context(), nullptr, nullptr, nullptr);
    }
}

void SccRules::InfoBits(ValidationSubject& subject)
{
    constexpr LONG Guard = 0x5A5A5A5A;
    constexpr std::size_t GuardWords = 64;

    ValidationScc scc(subject);
    scc.Begin(nullptr);
    Names names(GoodNames(subject));
    const auto count = static_cast<std::size_t>(names.Count());
    for (const Step& step : Scenario)
    {
        step.run(scc, names.Count(), names.Get());
        std::vector<LONG> status(count + GuardWords, Guard);
        const SCCRTN result =
            scc.Call(SccFunctions::QueryInfo, scc.Context(), names.Count(), names.Get(), status.data());
        CheckStatusWords(status, count, Guard, result >= SCC_OK);
    }
}

void SccRules::TextOutput(ValidationSubject& subject)
{
    ValidationScc scc(subject);
    scc.Begin(OutputCheck::Receive);
    for (const std::string& name : AllNames(subject))
    {
        Names one({name});
        RunScenario(scc, one);
    }
    if (!OutputCheck::problem.empty())
    {
        throw RuleBroken(OutputCheck::problem);
    }
    if (OutputCheck::lines == 0)
    {
        throw RuleSkipped("it prints nothing");
    }
}
