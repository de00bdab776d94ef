#include "GitTest.h"

#include "GitProgram.h"
#include "GitText.h"
#include "OrvixKnownFiles.h"
#include "OrvixProviderSource.h"
#include "Process.h"

#include <windows.h>

#include <algorithm>
#include <chrono>
#include <stdexcept>

namespace
{

/// The temporary folder as the Git of the tests has it.
std::wstring NativeTemporaryFolder()
{
    static const std::wstring folder = [] {
        const WorkFolder anchor;
        const PlainGit git(anchor.Text());
        git({L"init", L"--quiet"});
        const std::string top = git({L"rev-parse", L"--show-toplevel"});
        return GitText::FromUtf8(top.substr(0, top.rfind('/')));
    }();
    return folder;
}

} // namespace

bool RecordingClient::Shows(const std::wstring& text) const
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

WorkFolder::~WorkFolder()
{
    const std::filesystem::path folder = L"\\\\?\\" + Text();
    std::error_code error;
    for (std::filesystem::recursive_directory_iterator entry(folder, error), end; !error && entry != end;
         entry.increment(error))
    {
        if (!entry->is_directory(error))
        {
            SetFileAttributesW(entry->path().c_str(), FILE_ATTRIBUTE_NORMAL);
        }
    }
    std::filesystem::remove_all(folder, error);
}

std::wstring PlainGit::Program()
{
    const std::wstring bridge = GIT_BRIDGE; // under Wine, to the machine's own Git
    return bridge.empty() ? GitProgram::Find(L"") : bridge;
}

std::wstring PlainGit::ConsoleProgram()
{
    const std::wstring bridge = GIT_CONSOLE_BRIDGE;
    return bridge.empty() ? Program() : bridge;
}

ProcessCommand PlainGit::MakeProcess(const Texts& arguments, const std::string& input) const
{
    ProcessCommand command;
    command.program = Program();
    command.arguments = arguments;
    command.folder = m_folder;
    command.input = input;
    command.silence = std::chrono::minutes(2);
    return command;
}

std::string PlainGit::operator()(const Texts& arguments, const std::string& input) const
{
    const ProcessResult result = Process::Run(MakeProcess(arguments, input), nullptr);
    EXPECT_TRUE(result.Succeeded()) << result.errors << result.output;
    return result.output;
}

std::wstring PlainGit::File(std::wstring_view file) const
{
    std::wstring path = m_folder + L'\\' + std::wstring(file);
    std::replace(path.begin(), path.end(), L'/', L'\\');
    return path;
}

std::wstring PlainGit::Write(std::wstring_view file, std::string_view bytes) const
{
    const std::filesystem::path path = L"\\\\?\\" + File(file);
    std::filesystem::create_directories(path.parent_path());
    WriteBytes(path, bytes);
    return File(file);
}

std::string PlainGit::Read(std::wstring_view file) const
{
    return ReadBytes(L"\\\\?\\" + File(file));
}

bool PlainGit::Has(std::wstring_view file) const
{
    return GetFileAttributesW((L"\\\\?\\" + File(file)).c_str()) != INVALID_FILE_ATTRIBUTES;
}

void PlainGit::Configure(std::string_view settings) const
{
    Write(L".git/config", Read(L".git/config").append(settings));
}

std::wstring PlainGit::Commit(std::wstring_view file, std::string_view bytes, const wchar_t* comment) const
{
    std::wstring path = Write(file, bytes);
    (*this)({L"add", L"--", std::wstring(file)});
    (*this)({L"commit", L"--quiet", L"--only", L"-m", comment, L"--", std::wstring(file)});
    return path;
}

GitUser::GitUser(HWND__* parent)
{
    client.unattended = parent == nullptr;
    const std::wstring program = client.unattended ? PlainGit::Program() : PlainGit::ConsoleProgram();
    WriteBytes(m_config.Path() / L"OrvixProviders.xml",
               "<OrvixProviders><Provider><Name>Git</Name><AltProviderExecutable>" + GitText::ToUtf8(program) +
                   "</AltProviderExecutable></Provider></OrvixProviders>");
    m_info.SetConfigFilePath(m_config.Text().c_str());
    m_info.SetProviderPluginPath((std::filesystem::path(GIT_PLUGIN).parent_path().wstring() + L'\\').c_str());
    m_info.SetIOrvixClientAccess(&client);
    m_info.SetParentWindow(parent);
    EXPECT_TRUE(m_services->Initialize(&m_info, OrvixProviderSource::Plugins));
    for (std::uint32_t i = 0; i < m_services->GetProviderCount(); ++i)
    {
        if (std::wstring(m_services->GetProviderName(i)) == L"Git")
        {
            m_provider = m_services->GetProvider(i);
        }
    }
    if (m_provider == nullptr)
    {
        throw std::runtime_error("the plug-in is not listed");
    }
    EXPECT_EQ(m_provider->Initialize(&m_info), Success);
}

