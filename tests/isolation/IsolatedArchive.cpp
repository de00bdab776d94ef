#include "ArchiveLibrary.h"
#include "IsolatedCopy.h"

std::filesystem::path ArchiveLibrary()
{
    static const IsolatedCopy isolated(BuiltFile(L"archive_msscci.dll"));
    return isolated.Proxy();
}

bool IsArchiveIsolated()
{
    return true;
}
