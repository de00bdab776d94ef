#include "ImportHook.h"
#include "InstalledTest.h"
#include "UniqueHandle.h"

#include <map>

namespace
{

using InstalledList = InstalledTest;
using InstalledProvider = InstalledTest;

class InstalledTextOfSize : public InstalledTest, public testing::WithParamInterface<std::size_t>
{
};
using InstalledTextThatFits = InstalledTextOfSize;
using InstalledTextThatIsTooLong = InstalledTextOfSize;

constexpr std::size_t MaxBytes = 2047;

/// The list's texts as the registry enumerates them.
Names EnumeratedTexts()
{
    Names texts;
    UniqueRegistryKey key;
    if (RegOpenKeyExW(HKEY_LOCAL_MACHINE, ListPath, 0, KEY_READ, key.Out()) != ERROR_SUCCESS)
    {
        return texts;
    }
    for (DWORD index = 0;; ++index)
    {
        wchar_t name[64];
        wchar_t data[256] = {};
        DWORD nameSize = 64;
        DWORD dataSize = sizeof data;
        if (RegEnumValueW(key.Get(), index, name, &nameSize, nullptr, nullptr, reinterpret_cast<BYTE*>(data),
                          &dataSize) != ERROR_SUCCESS)
        {
            break;
        }
        texts.emplace_back(data);
    }
    return texts;
}

/// Disturbs the enumeration of a registry key by OrvixCore.dll after a number of good values.
class EnumerationTrouble
{
public:
    EnumerationTrouble(DWORD goodValues, LSTATUS (*trouble)(DWORD index))
    {
        s_goodValues = goodValues;
        s_trouble = trouble;
    }

private:
    static LSTATUS WINAPI Enumerate(HKEY key, DWORD index, wchar_t* name, DWORD* nameSize, DWORD* reserved, DWORD* type,
                                    BYTE* data, DWORD* dataSize)
    {
        if (index >= s_goodValues)
        {
            const LSTATUS status = s_trouble(index);
            if (status != ERROR_SUCCESS)
            {
                return status;
            }
        }
        return RegEnumValueW(key, index, name, nameSize, reserved, type, data, dataSize);
    }

    inline static DWORD s_goodValues = 0;
    inline static LSTATUS (*s_trouble)(DWORD) = nullptr;
    ImportHook m_hook{GetModuleHandleW(L"OrvixCore.dll"), "RegEnumValueW", reinterpret_cast<void*>(&Enumerate)};
};

/// Counts the registry keys that OrvixCore.dll opens and does not close.
class OpenKeys
{
public:
    OpenKeys() { s_open = s_opened = 0; }
    int Open() const { return s_open; }
    int Opened() const { return s_opened; }

private:
    static LSTATUS WINAPI OpenKey(HKEY parent, const wchar_t* path, DWORD options, REGSAM access, HKEY* key)
    {
        const LSTATUS status = RegOpenKeyExW(parent, path, options, access, key);
        if (status == ERROR_SUCCESS)
        {
            ++s_open;
            ++s_opened;
        }
        return status;
    }
    static LSTATUS WINAPI CloseKey(HKEY key)
    {
        --s_open;
        return RegCloseKey(key);
    }

    inline static int s_open = 0;
    inline static int s_opened = 0;
    ImportHook m_openHook{GetModuleHandleW(L"OrvixCore.dll"), "RegOpenKeyExW", reinterpret_cast<void*>(&OpenKey)};
    ImportHook m_closeHook{GetModuleHandleW(L"OrvixCore.dll"), "RegCloseKey", reinterpret_cast<void*>(&CloseKey)};
};

} // namespace

TEST_F(InstalledList, ThatIsMissingGivesFalse)
{
    m_list.Remove();
    EXPECT_FALSE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
}

TEST_F(InstalledList, ThatIsEmptyGivesTrue)
{
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
}

