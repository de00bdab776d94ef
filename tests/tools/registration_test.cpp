// orvix register and orvix unregister.

#include "BuiltFile.h"
#include "RegistryToolTest.h"

#include <gmock/gmock.h>

#include <aclapi.h>

#include <algorithm>
#include <array>
#include <fstream>

namespace
{

using testing::HasSubstr;
using Registration = RegistryToolTest;

constexpr const wchar_t* ForeignKey = L"Software\\OrvixTestForeign";

std::string Library()
{
    return std::filesystem::path(ORVIX_TALKING_MSSCCI).make_preferred().string();
}

} // namespace

TEST_F(Registration, IsSeenAmongTheProvidersUntilItIsTakenOut)
{
    const auto registered = Register(ORVIX_TALKING_MSSCCI, L"Talking");
    EXPECT_EQ(registered.code, Success);
    EXPECT_EQ(registered.output, "registered Talking: " + Library() + "\n");
    EXPECT_EQ(Providers().output, "Index  Provider\n0      Talking\n");

    const auto unregistered = Unregister(L"Talking");
    EXPECT_EQ(unregistered.code, Success);
    EXPECT_EQ(unregistered.output, "unregistered Talking\n");
    EXPECT_EQ(Providers().code, NotFound);
    EXPECT_EQ(Providers().errors, "orvix: no provider in the registry's list of MSSCCI libraries\n");
}

TEST_F(Registration, IsAValueInTheListAndAKeyOfItsOwn)
{
    ASSERT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Talking").code, Success);
    EXPECT_EQ(List().Text(L"Talking"), L"Software\\OrvixCore\\MSSCCI\\Talking");
    EXPECT_EQ(TemporaryRegistryKey::Text(L"Software\\OrvixCore\\MSSCCI\\Talking", L"SCCServerName"), L"Talking");
    EXPECT_EQ(Path(L"Talking"), std::filesystem::path(Library()).wstring());
}

TEST_F(Registration, LeavesNothingOfItsName)
{
    ASSERT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Talking").code, Success);
    ASSERT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Other").code, Success);
    ASSERT_EQ(Unregister(L"Talking").code, Success);
    EXPECT_EQ(List().Text(L"Talking"), std::nullopt);
    EXPECT_FALSE(TemporaryRegistryKey::Exists(L"Software\\OrvixCore\\MSSCCI\\Talking"));
    EXPECT_EQ(Providers().output, "Index  Provider\n0      Other\n");
}

TEST_F(Registration, MakesTheListWhereItIsMissing)
{
    List().Remove();
    ASSERT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Talking").code, Success);
    EXPECT_EQ(Providers().output, "Index  Provider\n0      Talking\n");
}

TEST_F(Registration, OfAKnownNameInAnyCaseReplacesThePath)
{
    const std::filesystem::path copy = Scratch() / L"copy.dll";
    std::filesystem::copy_file(ORVIX_TALKING_MSSCCI, copy);
    ASSERT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Talking").code, Success);
    const auto result = Register(copy, L"TALKING");
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(result.output, "replaced TALKING: " + copy.string() + " instead of " + Library() + "\n");
    EXPECT_EQ(Path(L"Talking"), copy.wstring());
    EXPECT_EQ(Providers().output, "Index  Provider\n0      TALKING\n");
}

TEST_F(Registration, IsTakenOutByItsNameInAnyCase)
{
    ASSERT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Talking").code, Success);
    EXPECT_EQ(Unregister(L"talking").code, Success);
    EXPECT_EQ(List().Text(L"Talking"), std::nullopt);
}

TEST_F(Registration, MakesARelativePathFull)
{
    std::filesystem::copy_file(ORVIX_TALKING_MSSCCI, File(L"here.dll"));
    ASSERT_EQ(Register(L"here.dll", L"Talking").code, Success);
    EXPECT_EQ(Path(L"Talking"), File(L"here.dll").wstring());
}

TEST_F(Registration, TakesNamesOutsideAscii)
{
    const auto result = Register(ORVIX_TALKING_MSSCCI, L"L\u00E4ger \u5009/\u5EAB");
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(Providers().output, "Index  Provider\n0      L\xC3\xA4ger \xE5\x80\x89/\xE5\xBA\xAB\n");
    EXPECT_EQ(Unregister(L"L\u00C4GER \u5009/\u5EAB").code, Success);
}

