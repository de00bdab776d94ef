// Makes a recording library need SccDependency.dll to be loaded.

extern "C" __declspec(dllimport) int SccDependency();

extern "C" __declspec(dllexport) int SccDependent()
{
    return SccDependency();
}
