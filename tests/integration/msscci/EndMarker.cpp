// Appends words to the file that an environment variable names. The last word comes when the library is detached.

#include "UniqueHandle.h"

#include <cstring>

extern "C" __declspec(dllexport) void Mark(const char* word)
{
    wchar_t path[MAX_PATH];
    if (GetEnvironmentVariableW(L"ORVIX_END_MARKER", path, MAX_PATH) == 0)
    {
        return;
    }
    const UniqueFile file(CreateFileW(path, FILE_APPEND_DATA, 0, nullptr, OPEN_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file)
    {
        return;
    }
    DWORD written = 0;
    WriteFile(file.Get(), word, static_cast<DWORD>(std::strlen(word)), &written, nullptr);
}

BOOL WINAPI DllMain(HINSTANCE, DWORD reason, void*)
{
    if (reason == DLL_PROCESS_DETACH)
    {
        Mark("detached ");
    }
    return TRUE;
}
