#include "AllocationSweep.h"
#include "InstalledTest.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixProviderOption.h"

#include <algorithm>
#include <cstdlib>
#include <string_view>

using testing::IsEmpty;

namespace
{

using InstalledWithoutMemory = InstalledTest;

/// Long enough to need memory of its own.
const wchar_t* const LongName = L"A provider's name that is long enough to need memory of its own";
const wchar_t* const OtherLongName = L"Another provider's name, which is long enough as well";

/// Makes the n-th allocation of braeutil's texts fail, and counts all of them. They are on another heap than the
/// records.
class TextMemory
{
public:
    explicit TextMemory(int n)
    {
        s_count = 0;
        s_failing = n;
    }
    bool Failed() const { return s_count >= s_failing; }

private:
    static void* Allocate(std::size_t size) { return ++s_count == s_failing ? nullptr : std::malloc(size); }

    inline static int s_count = 0;
    inline static int s_failing = 0;
    ImportHook m_hook{GetModuleHandleW(L"braeutil.dll"), "malloc", reinterpret_cast<void*>(&Allocate)};
};

struct Operation
{
    const char* name;
    int (*run)(IOrvixProvider& provider, OrvixFileList& list);
};

const Operation Operations[] = {
    {"CheckIn", [](IOrvixProvider& p, OrvixFileList& list) { return p.CheckIn(&list, L"comment", 0); }},
    {"CheckOut", [](IOrvixProvider& p,
                    OrvixFileList& list) { return p.CheckOut(&list, L"comment", OrvixProviderOption::GetLatest); }},
    {"UndoCheckOut",
     [](IOrvixProvider& p, OrvixFileList& list) { return p.UndoCheckOut(&list, OrvixProviderOption::GetLatest); }},
    {"GetLatest", [](IOrvixProvider& p, OrvixFileList& list) { return p.GetLatest(&list, 0); }},
    {"Add", [](IOrvixProvider& p,
               OrvixFileList& list) { return p.Add(&list, L"comment", OrvixProviderOption::KeepCheckedOut); }},
    {"ShowHistory", [](IOrvixProvider& p, OrvixFileList& list) { return p.ShowHistory(&list); }},
    {"ShowProperties", [](IOrvixProvider& p, OrvixFileList& list) { return p.ShowProperties(&list); }},
    {"QueryStatus", [](IOrvixProvider& p, OrvixFileList& list) { return p.QueryStatus(&list, 0); }},
};

/// An operation on two files of an open project. One path is not all ASCII.
class InstalledOperationWithoutMemory : public InstalledTest, public testing::WithParamInterface<Operation>
{
protected:
    void SetUp() override
    {
        Install(L"Recorded");
        m_provider = InitializeAndGet();
        ASSERT_NE(m_provider, nullptr);
        ASSERT_EQ(m_provider->Initialize(&m_info), OrvixProviderResult::Success);
        ASSERT_EQ(m_provider->OpenProject(L"C:\\p", L""), OrvixProviderResult::Success);
        for (const wchar_t* file : {L"C:\\\u00E9", L"C:\\b"})
        {
            m_files.AddActiveEntry(m_files.CreateEntry(file, nullptr, 0, 0));
        }
        m_scc.Take();
    }

    void ExpectOutcome(int result, bool failed)
    {
        EXPECT_EQ(result, failed ? OrvixProviderResult::Failure : OrvixProviderResult::Success);
        EXPECT_EQ(m_scc.Take().empty(), failed);
        EXPECT_TRUE(!failed || m_files.GetActiveFileEntry(0)->GetFlagsOut() == 0);
    }

    IOrvixProvider* m_provider = nullptr;
    OrvixFileList m_files;
};

} // namespace

TEST_F(InstalledWithoutMemory, DiscoverySkipsWhatItHasNoMemoryFor)
{
    Install(LongName);
    Install(OtherLongName);
    const long failures = SweepAllocations([&](AllocationRound& round) {
        OrvixServicesPointer services = MakeOrvixServices();
        const bool found =
            round.Attempt([&] { return services->Initialize(&m_info, OrvixProviderSource::InstalledMSSCCI); });
        EXPECT_TRUE(found || round.Failed());
        EXPECT_LE(services->GetProviderCount(), 2u);
        EXPECT_TRUE(round.Failed() || services->GetProviderCount() == 2);
        for (std::uint32_t i = 0; i < services->GetProviderCount(); ++i)
        {
            ASSERT_NE(services->GetProvider(i), nullptr);
            EXPECT_STREQ(services->GetProvider(i)->GetName(), services->GetProviderName(i));
            EXPECT_EQ(services->GetProvider(i)->RunProviderClient(), OrvixProviderResult::Success);
        }
        services->Shutdown();
        EXPECT_FALSE(IsLoaded(Recording(L"recording_full")));
        EXPECT_TRUE(services->Initialize(&m_info, OrvixProviderSource::InstalledMSSCCI));
        EXPECT_EQ(services->GetProviderCount(), 2u);
    });
    EXPECT_GE(failures, 20);
}

