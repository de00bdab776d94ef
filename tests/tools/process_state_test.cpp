// What a library changes in a process, found and restored.

#include "ComApartment.h"
#include "ProcessState.h"

#include <gmock/gmock.h>

#include <cfloat>
#include <clocale>

using testing::ElementsAre;
using testing::IsEmpty;

TEST(ProcessState, ChangesAreFoundAndRestored)
{
    const ComApartment apartment;
    const ProcessState state;
    EXPECT_THAT(state.FindChanges(), IsEmpty());

    SetCurrentDirectoryW(L"C:\\windows");
    CoUninitialize();
    CoInitializeEx(nullptr, COINIT_MULTITHREADED);
    CoInitializeEx(nullptr, COINIT_MULTITHREADED);
    SetThreadLocale(MAKELCID(MAKELANGID(LANG_TURKISH, SUBLANG_DEFAULT), SORT_DEFAULT));
    _controlfp(_RC_UP, _MCW_RC);
    SetErrorMode(GetErrorMode() ^ SEM_FAILCRITICALERRORS);
    SetDllDirectoryW(L"C:\\windows");
    SetStdHandle(STD_INPUT_HANDLE, nullptr);
    EXPECT_THAT(state.FindChanges(), ElementsAre("the current folder", "the COM apartment of the thread", "the locale",
                                                 "the floating-point control word", "the error mode",
                                                 "the DLL directory", "a standard handle"));
    state.Restore();
    EXPECT_THAT(state.FindChanges(), IsEmpty());

    CoUninitialize(); // once too often
    EXPECT_THAT(state.FindChanges(), ElementsAre("the COM apartment of the thread"));
    state.Restore();
    EXPECT_THAT(state.FindChanges(), IsEmpty());
}

TEST(ProcessState, NamesAStandardHandleThatWasClosed)
{
    const ComApartment apartment;
    const HANDLE before = GetStdHandle(STD_INPUT_HANDLE);
    const HANDLE event = CreateEventW(nullptr, FALSE, FALSE, nullptr);
    SetStdHandle(STD_INPUT_HANDLE, event);
    const ProcessState state;
    CloseHandle(event);
    EXPECT_THAT(state.FindChanges(), ElementsAre("a standard handle"));
    SetStdHandle(STD_INPUT_HANDLE, before);
}
