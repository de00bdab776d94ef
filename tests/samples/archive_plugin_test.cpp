#include "ArchiveProject.h"
#include "BuiltFile.h"
#include "LoadedLibrary.h"

#include "BraeDiagnostics.h"
#include "IOrvixClientAccess.h"
#include "IOrvixProvider.h"
#include "OrvixClientInfo.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixKnownFiles.h"
#include "OrvixProviderOption.h"
#include "OrvixProviderResult.h"
#include "OrvixVersion.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

namespace
{

using OrvixProviderResult::Failure;
using OrvixProviderResult::NotOffered;
using OrvixProviderResult::Success;

namespace Option = OrvixProviderOption;
namespace Permission = OrvixFilePermission;
namespace State = OrvixFileState;

/// A copy of the plug-in, as one host process has it loaded.
struct Plugin
{
    explicit Plugin(const std::filesystem::path& file) : library(file) {}

    bool IsLoaded() const { return version != nullptr && get != nullptr && release != nullptr && name != nullptr; }

    LoadedLibrary library;
    std::int32_t (*version)() = library.Export<std::int32_t()>("GetOrvixVersion");
    IOrvixProvider* (*get)() = library.Export<IOrvixProvider*()>("GetIOrvixProvider");
    void (*release)(IOrvixProvider*) = library.Export<void(IOrvixProvider*)>("ReleaseIOrvixProvider");
    const wchar_t* (*name)() = library.Export<const wchar_t*()>("GetOrvixProviderName");
    OrvixKnownFilesFunction* knownFiles = library.Export<OrvixKnownFilesFunction>("GetOrvixKnownFiles");
};

/// A host that records the lines of output.
class Client final : public IOrvixClientAccess
{
public:
    void OutputText(const wchar_t* text, int kind) override
    {
        EXPECT_EQ(kind, 0);
        lines.emplace_back(text);
    }
    std::intptr_t RelayA(void*, void*, void*, void*) override { return 0; }
    std::uint32_t GetColor(std::int32_t) override { return 0; }
    bool IsUnattended() override { return true; }
    std::intptr_t RelayB(void*, void*, void*, void*) override { return 0; }

    bool Shows(const std::wstring& text) const
    {
        for (const std::wstring& line : lines)
        {
            if (line.find(text) != std::wstring::npos)
            {
                return true;
            }
        }
        return false;
    }

    std::vector<std::wstring> lines;
};

/// A list of files, all of them active.
class Files
{
public:
    Files(std::initializer_list<std::wstring> files)
    {
        for (const std::wstring& file : files)
        {
            m_list.CreateEntry(file.c_str(), nullptr, OrvixFileSelection::Selected, 0);
        }
        m_list.BuildActiveList(OrvixFileSelection::Selected, false);
    }

    OrvixFileList* Get() { return &m_list; }
    unsigned long Flags(unsigned int index) { return m_list.GetActiveFileEntry(index)->GetFlagsOut(); }

private:
    OrvixFileList m_list;
};

/// One host with a user, its own copy of the plug-in, and a project open.
class Host
{
public:
    Host(const std::filesystem::path& plugin, const wchar_t* user) : m_plugin(plugin)
    {
        m_info.SetUserName(user);
        m_info.SetIOrvixClientAccess(&client);
        provider = m_plugin.get();
    }
    Host(const Host&) = delete;
    Host& operator=(const Host&) = delete;
    ~Host() { m_plugin.release(provider); }

    int Start() { return provider->Initialize(&m_info); }

    int Open(const ArchiveProject& project)
    {
        const int started = Start();
        return started == Success ? provider->OpenProject(project.Text().c_str(), L"") : started;
    }

    unsigned long Status(const std::wstring& file)
    {
        Files files{file};
        EXPECT_EQ(provider->QueryStatus(files.Get(), 0), Success);
        return files.Flags(0);
    }

    /// The files that the provider names in a folder, sorted.
    int Names(const std::wstring& folder, std::vector<std::wstring>& files) const
    {
        files.clear();
        constexpr auto add = [](void* data, const wchar_t* path) {
            static_cast<std::vector<std::wstring>*>(data)->emplace_back(path);
        };
        const int result = m_plugin.knownFiles(provider, folder.c_str(), add, &files);
        std::sort(files.begin(), files.end());
        return result;
    }

