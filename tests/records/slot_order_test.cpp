// Every operation of every record, called by its raw slot as clients built by other compilers call it.

#include "BraeDiagnostics.h"
#include "OrvixClientInfo.h"
#include "OrvixExploreProviderParams.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixNotifyParams.h"
#include "OrvixUserEntry.h"
#include "OrvixUserList.h"
#include "VTable.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <string>

namespace
{

using Text = const wchar_t*;
using Address = void*;
using Unsigned = unsigned int;
using Flags = unsigned long;

int g_target;
const Address SomeAddress = &g_target;

/// A record made for the test, whose slots count from the one after the destructor.
template <typename Record>
class Slots
{
public:
    Slots() = default;
    Slots(const Slots&) = delete;
    Slots& operator=(const Slots&) = delete;
    ~Slots()
    {
        const long blocks = BraeDiagnostics::LiveBlocks();
        DeleteThroughTable(m_record);
        EXPECT_LT(BraeDiagnostics::LiveBlocks(), blocks);
    }

    template <typename Result, typename... Arguments>
    Result Call(std::size_t slot, Arguments... arguments)
    {
        return CallSlot<Result>(m_record, DestructorSlots + slot, arguments...);
    }

    /// Slots `get` and `set` are a field: a value given to the one comes out of the other.
    template <typename Value>
    void ExpectField(std::size_t get, std::size_t set, Value value)
    {
        Call<void>(set, value);
        EXPECT_EQ(Call<Value>(get), value);
    }

    void ExpectText(std::size_t get, std::size_t set)
    {
        const std::wstring text = L"slot " + std::to_wstring(get);
        Call<void>(set, text.c_str());
        EXPECT_EQ(Call<Text>(get), text);
    }

    /// A text that no other slot has changed.
    void ExpectTextKept(std::size_t get) { EXPECT_EQ(Call<Text>(get), L"slot " + std::to_wstring(get)); }

    Address Object() const { return m_record; }

private:
    Record* m_record = new Record;
};

} // namespace

TEST(FileEntrySlots, StandInThePublishedOrder)
{
    Slots<OrvixFileEntry> entry;
    Slots<OrvixFileEntry> child;
    entry.ExpectText(0, 1);
    entry.ExpectField<Flags>(2, 3, 0x80000001);
    entry.ExpectField<long long>(4, 5, -2);
    entry.ExpectField<Flags>(6, 7, 0x80000002);
    EXPECT_EQ(entry.Call<Flags>(2), 0x80000001);
    EXPECT_EQ(entry.Call<long long>(4), -2);
    EXPECT_EQ(entry.Call<Unsigned>(8, child.Object()), 1u);
    EXPECT_EQ(entry.Call<Unsigned>(8, child.Object()), 2u);
    EXPECT_EQ(entry.Call<Unsigned>(9), 2u);
    EXPECT_EQ(entry.Call<Address>(10, 0u), child.Object());
    EXPECT_TRUE(entry.Call<bool>(11, 0u));
    EXPECT_EQ(entry.Call<Unsigned>(9), 1u);
    EXPECT_TRUE(entry.Call<bool>(12));
    EXPECT_EQ(entry.Call<Unsigned>(9), 0u);

    child.Call<void>(1, L"by entry");
    EXPECT_EQ(entry.Call<Unsigned>(13, child.Object()), 1u);
    EXPECT_EQ(entry.Call<Unsigned>(14, L"by path", SomeAddress, Flags{3}, 4ll), 2u);
    EXPECT_EQ(entry.Call<Unsigned>(15), 2u);
    const Address byEntry = entry.Call<Address>(16, 0u);
    const Address byPath = entry.Call<Address>(16, 1u);
    EXPECT_STREQ(CallSlot<Text>(byEntry, DestructorSlots), L"by entry");
    EXPECT_STREQ(CallSlot<Text>(byPath, DestructorSlots), L"by path");
    EXPECT_EQ(CallSlot<Flags>(byPath, DestructorSlots + 2), 3u);
    EXPECT_EQ(CallSlot<long long>(byPath, DestructorSlots + 4), 4);
    EXPECT_EQ(CallSlot<Address>(byPath, DestructorSlots + 20), SomeAddress);
    EXPECT_TRUE(entry.Call<bool>(17, 0u));
    EXPECT_EQ(entry.Call<Unsigned>(15), 1u);
    EXPECT_TRUE(entry.Call<bool>(18));
    EXPECT_EQ(entry.Call<Unsigned>(15), 0u);
    entry.ExpectField<Address>(20, 19, SomeAddress);
    entry.ExpectTextKept(0);
}