TEST_F(Registration, TakesTheLongestNameOfAKeyAndNoLongerOne)
{
    EXPECT_EQ(Register(ORVIX_TALKING_MSSCCI, std::wstring(255, L'n')).code, Success);
    EXPECT_EQ(Providers().output, "Index  Provider\n0      " + std::string(255, 'n') + "\n");
    EXPECT_EQ(Register(ORVIX_TALKING_MSSCCI, std::wstring(256, L'n')).code, BadUsage);
}

TEST_F(Registration, RefusesNamesThatNoKeyCanHave)
{
    for (const wchar_t* name : {L"", L"a\\b", L"tab\t", L"line\n", L"delete\x7F", L"next\x85"})
    {
        for (const auto& result : {Register(ORVIX_TALKING_MSSCCI, name), Unregister(name)})
        {
            EXPECT_EQ(result.code, BadUsage);
            EXPECT_EQ(result.errors, "orvix: a provider's name has 1 to 255 characters, and no backslash or control "
                                     "character among them\n");
        }
    }
    EXPECT_FALSE(TemporaryRegistryKey::Exists(L"Software\\OrvixCore\\MSSCCI"));
}

TEST_F(Registration, RefusesAPathThatWouldNotFitIntoTheLibrarysBuffer)
{
    const std::wstring root = L"C:\\";
    const auto tooLong = Register(root + std::wstring(1023 - root.size(), L'x'), L"Talking");
    EXPECT_EQ(tooLong.code, BadUsage);
    EXPECT_EQ(tooLong.errors, "orvix: the path of the library is longer than 1022 characters\n");
    EXPECT_THAT(Register(root + std::wstring(1022 - root.size(), L'x'), L"Talking").errors,
                HasSubstr("orvix: no such library: "));
    EXPECT_THAT(
        RunExactly({L"register", root + std::wstring(1023 - root.size(), L'x'), L"Talking", L"--isolated"}).errors,
        HasSubstr("orvix: no such library: "))
        << "the short path of the proxy is registered";
}

TEST_F(Registration, RefusesWhatIsNoMSSCCILibrary)
{
    const std::filesystem::path fakes(ORVIX_FAKE_PLUGINS);
    Write(L"text.dll", "no library");
    std::filesystem::copy_file(ORVIX_TALKING_MSSCCI, File(L"half.dll"));
    std::filesystem::resize_file(File(L"half.dll"), std::filesystem::file_size(File(L"half.dll")) / 2);
    std::vector<std::pair<std::filesystem::path, const char*>> bad = {
        {L"nowhere.dll", "no such library: "},
        {L".", "no such library: "},
        {L"text.dll", "not a 64-bit library: "},
        {L"half.dll", "not a 64-bit library: "},
        {fakes / L"good.dll", "no MSSCCI library, it has no SccGetVersion: "},
        {BuiltFile(L"orvix.exe"), "no MSSCCI library, it has no SccGetVersion: "},
    };
    if (std::filesystem::exists(fakes / L"wrongbitness.dll"))
    {
        bad.emplace_back(fakes / L"wrongbitness.dll", "no MSSCCI library, it has no SccGetVersion: ");
    }
    for (const auto& [path, message] : bad)
    {
        const auto result = Register(path, L"Talking");
        EXPECT_EQ(result.code, NotFound) << path;
        EXPECT_THAT(result.errors, HasSubstr(std::string("orvix: ") + message)) << path;
    }
    EXPECT_EQ(Providers().code, NotFound);
    EXPECT_EQ(Path(L"Talking"), std::nullopt);
}

TEST_F(Registration, OfAnUnknownNameCannotBeTakenOut)
{
    ASSERT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Talking").code, Success);
    const auto result = Unregister(L"Talk");
    EXPECT_EQ(result.code, NotFound);
    EXPECT_EQ(result.errors, "orvix: no such registration: Talk\n");
    EXPECT_EQ(Providers().code, Success);
}