    const Plugin& Library() const { return m_plugin; }

    Client client;
    IOrvixProvider* provider = nullptr;

private:
    Plugin m_plugin;
    OrvixClientInfo m_info;
};

/// Anna's and Ben's hosts on one project. A second copy of the plug-in stands in for the one in Ben's process.
class ArchivePlugin : public testing::Test
{
protected:
    void SetUp() override
    {
        std::filesystem::copy_file(BuiltFile(L"plugins/archive.dll"), m_copy.Path() / L"zweite Kopie.dll");
        m_anna = std::make_unique<Host>(BuiltFile(L"plugins/archive.dll").c_str(), L"anna");
        m_ben = std::make_unique<Host>(m_copy.Path() / L"zweite Kopie.dll", L"ben");
        ASSERT_EQ(m_anna->Open(m_project), Success);
        ASSERT_EQ(m_ben->Open(m_project), Success);
    }

    void TearDown() override
    {
        m_anna.reset();
        m_ben.reset();
    }

    std::wstring Added(std::wstring_view name, std::string_view bytes)
    {
        std::wstring file = m_project.Write(name, bytes);
        Files files{file};
        EXPECT_EQ(m_anna->provider->Add(files.Get(), L"added", 0), Success);
        return file;
    }

    std::wstring CheckedOut(std::wstring_view name, std::string_view bytes)
    {
        std::wstring file = Added(name, bytes);
        Files files{file};
        EXPECT_EQ(m_anna->provider->CheckOut(files.Get(), L"", 0), Success);
        return file;
    }

    TempFolder m_copy;
    ArchiveProject m_project;
    std::unique_ptr<Host> m_anna;
    std::unique_ptr<Host> m_ben;
};

} // namespace

// The contract

TEST(ArchivePluginContract, ExportsItsFunctionsAndNothingElse)
{
    const Plugin plugin(BuiltFile(L"plugins/archive.dll").c_str());
    ASSERT_TRUE(plugin.IsLoaded());

    EXPECT_EQ(plugin.library.ExportedNames(),
              (std::vector<std::string>{"GetIOrvixProvider", "GetOrvixKnownFiles", "GetOrvixProviderName",
                                        "GetOrvixVersion", "ReleaseIOrvixProvider"}));
    EXPECT_EQ(plugin.version(), ORVIX_PLUGIN_CONTRACT_VERSION);
    EXPECT_STREQ(plugin.name(), L"Archive");
}

TEST(ArchivePluginContract, ReturnsOneProviderUntilEveryRequestIsReleased)
{
    const Plugin plugin(BuiltFile(L"plugins/archive.dll").c_str());
    ASSERT_TRUE(plugin.IsLoaded());
    const long before = BraeDiagnostics::LiveBlocks();

    IOrvixProvider* provider = plugin.get();
    ASSERT_NE(provider, nullptr);
    EXPECT_EQ(plugin.get(), provider);
    EXPECT_STREQ(provider->GetName(), L"Archive");
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), before + 1);

    plugin.release(nullptr);
    plugin.release(provider);
    EXPECT_FALSE(provider->IsInitialized());
    plugin.release(provider);
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), before);
    EXPECT_EQ(BraeDiagnostics::ForeignFrees(), 0);
}

TEST(ArchivePluginContract, DeletesTheProviderWhenItIsUnloaded)
{
    const long before = BraeDiagnostics::LiveBlocks();
    Plugin plugin(BuiltFile(L"plugins/archive.dll").c_str());
    ASSERT_TRUE(plugin.IsLoaded());
    ASSERT_NE(plugin.get(), nullptr);

    plugin.library.Unload();

    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), before);
}

TEST(ArchivePluginContract, LeavesLittleMemoryWhenItIsUnloaded)
{
    EXPECT_LT(LeftByLoading(BuiltFile(L"plugins/archive.dll").c_str()), 10000u);
}

TEST(ArchivePluginContract, GivesNoProviderWhenTheHostsHeapIsExhausted)
{
    const Plugin plugin(BuiltFile(L"plugins/archive.dll").c_str());
    ASSERT_TRUE(plugin.IsLoaded());

    BraeDiagnostics::FailAllocation(1, false);
    EXPECT_EQ(plugin.get(), nullptr);
    BraeDiagnostics::FailAllocation(0, false);

    IOrvixProvider* provider = plugin.get();
    EXPECT_NE(provider, nullptr);
    plugin.release(provider);
}

