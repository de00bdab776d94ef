#include "ArchiveLibrary.h"

#include "BuiltFile.h"

std::filesystem::path ArchiveLibrary()
{
    return BuiltFile(L"archive_msscci.dll");
}

bool IsArchiveIsolated()
{
    return false;
}
