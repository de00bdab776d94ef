#pragma once

#include "OrvixClientInfo.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixMSSCC.h"
#include "OrvixProviderOption.h"
#include "OrvixProviderResult.h"
#include "OrvixProviderWrapper.h"
#include "OutputHost.h"
#include "SccRecorder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <initializer_list>
#include <memory>
#include <string>
#include <vector>

namespace Option = OrvixProviderOption;
namespace Permission = OrvixFilePermission;
namespace Result = OrvixProviderResult;
namespace State = OrvixFileState;

using Calls = std::vector<std::string>;

/// A word of options or flags with every bit set.
inline constexpr unsigned long AllBits = 0xFFFFFFFF;

/// A list whose entries are all active.
class ActiveList
{
public:
    ActiveList(std::initializer_list<const wchar_t*> files)
    {
        for (const wchar_t* file : files)
        {
            Append(file);
        }
    }

    OrvixFileEntry* Append(const wchar_t* file)
    {
        OrvixFileEntry* entry = m_list.CreateEntry(file, nullptr, 0, 0);
        m_list.AddActiveEntry(entry);
        return entry;
    }

    OrvixFileList* Get() { return &m_list; }
    OrvixFileList* operator->() { return &m_list; }
    unsigned long FlagsOf(unsigned int index) { return m_list.GetFileEntry(index)->GetFlagsOut(); }

private:
    OrvixFileList m_list;
};

/// A wrapper of a recording library that is not loaded yet. The library's context will be 0x77, the window 0x1234.
class WrapperTest : public testing::Test
{
protected:
    WrapperTest()
    {
        m_scc = {};
        m_scc.initialize = [](LPVOID* context, HWND, LPCSTR, LPSTR, LPLONG, LPSTR, LPLONG, LPLONG) {
            *context = reinterpret_cast<LPVOID>(0x77);
            return SCC_OK;
        };
        m_wrapper->SetMSSCC(NewBridge(L"recording_full"));
        m_info.SetClientName(L"Test host");
        m_info.SetParentWindow(reinterpret_cast<HWND>(0x1234));
        m_info.SetIOrvixClientAccess(&Host());
    }
    void TearDown() override { m_scc = {}; }

    static std::unique_ptr<OrvixMSSCC> NewBridge(const std::wstring& library)
    {
        auto bridge = std::make_unique<OrvixMSSCC>();
        bridge->SetProvider((ORVIX_RECORDING_MSSCCI L"\\" + library + L".dll").c_str(), L"", L"Recorded", false);
        return bridge;
    }

    /// The host of most tests. It lives as long as the program, since wrappers keep it after a test.
    static OutputHost& Host()
    {
        static OutputHost host;
        return host;
    }

    /// Initialises, opens a project and forgets the calls of the library.
    void Open()
    {
        ASSERT_EQ(m_wrapper->Initialize(&m_info), Result::Success);
        ASSERT_EQ(m_wrapper->OpenProject(L"C:\\Project", L""), Result::Success);
        m_scc.Take();
        Host() = {};
    }

    SccRecorder& m_scc = *TheSccRecorder();
    OrvixClientInfo m_info;
    std::unique_ptr<OrvixProviderWrapper> m_wrapper{new OrvixProviderWrapper};
};

/// An operation on a list, and the function of the library that carries it out.
struct ListOperation
{
    const char* name;
    const char* function;
    int (*run)(IOrvixProvider& provider, OrvixFileList* list);
};

inline const ListOperation ListOperations[] = {
    {"CheckIn", "SccCheckin", [](IOrvixProvider& p, OrvixFileList* list) { return p.CheckIn(list, L"", 0); }},
    {"CheckOut", "SccCheckout",
     [](IOrvixProvider& p, OrvixFileList* list) { return p.CheckOut(list, L"", Option::GetLatest); }},
    {"UndoCheckOut", "SccUncheckout", [](IOrvixProvider& p, OrvixFileList* list) { return p.UndoCheckOut(list, 0); }},
    {"GetLatest", "SccGet", [](IOrvixProvider& p, OrvixFileList* list) { return p.GetLatest(list, 0); }},
    {"Add", "SccAdd", [](IOrvixProvider& p, OrvixFileList* list) { return p.Add(list, L"", 0); }},
    {"ShowHistory", "SccHistory", [](IOrvixProvider& p, OrvixFileList* list) { return p.ShowHistory(list); }},
    {"ShowProperties", "SccProperties", [](IOrvixProvider& p, OrvixFileList* list) { return p.ShowProperties(list); }},
    {"QueryStatus", "SccQueryInfo", [](IOrvixProvider& p, OrvixFileList* list) { return p.QueryStatus(list, 0); }},
};

/// Names the tests of an operation.
struct NameOfOperation
{
    std::string operator()(const testing::TestParamInfo<ListOperation>& test) const { return test.param.name; }
};
