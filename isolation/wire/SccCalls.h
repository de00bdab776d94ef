#pragma once

#include "SccArguments.h"

#include <tuple>
#include <type_traits>

/// A function of an MSSCCI library: its place on the wire, its name, and of what kind its arguments are.
template <typename... Kinds>
struct SccCall
{
    using Function = SCCRTN(typename Kinds::Type...);

    std::uint32_t number;
    const char* name;
};

/// All functions of the interface. Both processes know a function by its number.
namespace SccCalls
{

using namespace SccArguments; // NOLINT(google-build-using-namespace): each call reads as its signature

inline constexpr SccCall<> GetVersion = {0, "SccGetVersion"};
inline constexpr SccCall<NewContext, Window, Text, Buffer<SCC_NAME_SIZE>, NumberPlace<LONG>, Buffer<SCC_AUXLABEL_SIZE>,
                         NumberPlace<LONG>, NumberPlace<LONG>>
    Initialize = {1, "SccInitialize"};
inline constexpr SccCall<Context> Uninitialize = {2, "SccUninitialize"};
inline constexpr SccCall<Context, Window, Buffer<SCC_USER_SIZE>, Text, Text, Buffer<SCC_PRJPATH_SIZE>, Text, Output,
                         Number<LONG>>
    OpenProject = {3, "SccOpenProject"};
inline constexpr SccCall<Context> CloseProject = {4, "SccCloseProject"};
inline constexpr SccCall<Context, Window, Buffer<SCC_USER_SIZE>, Buffer<SCC_PRJPATH_SIZE>, Buffer<MAX_PATH>,
                         Buffer<SCC_PRJPATH_SIZE>, Number<BOOL>, NumberPlace<BOOL>>
    GetProjPath = {5, "SccGetProjPath"};
inline constexpr SccCall<Context, Window, Count, Names, Number<LONG>, Block> Get = {6, "SccGet"};
inline constexpr SccCall<Context, Window, Count, Names, Text, Number<LONG>, Block> Checkout = {7, "SccCheckout"};
inline constexpr SccCall<Context, Window, Count, Names, Number<LONG>, Block> Uncheckout = {8, "SccUncheckout"};
inline constexpr SccCall<Context, Window, Count, Names, Text, Number<LONG>, Block> Checkin = {9, "SccCheckin"};
inline constexpr SccCall<Context, Window, Count, Names, Text, Options, Block> Add = {10, "SccAdd"};
inline constexpr SccCall<> BeginBatch = {11, "SccBeginBatch"};
inline constexpr SccCall<> EndBatch = {12, "SccEndBatch"};
inline constexpr SccCall<Context, Window, Count, Names, Number<LONG>, Block> History = {13, "SccHistory"};
inline constexpr SccCall<Context, Window, Text> Properties = {14, "SccProperties"};
inline constexpr SccCall<Context, Count, Names, Statuses> QueryInfo = {15, "SccQueryInfo"};
inline constexpr SccCall<Context, Number<SCCCOMMAND>, Count, Names, Populate, CallerData, Statuses, Number<LONG>>
    PopulateList = {16, "SccPopulateList"};
inline constexpr SccCall<Context, Window, Count, Names> RunScc = {17, "SccRunScc"};
inline constexpr SccCall<Context, Window, Number<SCCCOMMAND>, BlockPlace> GetCommandOptions = {18,
                                                                                               "SccGetCommandOptions"};
inline constexpr SccCall<Context, Window, AddedCount, AddedNames> AddFromScc = {19, "SccAddFromScc"};
inline constexpr SccCall<Context, Number<LONG>, Number<LONG>> SetOption = {20, "SccSetOption"};

/// In the order of their numbers.
inline constexpr std::tuple All = {
    GetVersion, Initialize, Uninitialize, OpenProject, CloseProject,      GetProjPath, Get,
    Checkout,   Uncheckout, Checkin,      Add,         BeginBatch,        EndBatch,    History,
    Properties, QueryInfo,  PopulateList, RunScc,      GetCommandOptions, AddFromScc,  SetOption};

// The kinds of the arguments are those of the interface's functions.
template <typename Function, typename... Kinds>
constexpr bool Describes(const SccCall<Kinds...>&)
{
    return std::is_same_v<typename SccCall<Kinds...>::Function, Function>;
}
static_assert(Describes<decltype(SccGetVersion)>(GetVersion));
static_assert(Describes<decltype(SccInitialize)>(Initialize));
static_assert(Describes<decltype(SccUninitialize)>(Uninitialize));
static_assert(Describes<decltype(SccOpenProject)>(OpenProject));
static_assert(Describes<decltype(SccCloseProject)>(CloseProject));
static_assert(Describes<decltype(SccGetProjPath)>(GetProjPath));
static_assert(Describes<decltype(SccGet)>(Get));
static_assert(Describes<decltype(SccCheckout)>(Checkout));
static_assert(Describes<decltype(SccUncheckout)>(Uncheckout));
static_assert(Describes<decltype(SccCheckin)>(Checkin));
static_assert(Describes<decltype(SccAdd)>(Add));
static_assert(Describes<decltype(SccBeginBatch)>(BeginBatch));
static_assert(Describes<decltype(SccEndBatch)>(EndBatch));
static_assert(Describes<decltype(SccHistory)>(History));
static_assert(Describes<decltype(SccProperties)>(Properties));
static_assert(Describes<decltype(SccQueryInfo)>(QueryInfo));
static_assert(Describes<decltype(SccPopulateList)>(PopulateList));
static_assert(Describes<decltype(SccRunScc)>(RunScc));
static_assert(Describes<decltype(SccGetCommandOptions)>(GetCommandOptions));
static_assert(Describes<decltype(SccAddFromScc)>(AddFromScc));
static_assert(Describes<decltype(SccSetOption)>(SetOption));

} // namespace SccCalls

/// The arguments of a call, first part: the host writes them.
template <typename... Kinds>
void SendArguments(const SccCall<Kinds...>&, MessageWriter& request, HostSide& side,
                   std::type_identity_t<typename Kinds::Type>... arguments)
{
    (Kinds::Send(request, side, arguments), ...);
}

/// Second part: the process of the library makes them, calls the function, and writes its result and what it stored. A
/// function that is null, and an exception of the library, give SCC_E_INITIALIZEFAILED, as they do in OrvixCore.
template <typename... Kinds>
void Perform(const SccCall<Kinds...>&, typename SccCall<Kinds...>::Function* function, MessageReader& request,
             LibrarySide& side, MessageWriter& reply)
{
    std::tuple<Kinds...> arguments{Kinds(request, side)...};
    request.End();
    side.result = std::apply(
        [function](Kinds&... kinds) {
            try
            {
                return function != nullptr ? function(kinds.Get()...) : SCC_E_INITIALIZEFAILED;
            }
            catch (...)
            {
                return SCC_E_INITIALIZEFAILED;
            }
        },
        arguments);
    reply.Number(static_cast<std::int32_t>(side.result));
    std::apply([&](const Kinds&... kinds) { (kinds.Answer(reply, side), ...); }, arguments);
}

/// Third part: the host takes what the library stored, after the result.
template <typename... Kinds>
void ReceiveArguments(const SccCall<Kinds...>&, MessageReader& reply, HostSide& side,
                      std::type_identity_t<typename Kinds::Type>... arguments)
{
    (Kinds::Receive(reply, side, arguments), ...);
    reply.End();
}