TEST_F(InstalledList, WithoutAUsableProviderGivesTrue)
{
    m_list.SetString(L"1", L"Software\\OrvixTest\\Missing");
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
}

TEST_F(InstalledList, IsReadOnlyWhenItsSourceBitIsSet)
{
    Install(L"Recorded");
    EXPECT_FALSE(Initialize(0));
    EXPECT_FALSE(Initialize(OrvixProviderSource::Plugins));
    EXPECT_FALSE(Initialize(OtherSources));
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), Names{L"Recorded"});
}

TEST_F(InstalledList, FollowsThePlugins)
{
    AddPlugin(L"good");
    Install(L"Recorded");
    EXPECT_TRUE(Initialize(OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), (Names{L"Fake Depot", L"Recorded"}));
}

TEST_F(InstalledList, IsLookedForWithoutPlugins)
{
    AddPlugin(L"good");
    Install(L"Recorded");
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), Names{L"Recorded"});
    EXPECT_EQ(FakeJournal::Read(), L"");
}

TEST_F(InstalledList, AndPluginsAreLookedForIndependently)
{
    EXPECT_TRUE(Initialize(OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI)) << "an empty list";
    m_list.Remove();
    EXPECT_FALSE(Initialize(OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI));
    AddPlugin(L"good");
    EXPECT_TRUE(Initialize(OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI)) << "a plug-in";
    EXPECT_EQ(ProviderNames(), Names{L"Fake Depot"});
}

TEST_F(InstalledList, IsAddedAgainByASecondInitialize)
{
    Install(L"Recorded");
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), (Names{L"Recorded", L"Recorded"}));
    EXPECT_NE(m_services->GetProvider(0), m_services->GetProvider(1));
}

TEST_F(InstalledList, KeepsTheRegistrysOrder)
{
    std::map<std::wstring, std::wstring> nameOfKey;
    for (const wchar_t* value : {L"z", L"b", L"", L"a", L"C"})
    {
        const std::wstring name = L"Provider " + std::wstring(value);
        TemporaryRegistryKey& key = AddProvider(name);
        m_list.SetString(value, key.Path());
        nameOfKey[key.Path()] = name;
    }
    Names expected;
    for (const std::wstring& path : EnumeratedTexts())
    {
        expected.push_back(nameOfKey[path]);
    }
    ASSERT_EQ(expected.size(), 5u);
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), expected);
}

TEST_F(InstalledList, MayNameAKeyTwice)
{
    TemporaryRegistryKey& key = Install(L"Recorded");
    m_list.SetString(L"again", key.Path());
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), (Names{L"Recorded", L"Recorded"}));
}

TEST_F(InstalledList, SkipsValuesThatAreNoStrings)
{
    Install(L"First");
    const TemporaryRegistryKey& key = AddProvider(L"Wrong type");
    const std::string path = Bytes(key.Path() + L'\0', (key.Path().size() + 1) * sizeof(wchar_t));
    SetBytes(m_list, L"10", REG_EXPAND_SZ, path);
    SetBytes(m_list, L"11", REG_MULTI_SZ, path + std::string(2, '\0'));
    SetBytes(m_list, L"12", REG_BINARY, path);
    SetBytes(m_list, L"13", REG_NONE, path);
    SetBytes(m_list, L"14", REG_LINK, path);
    SetBytes(m_list, L"15", REG_BINARY, std::string(2048, 'x'));
    m_list.SetDword(L"16", 1);
    m_list.SetString(L"99", AddProvider(L"Last").Path());
    const OpenKeys keys;
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), (Names{L"First", L"Last"}));
    EXPECT_EQ(keys.Opened(), 3) << "the list and two providers";
}

TEST_F(InstalledList, SkipsValuesWhoseNameIsTooLong)
{
    TemporaryRegistryKey& key = AddProvider(L"Recorded");
    m_list.SetString(std::wstring(1023, L'a'), key.Path());
    m_list.SetString(std::wstring(1024, L'b'), key.Path());
    m_list.SetString(std::wstring(3000, L'c'), key.Path());
    m_list.SetString(L"z", key.Path());
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), (Names{L"Recorded", L"Recorded"}));
}

