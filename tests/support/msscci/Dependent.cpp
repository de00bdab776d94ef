// Makes a recording library depend on scc_dependency.dll.

extern "C" __declspec(dllimport) int SccDependency();

extern "C" __declspec(dllexport) int SccDependent()
{
    return SccDependency();
}
