// An MSSCCI library for the tests of isolation. It prints each call with its arguments, and misbehaves in the way and
// in the function that `Defect` names, such as "crash-SccGet". It changes no file.

#include "Defect.h"
#include "MSSCCI.h"
#include "ModulePath.h"
#include "UniqueHandle.h"

#include <objbase.h>

#include <array>
#include <cfloat>
#include <clocale>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <set>
#include <sstream>
#include <string>
#include <string_view>
#include <thread>
#include <utility>
#include <vector>

namespace
{

LPTEXTOUTPROC printer = nullptr;
std::vector<std::string> waiting; // lines that there was no printer for
HWND parent = nullptr;
HWND painting = nullptr;
int session = 0;
int optionBlock = 0;
POPLISTFUNC lister = nullptr; // of the last SccPopulateList
LPVOID listerData = nullptr;
std::vector<LPCSTR> found = {"C:\\project\\one.txt", "C:\\project\\two.txt"};

void Print(const std::string& line)
{
    if (printer == nullptr)
    {
        waiting.push_back(line);
        return;
    }
    printer(line.c_str(), SCC_MSG_INFO);
}

std::string Show(LPCSTR text)
{
    return text != nullptr ? '"' + std::string(text) + '"' : "null";
}

std::string Show(LPSTR text)
{
    return Show(const_cast<LPCSTR>(text));
}

template <typename Number>
std::string Show(Number number)
{
    return std::to_string(static_cast<long long>(number));
}

std::string Show(HWND window)
{
    return std::to_string(reinterpret_cast<std::uintptr_t>(window));
}

template <typename Element>
std::string List(LONG count, Element* elements)
{
    std::string text;
    for (LONG i = 0; elements != nullptr && i < count; ++i)
    {
        text += (i == 0 ? "" : ", ") + Show(elements[i]);
    }
    return elements != nullptr ? '[' + text + ']' : "null";
}

std::string Context(LPVOID context)
{
    return context == &session ? "context" : context == nullptr ? "no context" : "a wrong context";
}

std::string Block(LPCMDOPTS block)
{
    return block == &optionBlock ? "block" : block == nullptr ? "no block" : "a wrong block";
}

/// Calls itself until the stack is full: `depth` is never reached.
int OverflowStack(int depth)
{
    volatile char frame[4096];
    frame[0] = static_cast<char>(depth);
    return depth == 0 ? 0 : OverflowStack(depth - 1) + frame[0];
}

/// A window of the library, above the host's, which the library disables meanwhile as dialogs do.
void ShowWindowFor(DWORD milliseconds)
{
    HWND window = CreateWindowExW(0, L"STATIC", L"question", WS_POPUP | WS_VISIBLE, 0, 0, 50, 50, parent, nullptr,
                                  nullptr, nullptr);
    if (parent != nullptr)
    {
        EnableWindow(parent, FALSE);
    }
    const ULONGLONG end = GetTickCount64() + milliseconds;
    while (GetTickCount64() < end)
    {
        MsgWaitForMultipleObjects(0, nullptr, FALSE, 20, QS_ALLINPUT);
        MSG message;
        while (PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE))
        {
            DispatchMessageW(&message);
        }
    }
    if (Defect::Is(L"crash-in-window"))
    {
        Defect::Crash();
    }
    if (parent != nullptr)
    {
        EnableWindow(parent, TRUE);
    }
    DestroyWindow(window);
}

void PrintFromThreads()
{
    std::thread([] { Print("from a thread"); }).join();
    std::thread([] {
        Sleep(300);
        Print("between calls");
    }).detach();
}

/// Longer than the patience of the tests, with signs of life.
void PrintForLong()
{
    for (int i = 0; i < 6; ++i)
    {
        Sleep(500);
        Print("still there");
    }
}

/// Works on until the host sets an event, and a little longer.
void WorkUntilTheHostSays()
{
    const UniqueKernelHandle event(OpenEventW(SYNCHRONIZE, FALSE, L"OrvixTestGoOn"));
    WaitForSingleObject(event.Get(), 30000);
    Sleep(500);
}

