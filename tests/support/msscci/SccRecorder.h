#pragma once

#include "MSSCCI.h"

#include <functional>
#include <map>
#include <set>
#include <string>
#include <vector>

/// What the recording MSSCCI libraries of this process were called with, and what they are to answer.
///
/// One line a call, in order: the function's name and its arguments in brackets, pointers and numbers in hexadecimal
/// ("0x0" for null and 0), texts in quotes ("null" for none), file names and words as lists:
///
///     SccCheckin(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], "comment", 0x1000, 0x0)
///
/// A function answers `results` by its name, or 0, after its handler, where one is set, has run: a handler's result
/// counts instead. A library adds "load NAME" when it is loaded and "unload NAME" when it is freed.
struct SccRecorder
{
    std::vector<std::string> calls;
    std::map<std::string, SCCRTN> results;
    std::set<std::string> throwing; ///< functions that throw an exception once they have written down their call

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

    // As a library's start-up code found them when it was loaded last.
    std::wstring manifestAtLoad;     ///< file of the active manifest
    std::wstring dllDirectoryAtLoad; ///< of the process

    /// The calls without "load" and "unload", and forgets all of them.
    std::vector<std::string> Take();
};

/// The test program's recorder; the program exports it to the libraries.
extern "C" __declspec(dllexport) SccRecorder* TheSccRecorder();