TEST_F(ArchivePlugin, ReturnsTheDocumentedResultsOfReservedAndNotOfferedOperations)
{
    IOrvixProvider* provider = m_anna->provider;
    unsigned long first = 1;
    unsigned long second = 2;
    EXPECT_EQ(provider->ReservedA(), Success);
    EXPECT_EQ(provider->ReservedB(), Success);
    EXPECT_EQ(provider->ReservedC(), NotOffered);
    EXPECT_EQ(provider->ReservedD(nullptr, &first, &second), NotOffered);
    EXPECT_EQ(first, 0u);
    EXPECT_EQ(second, 0u);
    EXPECT_EQ(provider->ReservedE(), NotOffered);
    EXPECT_EQ(provider->ReservedF(), NotOffered);
    EXPECT_EQ(provider->ReservedG(), NotOffered);
    EXPECT_EQ(provider->ReservedH(), NotOffered);
    EXPECT_TRUE(provider->ReservedI());
    EXPECT_EQ(provider->ShowOptions(), NotOffered);
    EXPECT_EQ(provider->RunProviderClient(), NotOffered);
}

// The session

TEST_F(ArchivePlugin, GoesThroughItsStates)
{
    IOrvixProvider* provider = m_anna->provider;
    EXPECT_TRUE(provider->IsInitialized());
    EXPECT_TRUE(provider->IsProjectOpen());
    EXPECT_EQ(provider->CloseProject(), Success);
    EXPECT_FALSE(provider->IsProjectOpen());
    EXPECT_EQ(provider->CloseProject(), Failure);
    EXPECT_EQ(provider->OpenProject(m_project.Text().c_str(), nullptr), Success);
    EXPECT_EQ(provider->Uninitialize(), Success);
    EXPECT_FALSE(provider->IsInitialized());
    EXPECT_FALSE(provider->IsProjectOpen());
    EXPECT_EQ(provider->Uninitialize(), Failure);
    EXPECT_EQ(provider->OpenProject(m_project.Text().c_str(), nullptr), Failure);
    EXPECT_EQ(provider->Initialize(nullptr), Failure);
    EXPECT_FALSE(provider->IsInitialized());
}

TEST_F(ArchivePlugin, ShowsTheReasonWhyAProjectCannotBeOpened)
{
    EXPECT_EQ(m_anna->provider->OpenProject(nullptr, L""), Failure);
    EXPECT_EQ(m_anna->provider->OpenProject(m_project.File(L"nowhere").c_str(), L""), Failure);

    EXPECT_FALSE(m_anna->provider->IsProjectOpen());
    EXPECT_EQ(m_anna->client.lines.size(), 1u);
}

TEST_F(ArchivePlugin, StartsANewSessionWithASecondInitialize)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    Client second;
    OrvixClientInfo info;
    info.SetUserName(L"clara");
    info.SetIOrvixClientAccess(&second);

    ASSERT_EQ(m_anna->provider->Initialize(&info), Success);

    EXPECT_FALSE(m_anna->provider->IsProjectOpen());
    ASSERT_EQ(m_anna->provider->OpenProject(m_project.Text().c_str(), L""), Success);
    EXPECT_EQ(m_anna->Status(file) & (State::CheckedOut | State::CheckedOutByOther), State::CheckedOutByOther);
    EXPECT_EQ(m_anna->Start(), Success);
}

TEST_F(ArchivePlugin, UsesTheWindowsUserWhenTheClientNamesNone)
{
    wchar_t user[257] = L"";
    DWORD size = 257;
    ASSERT_TRUE(::GetUserNameW(user, &size));
    OrvixClientInfo info;
    info.SetIOrvixClientAccess(&m_anna->client);
    ASSERT_EQ(m_anna->provider->Initialize(&info), Success);
    ASSERT_EQ(m_anna->provider->OpenProject(m_project.Text().c_str(), L""), Success);
    Files files{Added(L"a.txt", "one")};

    EXPECT_EQ(m_anna->provider->ShowHistory(files.Get()), Success);

    EXPECT_TRUE(m_anna->client.Shows(user));
}

