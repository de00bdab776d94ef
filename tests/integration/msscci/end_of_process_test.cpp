#include "InstalledTest.h"
#include "ModulePath.h"
#include "UniqueHandle.h"

#include <memory>

using testing::HasSubstr;

namespace
{

/// How a process that looks for installed libraries has ended.
struct Outcome
{
    DWORD exitCode = 0;
    std::string debugOutput;
    std::string marks; ///< the steps that it reached
};

/// Listens to the debug output of all processes, as a monitor program does. It is no debugger, since under Wine a
/// library that throws and catches while it is loaded does not survive one.
class DebugOutput
{
public:
    /// The debug output of the process until it ends. It must end within a minute.
    std::string ReadUntilTheEnd(const PROCESS_INFORMATION& process)
    {
        std::string output;
        const HANDLE events[] = {m_written.Get(), process.hProcess};
        DWORD event = WAIT_OBJECT_0;
        while (event == WAIT_OBJECT_0)
        {
            SetEvent(m_free.Get());
            event = WaitForMultipleObjects(2, events, FALSE, 60000);
            if (event == WAIT_OBJECT_0 && m_buffer->process == process.dwProcessId)
            {
                output += m_buffer->text;
            }
        }
        EXPECT_EQ(event, WAIT_OBJECT_0 + 1) << "the process does not end";
        return output;
    }

private:
    struct Buffer
    {
        DWORD process;
        char text[4096 - sizeof(DWORD)];
    };

    // The names by which the system finds its monitor.
    UniqueKernelHandle m_free{CreateEventW(nullptr, FALSE, FALSE, L"DBWIN_BUFFER_READY")};
    UniqueKernelHandle m_written{CreateEventW(nullptr, FALSE, FALSE, L"DBWIN_DATA_READY")};
    UniqueKernelHandle m_section{
        CreateFileMappingW(INVALID_HANDLE_VALUE, nullptr, PAGE_READWRITE, 0, sizeof(Buffer), L"DBWIN_BUFFER")};
    std::unique_ptr<const Buffer, decltype(&UnmapViewOfFile)> m_buffer{
        static_cast<const Buffer*>(MapViewOfFile(m_section.Get(), FILE_MAP_READ, 0, 0, 0)), UnmapViewOfFile};
};

/// Runs a process that looks for installed libraries.
class EndOfProcess : public InstalledTest
{
protected:
    Outcome Discover() const
    {
        const std::filesystem::path marker = m_config.Path() / L"marks";
        SetEnvironmentVariableW(L"ORVIX_END_MARKER", marker.c_str());
        const std::filesystem::path program =
            std::filesystem::path(ModulePath(nullptr)).parent_path() / L"discovering_process.exe";

        DebugOutput debugOutput;
        STARTUPINFOW startup = {};
        startup.cb = sizeof startup;
        PROCESS_INFORMATION process = {};
        Outcome outcome;
        if (!CreateProcessW(program.c_str(), nullptr, nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup, &process))
        {
            ADD_FAILURE() << "no process: error " << GetLastError();
            return outcome;
        }
        const UniqueKernelHandle thread(process.hThread);
        const UniqueKernelHandle handle(process.hProcess);
        outcome.debugOutput = debugOutput.ReadUntilTheEnd(process);
        GetExitCodeProcess(process.hProcess, &outcome.exitCode);
        outcome.marks = ReadBytes(marker);
        return outcome;
    }

    /// The process ended at once, with the code of a failure that cannot be handled and a reason, and ran nothing more.
    void ExpectFatal() const
    {
        const Outcome outcome = Discover();
        EXPECT_EQ(outcome.exitCode, STATUS_STACK_BUFFER_OVERRUN);
        EXPECT_THAT(outcome.debugOutput,
                    HasSubstr("OrvixCore: the process ends: a text of an installed MSSCCI provider"));
        EXPECT_EQ(outcome.marks, "started ");
    }

    static constexpr std::size_t Unterminable = 2048; ///< bytes of a text that leave no room for a terminator
};

} // namespace

TEST_F(EndOfProcess, IsTheOrdinaryOneWithTextsThatFit)
{
    SetBytes(Install(L"Recorded"), ServerPath, REG_SZ, std::string(Unterminable - 1, '\0'));
    const Outcome outcome = Discover();
    EXPECT_EQ(outcome.exitCode, 1u);
    EXPECT_EQ(outcome.debugOutput, "");
    EXPECT_EQ(outcome.marks, "started initialised atexit detached ");
}

TEST_F(EndOfProcess, ComesAtOnceForAListTextThatFillsItsBuffer)
{
    SetBytes(m_list, L"1", REG_SZ, Bytes(AddProvider(L"Recorded").Path(), Unterminable));
    ExpectFatal();
}

TEST_F(EndOfProcess, ComesAtOnceForANameThatFillsItsBuffer)
{
    SetBytes(Install(L"Recorded"), ServerName, REG_SZ, Bytes(L"Recorded", Unterminable));
    ExpectFatal();
}

TEST_F(EndOfProcess, ComesAtOnceForAPathThatFillsItsBuffer)
{
    SetBytes(Install(L"Recorded"), ServerPath, REG_SZ, Bytes(Recording(L"recording_full"), Unterminable));
    ExpectFatal();
}

TEST_F(EndOfProcess, ComesAtOnceForATextOfAnyTypeInAProvidersKey)
{
    SetBytes(Install(L"Recorded"), ServerName, REG_BINARY, std::string(Unterminable, 'x'));
    ExpectFatal();
}
