#include "FileLists.h"
#include "Libraries.h"
#include "MSSCCI.h"
#include "Measure.h"
#include "OrvixClientInfo.h"
#include "OrvixMSSCC.h"
#include "OrvixProviderWrapper.h"

#include <psapi.h>

#include <cstdio>
#include <cstring>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

namespace
{

/// A provider over the library that does nothing, with an open project.
class IdleMsscci
{
public:
    IdleMsscci()
    {
        auto bridge = std::make_unique<OrvixMSSCC>();
        bridge->SetProvider((ProgramFolder() / IdleLibrary).c_str(), L"", L"Idle", false);
        m_wrapper.SetMSSCC(std::move(bridge));
        OrvixClientInfo info;
        m_wrapper.Initialize(&info);
        m_wrapper.OpenProject(L"C:\\project", L"");
    }

    OrvixProviderWrapper& Provider() { return m_wrapper; }

private:
    OrvixProviderWrapper m_wrapper;
};

/// One conversion of each path into a block, and `call` with all.
template <typename Call>
void CallByHand(OrvixFileList& list, const Call& call)
{
    constexpr std::size_t LongestPath = 64;
    const unsigned int count = list.NumActiveEntries();
    const std::unique_ptr<char[]> block(new char[count * LongestPath]);
    const std::unique_ptr<LPCSTR[]> names(new LPCSTR[count]);
    char* next = block.get();
    for (unsigned int i = 0; i < count; ++i)
    {
        names[i] = next;
        next += WideCharToMultiByte(CP_ACP, 0, list.GetActiveFileEntry(i)->GetFile(), -1, next, LongestPath, nullptr,
                                    nullptr);
    }
    call(static_cast<LONG>(count), names.get());
}

SIZE_T MemoryNow()
{
    PROCESS_MEMORY_COUNTERS counters = {};
    GetProcessMemoryInfo(GetCurrentProcess(), &counters, sizeof counters);
    return counters.PagefileUsage;
}

/// Peak memory of a query, which is during the library's call.
void ReportMemory(IdleMsscci& msscci, HMODULE library)
{
    constexpr unsigned int Count = 100000;
    const auto list = MakeActiveList(Count);
    std::size_t bytes = 0;
    for (unsigned int i = 0; i < Count; ++i)
    {
        bytes += std::wcslen(list->GetActiveFileEntry(i)->GetFile()) + 1;
    }
    const SIZE_T before = MemoryNow();
    Export<void()>(library, "WatchNextQuery")();
    msscci.Provider().QueryStatus(list.get(), 0);
    const SIZE_T during = Export<SIZE_T()>(library, "MemoryInQuery")();
    std::printf("QueryStatus, 100,000 files: %.1f MB more than before at its peak; the narrow paths have %.1f MB\n",
                static_cast<double>(during - before) / 1e6, static_cast<double>(bytes) / 1e6);
}

/// The milliseconds of both operations for `count` files.
struct QueryAndCheckOut
{
    Measure query;
    Measure checkOut;
};

QueryAndCheckOut CompareOperations(IdleMsscci& msscci, HMODULE library, unsigned int count)
{
    const auto list = MakeActiveList(count);
    const std::string name = " through an MSSCCI library, " + std::to_string(count) + " files";
    const auto queryInfo = Export<decltype(SccQueryInfo)>(library, "SccQueryInfo");
    const auto checkOut = Export<decltype(SccCheckout)>(library, "SccCheckout");
    return {Compare(
                "QueryStatus" + name, 1.2, [&] { msscci.Provider().QueryStatus(list.get(), 0); },
                [&] {
                    CallByHand(*list, [&](LONG size, LPCSTR* names) {
                        std::vector<LONG> statuses(static_cast<std::size_t>(size));
                        queryInfo(nullptr, size, names, statuses.data());
                    });
                }),
            Compare(
                "CheckOut" + name, 1.2, [&] { msscci.Provider().CheckOut(list.get(), L"comment", 0); },
                [&] {
                    CallByHand(*list, [&](LONG size, LPCSTR* names) {
                        checkOut(nullptr, nullptr, size, names, "comment", 0, nullptr);
                    });
                })};
}

} // namespace

void BenchMsscci(MeasureTable& table)
{
    IdleMsscci msscci;
    const UniqueModule library(LoadLibraryW((ProgramFolder() / IdleLibrary).c_str()));
    ReportMemory(msscci, library.Get());
    std::vector<QueryAndCheckOut> measures;
    for (const unsigned int count : {1000U, 10000U, 100000U})
    {
        measures.push_back(CompareOperations(msscci, library.Get(), count));
        table.Print(measures.back().query);
        table.Print(measures.back().checkOut);
    }
    const auto printGrowth = [&](const char* name, Measure QueryAndCheckOut::*operation) {
        const Measure& small = measures.front().*operation;
        const Measure& large = measures.back().*operation;
        table.Print({std::string(name) + ", growth of the time per file from 1,000 to 100,000 files",
                     large.ours / small.ours / 100, large.floor / small.floor / 100, 1.3});
    };
    printGrowth("QueryStatus", &QueryAndCheckOut::query);
    printGrowth("CheckOut", &QueryAndCheckOut::checkOut);
}