TEST_F(ArchivePlugin, WorksForAClientWithoutAnInterface)
{
    OrvixClientInfo info;
    info.SetUserName(L"anna");
    ASSERT_EQ(m_anna->provider->Initialize(&info), Success);
    ASSERT_EQ(m_anna->provider->OpenProject(m_project.Text().c_str(), L""), Success);
    Files files{Added(L"a.txt", "one"), m_project.File(L"missing.txt")};

    EXPECT_EQ(m_anna->provider->ShowHistory(files.Get()), Failure);
}

// File operations

TEST_F(ArchivePlugin, FailsWithoutActiveEntriesInEveryFileOperation)
{
    IOrvixProvider* provider = m_anna->provider;
    Files none{};
    for (OrvixFileList* list : {none.Get(), static_cast<OrvixFileList*>(nullptr)})
    {
        EXPECT_EQ(provider->Add(list, L"", 0), Failure);
        EXPECT_EQ(provider->CheckOut(list, L"", 0), Failure);
        EXPECT_EQ(provider->CheckIn(list, L"", 0), Failure);
        EXPECT_EQ(provider->UndoCheckOut(list, 0), Failure);
        EXPECT_EQ(provider->GetLatest(list, 0), Failure);
        EXPECT_EQ(provider->ShowHistory(list), Failure);
        EXPECT_EQ(provider->ShowProperties(list), Failure);
        EXPECT_EQ(provider->QueryStatus(list, 0), Failure);
    }
}

TEST_F(ArchivePlugin, FailsWithAMessageWithoutAnOpenProject)
{
    Files files{m_project.Write(L"a.txt", "one")};
    IOrvixProvider* provider = m_anna->provider;
    ASSERT_EQ(provider->CloseProject(), Success);

    EXPECT_EQ(provider->Add(files.Get(), L"", 0), Failure);
    EXPECT_EQ(provider->CheckOut(files.Get(), L"", Option::GetLatest), Failure);
    EXPECT_EQ(provider->CheckIn(files.Get(), L"", 0), Failure);
    EXPECT_EQ(provider->UndoCheckOut(files.Get(), 0), Failure);
    EXPECT_EQ(provider->GetLatest(files.Get(), 0), Failure);
    EXPECT_EQ(provider->ShowHistory(files.Get()), Failure);
    EXPECT_EQ(provider->ShowProperties(files.Get()), Failure);
    EXPECT_EQ(m_anna->client.lines, std::vector<std::wstring>(7, L"No project is open"));
}

TEST_F(ArchivePlugin, WorksOnTheActiveEntriesOnly)
{
    const std::wstring active = m_project.Write(L"active.txt", "x");
    const std::wstring passive = m_project.Write(L"passive.txt", "x");
    OrvixFileList list;
    list.CreateEntry(active.c_str(), nullptr, OrvixFileSelection::Selected, 0);
    list.CreateEntry(passive.c_str(), nullptr, 0, 0);
    ASSERT_EQ(list.BuildActiveList(OrvixFileSelection::Selected, false), 1u);

    EXPECT_EQ(m_anna->provider->Add(&list, nullptr, 0), Success);

    EXPECT_NE(m_anna->Status(active) & State::Controlled, 0u);
    EXPECT_EQ(m_anna->Status(passive) & State::Controlled, 0u);
}

TEST_F(ArchivePlugin, ShowsTheReasonForEachFileThatFailsAndDoesTheOthers)
{
    const std::wstring good = m_project.Write(L"good.txt", "x");
    Files files{m_project.File(L"missing.txt"), good, m_project.File(L"..\\x.txt")};

    EXPECT_EQ(m_anna->provider->Add(files.Get(), L"", 0), Failure);

    ASSERT_EQ(m_anna->client.lines.size(), 2u);
    EXPECT_EQ(m_anna->client.lines[0].find(m_project.File(L"missing.txt") + L": "), 0u);
    EXPECT_EQ(m_anna->client.lines[1].find(m_project.File(L"..\\x.txt") + L": "), 0u);
    EXPECT_TRUE(IsReadOnly(good));
}