GitUser::~GitUser()
{
    m_provider->Uninitialize();
}

OrvixFileList& GitUser::List(const Texts& files)
{
    m_list.RemoveAll();
    for (const std::wstring& file : files)
    {
        m_list.AddActiveEntry(m_list.CreateEntry(file.c_str(), nullptr, 0, 0));
    }
    client.lines.clear();
    return m_list;
}

int GitUser::Add(const Texts& files)
{
    return m_provider->Add(&List(files), L"", 0);
}

int GitUser::CheckIn(const Texts& files, const wchar_t* comment, unsigned long options)
{
    return m_provider->CheckIn(&List(files), comment, options);
}

int GitUser::CheckOut(const Texts& files, unsigned long options)
{
    return m_provider->CheckOut(&List(files), L"", options);
}

int GitUser::Undo(const Texts& files, unsigned long options)
{
    return m_provider->UndoCheckOut(&List(files), options);
}

int GitUser::Get(const Texts& files)
{
    return m_provider->GetLatest(&List(files), 0);
}

int GitUser::History(const Texts& files)
{
    return m_provider->ShowHistory(&List(files));
}

int GitUser::Properties(const Texts& files)
{
    return m_provider->ShowProperties(&List(files));
}

int GitUser::Names(const std::wstring& folder, Texts& files) const
{
    auto* const function = reinterpret_cast<OrvixKnownFilesFunction*>(
        reinterpret_cast<void (*)()>(GetProcAddress(GetModuleHandleW(GIT_PLUGIN), "GetOrvixKnownFiles")));
    constexpr auto add = [](void* data, const wchar_t* path) { static_cast<Texts*>(data)->emplace_back(path); };
    return function != nullptr ? function(m_provider, folder.c_str(), add, &files) : NotOffered;
}

std::vector<unsigned long> GitUser::Query(const Texts& files)
{
    OrvixFileList& list = List(files);
    std::vector<unsigned long> flags;
    if (m_provider->QueryStatus(&list, 0) == Success)
    {
        for (unsigned int i = 0; i < list.NumActiveEntries(); ++i)
        {
            flags.push_back(list.GetActiveFileEntry(i)->GetFlagsOut());
        }
    }
    return flags;
}

unsigned long GitUser::Query(const std::wstring& file)
{
    const std::vector<unsigned long> flags = Query(Texts{file});
    return flags.empty() ? 0 : flags.front();
}

GitTest::GitTest()
{
    // Git looks for a repository in the folders above, too; there may be one around the temporary folder.
    SetEnvironmentVariableW(L"GIT_CEILING_DIRECTORIES", NativeTemporaryFolder().c_str());
    SetEnvironmentVariableW(L"GIT_CONFIG_GLOBAL", L"/dev/null");
    SetEnvironmentVariableW(L"GIT_CONFIG_NOSYSTEM", L"1");
    SetEnvironmentVariableW(L"GIT_CONFIG_COUNT", L"1");
    SetEnvironmentVariableW(L"GIT_CONFIG_KEY_0", L"protocol.file.allow");
    SetEnvironmentVariableW(L"GIT_CONFIG_VALUE_0", L"always");
}

PlainGit GitTest::MakeRepository(const std::wstring& name) const
{
    const PlainGit parent(m_folder.Text());
    parent({L"init", L"--quiet", L"--initial-branch=main", name});
    PlainGit repository(m_folder.Text() + L'\\' + name);
    repository.Configure("[user]\n\tname = Ada\n\temail = ada@example.org\n");
    return repository;
}

PlainGit GitTest::Clone(const std::wstring& from, const std::wstring& name) const
{
    const PlainGit parent(m_folder.Text());
    parent({L"clone", L"--quiet", from, name});
    PlainGit repository(m_folder.Text() + L'\\' + name);
    const std::string user = GitText::ToUtf8(name);
    repository.Configure("[user]\n\tname = " + user + "\n\temail = " + user + "@example.org\n");
    return repository;
}

std::wstring GitTest::Address(const std::wstring& name) const
{
    return NativeTemporaryFolder() + L'/' + std::filesystem::path(m_folder.Text()).filename().wstring() + L'/' + name;
}

void GitTest::AddHook(const PlainGit& repository, const wchar_t* name, const std::string& script) const
{
    // Git itself makes the file executable, on every system.
    const PlainGit hooks = MakeRepository(L"hooks");
    const std::wstring file = hooks.Write(name, "#!/bin/sh\n" + script);
    hooks({L"add", L"--chmod=+x", L"--", name});
    std::filesystem::remove(file);
    hooks({L"checkout-index", L"--", name});
    repository({L"config", L"core.hooksPath", Address(L"hooks")});
}