TEST_F(Registration, OfAnotherProgramIsNeitherReplacedNorTakenOut)
{
    TemporaryRegistryKey foreign(ForeignKey);
    foreign.SetString(L"SCCServerName", L"Talking");
    foreign.SetString(L"SCCServerPath", L"C:\\elsewhere.dll");
    List().SetString(L"any name", ForeignKey);
    for (const auto& result : {Register(ORVIX_TALKING_MSSCCI, L"talking"), Unregister(L"talking")})
    {
        EXPECT_EQ(result.code, Failed);
        EXPECT_EQ(result.errors, "orvix: talking is registered by another program and stays as it is: "
                                 "HKEY_LOCAL_MACHINE\\Software\\OrvixTestForeign\n");
    }
    EXPECT_EQ(List().Text(L"any name"), ForeignKey);
    EXPECT_EQ(foreign.Text(L"SCCServerPath"), L"C:\\elsewhere.dll");
    EXPECT_EQ(Path(L"talking"), std::nullopt);
}

TEST_F(Registration, NeverOverwritesAValueOfTheListThatBelongsToAnotherProgram)
{
    List().SetString(L"Talking", ForeignKey);
    List().SetDword(L"Number", 7);
    EXPECT_EQ(Register(ORVIX_TALKING_MSSCCI, L"talking").code, Failed);
    EXPECT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Number").code, Failed);
    EXPECT_EQ(List().Text(L"Talking"), ForeignKey);
}

TEST_F(Registration, ThatAnInterruptedRunHasLeftOutOfTheListCanBeCompletedOrTakenOut)
{
    TemporaryRegistryKey half(std::wstring(OwnKeys) + L"Talking");
    half.SetString(L"SCCServerName", L"Talking");
    ASSERT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Talking").code, Success);
    EXPECT_EQ(Providers().output, "Index  Provider\n0      Talking\n");
    List().Remove();
    EXPECT_EQ(Unregister(L"Talking").code, Success);
    EXPECT_FALSE(TemporaryRegistryKey::Exists(half.Path()));
}

TEST_F(Registration, WithoutRightsSaysSoAndLeavesNothingBehind)
{
    SetAccess(List().Path(), ReadAndDelete);
    const auto result = Register(ORVIX_TALKING_MSSCCI, L"Talking");
    EXPECT_EQ(result.code, Failed);
    EXPECT_EQ(result.errors, "orvix: the registry cannot be changed without administrator rights: run orvix as "
                             "administrator\n");
    EXPECT_EQ(result.output, "");
    EXPECT_FALSE(TemporaryRegistryKey::Exists(L"Software\\OrvixCore\\MSSCCI\\Talking"));
}

TEST_F(Registration, IsNotListedWhenItsOwnKeyCannotBeWritten)
{
    SetAccess(L"Software\\OrvixCore", ReadAndDelete);
    EXPECT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Talking").code, Failed);
    EXPECT_EQ(List().Text(L"Talking"), std::nullopt);
}

TEST_F(Registration, WithoutRightsStaysRegistered)
{
    ASSERT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Talking").code, Success);
    SetAccess(List().Path(), ReadAndDelete);
    const auto result = Unregister(L"Talking");
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.errors, HasSubstr("run orvix as administrator"));
    EXPECT_EQ(Providers().output, "Index  Provider\n0      Talking\n");
}

TEST_F(Registration, ThatFailsKeepsThePathThatWasThere)
{
    const std::filesystem::path copy = Scratch() / L"copy.dll";
    std::filesystem::copy_file(ORVIX_TALKING_MSSCCI, copy);
    ASSERT_EQ(Register(copy, L"Talking").code, Success);
    List().Remove();
    List().SetString(L"", L"");
    SetAccess(List().Path(), ReadAndDelete);
    EXPECT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Talking").code, Failed);
    EXPECT_EQ(Path(L"Talking"), copy.wstring());
}

