// An MSSCCI library that says what it is asked to do. It fails at everything but opening a project when the environment
// variable ORVIX_TEST_SCC_FAILS is set.

#include "MSSCCI.h"

#include <string>

namespace
{

LPTEXTOUTPROC printer = nullptr;

SCCRTN Answer(const std::string& text)
{
    printer(text.c_str(), SCC_MSG_INFO);
    return GetEnvironmentVariableW(L"ORVIX_TEST_SCC_FAILS", nullptr, 0) == 0 ? SCC_OK : SCC_E_NONSPECIFICERROR;
}

} // namespace

extern "C" {
LONG SccGetVersion()
{
    return 0x00010003;
}

SCCRTN SccInitialize(LPVOID*, HWND, LPCSTR, LPSTR, LPLONG, LPSTR, LPLONG, LPLONG)
{
    return SCC_OK;
}

SCCRTN SccUninitialize(LPVOID)
{
    return SCC_OK;
}

SCCRTN SccOpenProject(LPVOID, HWND, LPSTR, LPCSTR, LPCSTR, LPSTR, LPCSTR, LPTEXTOUTPROC output, LONG)
{
    printer = output;
    return SCC_OK;
}

SCCRTN SccCloseProject(LPVOID)
{
    Answer("the project is closed");
    return SCC_OK;
}

SCCRTN SccGetCommandOptions(LPVOID, HWND, SCCCOMMAND, LPCMDOPTS* block)
{
    return block == nullptr ? SCC_I_ADV_SUPPORT : Answer("the options");
}

SCCRTN SccRunScc(LPVOID, HWND, LONG, LPCSTR*)
{
    return Answer("the client");
}

SCCRTN SccProperties(LPVOID, HWND, LPCSTR name)
{
    return Answer(std::string("the properties of ") + name);
}
}
