// Looks for installed MSSCCI libraries; the exit code is their number. It marks each step that it reaches.

#include "OrvixClientInfo.h"
#include "OrvixProviderSource.h"
#include "OrvixServicesPointer.h"

#include <cstdlib>

extern "C" __declspec(dllimport) void Mark(const char* word);

int main()
{
    std::atexit([] { Mark("atexit "); });
    Mark("started ");
    const OrvixServicesPointer services = MakeOrvixServices();
    OrvixClientInfo info;
    services->Initialize(&info, OrvixProviderSource::InstalledMSSCCI);
    Mark("initialised ");
    return static_cast<int>(services->GetProviderCount());
}
