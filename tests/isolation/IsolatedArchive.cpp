#include "ArchiveLibrary.h"
#include "IsolatedCopy.h"
#include "UniqueHandle.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <string_view>

namespace
{

/// The bits of the archive's library: 32 when the environment says so.
int Bits()
{
    const char* const bits = std::getenv("ORVIX_ARCHIVE_BITS");
    return bits != nullptr && std::string_view(bits) == "32" ? 32 : 64;
}

/// Whether the system runs the program for 32-bit libraries: without arguments it ends with this exit code.
bool Runs32BitPrograms()
{
    constexpr DWORD BadArguments = 2;
    constexpr DWORD Patience = 60000; // milliseconds

    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    PROCESS_INFORMATION started{};
    if (CreateProcessW(BuiltFile(L"scc_host32.exe").c_str(), nullptr, nullptr, nullptr, FALSE, 0, nullptr, nullptr,
                       &startup, &started) == FALSE)
    {
        return false;
    }
    const UniqueKernelHandle thread(started.hThread);
    const UniqueKernelHandle process(started.hProcess);
    DWORD code = 0;
    return WaitForSingleObject(process.Get(), Patience) == WAIT_OBJECT_0 &&
           GetExitCodeProcess(process.Get(), &code) != FALSE && code == BadArguments;
}

/// Skips all tests when they need what the system does not have.
class BitsOfTheSystem : public testing::Environment
{
public:
    void SetUp() override
    {
        if (Bits() == 32 && !Runs32BitPrograms())
        {
            GTEST_SKIP() << "this system runs no 32-bit programs: nothing was tested with a 32-bit library";
        }
    }
};

testing::Environment* const bitsOfTheSystem = testing::AddGlobalTestEnvironment(new BitsOfTheSystem);

} // namespace

std::filesystem::path ArchiveLibrary()
{
    static const IsolatedCopy isolated(Bits() == 32 ? std::filesystem::path(ORVIX_ARCHIVE_32)
                                                    : BuiltFile(L"archive_msscci.dll"),
                                       IsolationSettings().patience, Bits());
    return isolated.Proxy();
}

bool IsArchiveIsolated()
{
    return true;
}