TEST_F(ArchivePlugin, KeepsFilesCheckedOutAfterAddAndCheckInWhenAsked)
{
    const std::wstring file = m_project.Write(L"a.txt", "one");
    Files files{file};

    ASSERT_EQ(m_anna->provider->Add(files.Get(), L"", Option::KeepCheckedOut), Success);
    EXPECT_FALSE(IsReadOnly(file));
    ASSERT_EQ(m_anna->provider->CheckIn(files.Get(), L"", Option::KeepCheckedOut | Option::NoDialog), Success);
    EXPECT_FALSE(IsReadOnly(file));
    EXPECT_NE(m_anna->Status(file) & State::CheckedOut, 0u);
    ASSERT_EQ(m_anna->provider->CheckIn(files.Get(), L"", Option::NoDialog), Success);
    EXPECT_TRUE(IsReadOnly(file));
    EXPECT_EQ(m_anna->Status(file) & State::CheckedOut, 0u);
}

TEST_F(ArchivePlugin, LetsOnlyOneHostCheckAFileOut)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    Files files{file};

    EXPECT_EQ(m_ben->provider->CheckOut(files.Get(), L"", 0), Failure);
    EXPECT_TRUE(m_ben->client.Shows(L"anna"));
    EXPECT_EQ(m_ben->provider->CheckIn(files.Get(), L"", 0), Failure);
    EXPECT_EQ(m_ben->provider->UndoCheckOut(files.Get(), 0), Failure);

    m_project.Write(L"a.txt", "two");
    EXPECT_EQ(m_anna->provider->CheckIn(files.Get(), L"", 0), Success);
    EXPECT_EQ(m_ben->provider->CheckOut(files.Get(), L"", 0), Success);
    EXPECT_EQ(m_project.Read(L"a.txt"), "two");
}

TEST_F(ArchivePlugin, GetsTheLatestVersionBeforeACheckOutWhenAsked)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    Files files{file};
    m_project.Write(L"a.txt", "two");
    ASSERT_EQ(m_anna->provider->CheckIn(files.Get(), L"", 0), Success);
    m_project.Overwrite(file, "one");

    EXPECT_EQ(m_ben->provider->CheckOut(files.Get(), L"", 0), Failure);
    EXPECT_EQ(m_ben->provider->CheckOut(files.Get(), L"", Option::GetLatest), Success);

    EXPECT_EQ(m_project.Read(L"a.txt"), "two");
}

TEST_F(ArchivePlugin, UndoesACheckOutAndGetsTheLatestVersionAfterwardsWhenAsked)
{
    const std::wstring held = CheckedOut(L"held.txt", "one");
    const std::wstring missing = Added(L"missing.txt", "one");
    m_project.Write(L"held.txt", "no good");
    SetReadOnly(missing, false);
    std::filesystem::remove(missing);
    Files files{held, missing};

    EXPECT_EQ(m_anna->provider->UndoCheckOut(files.Get(), Option::GetLatest), Failure)
        << "one file was not checked out";

    EXPECT_EQ(m_project.Read(L"held.txt"), "one");
    EXPECT_TRUE(IsReadOnly(held));
    EXPECT_EQ(m_project.Read(L"missing.txt"), "one");

    Files one{CheckedOut(L"other.txt", "one")};
    EXPECT_EQ(m_anna->provider->UndoCheckOut(one.Get(), Option::GetLatest), Success);
}

TEST_F(ArchivePlugin, GetsTheLatestVersion)
{
    const std::wstring file = Added(L"Ünïcode 日本.txt", "one");
    SetReadOnly(file, false);
    std::filesystem::remove(file);
    Files files{file};

    EXPECT_EQ(m_ben->provider->GetLatest(files.Get(), 0), Success);

    EXPECT_EQ(m_project.Read(L"Ünïcode 日本.txt"), "one");
    EXPECT_TRUE(IsReadOnly(file));
}

// Status