TEST_F(InstalledWithoutMemory, DiscoveryGoesOnAfterAProviderThatItHasNoMemoryFor)
{
    Install(LongName);
    Install(OtherLongName);
    HostHeap hostHeap;
    LibraryHeap libraryHeap;
    for (AllocationHeap* heap : {static_cast<AllocationHeap*>(&hostHeap), static_cast<AllocationHeap*>(&libraryHeap)})
    {
        bool goesOn = false;
        bool failed = true;
        for (long n = 1; failed; ++n)
        {
            m_services = MakeOrvixServices();
            AllocationRound round(*heap, n, false);
            round.Attempt([&] { return Initialize(OrvixProviderSource::InstalledMSSCCI); });
            failed = round.Failed();
            goesOn |= ProviderNames() == Names{OtherLongName};
        }
        EXPECT_TRUE(goesOn) << heap->Name();
    }
}

TEST_F(InstalledWithoutMemory, InitializeAndOpenProjectFailBeforeTheyCallTheLibraryOrSucceed)
{
    Install(L"Recorded");
    m_info.SetClientName(LongName);
    const long failures = SweepAllocations([&](AllocationRound& round) {
        const OrvixServicesPointer services = MakeOrvixServices();
        ASSERT_TRUE(services->Initialize(&m_info, OrvixProviderSource::InstalledMSSCCI));
        IOrvixProvider* provider = services->GetProvider(0);
        m_scc.Take();
        const int result = round.Attempt([&] {
            const int initialized = provider->Initialize(&m_info);
            return initialized == OrvixProviderResult::Success ? provider->OpenProject(L"C:\\p", LongName)
                                                               : initialized;
        });
        const bool opened = result == OrvixProviderResult::Success;
        EXPECT_TRUE(opened || (result == OrvixProviderResult::Failure && round.Failed())) << result;
        EXPECT_EQ(provider->IsProjectOpen(), opened);
        const std::vector<std::string> calls = m_scc.Take();
        EXPECT_EQ(std::any_of(calls.begin(), calls.end(),
                              [](const std::string& call) { return call.starts_with("SccOpenProject"); }),
                  opened);
        EXPECT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
        EXPECT_EQ(provider->OpenProject(L"C:\\p", LongName), OrvixProviderResult::Success);
    });
    EXPECT_GE(failures, 2);
}

TEST_P(InstalledOperationWithoutMemory, SendsNothing)
{
    const long failures = SweepAllocations([&](AllocationRound& round) {
        const int result = round.Attempt([&] { return GetParam().run(*m_provider, m_files); });
        ExpectOutcome(result, round.Failed());
        EXPECT_EQ(GetParam().run(*m_provider, m_files), OrvixProviderResult::Success);
        m_scc.Take();
        m_files.GetActiveFileEntry(0)->SetFlagsOut(0);
    });
    EXPECT_GE(failures, 2);
}

TEST_P(InstalledOperationWithoutMemory, SendsNothingForTextsThatCannotBeConverted)
{
    int n = 1;
    for (bool failed = true; failed && !HasFailure(); ++n)
    {
        SCOPED_TRACE(n);
        TextMemory memory(n);
        const int result = GetParam().run(*m_provider, m_files);
        failed = memory.Failed();
        ExpectOutcome(result, failed);
        m_files.GetActiveFileEntry(0)->SetFlagsOut(0);
    }
    EXPECT_GE(n, 3) << "a path, and back again since it is not all ASCII";
}

INSTANTIATE_TEST_SUITE_P(Each, InstalledOperationWithoutMemory, testing::ValuesIn(Operations),
                         [](const testing::TestParamInfo<Operation>& test) { return std::string(test.param.name); });

TEST_F(InstalledWithoutMemory, TextOutputIsDropped)
{
    static OutputHost host; // the providers keep it
    Install(L"Recorded");
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    m_info.SetIOrvixClientAccess(&host);
    ASSERT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
    LPTEXTOUTPROC output = nullptr;
    m_scc.openProject = [&](LPVOID, HWND, LPSTR, LPCSTR, LPCSTR, LPSTR, LPCSTR, LPTEXTOUTPROC given, LONG) {
        output = given;
        return SCC_OK;
    };
    ASSERT_EQ(provider->OpenProject(L"C:\\p", L""), OrvixProviderResult::Success);
    const TextMemory memory(1);
    EXPECT_EQ(output("text", SCC_MSG_INFO), 0);
    EXPECT_TRUE(memory.Failed());
    EXPECT_THAT(host.lines, IsEmpty());
}
