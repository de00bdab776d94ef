// A host with a window: the files of a project, their states, and the commands of source control.

#include "Arguments.h"
#include "Failure.h"
#include "MainWindow.h"

#include <objbase.h>
#include <windows.h>

#include <algorithm>
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <span>
#include <string_view>

namespace
{

/// The single-threaded apartment in which the library reads and writes its files.
class Apartment
{
public:
    Apartment() { m_result = CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED | COINIT_DISABLE_OLE1DDE); }
    Apartment(const Apartment&) = delete;
    Apartment& operator=(const Apartment&) = delete;
    ~Apartment()
    {
        if (SUCCEEDED(m_result))
        {
            CoUninitialize();
        }
    }

private:
    HRESULT m_result;
};

/// Says why, unless nobody is there. The program's exit code.
int CannotStart(const wchar_t* reason)
{
    const std::span<wchar_t*> arguments(__wargv, static_cast<std::size_t>(__argc));
    if (std::find(arguments.begin(), arguments.end(), std::wstring_view(L"--unattended")) == arguments.end())
    {
        MessageBoxW(nullptr, reason, L"Desk cannot start", MB_ICONERROR);
    }
    return 2;
}

} // namespace

int WINAPI wWinMain(HINSTANCE, HINSTANCE, PWSTR, int)
{
    const Apartment apartment;
    try
    {
        MainWindow window(ReadArguments(__argc, __wargv));
        return window.Run();
    }
    catch (const Failure& failure)
    {
        return CannotStart(failure.text.c_str());
    }
    catch (const std::exception& failure)
    {
        return CannotStart(std::filesystem::path(failure.what()).c_str());
    }
}
