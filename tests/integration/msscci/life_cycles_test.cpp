// Many lives of a services object and of the library: nothing or little is left of them.

#include "BuiltFile.h"
#include "InstalledTest.h"
#include "NumberByHand.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixPrompt.h"
#include "UniqueHandle.h"

#include <windows.h>

#include <objbase.h>
#include <psapi.h>

#include <algorithm>
#include <array>
#include <vector>

namespace
{

constexpr int FirstLives = 50; // until everything that is made once has been made

/// What a process holds.
struct Possessions
{
    DWORD handles = 0;
    DWORD modules = 0;
    std::size_t heapBytes = 0;
};

/// The bytes in use on every heap of the process.
std::size_t HeapBytes()
{
    std::size_t bytes = 0;
    std::array<HANDLE, 64> heaps = {};
    const DWORD count = std::min<DWORD>(GetProcessHeaps(64, heaps.data()), 64);
    for (DWORD i = 0; i < count; ++i)
    {
        HeapLock(heaps[i]);
        PROCESS_HEAP_ENTRY entry = {};
        while (HeapWalk(heaps[i], &entry) != FALSE)
        {
            if ((entry.wFlags & PROCESS_HEAP_ENTRY_BUSY) != 0)
            {
                bytes += entry.cbData;
            }
        }
        HeapUnlock(heaps[i]);
    }
    return bytes;
}

/// Tries each value, since Wine does not count: handles are the lowest free values.
DWORD CountHandles()
{
    constexpr unsigned long Step = 4;
    constexpr unsigned long Highest = 8192 * Step;
    DWORD count = 0;
    for (unsigned long value = Step; value < Highest; value += Step)
    {
        DWORD flags = 0;
        count += GetHandleInformation(ULongToHandle(value), &flags) != FALSE ? 1 : 0;
    }
    return count;
}

Possessions Count()
{
    Possessions possessions;
    possessions.handles = CountHandles();
    DWORD bytes = 0;
    EnumProcessModules(GetCurrentProcess(), nullptr, 0, &bytes);
    possessions.modules = bytes / sizeof(HMODULE);
    possessions.heapBytes = HeapBytes();
    return possessions;
}

/// What each of many lives leaves.
struct Leftover
{
    double handles = 0;
    double modules = 0;
    double heapBytes = 0;
};

template <typename Life>
Leftover LeftoverOf(int lives, Life life)
{
    for (int i = 0; i < FirstLives; ++i)
    {
        life();
    }
    const Possessions before = Count();
    for (int i = 0; i < lives; ++i)
    {
        life();
    }
    const Possessions after = Count();
    EXPECT_GT(before.handles, 10u);
    EXPECT_GT(before.modules, 5u);
    EXPECT_GT(before.heapBytes, 10000u);
    const auto perLife = [lives](auto from, auto to) {
        return (static_cast<double>(to) - static_cast<double>(from)) / lives;
    };
    return {perLife(before.handles, after.handles), perLife(before.modules, after.modules),
            perLife(before.heapBytes, after.heapBytes)};
}

void Record(const Leftover& leftover)
{
    testing::Test::RecordProperty("handles", std::to_string(leftover.handles));
    testing::Test::RecordProperty("modules", std::to_string(leftover.modules));
    testing::Test::RecordProperty("heap_bytes", std::to_string(leftover.heapBytes));
}

using LifeCycles = InstalledTest;

} // namespace

TEST_F(LifeCycles, OfAServicesObjectLeaveNothing)
{
    // The two libraries stay loaded, and so does the XML service, as in most hosts: what each of them leaves when it is
    // unloaded is not ours.
    ASSERT_EQ(CoInitialize(nullptr), S_OK);
    const UniqueModule plugin(LoadLibraryW(AddPlugin(L"good").c_str()));
    const UniqueModule recording(LoadLibraryW(Recording(L"recording_full").c_str()));
    const UniqueModule xml(LoadLibraryW(L"msxml3.dll"));
    ASSERT_TRUE(plugin && recording && xml);
    Install(L"Recorded");
    OrvixFileList list;
    list.AddActiveEntry(list.CreateEntry(L"C:\\p\\a.wav", nullptr, 0, 0));
    const auto life = [&] {
        const OrvixServicesPointer services = MakeOrvixServices();
        ASSERT_TRUE(services->Initialize(&m_info, OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI));
        ASSERT_EQ(services->GetProviderCount(), 2u);
        ASSERT_NE(services->GetProvider(0), nullptr);
        services->RegisterPrompt(1, L"Check the file out?", Action::Yes, 0, true);
        IOrvixProvider* provider = services->GetProvider(1);
        EXPECT_EQ(provider->Initialize(&m_info), OrvixProviderResult::Success);
        EXPECT_EQ(provider->OpenProject(L"C:\\p", L""), OrvixProviderResult::Success);
        EXPECT_EQ(provider->QueryStatus(&list, 0), OrvixProviderResult::Success);
        EXPECT_EQ(provider->CheckOut(&list, L"", 0), OrvixProviderResult::Success);
        EXPECT_EQ(provider->CloseProject(), OrvixProviderResult::Success);
        provider->Uninitialize();
        services->Shutdown();
        m_scc.calls.clear();
        FakeJournal::Clear();
    };
    const Leftover leftover = LeftoverOf(static_cast<int>(NumberByHand(L"ORVIX_LIVES", 1000)), life);
    Record(leftover);
    EXPECT_LT(leftover.handles, 0.1);
    EXPECT_LT(leftover.modules, 0.1);
    // Wine's XML service leaves copies of the command line, so this depends on its length.
    EXPECT_LT(leftover.heapBytes, 1024);
    CoUninitialize();
}

TEST_F(LifeCycles, OfTheLibraryLeaveAlmostNothing)
{
    // The program itself holds OrvixCore.dll: this is a copy, which comes and goes.
    const std::filesystem::path copy = m_config.Path() / L"OrvixCoreCopy.dll";
    std::filesystem::copy_file(BuiltFile(L"OrvixCore.dll"), copy);
    const auto life = [&] {
        const UniqueModule library(LoadLibraryW(copy.c_str()));
        ASSERT_TRUE(library);
        const auto get = reinterpret_cast<decltype(&GetIOrvixServices)>(
            reinterpret_cast<void (*)()>(GetProcAddress(library.Get(), "GetIOrvixServices")));
        const auto release = reinterpret_cast<decltype(&ReleaseIOrvixServices)>(
            reinterpret_cast<void (*)()>(GetProcAddress(library.Get(), "ReleaseIOrvixServices")));
        ASSERT_TRUE(get != nullptr && release != nullptr);
        IOrvixServices* services = get();
        services->Initialize(&m_info, 0);
        services->RegisterPrompt(1, L"Check the file out?", Action::Yes, 0, true);
        services->Shutdown();
        release(services);
    };
    const Leftover leftover = LeftoverOf(static_cast<int>(NumberByHand(L"ORVIX_LIVES", 1000)) / 5, life);
    Record(leftover);
    // The locks of GCC's C++ run-time, and the same copies.
    EXPECT_LE(leftover.handles, 4.1);
    EXPECT_LT(leftover.modules, 0.1);
    EXPECT_LE(leftover.heapBytes, 4096);
}
