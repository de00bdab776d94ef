#include "SccFunctions.h"
#include "Text.h"
#include "ValidationRules.h"
#include "ValidationScc.h"

#include <array>
#include <cstring>
#include <iterator>
#include <string>
#include <vector>

namespace
{

/// A function of the interface.
struct Function
{
    const char* name;
    bool isNeeded;   ///< OrvixCore cannot do without it
    LONG capability; ///< the bit that promises it; 0 for none
};

constexpr Function Functions[] = {
    {SccFunctions::GetVersion.name, true, 0},
    {SccFunctions::Initialize.name, true, 0},
    {SccFunctions::Uninitialize.name, true, 0},
    {SccFunctions::OpenProject.name, true, 0},
    {SccFunctions::CloseProject.name, true, 0},
    {SccFunctions::GetProjPath.name, false, SCC_CAP_GETPROJPATH},
    {SccFunctions::Get.name, true, 0},
    {SccFunctions::Checkout.name, true, 0},
    {SccFunctions::Uncheckout.name, true, 0},
    {SccFunctions::Checkin.name, true, 0},
    {SccFunctions::Add.name, true, 0},
    {SccFunctions::BeginBatch.name, false, SCC_CAP_BATCH},
    {SccFunctions::EndBatch.name, false, SCC_CAP_BATCH},
    {SccFunctions::History.name, false, SCC_CAP_HISTORY},
    {SccFunctions::Properties.name, false, SCC_CAP_PROPERTIES},
    {SccFunctions::QueryInfo.name, true, SCC_CAP_QUERYINFO},
    {SccFunctions::PopulateList.name, false, SCC_CAP_POPULATELIST},
    {SccFunctions::RunScc.name, false, SCC_CAP_RUNSCC},
    {SccFunctions::GetCommandOptions.name, false, SCC_CAP_GETCOMMANDOPTIONS},
    {SccFunctions::AddFromScc.name, false, SCC_CAP_ADDFROMSCC},
    {SccFunctions::SetOption.name, false, 0},
};
static_assert(std::size(Functions) == std::size(SccFunctions::Names));

constexpr LPCSTR Comment = "validation";

/// File names as a library is given them.
class Names
{
public:
    explicit Names(std::vector<std::string> names) : m_names(std::move(names)), m_given(m_names)
    {
        for (const std::string& name : m_given)
        {
            m_pointers.push_back(name.c_str());
        }
        m_pointersGiven = m_pointers;
    }
    Names(const Names&) = delete;
    Names& operator=(const Names&) = delete;
    ~Names() = default;

    LONG Count() const { return static_cast<LONG>(m_pointersGiven.size()); }
    LPCSTR* Get() { return m_pointersGiven.data(); }

    bool AreKept() const { return m_given == m_names && m_pointersGiven == m_pointers; }

private:
    std::vector<std::string> m_names;
    std::vector<std::string> m_given;
    std::vector<LPCSTR> m_pointers;
    std::vector<LPCSTR> m_pointersGiven;
};

std::vector<std::string> GoodNames(const ValidationSubject& subject)
{
    return {ValidationScc::Narrow(subject.Write(L"first.txt", "first\r\n")),
            ValidationScc::Narrow(subject.Write(L"with blanks.bin", std::string("\0\xFF", 2)))};
}

/// The good ones, and what is no file of the project. All lie in the scratch folder, the current one.
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
    return scc.Call<decltype(SccQueryInfo)>("SccQueryInfo", scc.Context(), count, names, status.data());
}

template <LONG Options>
SCCRTN Add(ValidationScc& scc, LONG count, LPCSTR* names)
{
    std::vector<LONG> options(static_cast<std::size_t>(count) + 1, Options);
    return scc.Call<decltype(SccAdd)>("SccAdd", scc.Context(), HWND{nullptr}, count, names, Comment, options.data(),
                                      LPCMDOPTS{nullptr});
}

SCCRTN Checkout(ValidationScc& scc, LONG count, LPCSTR* names)
{
    return scc.Call<decltype(SccCheckout)>("SccCheckout", scc.Context(), HWND{nullptr}, count, names, Comment, LONG{0},
                                           LPCMDOPTS{nullptr});
}

template <LONG Options>
SCCRTN Checkin(ValidationScc& scc, LONG count, LPCSTR* names)
{
    return scc.Call<decltype(SccCheckin)>("SccCheckin", scc.Context(), HWND{nullptr}, count, names, Comment, Options,
                                          LPCMDOPTS{nullptr});
}

SCCRTN Uncheckout(ValidationScc& scc, LONG count, LPCSTR* names)
{
    return scc.Call<decltype(SccUncheckout)>("SccUncheckout", scc.Context(), HWND{nullptr}, count, names, LONG{0},
                                             LPCMDOPTS{nullptr});
}

SCCRTN Get(ValidationScc& scc, LONG count, LPCSTR* names)
{
    return scc.Call<decltype(SccGet)>("SccGet", scc.Context(), HWND{nullptr}, count, names, LONG{0},
                                      LPCMDOPTS{nullptr});
}

/// A file's way through all states, with the options that OrvixCore passes.
constexpr Step WayOfAFile[] = {
    {"SccQueryInfo", QueryInfo},
    {"SccAdd", Add<0>},
    {"SccQueryInfo", QueryInfo},
    {"SccCheckout", Checkout},
    {"SccCheckin", Checkin<SCC_KEEP_CHECKEDOUT>},
    {"SccUncheckout", Uncheckout},
    {"SccCheckout", Checkout},
    {"SccCheckin", Checkin<0>},
    {"SccGet", Get},
    {"SccAdd", Add<SCC_KEEP_CHECKEDOUT>},
    {"SccQueryInfo", QueryInfo},
};