LRESULT CALLBACK PaintForEver(HWND window, UINT message, WPARAM first, LPARAM second)
{
    const LRESULT result = DefWindowProcW(window, message, first, second);
    if (message == WM_PAINT)
    {
        InvalidateRect(window, nullptr, FALSE);
    }
    return result;
}

/// Shows a window until SccUninitialize.
void ShowWindowThatPaintsForEver()
{
    painting =
        CreateWindowExW(0, L"STATIC", L"", WS_POPUP | WS_VISIBLE, 0, 0, 50, 50, nullptr, nullptr, nullptr, nullptr);
    SetWindowLongPtrW(painting, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(&PaintForEver));
    InvalidateRect(painting, nullptr, FALSE);
}

/// Until the process is ended, or for a minute.
void PrintWithoutPause()
{
    const ULONGLONG end = GetTickCount64() + 60000;
    while (GetTickCount64() < end)
    {
        Print("chatter");
    }
}

/// Uses a callback that was valid in an earlier call only.
void ListLate()
{
    std::array<char, 5> name = {"late"};
    lister(listerData, TRUE, 0, name.data());
    std::thread([&name] { lister(listerData, TRUE, 0, name.data()); }).join();
}

/// Leaves the process in another state than before.
void ChangeProcess()
{
    SetCurrentDirectoryW(L"C:\\windows");
    SetDllDirectoryW(L"C:\\windows");
    std::setlocale(LC_ALL, "");
    static_cast<void>(CoInitializeEx(nullptr, COINIT_MULTITHREADED));
    CoUninitialize();
    CoUninitialize();
    unsigned before = 0;
    _controlfp_s(&before, 0, _EM_ZERODIVIDE | _EM_INVALID);
    SetErrorMode(0);
    SetUnhandledExceptionFilter(nullptr);
}

/// What happens in every function.
void Misbehave(const char* function, HWND window)
{
    parent = window != nullptr ? window : parent;
    const std::wstring name(function, function + std::strlen(function));
    const auto is = [&name](const wchar_t* what) { return Defect::Is(what + (L'-' + name)); };
    if (is(L"crash"))
    {
        Defect::Crash();
    }
    if (is(L"overflow"))
    {
        OverflowStack(1 << 30);
    }
    if (is(L"exit"))
    {
        std::exit(3);
    }
    if (is(L"abort"))
    {
        std::abort();
    }
    if (is(L"kill"))
    {
        TerminateProcess(GetCurrentProcess(), 9);
    }
    if (is(L"thread-crash"))
    {
        std::thread(Defect::Crash).join();
    }
    if (is(L"slow"))
    {
        Sleep(1500);
    }
    if (is(L"talk"))
    {
        PrintForLong();
    }
    if (is(L"murmur"))
    {
        std::thread(PrintForLong).join();
    }
    if (is(L"work"))
    {
        WorkUntilTheHostSays();
    }
    if (is(L"paint"))
    {
        ShowWindowThatPaintsForEver();
    }
    if (is(L"chatter"))
    {
        PrintWithoutPause();
    }
    if (is(L"hang")) // after what else there is
    {
        Defect::Hang();
    }
    if (is(L"list") && lister != nullptr)
    {
        ListLate();
    }
    if (is(L"window"))
    {
        ShowWindowFor(3000);
    }
    if (is(L"threads"))
    {
        PrintFromThreads();
    }
    if (is(L"change"))
    {
        ChangeProcess();
    }
    if (is(L"throw"))
    {
        throw 1;
    }
    if (is(L"message") && window != nullptr)
    {
        Print("the window answers " + Show(SendMessageW(window, WM_APP, 1, 2)));
    }
    if (is(L"state"))
    {
        std::array<char, MAX_PATH> folder = {};
        GetCurrentDirectoryA(MAX_PATH, folder.data());
        Print("folder " + std::string(folder.data()) + ", code page " + Show(GetACP()));
    }
}