TEST_F(InstalledList, ThatIsDeletedMeanwhileEndsAtOnce)
{
    Install(L"First");
    Install(L"Second");
    const EnumerationTrouble deleted(1, [](DWORD) -> LSTATUS {
        RegDeleteTreeW(HKEY_LOCAL_MACHINE, ListPath);
        return ERROR_SUCCESS;
    });
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), Names{L"First"});
}

TEST_F(InstalledList, SkipsAValueThatCannotBeRead)
{
    Install(L"First");
    Install(L"Second");
    Install(L"Third");
    const EnumerationTrouble unreadable(
        1, [](DWORD index) -> LSTATUS { return index == 1 ? ERROR_ACCESS_DENIED : ERROR_SUCCESS; });
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), (Names{L"First", L"Third"}));
}

TEST_F(InstalledList, LeavesNoKeyOpen)
{
    Install(L"First");
    Install(L"No path").Remove();
    AddKey().SetString(ServerName, L"No path");
    m_list.SetString(L"9", m_keys.back().Path());
    const OpenKeys keys;
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(keys.Opened(), 3);
    EXPECT_EQ(keys.Open(), 0);
}

TEST_F(InstalledProvider, WhoseKeyIsIncompleteIsSkipped)
{
    m_list.SetString(L"1", L"Software\\OrvixTest\\Missing");
    m_list.SetString(L"2", AddKey().Path());
    m_list.SetString(L"3", AddKey().Path());
    m_keys.back().SetString(ServerName, L"No path");
    m_list.SetString(L"4", AddKey().Path());
    m_keys.back().SetString(ServerPath, Recording(L"recording_full"));
    m_list.SetString(L"5", AddProvider(L"Recorded").Path());
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), Names{L"Recorded"});
}

TEST_F(InstalledProvider, MayHaveItsTextsInValuesOfAnyType)
{
    const std::wstring path = Recording(L"recording_full") + L'\0';
    for (const DWORD type :
         {DWORD{REG_BINARY}, DWORD{REG_NONE}, DWORD{REG_MULTI_SZ}, DWORD{REG_EXPAND_SZ}, DWORD{REG_DWORD}})
    {
        TemporaryRegistryKey& key = AddKey();
        SetBytes(key, ServerName, type, Bytes(L"%TEMP%", 14));
        SetBytes(key, ServerPath, type, Bytes(path, path.size() * sizeof(wchar_t)));
        m_list.SetString(std::to_wstring(type), key.Path());
    }
    ASSERT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), Names(5, L"%TEMP%"));
    for (std::uint32_t i = 0; i < 5; ++i)
    {
        EXPECT_EQ(m_services->GetProvider(i)->RunProviderClient(), OrvixProviderResult::Success) << i;
    }
}

TEST_F(InstalledProvider, NeedsNoTerminatorsInTheRegistry)
{
    const std::wstring path = Recording(L"recording_full");
    TemporaryRegistryKey& key = AddKey();
    SetBytes(key, ServerName, REG_SZ, Bytes(L"Recorded", 16));
    SetBytes(key, ServerPath, REG_SZ, Bytes(path, path.size() * sizeof(wchar_t)));
    SetBytes(m_list, L"1", REG_SZ, Bytes(key.Path(), key.Path().size() * sizeof(wchar_t)));
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(ProviderNames(), Names{L"Recorded"});
    EXPECT_EQ(provider->RunProviderClient(), OrvixProviderResult::Success);
}