namespace
{

/// Who may change a file or folder.
struct Access
{
    explicit Access(const std::filesystem::path& path)
    {
        UniqueLocalMemory descriptor;
        PACL list = nullptr;
        EXPECT_EQ(GetNamedSecurityInfoW(path.c_str(), SE_FILE_OBJECT, DACL_SECURITY_INFORMATION, nullptr, nullptr,
                                        &list, nullptr, descriptor.Out()),
                  static_cast<DWORD>(ERROR_SUCCESS));
        SECURITY_DESCRIPTOR_CONTROL control = 0;
        DWORD revision = 0;
        GetSecurityDescriptorControl(descriptor.Get(), &control, &revision);
        isProtected = (control & SE_DACL_PROTECTED) != 0;
        for (DWORD i = 0; list != nullptr && i < list->AceCount; ++i)
        {
            LPVOID entry = nullptr;
            GetAce(list, i, &entry);
            auto& allowed = *static_cast<ACCESS_ALLOWED_ACE*>(entry);
            if (allowed.Header.AceType == ACCESS_ALLOWED_ACE_TYPE && IsEverybody(&allowed.SidStart))
            {
                everybodysRights |= allowed.Mask;
            }
        }
    }

    static bool IsEverybody(PSID group)
    {
        constexpr WELL_KNOWN_SID_TYPE Groups[] = {WinWorldSid, WinBuiltinUsersSid, WinAuthenticatedUserSid};
        return std::any_of(std::begin(Groups), std::end(Groups),
                           [group](auto one) { return IsWellKnownSid(group, one) != FALSE; });
    }

    bool EverybodyMayWrite() const
    {
        constexpr ACCESS_MASK Write = FILE_WRITE_DATA | FILE_APPEND_DATA | FILE_WRITE_EA | FILE_DELETE_CHILD |
                                      FILE_WRITE_ATTRIBUTES | DELETE | WRITE_DAC | WRITE_OWNER | GENERIC_WRITE |
                                      GENERIC_ALL;
        return (everybodysRights & Write) != 0;
    }

    bool isProtected = false; ///< nothing is inherited from the folder above
    ACCESS_MASK everybodysRights = 0;
};

/// Nothing is inherited from the folder above.
void LetEverybodyWrite(const std::filesystem::path& folder)
{
    UniqueLocalMemory descriptor;
    ASSERT_TRUE(ConvertStringSecurityDescriptorToSecurityDescriptorW(L"D:P(A;OICI;FA;;;WD)", SDDL_REVISION_1,
                                                                     descriptor.Out(), nullptr));
    ASSERT_TRUE(SetFileSecurityW(folder.c_str(), DACL_SECURITY_INFORMATION | PROTECTED_DACL_SECURITY_INFORMATION,
                                 descriptor.Get()));
}

/// The folder of an isolated library.
std::filesystem::path IsolatedPath(const wchar_t* name)
{
    return std::filesystem::path(L"C:\\ProgramData\\OrvixCore Isolation") / name;
}

/// The folder of the talking library is complete, with a patience of 77 seconds.
void ExpectTalkingIsIsolated()
{
    const std::filesystem::path folder = IsolatedPath(L"TALKING");
    const std::filesystem::path settings = folder / L"scc_proxy.ini";
    std::array<wchar_t, 1024> library = {};
    GetPrivateProfileStringW(L"Isolation", L"Library", L"", library.data(), static_cast<DWORD>(library.size()),
                             settings.c_str());
    EXPECT_EQ(std::filesystem::path(library.data()).string(), Library());
    EXPECT_EQ(GetPrivateProfileIntW(L"Isolation", L"SecondsWithoutAnswer", 0, settings.c_str()), 77u);
    EXPECT_TRUE(std::filesystem::exists(folder / L"scc_proxy.dll"));
    EXPECT_TRUE(std::filesystem::exists(folder / L"scc_host64.exe"));
}

} // namespace

TEST_F(Registration, OfAnIsolatedLibraryMakesAFolderWithItsProxy)
{
    const auto result =
        RunExactly({L"register", ORVIX_TALKING_MSSCCI, L"Talk/ing", L"--isolated", L"--patience", L"77"});
    EXPECT_EQ(result.code, Success) << result.errors;
    EXPECT_EQ(result.output, "registered Talk/ing: " + Library() + "\nit runs isolated, in a process of its own\n");
    const std::filesystem::path folder = IsolatedPath(L"TALK%2FING");
    EXPECT_EQ(Path(L"Talk/ing"), (folder / L"scc_proxy.dll").wstring());
    EXPECT_TRUE(std::filesystem::exists(folder / L"scc_proxy.dll"));
    EXPECT_TRUE(std::filesystem::exists(folder / L"scc_host64.exe"));
    EXPECT_EQ(GetPrivateProfileIntW(L"Isolation", L"SecondsWithoutAnswer", 0, (folder / L"scc_proxy.ini").c_str()),
              77u);
    EXPECT_EQ(Providers().output, "Index  Provider\n0      Talk/ing\n");

    EXPECT_EQ(Unregister(L"talk/ing").code, Success);
    EXPECT_FALSE(std::filesystem::exists(folder));
    EXPECT_EQ(Path(L"Talk/ing"), std::nullopt);
}

