// A library that another one needs and that lies in a folder of its own.

extern "C" __declspec(dllexport) int SccDependency()
{
    return 1;
}
