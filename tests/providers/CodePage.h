#pragma once

#include "ImportHook.h"

#include <windows.h>

/// Another ANSI code page, for a scope, in the conversions of the program's own code and of the host utility library.
class CodePage
{
public:
    explicit CodePage(UINT page) { s_page = page; }

private:
    static int WINAPI ToNarrow(UINT page, DWORD flags, LPCWCH text, int size, LPSTR narrow, int narrowSize,
                               LPCCH unknown, LPBOOL lost)
    {
        return System<decltype(WideCharToMultiByte)>("WideCharToMultiByte")(Replace(page), flags, text, size, narrow,
                                                                            narrowSize, unknown, lost);
    }

    static int WINAPI ToWide(UINT page, DWORD flags, LPCCH text, int size, LPWSTR wide, int wideSize)
    {
        return System<decltype(MultiByteToWideChar)>("MultiByteToWideChar")(Replace(page), flags, text, size, wide,
                                                                            wideSize);
    }

    static UINT Replace(UINT page) { return page == CP_ACP ? s_page : page; }

    /// The function of the system, whatever the program imports.
    template <typename Function>
    static Function* System(const char* name)
    {
        return reinterpret_cast<Function*>(
            reinterpret_cast<void (*)()>(GetProcAddress(GetModuleHandleW(L"kernel32.dll"), name)));
    }

    inline static UINT s_page = CP_ACP;
    ImportHook m_toNarrow{GetModuleHandleW(nullptr), "WideCharToMultiByte", reinterpret_cast<void*>(&ToNarrow)};
    ImportHook m_toWide{GetModuleHandleW(L"braeutil.dll"), "MultiByteToWideChar", reinterpret_cast<void*>(&ToWide)};
};
