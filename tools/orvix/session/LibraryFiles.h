#pragma once

#include "InstalledProviders.h"
#include "OrvixClientInfo.h"
#include "OrvixKnownFiles.h"

#include <string>

/// The files that an installed MSSCCI library knows. `IOrvixProvider` lists none, so the library is asked directly.
namespace LibraryFiles
{

struct Place
{
    const std::wstring& project; ///< full path of the project's folder
    const std::wstring& folder;  ///< full path of the project's folder or of one below it
};

/// Calls `callback` with `callerData` for the files that the library lists in the folder. The library is loaded already
/// and has the project open; it gets a second context for the list. Names nothing when the library cannot list files
/// (`SCC_CAP_POPULATELIST`) or a step fails; texts of the library go to the client.
void Name(const InstalledProviders::Candidate& library, OrvixClientInfo& client, const Place& place,
          OrvixKnownFileCallback callback, void* callerData);

} // namespace LibraryFiles
