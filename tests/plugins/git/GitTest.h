#pragma once

#include "Files.h"
#include "IOrvixClientAccess.h"
#include "IOrvixProvider.h"
#include "OrvixClientInfo.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixProviderOption.h"
#include "OrvixProviderResult.h"
#include "OrvixServicesPointer.h"
#include "Process.h"
#include "TempFolder.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

namespace Option = OrvixProviderOption;
namespace Permission = OrvixFilePermission;
namespace State = OrvixFileState;

using OrvixProviderResult::Failure;
using OrvixProviderResult::NotOffered;
using OrvixProviderResult::Success;
using Texts = std::vector<std::wstring>;

/// A host that records the lines of output.
class RecordingClient final : public IOrvixClientAccess
{
public:
    void OutputText(const wchar_t* text, int kind) override
    {
        EXPECT_EQ(kind, 0);
        lines.emplace_back(text);
    }
    std::intptr_t RelayA(void*, void*, void*, void*) override { return 0; }
    std::uint32_t GetColor(std::int32_t) override { return 0; }
    bool IsUnattended() override { return unattended; }
    std::intptr_t RelayB(void*, void*, void*, void*) override { return 0; }

    bool Shows(const std::wstring& text) const;

    Texts lines;
    bool unattended = true;
};

/// A folder that is deleted at the end with its files, read-only ones and long paths included.
class WorkFolder
{
public:
    WorkFolder() = default;
    WorkFolder(const WorkFolder&) = delete;
    WorkFolder& operator=(const WorkFolder&) = delete;
    ~WorkFolder();

    std::wstring Text() const { return m_folder.Text(); }

private:
    TempFolder m_folder;
};

/// The machine's Git by itself, without the provider, in one folder.
class PlainGit
{
public:
    explicit PlainGit(std::wstring folder) : m_folder(std::move(folder)) {}

    /// Runs Git, which must succeed; returns its output.
    std::string operator()(const Texts& arguments, const std::string& input = {}) const;

    /// The full path of the program.
    static std::wstring Program();

    /// The same for a Git that can be asked to end.
    static std::wstring ConsoleProgram();

    /// How a call is started.
    ProcessCommand MakeProcess(const Texts& arguments, const std::string& input = {}) const;

    /// The full path of a file in the folder.
    std::wstring File(std::wstring_view file) const;

    /// Writes a file in place, as an editor does, and makes its folders.
    std::wstring Write(std::wstring_view file, std::string_view bytes) const;
    std::string Read(std::wstring_view file) const;
    bool Has(std::wstring_view file) const;

    /// Adds settings to the repository's file of them, which is quicker than to run Git for each.
    void Configure(std::string_view settings) const;

    /// Makes a file and commits it with Git.
    std::wstring Commit(std::wstring_view file, std::string_view bytes, const wchar_t* comment = L"By hand") const;

    const std::wstring& Folder() const { return m_folder; }

private:
    std::wstring m_folder;
};

/// One user of a working folder, with the provider that a services object has found.
class GitUser
{
public:
    explicit GitUser(HWND__* parent = nullptr);
    GitUser(const GitUser&) = delete;
    GitUser& operator=(const GitUser&) = delete;
    ~GitUser();

    IOrvixProvider& Provider() const { return *m_provider; }
    int Open(const std::wstring& folder) const { return m_provider->OpenProject(folder.c_str(), L""); }

    int Add(const Texts& files);
    int CheckIn(const Texts& files, const wchar_t* comment, unsigned long options = 0);
    int CheckOut(const Texts& files, unsigned long options = 0);
    int Undo(const Texts& files, unsigned long options = 0);
    int Get(const Texts& files);
    int History(const Texts& files);
    int Properties(const Texts& files);

    /// The flags of files; empty when the query fails.
    std::vector<unsigned long> Query(const Texts& files);
    unsigned long Query(const std::wstring& file);

    /// Appends the files that the plug-in names in a folder.
    int Names(const std::wstring& folder, Texts& files) const;

    RecordingClient client;

private:
    OrvixFileList& List(const Texts& files);

    TempFolder m_config;
    OrvixClientInfo m_info;
    OrvixFileList m_list;
    OrvixServicesPointer m_services = MakeOrvixServices();
    IOrvixProvider* m_provider = nullptr;
};

/// A repository of Git with a user name and without the machine's own configuration.
class GitTest : public testing::Test
{
protected:
    GitTest();

    /// A new repository in a folder of its own; its name may have spaces.
    PlainGit MakeRepository(const std::wstring& name) const;

    /// A copy of a repository whose upstream it is.
    PlainGit Clone(const std::wstring& from, const std::wstring& name) const;

    /// A folder below the test's own, in the form that Git takes as an address.
    std::wstring Address(const std::wstring& name) const;

    /// Gives a repository a hook: a shell script.
    void AddHook(const PlainGit& repository, const wchar_t* name, const std::string& script) const;

    WorkFolder m_folder;
};