TEST(FileListSlots, StandInThePublishedOrder)
{
    Slots<OrvixFileList> list;
    Slots<OrvixFileEntry> source;
    source.Call<void>(1, L"by entry");
    const Address byEntry = list.Call<Address>(0, source.Object());
    const Address byPath = list.Call<Address>(1, L"by path", Address{}, Flags{1}, 2ll);
    ASSERT_NE(byEntry, nullptr);
    ASSERT_NE(byPath, nullptr);
    EXPECT_STREQ(CallSlot<Text>(byEntry, DestructorSlots), L"by entry");
    EXPECT_STREQ(CallSlot<Text>(byPath, DestructorSlots), L"by path");
    EXPECT_EQ(list.Call<Unsigned>(4), 2u);
    EXPECT_EQ(list.Call<Address>(6, 1u), byPath);
    EXPECT_EQ(list.Call<Unsigned>(7, Flags{1}, false), 1u);
    EXPECT_EQ(list.Call<Unsigned>(8, byEntry), 2u);
    EXPECT_EQ(list.Call<Unsigned>(10), 2u);
    EXPECT_EQ(list.Call<Address>(11, 1u), byEntry);
    EXPECT_TRUE(list.Call<bool>(9, byPath));
    EXPECT_EQ(list.Call<Unsigned>(10), 1u);
    EXPECT_EQ(list.Call<Unsigned>(12), 2u);
    EXPECT_EQ(list.Call<Address>(13, 0u), byEntry);
    EXPECT_TRUE(list.Call<bool>(2, 0u));
    EXPECT_EQ(list.Call<Unsigned>(4), 1u);
    EXPECT_TRUE(list.Call<bool>(3, byPath));
    EXPECT_EQ(list.Call<Unsigned>(4), 0u);
    list.Call<Address>(1, L"by path", Address{}, Flags{1}, 2ll);
    EXPECT_TRUE(list.Call<bool>(5));
    EXPECT_EQ(list.Call<Unsigned>(4), 0u);
}

TEST(UserEntrySlots, StandInThePublishedOrder)
{
    Slots<OrvixUserEntry> user;
    for (const std::size_t get : {0u, 2u, 4u, 6u})
    {
        user.ExpectText(get, get + 1);
    }
    for (const std::size_t get : {0u, 2u, 4u, 6u})
    {
        user.ExpectTextKept(get);
    }
    auto* record = static_cast<OrvixUserEntry*>(user.Object());
    EXPECT_STREQ(record->GetUserNameW(), L"slot 0");
    EXPECT_STREQ(record->GetFirstName(), L"slot 2");
    EXPECT_STREQ(record->GetLastName(), L"slot 4");
    EXPECT_STREQ(record->GetEmail(), L"slot 6");
}

TEST(UserListSlots, StandInThePublishedOrder)
{
    Slots<OrvixUserList> list;
    Slots<OrvixUserEntry> source;
    source.Call<void>(1, L"by user");
    const Address byUser = list.Call<Address>(0, source.Object());
    const Address byName = list.Call<Address>(1, L"by name");
    ASSERT_NE(byUser, nullptr);
    ASSERT_NE(byName, nullptr);
    EXPECT_STREQ(CallSlot<Text>(byUser, DestructorSlots), L"by user");
    EXPECT_STREQ(CallSlot<Text>(byName, DestructorSlots), L"by name");
    EXPECT_EQ(list.Call<Unsigned>(4), 2u);
    EXPECT_EQ(list.Call<Address>(6, 1u), byName);
    EXPECT_TRUE(list.Call<bool>(2, 0u));
    EXPECT_EQ(list.Call<Unsigned>(4), 1u);
    EXPECT_TRUE(list.Call<bool>(3, byName));
    EXPECT_EQ(list.Call<Unsigned>(4), 0u);
    list.Call<Address>(1, L"by name");
    EXPECT_TRUE(list.Call<bool>(5));
    EXPECT_EQ(list.Call<Unsigned>(4), 0u);
}

