#pragma once

#include "LoadedLibrary.h"
#include "MSSCCI.h"

/// A loaded MSSCCI library with the 21 functions of the interface; null for one that it does not export.
struct SccLibrary
{
    explicit SccLibrary(const std::filesystem::path& file) : library(file) {}

    LoadedLibrary library;
    decltype(&SccGetVersion) getVersion = library.Export<decltype(SccGetVersion)>("SccGetVersion");
    decltype(&SccInitialize) initialize = library.Export<decltype(SccInitialize)>("SccInitialize");
    decltype(&SccUninitialize) uninitialize = library.Export<decltype(SccUninitialize)>("SccUninitialize");
    decltype(&SccOpenProject) openProject = library.Export<decltype(SccOpenProject)>("SccOpenProject");
    decltype(&SccCloseProject) closeProject = library.Export<decltype(SccCloseProject)>("SccCloseProject");
    decltype(&SccGetProjPath) getProjPath = library.Export<decltype(SccGetProjPath)>("SccGetProjPath");
    decltype(&SccGet) get = library.Export<decltype(SccGet)>("SccGet");
    decltype(&SccCheckout) checkout = library.Export<decltype(SccCheckout)>("SccCheckout");
    decltype(&SccUncheckout) uncheckout = library.Export<decltype(SccUncheckout)>("SccUncheckout");
    decltype(&SccCheckin) checkin = library.Export<decltype(SccCheckin)>("SccCheckin");
    decltype(&SccAdd) add = library.Export<decltype(SccAdd)>("SccAdd");
    decltype(&SccBeginBatch) beginBatch = library.Export<decltype(SccBeginBatch)>("SccBeginBatch");
    decltype(&SccEndBatch) endBatch = library.Export<decltype(SccEndBatch)>("SccEndBatch");
    decltype(&SccHistory) history = library.Export<decltype(SccHistory)>("SccHistory");
    decltype(&SccProperties) properties = library.Export<decltype(SccProperties)>("SccProperties");
    decltype(&SccQueryInfo) queryInfo = library.Export<decltype(SccQueryInfo)>("SccQueryInfo");
    decltype(&SccPopulateList) populateList = library.Export<decltype(SccPopulateList)>("SccPopulateList");
    decltype(&SccRunScc) runScc = library.Export<decltype(SccRunScc)>("SccRunScc");
    decltype(&SccGetCommandOptions) getCommandOptions =
        library.Export<decltype(SccGetCommandOptions)>("SccGetCommandOptions");
    decltype(&SccAddFromScc) addFromScc = library.Export<decltype(SccAddFromScc)>("SccAddFromScc");
    decltype(&SccSetOption) setOption = library.Export<decltype(SccSetOption)>("SccSetOption");
};