TEST_F(Registration, OfAnIsolatedLibraryLetsOnlyAdministratorsWrite)
{
    ASSERT_EQ(RunExactly({L"register", ORVIX_TALKING_MSSCCI, L"Talking", L"--isolated"}).code, Success);
    const std::filesystem::path folder = IsolatedPath(L"TALKING");
    for (const std::filesystem::path& path : {folder.parent_path(), folder, folder / L"scc_proxy.ini",
                                              folder / L"scc_proxy.dll", folder / L"scc_host64.exe"})
    {
        const Access access(path);
        EXPECT_FALSE(access.EverybodyMayWrite()) << path;
        EXPECT_NE(access.everybodysRights, 0u) << "they may read " << path;
    }
    LetEverybodyWrite(Scratch());
    if (Access(Scratch()).isProtected) // Wine does not keep that
    {
        EXPECT_TRUE(Access(folder.parent_path()).isProtected);
        EXPECT_TRUE(Access(folder).isProtected);
    }
    EXPECT_EQ(Unregister(L"Talking").code, Success);
}

TEST_F(Registration, OfAnIsolatedLibraryTakesTheRightsFromWhoMadeTheFolderBefore)
{
    const std::filesystem::path folder = IsolatedPath(L"TALKING");
    for (const std::filesystem::path& path : {folder.parent_path(), folder})
    {
        std::filesystem::create_directory(path);
        LetEverybodyWrite(path);
        ASSERT_TRUE(Access(path).EverybodyMayWrite());
    }
    ASSERT_EQ(RunExactly({L"register", ORVIX_TALKING_MSSCCI, L"Talking", L"--isolated"}).code, Success);
    EXPECT_FALSE(Access(folder.parent_path()).EverybodyMayWrite());
    EXPECT_FALSE(Access(folder).EverybodyMayWrite());
    EXPECT_EQ(Unregister(L"Talking").code, Success);
}

TEST_F(Registration, OfAnIsolatedLibraryThatCannotBeCopiedKeepsTheOneThatWasThere)
{
    const std::filesystem::path tools =
        UseCopy({L"OrvixCore.dll", L"OrvixCoreUI.dll", L"braeutil.dll", L"scc_proxy.dll", L"scc_host64.exe"});
    std::filesystem::create_directory(tools / L"scc_host32.exe"); // which cannot be copied as a file
    ASSERT_EQ(RunExactly({L"register", ORVIX_TALKING_MSSCCI, L"Talking", L"--isolated", L"--patience", L"77"}).code,
              Success);
    const auto result = Register(ORVIX_ARCHIVE_32, L"Talking");
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.errors, HasSubstr("scc_host32.exe cannot be copied"));
    ExpectTalkingIsIsolated();
    EXPECT_EQ(Unregister(L"Talking").code, Success);
}

TEST_F(Registration, OfAnIsolatedLibraryRemovesWhatLiesInItsFolder)
{
    const std::filesystem::path folder = IsolatedPath(L"TALKING");
    std::filesystem::create_directories(folder);
    std::ofstream(folder / L"version.dll") << "a library that must not be loaded";
    std::filesystem::create_directories(folder / L"full");
    std::ofstream(folder / L"full" / L"file") << "not to be removed";
    const auto refused = RunExactly({L"register", ORVIX_TALKING_MSSCCI, L"Talking", L"--isolated"});
    EXPECT_EQ(refused.code, Failed);
    EXPECT_THAT(refused.errors, HasSubstr("the library cannot be isolated: remove the folder "));
    EXPECT_TRUE(std::filesystem::exists(folder / L"full" / L"file"));
    EXPECT_EQ(Path(L"Talking"), std::nullopt);

    std::filesystem::remove_all(folder / L"full");
    ASSERT_EQ(RunExactly({L"register", ORVIX_TALKING_MSSCCI, L"Talking", L"--isolated"}).code, Success);
    EXPECT_FALSE(std::filesystem::exists(folder / L"version.dll"));
    EXPECT_TRUE(std::filesystem::exists(folder / L"scc_proxy.dll"));

    EXPECT_EQ(Register(ORVIX_TALKING_MSSCCI, L"Talking").output,
              "replaced Talking: " + Library() + " instead of " + (folder / L"scc_proxy.dll").string() + "\n");
    EXPECT_FALSE(std::filesystem::exists(folder)) << "it is not isolated any more";
}

