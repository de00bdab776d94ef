// The two processes when the other one dies or breaks the rules of messages.

#include "IsolationTest.h"
#include "LibraryProcess.h"
#include "Message.h"
#include "ModulePath.h"

#include <cstdlib>
#include <cstring>
#include <fstream>
#include <random>

namespace
{

constexpr DWORD Soon = 10000; // milliseconds

class TwoProcesses : public IsolationTest
{
protected:
    void TearDown() override
    {
        SetEnvironmentVariableW(L"ORVIX_HOSTILE", nullptr);
        IsolationTest::TearDown();
    }
};

// What the second process of this program gets: the library to use, and the file for the ID of that library's process.
constexpr const char* LibraryVariable = "ORVIX_HOST_LIBRARY";
constexpr const char* ReadyVariable = "ORVIX_HOST_READY";

/// The host's text output. The first argument of these kinds is a structure, which must not come from another process.
LONG OutputOfText(LPCSTR text, LONG kind)
{
    EXPECT_TRUE(kind < 8 || kind > 11) << kind;
    return IsolationTest::Output(kind < 8 || kind > 11 ? text : nullptr, kind);
}

} // namespace

TEST_F(TwoProcesses, DISABLED_HostThatWaitsToBeKilled)
{
    const SccLibrary library(std::filesystem::path(std::getenv(LibraryVariable)));
    Session session(library);
    ASSERT_EQ(session.Open(), SCC_OK);
    ASSERT_EQ(LibraryProcesses().size(), 1u);
    std::ofstream(std::getenv(ReadyVariable)) << LibraryProcesses().front() << '\n';
    Sleep(INFINITE);
}

TEST_F(TwoProcesses, TheLibrarysOneEndsWhenTheHostIsKilled)
{
    const TempFolder folder;
    const std::filesystem::path ready = folder.Path() / L"ready";
    SetEnvironmentVariableA(ReadyVariable, ready.string().c_str());
    SetEnvironmentVariableA(LibraryVariable, Proxy().string().c_str());
    std::wstring commandLine = L'"' + ModulePath(nullptr) +
                               L"\" --gtest_also_run_disabled_tests "
                               L"--gtest_filter=TwoProcesses.DISABLED_HostThatWaitsToBeKilled";
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    PROCESS_INFORMATION started{};
    ASSERT_TRUE(
        CreateProcessW(nullptr, commandLine.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup, &started));
    const UniqueKernelHandle thread(started.hThread);
    const UniqueKernelHandle host(started.hProcess);
    DWORD id = 0;
    for (int i = 0; id == 0 && WaitForSingleObject(host.Get(), 50) == WAIT_TIMEOUT && i < 600; ++i)
    {
        std::ifstream(ready) >> id;
    }
    const UniqueKernelHandle library(OpenProcess(SYNCHRONIZE, FALSE, id));
    ASSERT_TRUE(library) << id;
    EXPECT_EQ(WaitForSingleObject(library.Get(), 0), static_cast<DWORD>(WAIT_TIMEOUT));

    ASSERT_TRUE(TerminateProcess(host.Get(), 1));
    EXPECT_EQ(WaitForSingleObject(library.Get(), Soon), static_cast<DWORD>(WAIT_OBJECT_0));
}

TEST_F(TwoProcesses, AHostileLibrarysOneDoesNoHarm)
{
    constexpr int Programs = 20;

    const IsolatedCopy hostile(ORVIX_MISBEHAVING_SCC, std::chrono::seconds(2));
    std::filesystem::copy_file(ORVIX_HOSTILE_HOST, hostile.Folder() / L"scc_host64.exe",
                               std::filesystem::copy_options::overwrite_existing);
    int refused = 0;
    int answered = 0;
    for (int i = 0; i < Programs; ++i)
    {
        SetEnvironmentVariableW(L"ORVIX_HOSTILE", std::to_wstring(i).c_str());
        const SccLibrary library(hostile.Proxy());
        Session session(library);
        session.Open(OutputOfText);
        LONG status = 0;
        LPCSTR name = "C:\\project\\a.txt";
        for (int call = 0; session.context != nullptr && call < 20; ++call)
        {
            answered += session.Get() == SCC_OK ? 1 : 0;
            library.queryInfo(session.context, 1, &name, &status);
            library.populateList(session.context, SCC_COMMAND_GET, 1, &name, nullptr, nullptr, &status, 0);
            LONG count = 0;
            LPCSTR* added = nullptr;
            library.addFromScc(session.context, nullptr, &count, &added);
        }
        refused += Text().find("sent an answer that cannot be read") != std::string::npos ? 1 : 0;
    }
    EXPECT_GT(answered, 0);
    EXPECT_GT(refused, Programs / 4);
    EXPECT_EQ(LibraryProcesses().size(), 0u);
}

TEST_F(TwoProcesses, AHostileHostOnlyEndsTheLibrarysOne)
{
    constexpr unsigned int Programs = 15;
    constexpr DWORD BadMessage = 3; // its exit code

    std::mt19937 random(1);
    int refused = 0;
    for (unsigned int i = 0; i < Programs; ++i)
    {
        const std::shared_ptr<LibraryProcess> running =
            LibraryProcess::Start(Proxy().parent_path() / L"scc_host64.exe");
        ASSERT_TRUE(running);
        LibraryProcess& process = *running;
        const HANDLE handles[] = {process.Process(), process.Replied()};
        DWORD woken = WAIT_OBJECT_0 + 1;
        for (int message = 0; message < 20 && woken == WAIT_OBJECT_0 + 1; ++message)
        {
            const std::span<std::byte> area = process.Memory().Request();
            MessageWriter request(area, {0, message % 2 == 0 ? MessageKind::Load : MessageKind::Call, 0, i % 21});
            for (int number = 0; number < 8; ++number)
            {
                request.Number(static_cast<std::uint32_t>(random() % 3 == 0 ? random() : random() % 2));
            }
            request.Finish();
            std::memcpy(&area[random() % sizeof(MessageHeader)], &message, 1);
            SetEvent(process.Requested());
            woken = WaitForMultipleObjects(2, handles, FALSE, Soon);
            ASSERT_NE(woken, static_cast<DWORD>(WAIT_TIMEOUT));
        }
        DWORD code = 0;
        GetExitCodeProcess(process.Process(), &code);
        EXPECT_TRUE(code == STILL_ACTIVE || code == 0 || code == BadMessage) << code;
        EXPECT_EQ(process.Memory().GetState().crash.code, 0u);
        refused += code == BadMessage ? 1 : 0;
    }
    EXPECT_GT(refused, static_cast<int>(Programs / 4));
}
