// An MSSCCI library that breaks one rule of the interface, which `Defect` names, and keeps all others. It remembers the
// status of files while it is loaded, and their bytes in a `DiskStore`.

#include "Defect.h"
#include "DiskStore.h"
#include "ImportHook.h"
#include "MSSCCI.h"

#include <cstring>
#include <map>
#include <optional>
#include <string>

namespace
{

constexpr LONG Version = 0x00010003;        // 1.3, the major number in the high word
constexpr LONG SwappedVersion = 0x00030001; // the numbers in the wrong order

// What the interface does not know.
constexpr SCCRTN UnknownResult = 42;
constexpr LONG UnknownKind = 99;
constexpr LONG UnknownStatus = 0x4000;

constexpr LONG CheckedOut = SCC_STATUS_CONTROLLED | SCC_STATUS_CHECKEDOUT;

std::optional<ImportHook> refusal; // of the program's private registration
LPTEXTOUTPROC printer = nullptr;
std::map<std::string, LONG> statuses;
DiskStore disk;

std::filesystem::path PathOf(LPCSTR name)
{
    std::wstring path(static_cast<std::size_t>(MultiByteToWideChar(CP_ACP, 0, name, -1, nullptr, 0)), L'\0');
    MultiByteToWideChar(CP_ACP, 0, name, -1, path.data(), static_cast<int>(path.size()));
    return path.c_str();
}

void Print(LPCSTR text, LONG kind)
{
    if (printer != nullptr)
    {
        printer(text, kind);
    }
}

LSTATUS WINAPI RefuseOverride(HKEY, HKEY)
{
    return ERROR_ACCESS_DENIED;
}

LSTATUS WINAPI RefuseValue(HKEY, LPCWSTR, DWORD, DWORD, const BYTE*, DWORD)
{
    return ERROR_ACCESS_DENIED;
}

template <typename Work>
SCCRTN Become(LONG count, LPCSTR* names, LONG status, Work work)
{
    for (LONG i = 0; i < count; ++i)
    {
        statuses[names[i]] = status;
        work(names[i]);
    }
    return SCC_OK;
}

} // namespace

