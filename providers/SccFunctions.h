#pragma once

#include "MSSCCI.h"

#include <cstddef>

/// A function of an MSSCCI library.
template <typename Function>
struct SccFunction
{
    std::size_t slot; ///< of the bridge's operation, counted from GetVersion; those between belong to reserved ones
    const char* name;
};

/// The functions that the bridge knows.
namespace SccFunctions
{

inline constexpr SccFunction<decltype(SccGetVersion)> GetVersion = {0, "SccGetVersion"};
inline constexpr SccFunction<decltype(SccInitialize)> Initialize = {1, "SccInitialize"};
inline constexpr SccFunction<decltype(SccUninitialize)> Uninitialize = {2, "SccUninitialize"};
inline constexpr SccFunction<decltype(SccOpenProject)> OpenProject = {3, "SccOpenProject"};
inline constexpr SccFunction<decltype(SccCloseProject)> CloseProject = {4, "SccCloseProject"};
inline constexpr SccFunction<decltype(SccGetProjPath)> GetProjPath = {5, "SccGetProjPath"};
inline constexpr SccFunction<decltype(SccGet)> Get = {6, "SccGet"};
inline constexpr SccFunction<decltype(SccCheckout)> Checkout = {7, "SccCheckout"};
inline constexpr SccFunction<decltype(SccUncheckout)> Uncheckout = {8, "SccUncheckout"};
inline constexpr SccFunction<decltype(SccCheckin)> Checkin = {9, "SccCheckin"};
inline constexpr SccFunction<decltype(SccAdd)> Add = {10, "SccAdd"};
inline constexpr SccFunction<decltype(SccBeginBatch)> BeginBatch = {12, "SccBeginBatch"};
inline constexpr SccFunction<decltype(SccEndBatch)> EndBatch = {13, "SccEndBatch"};
inline constexpr SccFunction<decltype(SccHistory)> History = {17, "SccHistory"};
inline constexpr SccFunction<decltype(SccProperties)> Properties = {18, "SccProperties"};
inline constexpr SccFunction<decltype(SccQueryInfo)> QueryInfo = {19, "SccQueryInfo"};
inline constexpr SccFunction<decltype(SccPopulateList)> PopulateList = {21, "SccPopulateList"};
inline constexpr SccFunction<decltype(SccRunScc)> RunScc = {23, "SccRunScc"};
inline constexpr SccFunction<decltype(SccGetCommandOptions)> GetCommandOptions = {24, "SccGetCommandOptions"};
inline constexpr SccFunction<decltype(SccAddFromScc)> AddFromScc = {25, "SccAddFromScc"};
inline constexpr SccFunction<decltype(SccSetOption)> SetOption = {26, "SccSetOption"};

inline constexpr const char* Names[] = {
    GetVersion.name,  Initialize.name,   Uninitialize.name, OpenProject.name,       CloseProject.name,
    GetProjPath.name, Get.name,          Checkout.name,     Uncheckout.name,        Checkin.name,
    Add.name,         BeginBatch.name,   EndBatch.name,     History.name,           Properties.name,
    QueryInfo.name,   PopulateList.name, RunScc.name,       GetCommandOptions.name, AddFromScc.name,
    SetOption.name};

} // namespace SccFunctions
