// The process of one isolated MSSCCI library. The library scc_proxy.dll starts it; the arguments are the handles that
// it inherits.

#include "LibraryHost.h"

#include <bit>
#include <cstdint>
#include <cstdlib>

namespace
{

constexpr int BadArguments = 2;
constexpr int BadMessage = 3;

UniqueKernelHandle Argument(int index)
{
    const auto value = static_cast<std::uintptr_t>(std::strtoull(__argv[index], nullptr, 10));
    UniqueKernelHandle handle(std::bit_cast<HANDLE>(value));
    SetHandleInformation(handle.Get(), HANDLE_FLAG_INHERIT, 0); // programs that the library starts must not have it
    return handle;
}

} // namespace

int WINAPI WinMain(HINSTANCE, HINSTANCE, LPSTR, int)
{
    if (__argc != 6)
    {
        return BadArguments;
    }
    LibraryHost host({Argument(1), Argument(2), Argument(3), Argument(4), Argument(5)});
    return host.Run() ? 0 : BadMessage;
}