extern "C" {

LONG SccGetVersion()
{
    return Defect::Is(L"version") ? SwappedVersion : Version;
}

SCCRTN SccInitialize(LPVOID* context, HWND, LPCSTR, LPSTR sccName, LPLONG capabilities, LPSTR auxPathLabel,
                     LPLONG checkoutCommentLength, LPLONG commentLength)
{
    if (Defect::Is(L"handles"))
    {
        CreateEventW(nullptr, FALSE, FALSE, nullptr);
    }
    if (Defect::Is(L"starts"))
    {
        return SCC_E_INITIALIZEFAILED;
    }
    *context = &statuses;
    std::memset(sccName, 0, Defect::Is(L"texts") ? 260 : SCC_NAME_SIZE);
    std::strcpy(sccName, "Defective");
    if (Defect::Is(L"no-terminator"))
    {
        std::memset(auxPathLabel, 'x', SCC_AUXLABEL_SIZE);
    }
    *capabilities = SCC_CAP_QUERYINFO | (Defect::Is(L"capabilities") ? SCC_CAP_POPULATELIST : 0);
    *checkoutCommentLength = 100;
    *commentLength = 100;
    return SCC_OK;
}

SCCRTN SccUninitialize(LPVOID)
{
    return SCC_OK;
}

SCCRTN SccOpenProject(LPVOID, HWND, LPSTR, LPCSTR, LPCSTR localPath, LPSTR, LPCSTR, LPTEXTOUTPROC output, LONG)
{
    printer = output;
    disk.Open(PathOf(localPath));
    if (Defect::Is(L"input-texts"))
    {
        std::strcpy(const_cast<LPSTR>(localPath), "mine");
    }
    return SCC_OK;
}

SCCRTN SccCloseProject(LPVOID)
{
    return SCC_OK;
}

SCCRTN SccGet(LPVOID, HWND, LONG count, LPCSTR* names, LONG, LPCMDOPTS)
{
    for (LONG i = 0; i < count; ++i)
    {
        disk.Fetch(PathOf(names[i]));
    }
    if (Defect::Is(L"text-without-kind"))
    {
        Print("got", UnknownKind);
    }
    else if (Defect::Is(L"text-null"))
    {
        Print(nullptr, SCC_MSG_INFO);
    }
    else
    {
        Print(Defect::Is(L"text-output") ? "got\r\n" : "got", SCC_MSG_INFO);
    }
    return Defect::Is(L"codes") && count > 1 ? UnknownResult : SCC_OK;
}

SCCRTN SccCheckout(LPVOID, HWND, LONG count, LPCSTR* names, LPCSTR, LONG, LPCMDOPTS)
{
    return Become(count, names, CheckedOut, [](LPCSTR file) { DiskStore::SetWritable(PathOf(file), true); });
}

SCCRTN SccUncheckout(LPVOID, HWND, LONG count, LPCSTR* names, LONG, LPCMDOPTS)
{
    return Become(count, names, SCC_STATUS_CONTROLLED, [](LPCSTR file) { disk.Fetch(PathOf(file)); });
}

SCCRTN SccCheckin(LPVOID, HWND, LONG count, LPCSTR* names, LPCSTR, LONG options, LPCMDOPTS)
{
    if (Defect::Is(L"codes-given-back") && options == 0 && count > 1)
    {
        return UnknownResult;
    }
    const SCCRTN result =
        Become(count, names, SCC_STATUS_CONTROLLED, [](LPCSTR file) { disk.Store(PathOf(file), false); });
    if (Defect::Is(L"input-names") && count > 0)
    {
        const_cast<LPSTR>(names[0])[0] = '#';
    }
    return result;
}

SCCRTN SccAdd(LPVOID, HWND, LONG count, LPCSTR* names, LPCSTR, LONG* options, LPCMDOPTS)
{
    if (Defect::Is(L"codes-kept") && count > 0 && options[0] == SCC_KEEP_CHECKEDOUT)
    {
        return UnknownResult;
    }
    return Become(count, names, SCC_STATUS_CONTROLLED, [](LPCSTR file) { disk.Store(PathOf(file), false); });
}

SCCRTN SccQueryInfo(LPVOID, LONG count, LPCSTR* names, LPLONG status)
{
    if (Defect::Is(L"null-arguments") && count == 0)
    {
        Defect::Crash();
    }
    for (LONG i = 0; i < count; ++i)
    {
        if (Defect::Is(L"info-left-out") && count > 1 && i + 1 == count)
        {
            break;
        }
        status[i] = statuses.contains(names[i]) ? statuses[names[i]] : 0;
        status[i] |= Defect::Is(L"info-bits") && status[i] == CheckedOut ? UnknownStatus : 0;
    }
    if (Defect::Is(L"info-overrun"))
    {
        status[count] = 0;
    }
    return SCC_OK;
}

SCCRTN SccGetCommandOptions(LPVOID, HWND, SCCCOMMAND, LPCMDOPTS* block)
{
    if (Defect::Is(L"hang") && block == nullptr)
    {
        Defect::Hang();
    }
    return SCC_E_OPNOTSUPPORTED;
}

} // extern "C"

BOOL WINAPI DllMain(HINSTANCE, DWORD reason, void*)
{
    const HMODULE program = GetModuleHandleW(nullptr);
    if (reason == DLL_PROCESS_DETACH)
    {
        refusal.reset();
    }
    else if (reason == DLL_PROCESS_ATTACH && Defect::Is(L"no-override"))
    {
        refusal.emplace(program, "RegOverridePredefKey", reinterpret_cast<void*>(&RefuseOverride));
    }
    else if (reason == DLL_PROCESS_ATTACH && Defect::Is(L"no-value"))
    {
        refusal.emplace(program, "RegSetValueExW", reinterpret_cast<void*>(&RefuseValue));
    }
    return TRUE;
}
