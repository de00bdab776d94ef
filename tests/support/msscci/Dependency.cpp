// A library in a folder of its own, which another library needs.

extern "C" __declspec(dllexport) int SccDependency()
{
    return 1;
}
