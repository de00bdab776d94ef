#include "BraeDiagnostics.h"
#include "IOrvixClientAccess.h"
#include "OrvixClientInfo.h"
#include "OrvixExploreProviderParams.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixNotifyParams.h"
#include "OrvixUserEntry.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace
{

/// A text field, bound to a record of its own.
struct TextField
{
    std::function<const wchar_t*()> get;
    std::function<void(const wchar_t*)> set;
};

struct TextFieldCase
{
    const char* name;
    std::function<TextField()> make;
};

template <typename Record>
TextFieldCase Field(const char* name, const wchar_t* (Record::*get)(), void (Record::*set)(const wchar_t*))
{
    return {name, [get, set] {
                auto record = std::make_shared<Record>();
                return TextField{[record, get] { return (record.get()->*get)(); },
                                 [record, set](const wchar_t* text) { (record.get()->*set)(text); }};
            }};
}

std::vector<TextFieldCase> AllTextFields()
{
    using Client = OrvixClientInfo;
    using Dialog = OrvixFileListDialogParams;
    using Explore = OrvixExploreProviderParams;
    using User = OrvixUserEntry;
    return {
        Field("ClientInfoClientName", &Client::GetClientName, &Client::SetClientName),
        Field("ClientInfoUserName", &Client::GetUserNameW, &Client::SetUserName),
        Field("ClientInfoProviderPluginPath", &Client::GetProviderPluginPath, &Client::SetProviderPluginPath),
        Field("ClientInfoConfigFilePath", &Client::GetConfigFilePath, &Client::SetConfigFilePath),
        Field("DialogTitle", &Dialog::GetTitle, &Dialog::SetTitle),
        Field("DialogMessage", &Dialog::GetMessageW, &Dialog::SetMessage),
        Field("DialogComment", &Dialog::GetComment, &Dialog::SetComment),
        Field("ExploreTitle", &Explore::GetTitle, &Explore::SetTitle),
        Field("UserName", &User::GetUserNameW, &User::SetUserName),
        Field("UserFirstName", &User::GetFirstName, &User::SetFirstName),
        Field("UserLastName", &User::GetLastName, &User::SetLastName),
        Field("UserEmail", &User::GetEmail, &User::SetEmail),
    };
}

/// A host whose answers do not matter here.
class SilentHost final : public IOrvixClientAccess
{
public:
    void OutputText(const wchar_t*, int) override {}
    std::intptr_t RelayA(void*, void*, void*, void*) override { return 0; }
    std::uint32_t GetColor(std::int32_t) override { return 0; }
    bool IsUnattended() override { return false; }
    std::intptr_t RelayB(void*, void*, void*, void*) override { return 0; }
};

int g_window;
HWND__* const SomeWindow = reinterpret_cast<HWND__*>(&g_window);

} // namespace

class RecordText : public testing::TestWithParam<TextFieldCase>
{
protected:
    const TextField field = GetParam().make();
};

TEST_P(RecordText, IsEmptyByDefault)
{
    EXPECT_STREQ(field.get(), L"");
}

TEST_P(RecordText, IsCopied)
{
    std::wstring text = L"a text that is longer than a short one \xE4\x4E2D\xD83D\xDE00";
    const std::wstring original = text;
    field.set(text.c_str());
    text.assign(text.size(), L'x');
    EXPECT_EQ(field.get(), original);
}

TEST_P(RecordText, IsKeptWhenNullIsSet)
{
    field.set(L"kept");
    field.set(nullptr);
    EXPECT_STREQ(field.get(), L"kept");
}

TEST_P(RecordText, IsEmptiedByAnEmptyText)
{
    field.set(L"a text that goes away again");
    field.set(L"");
    EXPECT_STREQ(field.get(), L"");
}

