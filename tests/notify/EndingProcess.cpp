// A process that ends while a listener is registered; exit code 0 when all goes well. Libraries are detached in the
// reverse order of their start.

#include <windows.h>

#include <bit>

int main()
{
    if (LoadLibraryW(L"late_listener.dll") == nullptr)
    {
        return 3;
    }
    const HMODULE registering = LoadLibraryW(L"registering.dll"); // brings OrvixCore.dll
    const auto doRegister = std::bit_cast<bool (*)()>(GetProcAddress(registering, "Register"));
    return doRegister != nullptr && doRegister() ? 0 : 4;
}
