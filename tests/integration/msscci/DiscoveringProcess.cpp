// Looks for installed MSSCCI libraries and ends with their number as its exit code. It marks how far it comes.

#include "OrvixClientInfo.h"
#include "ServicesPointer.h"

#include <cstdlib>

extern "C" __declspec(dllimport) void Mark(const char* word);

int main()
{
    std::atexit([] { Mark("atexit "); });
    Mark("started ");
    const ServicesPointer services(GetIOrvixServices());
    OrvixClientInfo info;
    services->Initialize(&info, 0x2);
    Mark("initialised ");
    return static_cast<int>(services->GetProviderCount());
}