TEST_P(RecordText, HasNoLimitOfLength)
{
    const std::wstring text(100'000, L't');
    field.set(text.c_str());
    EXPECT_EQ(field.get(), text);
}

TEST_P(RecordText, MaySetAPartOfItself)
{
    field.set(L"the first part and the second part");
    field.set(field.get() + 19);
    EXPECT_STREQ(field.get(), L"the second part");
}

INSTANTIATE_TEST_SUITE_P(Fields, RecordText, testing::ValuesIn(AllTextFields()),
                         [](const auto& test) { return std::string(test.param.name); });

TEST(ClientInfo, StartsWithoutWindowAndClientAccess)
{
    OrvixClientInfo info;
    EXPECT_EQ(info.GetParentWindow(), nullptr);
    EXPECT_EQ(info.GetIOrvixClientAccess(), nullptr);
}

TEST(ClientInfo, KeepsEveryFieldApartFromTheOthers)
{
    OrvixClientInfo info;
    SilentHost host;
    info.SetClientName(L"client");
    info.SetUserName(L"user");
    info.SetParentWindow(SomeWindow);
    info.SetProviderPluginPath(L"C:\\plugins\\");
    info.SetConfigFilePath(L"C:\\config");
    info.SetIOrvixClientAccess(&host);
    EXPECT_STREQ(info.GetClientName(), L"client");
    EXPECT_STREQ(info.GetUserNameW(), L"user");
    EXPECT_EQ(info.GetParentWindow(), SomeWindow);
    EXPECT_STREQ(info.GetProviderPluginPath(), L"C:\\plugins\\");
    EXPECT_STREQ(info.GetConfigFilePath(), L"C:\\config");
    EXPECT_EQ(info.GetIOrvixClientAccess(), &host);
    info.SetParentWindow(nullptr);
    info.SetIOrvixClientAccess(nullptr);
    EXPECT_EQ(info.GetParentWindow(), nullptr);
    EXPECT_EQ(info.GetIOrvixClientAccess(), nullptr);
}

TEST(ClientInfo, LeavesTheClientAccessAliveWhenItGoes)
{
    SilentHost host;
    {
        OrvixClientInfo info;
        info.SetIOrvixClientAccess(&host);
    }
    IOrvixClientAccess* access = &host;
    EXPECT_FALSE(access->IsUnattended());
}

TEST(FileListDialogParams, StartsWithoutPromptsOptionsAndList)
{
    OrvixFileListDialogParams params;
    EXPECT_EQ(params.GetDialogPromptID(), -1);
    EXPECT_EQ(params.GetOptionPromptID(), -1);
    EXPECT_EQ(params.GetOptions(), 0u);
    EXPECT_EQ(params.GetOrvixFileList(), nullptr);
}

TEST(FileListDialogParams, KeepsEveryFieldApartFromTheOthers)
{
    OrvixFileListDialogParams params;
    OrvixFileList list;
    params.SetOptions(0xFFFFFFFF);
    params.SetTitle(L"title");
    params.SetMessage(L"message");
    params.SetOrvixFileList(&list);
    params.SetComment(L"comment");
    params.SetDialogPromptID(INT_MIN);
    params.SetOptionPromptID(INT_MAX);
    EXPECT_EQ(params.GetOptions(), 0xFFFFFFFF);
    EXPECT_STREQ(params.GetTitle(), L"title");
    EXPECT_STREQ(params.GetMessageW(), L"message");
    EXPECT_EQ(params.GetOrvixFileList(), &list);
    EXPECT_STREQ(params.GetComment(), L"comment");
    EXPECT_EQ(params.GetDialogPromptID(), INT_MIN);
    EXPECT_EQ(params.GetOptionPromptID(), INT_MAX);
    params.SetOrvixFileList(nullptr);
    EXPECT_EQ(params.GetOrvixFileList(), nullptr);
}

TEST(FileListDialogParams, LeavesTheFileListAliveWhenItGoes)
{
    OrvixFileList list;
    list.CreateEntry(L"a.txt", nullptr, 0, 0);
    const long blocks = BraeDiagnostics::LiveBlocks();
    {
        OrvixFileListDialogParams params;
        params.SetOrvixFileList(&list);
    }
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_STREQ(list.GetFileEntry(0)->GetFile(), L"a.txt");
}

namespace
{

/// The two flags together, as their bits: 1 for multiple selections, 2 for downloading.
int Flags(OrvixExploreProviderParams& params)
{
    return (params.GetMultipleSelections() ? 1 : 0) | (params.GetDownloadFiles() ? 2 : 0);
}

/// Answers for the number of filters.
class CountingParams : public OrvixExploreProviderParams
{
public:
    std::uint32_t NumFilters() override { return 77; }
};

} // namespace

TEST(ExploreProviderParams, StartsWithDownloadingAloneAndNoFilter)
{
    OrvixExploreProviderParams params;
    EXPECT_TRUE(params.GetDownloadFiles());
    EXPECT_FALSE(params.GetMultipleSelections());
    EXPECT_EQ(params.NumFilters(), 0u);
}

TEST(ExploreProviderParams, ChangesEachFlagAlone)
{
    OrvixExploreProviderParams params;
    params.SetDownloadFiles(false);
    EXPECT_EQ(Flags(params), 0);
    params.SetMultipleSelections(true);
    EXPECT_EQ(Flags(params), 1);
    params.SetMultipleSelections(true);
    EXPECT_EQ(Flags(params), 1);
    params.SetDownloadFiles(true);
    EXPECT_EQ(Flags(params), 3);
    params.SetMultipleSelections(false);
    EXPECT_EQ(Flags(params), 2);
    params.SetMultipleSelections(false);
    EXPECT_EQ(Flags(params), 2);
}

TEST(ExploreProviderParamsAddFilter, GivesTheNewCount)
{
    OrvixExploreProviderParams params;
    EXPECT_EQ(params.AddFilter(L"Text", L"*.txt;*.md"), 1u);
    EXPECT_EQ(params.AddFilter(L"All", L" *.* ; "), 2u);
    EXPECT_EQ(params.NumFilters(), 2u);
    EXPECT_STREQ(params.GetFilterName(0), L"Text");
    EXPECT_STREQ(params.GetFilterExtensions(0), L"*.txt;*.md");
    EXPECT_STREQ(params.GetFilterName(1), L"All");
    EXPECT_STREQ(params.GetFilterExtensions(1), L" *.* ; ");
}

TEST(ExploreProviderParamsAddFilter, AddsNothingWhenATextIsNull)
{
    OrvixExploreProviderParams params;
    EXPECT_EQ(params.AddFilter(nullptr, L"*.txt"), 0u);
    EXPECT_EQ(params.NumFilters(), 0u);
    params.AddFilter(L"Text", L"*.txt");
    EXPECT_EQ(params.AddFilter(nullptr, L"*.txt"), 0u);
    EXPECT_EQ(params.AddFilter(L"Text", nullptr), 0u);
    EXPECT_EQ(params.AddFilter(nullptr, nullptr), 0u);
    EXPECT_EQ(params.NumFilters(), 1u);
    EXPECT_EQ(params.GetFilterName(1), nullptr);
}

TEST(ExploreProviderParamsAddFilter, AllowsDuplicatesAndEmptyTexts)
{
    OrvixExploreProviderParams params;
    params.AddFilter(L"", L"");
    EXPECT_EQ(params.AddFilter(L"", L""), 2u);
    EXPECT_STREQ(params.GetFilterName(1), L"");
    EXPECT_STREQ(params.GetFilterExtensions(1), L"");
}

TEST(ExploreProviderParamsAddFilter, TakesTheCountFromTheVirtualOperation)
{
    CountingParams params;
    EXPECT_EQ(params.AddFilter(L"Text", L"*.txt"), 77u);
    EXPECT_EQ(params.AddFilter(nullptr, L"*.txt"), 0u);
}

TEST(ExploreProviderParamsAddFilter, TakesTextsThatAreTheRecordsOwn)
{
    OrvixExploreProviderParams params;
    params.AddFilter(L"Text", L"*.txt");
    for (std::uint32_t n = 2; n <= 100; ++n)
    {
        ASSERT_EQ(params.AddFilter(params.GetFilterName(0), params.GetFilterExtensions(0)), n);
    }
    EXPECT_STREQ(params.GetFilterName(99), L"Text");
    EXPECT_STREQ(params.GetFilterExtensions(99), L"*.txt");
}

TEST(ExploreProviderParamsAddFilter, TakesManyFiltersWithinTheTimeLimit)
{
    OrvixExploreProviderParams params;
    for (std::uint32_t i = 1; i <= 200000; ++i)
    {
        ASSERT_EQ(params.AddFilter(L"Text", L"*.txt"), i);
    }
}

TEST(ExploreProviderParamsGetFilter, KeepsTheAddressesOfItsTextsWhileFiltersAreAdded)
{
    const wchar_t* const longText = L"a text too long to be inside a string object";
    OrvixExploreProviderParams params;
    params.AddFilter(L"Text", L"*.txt");
    params.AddFilter(longText, longText);
    const wchar_t* const shortName = params.GetFilterName(0);
    const wchar_t* const shortExtensions = params.GetFilterExtensions(0);
    const wchar_t* const longName = params.GetFilterName(1);
    for (int n = 0; n < 10'000; ++n)
    {
        ASSERT_NE(params.AddFilter(n % 2 == 0 ? L"All" : longText, L"*.*"), 0u);
    }
    EXPECT_EQ(params.GetFilterName(0), shortName);
    EXPECT_EQ(params.GetFilterExtensions(0), shortExtensions);
    EXPECT_EQ(params.GetFilterName(1), longName);
    EXPECT_STREQ(shortName, L"Text");
    EXPECT_STREQ(shortExtensions, L"*.txt");
    EXPECT_STREQ(longName, longText);
}

TEST(ExploreProviderParamsGetFilter, GivesNullForAnIndexOutOfRange)
{
    OrvixExploreProviderParams params;
    EXPECT_EQ(params.GetFilterName(0), nullptr);
    EXPECT_EQ(params.GetFilterExtensions(0), nullptr);
    params.AddFilter(L"Text", L"*.txt");
    EXPECT_EQ(params.GetFilterName(1), nullptr);
    EXPECT_EQ(params.GetFilterExtensions(1), nullptr);
    EXPECT_EQ(params.GetFilterName(UINT_MAX), nullptr);
    EXPECT_EQ(params.GetFilterExtensions(UINT_MAX), nullptr);
}

TEST(NotifyParams, StartsAsZeroNotCancelledAndWithoutAList)
{
    OrvixNotifyParams params;
    EXPECT_EQ(params.GetID(), 0u);
    EXPECT_EQ(params.GetProviderIndex(), 0u);
    EXPECT_FALSE(params.IsCancelled());
    EXPECT_EQ(params.GetOrvixFileList(), nullptr);
}

TEST(NotifyParams, KeepsEveryFieldApartFromTheOthers)
{
    OrvixNotifyParams params;
    OrvixFileList list;
    params.SetID(0xFFFFFFFF);
    params.SetProviderIndex(0x80000000);
    params.SetCancelled(true);
    params.SetOrvixFileList(&list);
    EXPECT_EQ(params.GetID(), 0xFFFFFFFF);
    EXPECT_EQ(params.GetProviderIndex(), 0x80000000);
    EXPECT_TRUE(params.IsCancelled());
    EXPECT_EQ(params.GetOrvixFileList(), &list);
    params.SetCancelled(false);
    params.SetOrvixFileList(nullptr);
    EXPECT_FALSE(params.IsCancelled());
    EXPECT_EQ(params.GetOrvixFileList(), nullptr);
}

TEST(NotifyParams, LeavesTheFileListAliveWhenItGoes)
{
    OrvixFileList list;
    list.CreateEntry(L"a.txt", nullptr, 0, 0);
    const long blocks = BraeDiagnostics::LiveBlocks();
    {
        OrvixNotifyParams params;
        params.SetOrvixFileList(&list);
    }
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_STREQ(list.GetFileEntry(0)->GetFile(), L"a.txt");
}
