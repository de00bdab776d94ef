// A provider, a listener, a dialog and the host itself change something of the process, of the list or of the services
// object while an operation runs. It goes on, and no stored answer is lost.

#include "CurrentFolder.h"
#include "OperationTest.h"
#include "ProcessDllDirectory.h"

#include <windows.h>

#include <objbase.h>

#include <algorithm>
#include <array>
#include <cfloat>
#include <clocale>
#include <filesystem>
#include <functional>
#include <ostream>
#include <string>

namespace
{

constexpr std::uint32_t StoredPrompt = 1000000;

/// Those that libraries of some compilers unmask.
void MaskFloatingPointExceptions(bool masked)
{
    constexpr unsigned int Exceptions = _EM_INVALID | _EM_ZERODIVIDE | _EM_OVERFLOW;
    unsigned int control = 0;
    _controlfp_s(&control, masked ? Exceptions : 0, Exceptions);
}

/// What foreign code does to the process.
struct Change
{
    const char* name;
    std::function<void()> make;
    std::function<void()> undo;
};

void PrintTo(const Change& change, std::ostream* stream)
{
    *stream << change.name;
}

class ForeignCode : public OperationTest
{
protected:
    ForeignCode()
    {
        AddFile(L"a");
        AddPrompt(DialogPrompt, Action::Ask | Action::Yes);
        m_params.SetDialogPromptID(DialogPrompt);
    }

    /// Runs an operation in which each of these has the code run once, and gives the result.
    std::int32_t RunWith(const std::string& caller, const std::function<void()>& code)
    {
        m_provider.onCall = [=](const std::string& operation, OrvixFileList&) {
            if (operation == caller)
            {
                code();
            }
        };
        m_listener.onNotify = [=](OrvixNotifyParams& params) {
            if (caller == "listener" && params.GetID() == OrvixNotificationID::BeforeCheckIn)
            {
                code();
            }
            return OrvixListenerAnswer::Accept;
        };
        m_onDialog = [=](OrvixFileListDialogParams&) {
            if (caller == "dialog")
            {
                code();
            }
        };
        m_host.onUnattended = [=] {
            if (caller == "host")
            {
                code();
            }
        };
        return m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider,
                                                Operation::Notify | Operation::CheckIn, AllBits);
    }

    const std::array<std::string, 5> m_callers = {"QueryStatus", "CheckIn", "listener", "dialog", "host"};
};

class ForeignCodeThat : public ForeignCode, public testing::WithParamInterface<Change>
{
};

} // namespace

TEST_P(ForeignCodeThat, LosesNeitherTheOperationNorAnAnswer)
{
    const CurrentFolder folder(std::filesystem::current_path()); // which is restored
    const ProcessDllDirectory directory(nullptr);
    for (const std::string& caller : m_callers)
    {
        SCOPED_TRACE(caller);
        m_log.clear();
        EXPECT_EQ(RunWith(caller, GetParam().make), OperationResult::Done);
        EXPECT_EQ(m_log.back(), "Notify AfterCheckIn [a]");
        m_services->RegisterPrompt(StoredPrompt, caller == "host" ? L"host" : L"text", Action::YesToAll, 0, true);
        m_services->Shutdown();
        m_services = MakeOrvixServices();
        Initialize(&m_host);
        EXPECT_EQ(m_services->GetPromptAction(StoredPrompt), Action::YesToAll);
        EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Action::Ask | Action::Yes);
        GetParam().undo();
        EXPECT_TRUE(std::filesystem::remove(m_config.Path() / L"OrvixPrompts.xml"));
        m_services->SetPromptAction(StoredPrompt, Action::No);
    }
}

INSTANTIATE_TEST_SUITE_P(
    Changes, ForeignCodeThat,
    testing::Values(
        Change{"TheCurrentFolder", [] { SetCurrentDirectoryW(L"C:\\windows"); }, [] {}},
        Change{"JoinsAnApartment", [] { CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED); }, [] { CoUninitialize(); }},
        Change{"LeavesAnApartmentTooOften", [] { CoUninitialize(); }, [] {}},
        Change{"TheLocale", [] { std::setlocale(LC_ALL, "German_Germany.1252"); }, [] { std::setlocale(LC_ALL, "C"); }},
        Change{"TheDllDirectory", [] { SetDllDirectoryW(L"C:\\nowhere"); }, [] {}},
        Change{"UnmasksFloatingPointExceptions", [] { MaskFloatingPointExceptions(false); },
               [] { MaskFloatingPointExceptions(true); }}),
    [](const testing::TestParamInfo<Change>& test) { return std::string(test.param.name); });

TEST_F(ForeignCode, MayDeleteEveryEntryInTheMiddle)
{
    for (const std::string& caller : m_callers)
    {
        SCOPED_TRACE(caller);
        EXPECT_EQ(RunWith(caller, [this] { m_list.RemoveAll(); }), OperationResult::Done);
        EXPECT_EQ(m_list.NumEntries(), 0u);
        AddFile(L"a");
    }
}

TEST_F(ForeignCode, MayRunAnotherOperationInTheMiddle)
{
    for (const std::string& caller : m_callers)
    {
        SCOPED_TRACE(caller);
        bool isInner = false;
        std::int32_t inner = OperationResult::Cancelled;
        const auto code = [&] {
            if (!isInner)
            {
                isInner = true;
                inner = m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider, Operation::GetLatest,
                                                         AllBits);
            }
        };
        m_log.clear();
        EXPECT_EQ(RunWith(caller, code), OperationResult::Done);
        EXPECT_EQ(inner, OperationResult::Done);
        EXPECT_EQ(std::count(m_log.begin(), m_log.end(), "GetLatest [a]"), 1);
        EXPECT_EQ(std::count(m_log.begin(), m_log.end(), "CheckIn [a] comment"), 1);
    }
}