TEST_F(Registration, OfTheProxyOfAnIsolatedLibraryIsRefused)
{
    ASSERT_EQ(RunExactly({L"register", ORVIX_TALKING_MSSCCI, L"Talking", L"--isolated"}).code, Success);
    const std::filesystem::path proxy = IsolatedPath(L"TALKING") / L"scc_proxy.dll";
    for (const wchar_t* name : {L"Talking", L"Other"})
    {
        for (const auto& result : {Register(proxy, name), RunExactly({L"register", proxy, name, L"--isolated"})})
        {
            EXPECT_EQ(result.code, BadUsage);
            EXPECT_EQ(result.errors, "orvix: this is the proxy of an isolated library; give the path of the library "
                                     "itself: " +
                                         Library() + "\n");
        }
    }
    EXPECT_TRUE(std::filesystem::exists(proxy));
    EXPECT_EQ(Path(L"Talking"), proxy.wstring());
    EXPECT_EQ(Path(L"Other"), std::nullopt);
    EXPECT_EQ(Unregister(L"Talking").code, Success);
}

TEST_F(Registration, OfAnIsolatedLibraryThatAHostUsesIsTakenOutInTwoSteps)
{
    ASSERT_EQ(RunExactly({L"register", ORVIX_TALKING_MSSCCI, L"Talking", L"--isolated"}).code, Success);
    const std::filesystem::path folder = IsolatedPath(L"TALKING");
    {
        const std::ifstream used(folder / L"scc_proxy.dll");
        EXPECT_EQ(Unregister(L"Talking").code, Failed);
        EXPECT_EQ(Path(L"Talking"), std::nullopt);
        EXPECT_TRUE(std::filesystem::exists(folder));
    }
    EXPECT_EQ(Unregister(L"Talking").code, Success);
    EXPECT_FALSE(std::filesystem::exists(folder));
    EXPECT_EQ(Unregister(L"Talking").code, NotFound);
}

TEST_F(Registration, OfAnIsolatedLibraryThatFailsKeepsTheOneThatWasThere)
{
    ASSERT_EQ(RunExactly({L"register", ORVIX_TALKING_MSSCCI, L"Talking", L"--isolated", L"--patience", L"77"}).code,
              Success);
    const std::filesystem::path copy = Scratch() / L"copy.dll";
    std::filesystem::copy_file(ORVIX_TALKING_MSSCCI, copy);
    SetAccess(std::wstring(OwnKeys) + L"Talking", ReadAndDelete);
    EXPECT_EQ(RunExactly({L"register", copy, L"Talking", L"--isolated"}).code, Failed);
    ExpectTalkingIsIsolated();
    EXPECT_EQ(Unregister(L"Talking").code, Success);
}

TEST_F(Registration, OfAnIsolatedLibraryIsRefusedAsAnyOther)
{
    const auto result = RunExactly({L"register", BuiltFile(L"orvix.exe").wstring(), L"Talking", L"--isolated"});
    EXPECT_EQ(result.code, NotFound);
    EXPECT_FALSE(std::filesystem::exists(IsolatedPath(L"TALKING")));
}

TEST_F(Registration, OfAnIsolatedLibraryWorksInAHost)
{
    ASSERT_EQ(RunExactly({L"register", ORVIX_TALKING_MSSCCI, L"Talking", L"--isolated"}).code, Success);
    const auto direct =
        RunExactly({L"open", L"--sources", L"msscci", L"--provider", L"Talking", L"--project", Scratch().wstring()});
    EXPECT_EQ(direct.code, Success) << direct.errors;
    EXPECT_EQ(Unregister(L"Talking").code, Success);
}
