#pragma once

#include "MSSCCI.h"

#include <functional>
#include <map>
#include <set>
#include <string>
#include <vector>

/// The calls of the recording MSSCCI libraries of this process, and their answers.
///
/// A call is one line: the name of the function and its arguments in brackets. Pointers and numbers are hexadecimal
/// ("0x0" for null and 0), texts are in quotes ("null" for none), file names and words are lists:
///
///     SccCheckin(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], "comment", 0x1000, 0x0)
///
/// A function returns what `results` has for its name, or SCC_OK. Where a handler is set, it runs and its result counts
/// instead. A library adds "load NAME" when it is loaded and "unload NAME" when it is freed.
struct SccRecorder
{
    std::vector<std::string> calls;
    std::map<std::string, SCCRTN> results;
    std::set<std::string> throwing; ///< functions that note their call and then throw an exception

    std::function<decltype(SccInitialize)> initialize;
    std::function<decltype(SccUninitialize)> uninitialize;
    std::function<decltype(SccOpenProject)> openProject;
    std::function<decltype(SccGetProjPath)> getProjPath;
    std::function<decltype(SccGet)> get;
    std::function<decltype(SccAdd)> add;
    std::function<decltype(SccHistory)> history;
    std::function<decltype(SccQueryInfo)> queryInfo;
    std::function<decltype(SccPopulateList)> populateList;
    std::function<decltype(SccGetCommandOptions)> getCommandOptions;
    std::function<decltype(SccAddFromScc)> addFromScc;

    // What the start-up code of the library that was loaded last found.
    std::wstring manifestAtLoad;     ///< file of the active manifest
    std::wstring dllDirectoryAtLoad; ///< of the process

    /// Returns the calls without "load" and "unload", and forgets all calls.
    std::vector<std::string> Take();
};

/// The test program's recorder; the program exports it to the libraries.
extern "C" __declspec(dllexport) SccRecorder* TheSccRecorder();