void RunWayOfAFile(ValidationScc& scc, Names& names)
{
    for (const Step& step : WayOfAFile)
    {
        step.run(scc, names.Count(), names.Get());
    }
}

/// What a library prints. Its callback is a bare function, so there is one for the process.
class Output
{
public:
    static inline std::string broken; ///< what was wrong with a line; empty for nothing
    static inline int lines = 0;

    static LONG Receive(LPCSTR text, LONG kind)
    {
        constexpr LONG LastKind = 11; // SCC_MSG_BACKGROUND_ON_MESSAGE
        constexpr LONG DoCancel = 5;  // SCC_MSG_DOCANCEL, which has no text
        ++lines;
        if (kind < SCC_MSG_INFO || kind > LastKind)
        {
            broken = "the kind " + std::to_string(kind) + " means nothing";
        }
        else if (kind <= SCC_MSG_ERROR && text == nullptr)
        {
            broken = "a line of kind " + std::to_string(kind) + " has no text";
        }
        else if (kind < DoCancel && text != nullptr && std::strpbrk(text, "\r\n") != nullptr)
        {
            broken = "a line carries a line end";
        }
        return SCC_MSG_RTN_OK;
    }
};

} // namespace

void SccRules::Exports(ValidationSubject& subject)
{
    const ValidationLibrary library(subject);
    std::string missing;
    std::string without;
    for (const Function& function : Functions)
    {
        if (library.Find<void()>(function.name) == nullptr)
        {
            (function.isNeeded ? missing : without) += std::string(" ") + function.name;
        }
    }
    if (!missing.empty())
    {
        throw RuleBroken("it lacks" + missing);
    }
    if (!without.empty())
    {
        subject.Remark("without" + without + ": what needs these fails");
    }
}

void SccRules::Version(ValidationSubject& subject)
{
    const ValidationLibrary library(subject);
    const LONG version = subject.Call(SccFunctions::GetVersion.name,
                                      library.Need<decltype(SccGetVersion)>(SccFunctions::GetVersion.name));
    if (HIWORD(version) != 1 || LOWORD(version) > 3)
    {
        throw RuleBroken("SccGetVersion gives " + Hexadecimal(static_cast<unsigned long>(version)));
    }
}

void SccRules::Capabilities(ValidationSubject& subject)
{
    ValidationScc scc(subject);
    scc.Initialize();
    std::string missing;
    for (const Function& function : Functions)
    {
        if ((scc.Capabilities() & function.capability) != 0 && scc.Library().Find<void()>(function.name) == nullptr)
        {
            missing += std::string(" ") + function.name;
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
    for (const Step& step : WayOfAFile)
    {
        step.run(scc, names.Count(), names.Get());
        if (!names.AreKept())
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
    RunWayOfAFile(scc, good);
    for (const std::string& name : AllNames(subject))
    {
        Names one({name});
        RunWayOfAFile(scc, one);
    }
    scc.End();
    scc.CheckCodes();
}

void SccRules::NullArguments(ValidationSubject& subject)
{
    ValidationScc scc(subject);
    scc.Begin(nullptr);
    for (const Step& step : WayOfAFile)
    {
        LPCSTR none = nullptr;
        step.run(scc, 0, &none);
    }
    if (scc.Library().Find<void()>("SccGetCommandOptions") != nullptr)
    {
        scc.Call<decltype(SccGetCommandOptions)>("SccGetCommandOptions", scc.Context(), HWND{nullptr},
                                                 SCC_COMMAND_OPTIONS, static_cast<LPCMDOPTS*>(nullptr));
    }
    if (scc.Library().Find<void()>("SccAddFromScc") != nullptr)
    {
        scc.Call<decltype(SccAddFromScc)>("SccAddFromScc", scc.Context(), HWND{nullptr}, LPLONG{nullptr},
                                          static_cast<LPCSTR**>(nullptr));
    }
}

void SccRules::InfoBits(ValidationSubject& subject)
{
    constexpr LONG KnownBits = 0x3FFF;
    constexpr LONG Guard = 0x5A5A5A5A;

    ValidationScc scc(subject);
    scc.Begin(nullptr);
    Names names(GoodNames(subject));
    for (const Step& step : WayOfAFile)
    {
        step.run(scc, names.Count(), names.Get());
        std::vector<LONG> status(static_cast<std::size_t>(names.Count()) + 64, Guard);
        const SCCRTN result =
            scc.Call<decltype(SccQueryInfo)>("SccQueryInfo", scc.Context(), names.Count(), names.Get(), status.data());
        const auto end = status.begin() + names.Count();
        if (std::any_of(end, status.end(), [](LONG word) { return word != Guard; }))
        {
            throw RuleBroken("SccQueryInfo writes more words than there are files");
        }
        for (auto word = status.begin(); result >= SCC_OK && word != end; ++word)
        {
            if (*word == Guard)
            {
                throw RuleBroken("SccQueryInfo leaves a file's word as it was");
            }
            if (*word != SCC_STATUS_INVALID && (*word & ~KnownBits) != 0)
            {
                throw RuleBroken("SccQueryInfo sets unknown bits: " + Hexadecimal(static_cast<unsigned long>(*word)));
            }
        }
    }
}

void SccRules::TextOutput(ValidationSubject& subject)
{
    ValidationScc scc(subject);
    scc.Begin(Output::Receive);
    for (const std::string& name : AllNames(subject))
    {
        Names one({name});
        RunWayOfAFile(scc, one);
    }
    if (!Output::broken.empty())
    {
        throw RuleBroken(Output::broken);
    }
    if (Output::lines == 0)
    {
        throw RuleSkipped("it prints nothing");
    }
}