template <typename... Texts>
SCCRTN Call(const char* function, HWND window, const Texts&... texts)
{
    std::string line = std::string(function) + '(';
    ((line += texts + ", "), ...);
    Print(line + ')');
    Misbehave(function, window);
    return SCC_OK;
}

void Write(LPSTR place, std::string_view text)
{
    if (place != nullptr)
    {
        std::memcpy(place, text.data(), text.size());
        place[text.size()] = '\0';
    }
}

} // namespace

extern "C" {

LONG SccGetVersion()
{
    Misbehave(__func__, nullptr);
    return 0x00010003;
}

SCCRTN SccInitialize(LPVOID* context, HWND window, LPCSTR caller, LPSTR sccName, LPLONG capabilities,
                     LPSTR auxPathLabel, LPLONG checkoutCommentLength, LPLONG commentLength)
{
    Call(__func__, window, Context(*context), Show(window), Show(caller), Show(sccName), Show(auxPathLabel));
    if (Defect::Is(L"fail"))
    {
        return SCC_E_INITIALIZEFAILED;
    }
    *context = &session;
    Write(sccName, "Misbehaving");
    Write(auxPathLabel, "Label:");
    *capabilities = static_cast<LONG>(0x80000000UL) | SCC_CAP_QUERYINFO | SCC_CAP_ADDFROMSCC;
    *checkoutCommentLength = 100;
    *commentLength = 200;
    return SCC_OK;
}

SCCRTN SccUninitialize(LPVOID context)
{
    if (painting != nullptr)
    {
        DestroyWindow(std::exchange(painting, nullptr));
    }
    return Call(__func__, nullptr, Context(context));
}

SCCRTN SccOpenProject(LPVOID context, HWND window, LPSTR user, LPCSTR projectName, LPCSTR localPath, LPSTR auxPath,
                      LPCSTR comment, LPTEXTOUTPROC output, LONG flags)
{
    printer = output;
    for (const std::string& line : waiting)
    {
        Print(line);
    }
    waiting.clear();
    Print("process " + Show(GetCurrentProcessId()));
    Call(__func__, window, Context(context), Show(window), Show(user), Show(projectName), Show(localPath),
         Show(auxPath), Show(comment), Show(flags));
    Write(user, "Anna");
    Write(auxPath, std::string(SCC_PRJPATH_SIZE - 1, 'a'));
    return SCC_OK;
}

SCCRTN SccCloseProject(LPVOID context)
{
    return Call(__func__, nullptr, Context(context));
}

SCCRTN SccGetProjPath(LPVOID context, HWND window, LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath,
                      BOOL allowChangePath, LPBOOL isNew)
{
    Call(__func__, window, Context(context), Show(window), Show(user), Show(projectName), Show(localPath),
         Show(auxPath), Show(allowChangePath), Show(*isNew));
    Write(projectName, "Project");
    Write(localPath, "C:\\chosen");
    *isNew = *isNew == FALSE ? TRUE : FALSE;
    return SCC_OK;
}

SCCRTN SccGet(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block)
{
    return Call(__func__, window, Context(context), Show(window), Show(count), List(count, names), Show(options),
                Block(block));
}

SCCRTN SccCheckout(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG options,
                   LPCMDOPTS block)
{
    return Call(__func__, window, Context(context), Show(window), Show(count), List(count, names), Show(comment),
                Show(options), Block(block));
}

SCCRTN SccUncheckout(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block)
{
    return Call(__func__, window, Context(context), Show(window), Show(count), List(count, names), Show(options),
                Block(block));
}

SCCRTN SccCheckin(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG options, LPCMDOPTS block)
{
    return Call(__func__, window, Context(context), Show(window), Show(count), List(count, names), Show(comment),
                Show(options), Block(block));
}

SCCRTN SccAdd(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG* options, LPCMDOPTS block)
{
    return Call(__func__, window, Context(context), Show(window), Show(count), List(count, names), Show(comment),
                List(count, options), Block(block));
}

SCCRTN SccBeginBatch()
{
    return Call(__func__, nullptr);
}

SCCRTN SccEndBatch()
{
    return Call(__func__, nullptr);
}

SCCRTN SccHistory(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block)
{
    Call(__func__, window, Context(context), Show(window), Show(count), List(count, names), Show(options),
         Block(block));
    return SCC_I_RELOADFILE;
}

SCCRTN SccProperties(LPVOID context, HWND window, LPCSTR name)
{
    return Call(__func__, window, Context(context), Show(window), Show(name));
}

SCCRTN SccQueryInfo(LPVOID context, LONG count, LPCSTR* names, LPLONG status)
{
    if (count <= 10)
    {
        Call(__func__, nullptr, Context(context), Show(count), List(count, names), List(count, status));
    }
    for (LONG i = 0; status != nullptr && i < count; ++i)
    {
        status[i] = static_cast<LONG>(std::strlen(names[i]));
    }
    return SCC_OK;
}

SCCRTN SccPopulateList(LPVOID context, SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback,
                       LPVOID callerData, LPLONG status, LONG options)
{
    Call(__func__, nullptr, Context(context), Show(command), Show(count), List(count, names), List(count, status),
         Show(options));
    lister = callback;
    listerData = callerData;
    if (callback == nullptr)
    {
        return SCC_E_NONSPECIFICERROR;
    }
    for (LONG i = 0; i < count; ++i)
    {
        const BOOL more = callback(callerData, i % 2 == 0 ? TRUE : FALSE, i, const_cast<LPSTR>(names[i]));
        Print("the host says " + Show(more));
        if (!more)
        {
            return SCC_I_OPERATIONCANCELED;
        }
    }
    return SCC_OK;
}

SCCRTN SccRunScc(LPVOID context, HWND window, LONG count, LPCSTR* names)
{
    return Call(__func__, window, Context(context), Show(window), Show(count), List(count, names));
}

SCCRTN SccGetCommandOptions(LPVOID context, HWND window, SCCCOMMAND command, LPCMDOPTS* block)
{
    Call(__func__, window, Context(context), Show(window), Show(command),
         block != nullptr ? Block(*block) : "no place");
    if (block == nullptr)
    {
        return SCC_I_ADV_SUPPORT;
    }
    *block = &optionBlock;
    return SCC_OK;
}

SCCRTN SccAddFromScc(LPVOID context, HWND window, LPLONG count, LPCSTR** names)
{
    Call(__func__, window, Context(context), Show(window), count != nullptr ? Show(*count) : "null",
         count != nullptr && *count == 1 && names != nullptr ? Show(**names) : "none");
    if (Defect::Is(L"many-SccAddFromScc"))
    {
        static const std::string longest = "C:\\project\\" + std::string(MAX_PATH - 12, 'x');
        found.assign(100000, longest.c_str());
    }
    if (count != nullptr)
    {
        *count = static_cast<LONG>(found.size());
        *names = found.data();
    }
    return SCC_OK;
}

SCCRTN SccSetOption(LPVOID context, LONG option, LONG value)
{
    Call(__func__, nullptr, Context(context), Show(option), Show(value));
    return SCC_I_SHARESUBPROJOK;
}

} // extern "C"

BOOL WINAPI DllMain(HINSTANCE, DWORD reason, LPVOID)
{
    if (reason == DLL_PROCESS_ATTACH && Defect::Is(L"crash-load"))
    {
        Defect::Crash();
    }
    if (reason == DLL_PROCESS_ATTACH && Defect::Is(L"kill-load"))
    {
        TerminateProcess(GetCurrentProcess(), 9);
    }
    if (reason == DLL_PROCESS_DETACH && Defect::Is(L"hang-unload"))
    {
        Defect::Hang();
    }
    return reason == DLL_PROCESS_ATTACH && Defect::Is(L"refuse-load") ? FALSE : TRUE;
}
