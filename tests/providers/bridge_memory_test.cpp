// The bridge while memory is exhausted.

#include "Bridge.h"
#include "Files.h"
#include "ImportHook.h"
#include "ProcessDllDirectory.h"

#include <cstdlib>
#include <cstring>
#include <filesystem>

using testing::ElementsAre;
using testing::HasSubstr;

namespace
{

/// Makes allocation n of a module fail.
class FailingAllocation
{
public:
    FailingAllocation(HMODULE module, long n) : m_hook(module, "malloc", reinterpret_cast<void*>(&Allocate))
    {
        s_malloc = m_hook.Original<decltype(std::malloc)>();
        s_remaining = n;
    }

    /// Whether the failing allocation was reached.
    static bool WasMet() { return s_remaining <= 0; }

private:
    static void* Allocate(std::size_t size) { return --s_remaining == 0 ? nullptr : s_malloc(size); }

    inline static decltype(std::malloc)* s_malloc = nullptr;
    inline static long s_remaining = 0;
    ImportHook m_hook;
};

class BridgeMemory : public Bridge
{
protected:
    BridgeMemory()
    {
        m_recorder.results["SccInitialize"] = SCC_OK; // so that the handler allocates nothing
    }

    std::filesystem::path Settings() const { return m_folder.Path() / L"the settings of the project.xml"; }

    /// Runs the operation with each allocation of the program failing in turn, until none does; counts the failures.
    template <typename Prepare, typename Run, typename Check>
    long Sweep(Prepare prepare, Run run, Check check)
    {
        for (long n = 1;; ++n)
        {
            NewBridge(L"recording_full");
            m_bridge->SetProjectSettingsFile(Settings().filename().wstring());
            prepare();
            SCCRTN result = SCC_OK;
            {
                const FailingAllocation failing(GetModuleHandleW(nullptr), n);
                result = run();
            }
            SCOPED_TRACE("allocation " + std::to_string(n));
            check(result, FailingAllocation::WasMet());
            if (HasFailure() || !FailingAllocation::WasMet())
            {
                return n - 1;
            }
        }
    }
};

TEST_F(BridgeMemory, ThatIsExhaustedDuringTheLoadFailsThatCallAlone)
{
    const ProcessDllDirectory process(L"C:\\a folder with a long name");
    const auto useSearchFolder = [&] {
        NewBridge(L"recording_full", L"C:\\a search folder, for which the other one is kept");
    };
    const long failures = Sweep(
        useSearchFolder, [&] { return m_bridge->Initialize("host"); },
        [&](SCCRTN result, bool failed) {
            EXPECT_EQ(result, failed ? SCC_E_INITIALIZEFAILED : SCC_OK);
            EXPECT_EQ(m_bridge->IsInitialized(), !failed);
            EXPECT_EQ(ProcessDllDirectory::Current(), L"C:\\a folder with a long name");
            EXPECT_EQ(m_bridge->Initialize("host"), SCC_OK);
        });
    EXPECT_GT(failures, 0);
}

TEST_F(BridgeMemory, ThatIsExhaustedForTheSettingsFileLetsTheProjectOpen)
{
    const std::string project = Project();
    long opened = 0;
    const long failures =
        Sweep([&] { Start(); }, [&] { return m_bridge->OpenProject(project.c_str(), "comment", nullptr); },
              [&](SCCRTN result, bool failed) {
                  // Only the local path is needed before the library is asked.
                  EXPECT_EQ(result, Calls().empty() ? SCC_E_INITIALIZEFAILED : SCC_OK);
                  EXPECT_EQ(m_bridge->IsProjectOpen(), result == SCC_OK);
                  opened += static_cast<long>(failed && result == SCC_OK);
                  if (!failed)
                  {
                      EXPECT_TRUE(std::filesystem::exists(Settings()));
                  }
              });
    EXPECT_GT(failures, 1);
    EXPECT_EQ(opened, failures - 1);
}

TEST_F(BridgeMemory, ThatIsExhaustedForAWideTextLeavesTheFileOrTheFieldAsItWas)
{
    const std::string before = "<MSSCCProjectSettings><AuxPath>a</AuxPath></MSSCCProjectSettings>";
    const std::string project = Project();
    m_recorder.openProject = [](LPVOID, HWND, LPSTR, LPCSTR, LPCSTR, LPSTR auxPath, LPCSTR, LPTEXTOUTPROC, LONG) {
        std::strcpy(auxPath, "new");
        return SCC_OK;
    };
    const auto openWithout = [&](long text) {
        WriteBytes(Settings(), before);
        const FailingAllocation failing(GetModuleHandleW(L"braeutil.dll"), text);
        const SCCRTN result = m_bridge->OpenProject(project.c_str(), "comment", nullptr);
        return FailingAllocation::WasMet() ? result : SCC_E_NONSPECIFICERROR;
    };
    Start();
    m_bridge->SetProjectSettingsFile(Settings().filename().wstring());

    EXPECT_EQ(openWithout(1), SCC_OK); // the folder
    EXPECT_TRUE(m_bridge->IsProjectOpen());
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "", "")));
    EXPECT_EQ(ReadBytes(Settings()), before);

    EXPECT_EQ(openWithout(2), SCC_OK); // the user
    EXPECT_THAT(ReadBytes(Settings()), HasSubstr("<AuxPath>new</AuxPath>"));
    EXPECT_EQ(openWithout(3), SCC_OK); // the auxiliary path
    EXPECT_THAT(ReadBytes(Settings()), HasSubstr("<AuxPath>a</AuxPath>"));
}

} // namespace