TEST_F(ArchivePlugin, SetsTheFlagsOfEveryState)
{
    const std::wstring unknown = m_project.Write(L"unknown.txt", "x");
    const std::wstring controlled = Added(L"controlled.txt", "one");
    const std::wstring held = CheckedOut(L"held.txt", "one");
    const std::wstring edited = CheckedOut(L"edited.txt", "one");
    m_project.Write(L"edited.txt", "edited");
    const std::wstring changed = Added(L"changed.txt", "one");
    m_project.Overwrite(changed, "changed");
    const std::wstring missing = Added(L"missing.txt", "one");
    SetReadOnly(missing, false);
    std::filesystem::remove(missing);

    const auto flags = [&](Host& host) {
        Files files{unknown, controlled, held, edited, changed, missing};
        EXPECT_EQ(host.provider->QueryStatus(files.Get(), 0), Success);
        std::vector<unsigned long> result;
        for (unsigned int i = 0; i < 6; ++i)
        {
            result.push_back(files.Flags(i));
        }
        return result;
    };
    constexpr unsigned long Known = State::Controlled | Permission::GetLatest | Permission::ShowHistory;
    constexpr unsigned long Mine = Known | State::CheckedOut | Permission::CheckIn | Permission::UndoCheckOut;
    EXPECT_EQ(flags(*m_anna), (std::vector<unsigned long>{
                                  State::NotControlled | Permission::Add,
                                  Known | Permission::CheckOut,
                                  Mine | Permission::Compare,
                                  Mine | State::Modified | Permission::Compare,
                                  Known | State::Modified | Permission::CheckOut | Permission::Compare,
                                  Known | State::OutOfDate,
                              }));
    EXPECT_EQ(flags(*m_ben), (std::vector<unsigned long>{
                                 State::NotControlled | Permission::Add,
                                 Known | Permission::CheckOut,
                                 Known | State::CheckedOutByOther,
                                 Known | State::CheckedOutByOther | State::Modified | Permission::Compare,
                                 Known | State::Modified | Permission::CheckOut | Permission::Compare,
                                 Known | State::OutOfDate,
                             }));
}

TEST_F(ArchivePlugin, DoesNotOfferToAddItsOwnFilesAndRefusesThem)
{
    Files files{m_project.File(L".archive"), m_project.File(L".archive\\archive.txt"),
                m_project.Write(L"sub\\.archive.tmp", "left over"), m_project.Write(L"new.txt", "x")};

    ASSERT_EQ(m_anna->provider->QueryStatus(files.Get(), 0), Success);
    EXPECT_EQ(files.Flags(0), State::NotControlled);
    EXPECT_EQ(files.Flags(1), State::NotControlled);
    EXPECT_EQ(files.Flags(2), State::NotControlled);
    EXPECT_EQ(files.Flags(3), State::NotControlled | Permission::Add);

    EXPECT_EQ(m_anna->provider->Add(files.Get(), L"", 0), Failure);
    EXPECT_EQ(m_anna->client.lines.size(), 3u);
    EXPECT_TRUE(m_anna->client.Shows(m_project.File(L".archive") + L": The file belongs to the archive itself"));
    EXPECT_TRUE(m_anna->client.Shows(L"\\sub\\.archive.tmp: The file belongs to the archive itself"));
}

TEST_F(ArchivePlugin, DoesNotOfferToAddTheLinkToAnArchive)
{
    const ArchiveProject other;
    const std::wstring link =
        other.Write(L".archive", "orvix-archive-link 1\n" + m_project.Path(L".archive").string() + "\n");
    ASSERT_EQ(m_ben->provider->OpenProject(other.Text().c_str(), L""), Success);

    EXPECT_EQ(m_ben->Status(link), State::NotControlled);
}

TEST_F(ArchivePlugin, SetsEveryEntryToNotControlledWithoutAnOpenProject)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    ASSERT_EQ(m_anna->provider->CloseProject(), Success);

    EXPECT_EQ(m_anna->Status(file), State::NotControlled);
    m_anna->provider->Uninitialize();
    EXPECT_EQ(m_anna->Status(file), State::NotControlled);
    EXPECT_EQ(m_anna->Start(), Success);
}

TEST_F(ArchivePlugin, ChangesNoEntryWhenTheStatusOfOneFails)
{
    const std::wstring damaged = Added(L"a.txt", "one");
    for (const auto& entry : std::filesystem::recursive_directory_iterator(m_project.Path(L".archive\\files")))
    {
        if (entry.is_regular_file())
        {
            m_project.Overwrite(entry.path(), "damaged");
        }
    }
    constexpr unsigned long Before = State::Deleted;
    Files files{m_project.Write(L"good.txt", "x"), damaged};
    for (unsigned int i = 0; i < 2; ++i)
    {
        files.Get()->GetActiveFileEntry(i)->SetFlagsOut(Before);
    }

    EXPECT_EQ(m_anna->provider->QueryStatus(files.Get(), 0), Failure);

    EXPECT_EQ(files.Flags(0), Before);
    EXPECT_EQ(files.Flags(1), Before);
    EXPECT_TRUE(m_anna->client.Shows(damaged));
}

