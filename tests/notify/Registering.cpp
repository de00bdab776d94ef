// Registers the listener of a library that was loaded before.

#include "OrvixNotification.h"

#include <windows.h>

#include <bit>

class IOrvixNotifyCallback;

extern "C" __declspec(dllexport) bool Register()
{
    using Get = IOrvixNotifyCallback*(bool (*)(IOrvixNotifyCallback*));
    const auto get = std::bit_cast<Get*>(GetProcAddress(GetModuleHandleW(L"late_listener.dll"), "GetListener"));
    return get != nullptr &&
           OrvixNotification::RegisterOrvixNotification(get(&OrvixNotification::UnRegisterOrvixNotification), 0);
}