TEST(ClientInfoSlots, StandInThePublishedOrder)
{
    Slots<OrvixClientInfo> info;
    for (const std::size_t get : {0u, 2u, 6u, 8u})
    {
        info.ExpectText(get, get + 1);
    }
    info.ExpectField<Address>(4, 5, SomeAddress);
    info.ExpectField<Address>(10, 11, SomeAddress);
    auto* record = static_cast<OrvixClientInfo*>(info.Object());
    EXPECT_STREQ(record->GetClientName(), L"slot 0");
    EXPECT_STREQ(record->GetUserNameW(), L"slot 2");
    EXPECT_STREQ(record->GetProviderPluginPath(), L"slot 6");
    EXPECT_STREQ(record->GetConfigFilePath(), L"slot 8");
    EXPECT_EQ(static_cast<Address>(record->GetParentWindow()), SomeAddress);
    EXPECT_EQ(static_cast<Address>(record->GetIOrvixClientAccess()), SomeAddress);
}

TEST(FileListDialogParamsSlots, StandInThePublishedOrderWithTheOptionsSetterFirst)
{
    Slots<OrvixFileListDialogParams> params;
    params.ExpectField<std::uint32_t>(1, 0, 0x80000001);
    for (const std::size_t get : {2u, 4u, 8u})
    {
        params.ExpectText(get, get + 1);
    }
    params.ExpectField<Address>(6, 7, SomeAddress);
    params.ExpectField<std::int32_t>(10, 11, -10);
    params.ExpectField<std::int32_t>(12, 13, -12);
    auto* record = static_cast<OrvixFileListDialogParams*>(params.Object());
    EXPECT_EQ(record->GetOptions(), 0x80000001);
    EXPECT_STREQ(record->GetTitle(), L"slot 2");
    EXPECT_STREQ(record->GetMessageW(), L"slot 4");
    EXPECT_STREQ(record->GetComment(), L"slot 8");
    EXPECT_EQ(static_cast<Address>(record->GetOrvixFileList()), SomeAddress);
    EXPECT_EQ(record->GetDialogPromptID(), -10);
    EXPECT_EQ(record->GetOptionPromptID(), -12);
}

TEST(ExploreProviderParamsSlots, StandInThePublishedOrder)
{
    Slots<OrvixExploreProviderParams> params;
    params.ExpectText(0, 1);
    params.Call<void>(5, false);
    params.ExpectField<bool>(2, 3, true);
    EXPECT_FALSE(params.Call<bool>(4));
    params.Call<void>(3, false);
    params.ExpectField<bool>(4, 5, true);
    EXPECT_FALSE(params.Call<bool>(2));
    EXPECT_EQ(params.Call<std::uint32_t>(6, L"Text", L"*.txt"), 1u);
    EXPECT_EQ(params.Call<std::uint32_t>(7), 1u);
    EXPECT_STREQ(params.Call<Text>(8, 0u), L"Text");
    EXPECT_STREQ(params.Call<Text>(9, 0u), L"*.txt");
}

TEST(NotifyParamsSlots, StandInThePublishedOrder)
{
    Slots<OrvixNotifyParams> params;
    params.ExpectField<std::uint32_t>(0, 1, 0x80000001);
    params.ExpectField<std::uint32_t>(2, 3, 0x80000002);
    params.ExpectField<bool>(4, 5, true);
    params.ExpectField<Address>(6, 7, SomeAddress);
    auto* record = static_cast<OrvixNotifyParams*>(params.Object());
    EXPECT_EQ(record->GetID(), 0x80000001);
    EXPECT_EQ(record->GetProviderIndex(), 0x80000002);
    EXPECT_TRUE(record->IsCancelled());
    EXPECT_EQ(static_cast<Address>(record->GetOrvixFileList()), SomeAddress);
}