// Texts

TEST_F(ArchivePlugin, ShowsTheHistoryLineByLineNewestFirst)
{
    const std::wstring file = CheckedOut(L"sub\\a.txt", "one");
    Files files{file};
    ASSERT_EQ(m_anna->provider->CheckIn(files.Get(), L"first line\r\nsecond line", 0), Success);

    EXPECT_EQ(m_ben->provider->ShowHistory(files.Get()), Success);

    const std::vector<std::wstring>& lines = m_ben->client.lines;
    ASSERT_EQ(lines.size(), 4u);
    EXPECT_EQ(lines[0], L"sub/a.txt");
    EXPECT_EQ(lines[1].substr(0, 5), L"  2  ");
    EXPECT_EQ(lines[1].substr(25), L"  anna  first line");
    EXPECT_EQ(lines[2], L"     second line");
    EXPECT_EQ(lines[3].substr(0, 5), L"  1  ");
    EXPECT_EQ(lines[3].substr(25), L"  anna  added");
}

TEST_F(ArchivePlugin, ShowsThePropertiesOfTheFirstActiveFileOnly)
{
    Files files{CheckedOut(L"first.txt", "one"), Added(L"second.txt", "one"), m_project.File(L"missing.txt")};

    EXPECT_EQ(m_ben->provider->ShowProperties(files.Get()), Success);

    EXPECT_TRUE(m_ben->client.Shows(L"first.txt"));
    EXPECT_TRUE(m_ben->client.Shows(L"anna"));
    EXPECT_FALSE(m_ben->client.Shows(L"second.txt"));
    EXPECT_FALSE(m_ben->client.Shows(L"missing.txt"));
}

// The optional export

TEST_F(ArchivePlugin, NamesTheFilesThatItKnowsOnTheDiskOrNot)
{
    const std::wstring a = Added(L"a.txt", "x");
    const std::wstring gone = Added(L"sub\\gone.txt", "x");
    m_project.Write(L"new.txt", "x");
    SetFileAttributesW(gone.c_str(), FILE_ATTRIBUTE_NORMAL);
    std::filesystem::remove_all(m_project.Path(L"sub"));
    std::vector<std::wstring> files;

    EXPECT_EQ(m_anna->Names(m_project.Text(), files), Success);
    EXPECT_EQ(files, (std::vector<std::wstring>{a, gone}));
    EXPECT_EQ(m_anna->Names(m_project.Text() + L"\\sub\\", files), Success);
    EXPECT_EQ(files, (std::vector<std::wstring>{gone}));
    EXPECT_EQ(m_anna->Names(m_project.Text() + L"\\su", files), Success);
    EXPECT_EQ(files, std::vector<std::wstring>());
}

TEST_F(ArchivePlugin, NamesNoFilesOutsideOfTheProjectOrWithoutOne)
{
    Added(L"a.txt", "x");
    std::vector<std::wstring> files;
    constexpr auto ignore = [](void*, const wchar_t*) {};

    EXPECT_EQ(m_anna->Names(L"C:\\elsewhere", files), Failure);
    EXPECT_TRUE(m_anna->client.Shows(L"C:\\elsewhere"));
    EXPECT_EQ(m_anna->Library().knownFiles(m_anna->provider, nullptr, ignore, nullptr), Failure);
    EXPECT_EQ(m_anna->Library().knownFiles(m_anna->provider, m_project.Text().c_str(), nullptr, nullptr), Failure);
    EXPECT_EQ(m_anna->Library().knownFiles(m_ben->provider, m_project.Text().c_str(), ignore, nullptr), Failure);
    ASSERT_EQ(m_anna->provider->CloseProject(), Success);
    EXPECT_EQ(m_anna->Names(m_project.Text(), files), Failure);
    EXPECT_EQ(files, std::vector<std::wstring>());
}
