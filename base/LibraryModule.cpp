#include "LibraryModule.h"

namespace
{

HMODULE libraryModule = nullptr;

} // namespace

HMODULE LibraryModule()
{
    return libraryModule;
}

void RememberLibraryModule(HMODULE module)
{
    libraryModule = module;
}