TEST_F(InstalledProvider, LosesHalfACharacterAtTheEndOfAText)
{
    const std::wstring path = Recording(L"recording_full");
    TemporaryRegistryKey& key = AddKey();
    SetBytes(key, ServerName, REG_SZ, Bytes(L"Recorded!", 17));
    SetBytes(key, ServerPath, REG_SZ, Bytes(path + L"!", path.size() * sizeof(wchar_t) + 1));
    SetBytes(m_list, L"1", REG_SZ, Bytes(key.Path() + L"!", key.Path().size() * sizeof(wchar_t) + 1));
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(ProviderNames(), Names{L"Recorded"});
    EXPECT_EQ(provider->RunProviderClient(), OrvixProviderResult::Success);
}

TEST_F(InstalledProvider, EndsATextAtItsFirstZero)
{
    const std::wstring path = Recording(L"recording_full");
    TemporaryRegistryKey& key = AddKey();
    key.SetString(ServerName, std::wstring(L"Recorded\0 and more", 18));
    key.SetString(ServerPath, path + std::wstring(L"\0 and more", 10));
    m_list.SetString(L"1", key.Path() + std::wstring(L"\0 and more", 10));
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(ProviderNames(), Names{L"Recorded"});
    EXPECT_STREQ(provider->GetName(), L"Recorded");
    EXPECT_EQ(provider->RunProviderClient(), OrvixProviderResult::Success);
}

TEST_F(InstalledProvider, MayHaveEmptyTexts)
{
    SetBytes(m_list, L"1", REG_SZ, "");
    m_list.SetString(L"2", L"");
    SetBytes(AddKey(), ServerName, REG_SZ, "");
    SetBytes(m_keys.back(), ServerPath, REG_SZ, "");
    m_list.SetString(L"3", m_keys.back().Path());
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(ProviderNames(), Names{L""});
    EXPECT_STREQ(provider->GetName(), L"");
    EXPECT_EQ(provider->RunProviderClient(), OrvixProviderResult::Failure);
}

TEST_F(InstalledProvider, MayHaveNonAsciiLettersInItsName)
{
    Install(L"D\u00E9p\u00F4t \u5009\u5EAB \xD83D\xDE00");
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), Names{L"D\u00E9p\u00F4t \u5009\u5EAB \xD83D\xDE00"});
}

TEST_P(InstalledTextThatFits, WorksInAllThreePlaces)
{
    TemporaryRegistryKey& key = AddKey();
    const std::string name = Bytes(std::wstring(1024, L'n'), GetParam());
    SetBytes(key, ServerName, REG_SZ, name);
    SetBytes(key, ServerPath, REG_SZ, Bytes(Recording(L"recording_full"), GetParam()));
    SetBytes(m_list, L"1", REG_SZ, Bytes(key.Path(), GetParam()));
    IOrvixProvider* provider = InitializeAndGet();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(ProviderNames(), Names{std::wstring(GetParam() / 2, L'n')});
    EXPECT_EQ(provider->RunProviderClient(), OrvixProviderResult::Success);
}

INSTANTIATE_TEST_SUITE_P(Bytes, InstalledTextThatFits, testing::Values(2000, MaxBytes - 1, MaxBytes));

TEST_P(InstalledTextThatIsTooLong, SkipsThatProviderAlone)
{
    SetBytes(m_list, L"1", REG_SZ, Bytes(AddProvider(L"Long list text").Path(), GetParam()));
    SetBytes(Install(L"replaced"), ServerName, REG_SZ, Bytes(L"Long name", GetParam()));
    SetBytes(Install(L"Long path"), ServerPath, REG_SZ, Bytes(Recording(L"recording_full"), GetParam()));
    Install(L"Recorded");
    EXPECT_TRUE(Initialize(OrvixProviderSource::InstalledMSSCCI));
    EXPECT_EQ(ProviderNames(), Names{L"Recorded"});
}

INSTANTIATE_TEST_SUITE_P(Bytes, InstalledTextThatIsTooLong, testing::Values(MaxBytes + 2, MaxBytes + 3, 4096, 60000));
