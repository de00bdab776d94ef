#include "Doctor.h"

#include "ActivationContext.h"
#include "DllDirectoryScope.h"
#include "FilePath.h"
#include "HostSession.h"
#include "LibraryImage.h"
#include "LibraryModule.h"
#include "OrvixClientInfo.h"
#include "OrvixPromptTable.h"
#include "OrvixProviderConfig.h"
#include "OrvixProviderSource.h"
#include "OrvixVersion.h"
#include "PluginCandidate.h"
#include "PluginSearch.h"
#include "PromptFile.h"
#include "SccFunctions.h"
#include "Text.h"
#include "XmlFault.h"

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <iostream>
#include <memory>
#include <system_error>

namespace
{

using InstalledProviders::Step;
using Kind = FileDiagnostics::Kind;
using Content = OrvixFileIO::Content;

constexpr const char* InstalledKind = "MSSCCI library";

constexpr std::size_t EndingBytes = InstalledProviders::MaxText * sizeof(wchar_t);

std::wstring Quoted(std::wstring_view text)
{
    return L'"' + std::wstring(text) + L'"';
}

std::wstring MachineName(std::uint16_t machine)
{
    switch (machine)
    {
    case IMAGE_FILE_MACHINE_I386:
        return L"a 32-bit file (x86)";
    case IMAGE_FILE_MACHINE_ARMNT:
        return L"a 32-bit file (ARM)";
    case IMAGE_FILE_MACHINE_ARM64:
        return L"a file for ARM64";
    default:
        return L"a file for machine " + std::to_wstring(machine);
    }
}

/// What a file's headers say against loading it; read before it is loaded.
void CheckHeaders(DoctorReport::Place& place, const std::wstring& path)
{
    const std::optional<LibraryImage> image = LibraryImage::Read(path);
    if (IsFolder(path))
    {
        place.AddNote("not-a-library", L"it is a folder");
    }
    else if (!image)
    {
        place.AddNote("not-a-library", L"it is no library of Windows, or cannot be read");
    }
    else if (!image->IsFor64Bit())
    {
        place.AddNote("other-machine",
                      L"it is " + MachineName(image->machine) + L", which a 64-bit (x64) process cannot load");
    }
}

void ExplainLoadError(DoctorReport::Place& place, const std::wstring& path, const UniqueActivationContext& context,
                      DWORD error)
{
    place.AddProblem("does-not-load", L"it does not load: " + SystemMessage(error, path));
    for (const LibraryImage::Missing& missing : LibraryImage::FindMissing(path, context))
    {
        place.AddNote("missing-dependency", missing.neededBy + L" needs " + missing.name + L", which does not load: " +
                                                SystemMessage(missing.error, missing.name));
    }
}

/// The file of this path or bare name in some folders, or where the system looks by itself for null; empty when there
/// is none.
std::wstring FindIn(const wchar_t* folders, const std::wstring& path)
{
    std::wstring found(32768, L'\0');
    found.resize(SearchPathW(folders, path.c_str(), L".dll", static_cast<DWORD>(found.size()), found.data(), nullptr));
    return found;
}

/// Where the system finds a library of this path or bare name; empty when it does not. It looks beside the program and
/// in `searchFolder`, if there is one, before it looks anywhere else.
std::wstring FindLibrary(const std::wstring& path, const std::wstring& searchFolder)
{
    const std::wstring beside = std::filesystem::path(ModulePath(nullptr)).parent_path().wstring();
    const std::wstring found = searchFolder.empty() ? L"" : FindIn((beside + L';' + searchFolder).c_str(), path);
    return found.empty() ? FindIn(nullptr, path) : found;
}

std::wstring EndsProcess(const std::wstring& what)
{
    return what + L" has exactly " + std::to_wstring(EndingBytes) +
           L" bytes, which ends every process whose host asks for MSSCCI libraries";
}

std::wstring TooLong(const std::wstring& what, DWORD size)
{
    return what + L" has " + std::to_wstring(size) + L" bytes; the library reads at most " +
           std::to_wstring(EndingBytes - 1);
}

/// Why a text of a provider's own key could not be read.
void ExplainText(DoctorReport::Place& place, HKEY key, const wchar_t* valueName, const char* missingCode)
{
    DWORD size = 0;
    if (RegQueryValueExW(key, valueName, nullptr, nullptr, nullptr, &size) == ERROR_SUCCESS)
    {
        place.AddProblem("text-too-long", TooLong(valueName, size));
    }
    else
    {
        place.AddProblem(missingCode, std::wstring(L"its key has no value ") + valueName);
    }
}

/// The system's error when a file is opened for reading.
DWORD OpenError(const std::wstring& path)
{
    const std::unique_ptr<FILE, decltype(&std::fclose)> file(_wfopen(path.c_str(), L"rb"), &std::fclose);
    return file ? ERROR_SUCCESS : GetLastError();
}

void ExplainContent(DoctorReport::Place& place, const FileDiagnostics& log, const wchar_t* root)
{
    if (log.content == Content::Missing && !PathExists(place.location))
    {
        place.AddNote("no-file", L"there is no such file, which counts as an empty one");
    }
    else if (const DWORD error = OpenError(place.location); error != ERROR_SUCCESS)
    {
        place.AddProblem("unreadable-file",
                         L"the file cannot be opened and counts as empty: " + SystemMessage(error, place.location));
    }
    else if (log.content == Content::Missing)
    {
        place.AddProblem("no-xml-service",
                         L"the system's XML service does not start, so the file is not read and counts as empty");
    }
    else if (log.content == Content::UsesEntities)
    {
        place.AddProblem("entities", L"the file uses entities of its own and therefore counts as empty");
    }
    else if (log.content == Content::Malformed)
    {
        // Its texts are longer than the file only where entities stand for others, and those can stand for gigabytes.
        std::error_code unknownSize;
        const std::optional<XmlFault> fault =
            XmlFault::Find(place.location, std::filesystem::file_size(place.location, unknownSize));
        place.AddProblem("malformed", L"the file is not well-formed and counts as empty: " +
                                          (fault ? L"line " + std::to_wstring(fault->line) + L", column " +
                                                       std::to_wstring(fault->column) + L": " + fault->reason
                                                 : L"where and why cannot be said"));
    }
    else if (!log.hasRoot && _wcsicmp(log.root.c_str(), root) == 0)
    {
        place.AddProblem("root-not-second", L"the root element " + log.root +
                                                L" is not the second node of the document, behind the XML declaration, "
                                                L"so nothing of it is read");
    }
    else if (!log.hasRoot)
    {
        place.AddProblem("no-root", L"the root element is " + Quoted(log.root) + L", not " + Quoted(root) +
                                        L", so nothing of it is read");
    }
}

/// What the reader of a file passed over. `item` is what the elements below the root are called.
void ExplainRemarks(DoctorReport::Place& place, const FileDiagnostics& log, const wchar_t* item)
{
    std::map<unsigned int, std::wstring> names;
    for (const FileDiagnostics::Provider& provider : log.providers)
    {
        names[provider.item] = L" (" + Quoted(provider.name) + L")";
    }
    for (const FileDiagnostics::Diagnostic& diagnostic : log.diagnostics)
    {
        std::wstring where = item + std::wstring(L" ") + std::to_wstring(diagnostic.item) + names[diagnostic.item];
        where += diagnostic.filter != 0 ? L", filter " + std::to_wstring(diagnostic.filter) : L"";
        switch (diagnostic.kind)
        {
        case Kind::NoName:
            place.AddProblem("no-name", where + L" is ignored: it has no Name");
            break;
        case Kind::NameNotFirst:
            place.AddProblem("name-not-first", where + L" is ignored: Name is not its first element");
            break;
        case Kind::UnknownElement:
            place.AddProblem("unknown-element",
                             where + L": " + diagnostic.element + L" is ignored: no such element is known");
            break;
        case Kind::NoText:
            place.AddProblem("no-text", where + L": " + diagnostic.element + L" is ignored: it holds no text");
            break;
        case Kind::UnknownValue:
            place.AddProblem("unknown-value", where + L": " + diagnostic.element + L" is " + Quoted(diagnostic.text) +
                                                  L", which counts as " + Quoted(diagnostic.countsAs));
            break;
        case Kind::MissingElement:
            place.AddProblem("incomplete-prompt", where + L" is ignored: it has no " + diagnostic.element);
            break;
        case Kind::TextCut:
            place.AddProblem("text-cut", where + L": " + diagnostic.element + L" is too long and is cut");
            break;
        }
    }
}

} // namespace

Doctor::Doctor(const CommandLine& commandLine, Output& output) : m_commandLine(commandLine), m_output(output)
{
}

DoctorReport Doctor::Examine()
{
    RememberLibraryModule(GetModuleHandleW(L"OrvixCore.dll")); // whose manifest the plug-ins are to get
    SetThreadErrorMode(SEM_FAILCRITICALERRORS | SEM_NOOPENFILEERRORBOX, nullptr);
    const std::wstring folder = HostSession::ConfigFolder(m_commandLine) + L'\\';
    ReadSettings(folder);
    ReadPrompts(folder);
    if ((m_commandLine.sources & OrvixProviderSource::Plugins) != 0)
    {
        ExaminePlugins();
    }
    if ((m_commandLine.sources & OrvixProviderSource::InstalledMSSCCI) != 0)
    {
        ExamineInstalled();
        Examine32BitView();
    }
    if (m_commandLine.sources == (OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI))
    {
        FindUnusedSettings();
    }
    m_output.Progress({});
    return std::move(m_report);
}

void Doctor::ReadSettings(const std::wstring& folder)
{
    DoctorReport::Place& place =
        m_report.places.emplace_back("settings file", folder + OrvixProviderConfigManager::FileName);
    m_configs.LoadConfig(place.location.c_str(), &m_settings);
    ExplainContent(place, m_settings, OrvixProviderConfigManager::RootName);
    ExplainRemarks(place, m_settings, L"provider element");
}

void Doctor::ReadPrompts(const std::wstring& folder)
{
    DoctorReport::Place& place = m_report.places.emplace_back("prompt file", folder + PromptFileName);
    OrvixPromptTable table;
    FileDiagnostics log;
    ReadPromptFile(table, place.location.c_str(), &log);
    ExplainContent(place, log, PromptFileRoot);
    if (log.hasRoot && log.root != PromptFileRoot)
    {
        place.AddNote("other-root", L"the root element is " + Quoted(log.root) + L", not " + Quoted(PromptFileRoot) +
                                        L"; it is read all the same");
    }
    ExplainRemarks(place, log, L"prompt");
}

void Doctor::ExaminePlugins()
{
    const std::wstring folder = HostSession::PluginFolder(m_commandLine);
    OrvixClientInfo client;
    client.SetProviderPluginPath((folder + L'\\').c_str());
    PluginSearch search(client);
    DoctorReport::Place& place = m_report.places.emplace_back("plug-in folder", folder);
    if (search.GetState() == PluginSearch::State::FolderTooLong)
    {
        place.AddProblem("path-too-long", L"the path is too long to be searched: with what is searched for it has more "
                                          L"than " +
                                              std::to_wstring(PluginSearch::MaxPath) + L" characters");
    }
    else if (!IsFolder(folder))
    {
        place.AddProblem("no-folder", L"there is no such folder");
    }
    const UniqueActivationContext context = MakeManifestContext(LibraryModule());
    for (; search.GetState() == PluginSearch::State::Found; search.Next())
    {
        ExaminePlugin(search.Path(), context);
    }
}

void Doctor::ExaminePlugin(const std::wstring& path, const UniqueActivationContext& context)
{
    using Verdict = PluginCandidate::Verdict;

    DoctorReport::Candidate& candidate = m_report.candidates.emplace_back();
    candidate.kind = "plug-in";
    candidate.location = path;
    if (path.size() <= PluginSearch::MaxPath)
    {
        Announce(path);
        CheckHeaders(candidate, path);
    }
    const PluginCandidate judged = PluginCandidate::Judge(path, context, m_configs);
    candidate.listed = judged.verdict == Verdict::Listed;
    candidate.contractVersion = judged.version;
    if (judged.entry && (candidate.listed || !judged.entry->name.empty()))
    {
        candidate.name = judged.entry->name;
    }
    switch (judged.verdict)
    {
    case Verdict::PathTooLong:
        candidate.AddProblem("path-too-long", L"its path has " + std::to_wstring(path.size()) +
                                                  L" characters, and the library takes at most " +
                                                  std::to_wstring(PluginSearch::MaxPath));
        break;
    case Verdict::DoesNotLoad:
        ExplainLoadError(candidate, path, context, judged.loadError);
        break;
    case Verdict::OtherVersion:
        candidate.AddProblem("contract-version", L"it is made for version " + std::to_wstring(*judged.version) +
                                                     L" of the contract, the library for " +
                                                     std::to_wstring(ORVIX_PLUGIN_CONTRACT_VERSION));
        break;
    case Verdict::Throws:
        candidate.AddProblem("throws", L"it throws an exception when it is asked for its version or its name");
        break;
    case Verdict::Incomplete:
    case Verdict::SwitchedOff:
    case Verdict::Listed:
        break;
    }
    for (const char* function : judged.FindMissingExports())
    {
        candidate.AddProblem("missing-export", L"it does not export " + Wide(function));
    }
    if (candidate.listed && judged.entry->name.empty())
    {
        candidate.AddProblem("empty-name", L"its name is empty or null");
    }
    ExplainConfiguration(candidate, judged.entry ? judged.entry->config : nullptr,
                         judged.verdict == Verdict::SwitchedOff);
}

void Doctor::ExamineInstalled()
{
    DoctorReport::Place& place = m_report.places.emplace_back("registry list", std::wstring(L"HKEY_LOCAL_MACHINE\\") +
                                                                                   InstalledProviders::ListPath);
    const UniqueRegistryKey list = InstalledProviders::OpenList();
    if (!list && GetLastError() == ERROR_FILE_NOT_FOUND)
    {
        place.AddNote("no-list", L"there is no such key: no MSSCCI library is registered for 64-bit processes");
    }
    else if (!list)
    {
        place.AddProblem("unreadable-key",
                         L"the key cannot be opened: " + SystemMessage(GetLastError(), place.location));
    }
    for (DWORD index = 0; list; ++index)
    {
        std::wstring keyPath;
        const Step step = InstalledProviders::KeyPathAt(list.Get(), index, keyPath);
        if (step == Step::End)
        {
            return;
        }
        ExamineRegistration(list.Get(), index, step, keyPath);
    }
}

void Doctor::ExamineRegistration(HKEY list, DWORD index, Step step, const std::wstring& keyPath)
{
    std::wstring name(16384, L'\0'); // the longest name of a value that there is, with its terminator
    DWORD nameSize = static_cast<DWORD>(name.size());
    DWORD size = 0;
    const LSTATUS status = RegEnumValueW(list, index, name.data(), &nameSize, nullptr, nullptr, nullptr, &size);
    name.resize(status == ERROR_SUCCESS ? nameSize : 0);

    DoctorReport::Candidate& candidate = m_report.candidates.emplace_back();
    candidate.kind = InstalledKind;
    candidate.location = name;
    switch (step)
    {
    case Step::Found:
        m_keyPaths.insert(PathKey(keyPath));
        ExamineKey(candidate, keyPath);
        break;
    case Step::NoString:
        candidate.AddProblem("not-a-string", L"the value is not of the type REG_SZ");
        break;
    case Step::EndsProcess:
        candidate.AddProblem("ends-host", EndsProcess(L"the text of the value"));
        break;
    default:
        if (name.size() >= InstalledProviders::MaxValueName)
        {
            candidate.AddProblem("name-too-long", L"the name of the value has " + std::to_wstring(name.size()) +
                                                      L" characters; the library reads at most " +
                                                      std::to_wstring(InstalledProviders::MaxValueName - 1));
        }
        else
        {
            candidate.AddProblem("text-too-long", TooLong(L"the text of the value", size));
        }
    }
}

void Doctor::ExamineKey(DoctorReport::Candidate& candidate, const std::wstring& keyPath)
{
    using InstalledProviders::Verdict;

    const InstalledProviders::Candidate judged = InstalledProviders::Judge(keyPath, m_configs);
    candidate.listed = judged.verdict == Verdict::Listed;
    const UniqueRegistryKey key = InstalledProviders::OpenProvider(keyPath);
    const DWORD error = GetLastError();
    if (candidate.listed || !judged.name.empty())
    {
        candidate.name = judged.name;
    }
    switch (judged.verdict)
    {
    case Verdict::NoKey:
        candidate.AddProblem("no-key", L"HKEY_LOCAL_MACHINE\\" + keyPath + L" cannot be opened: " +
                                           SystemMessage(error, keyPath));
        break;
    case Verdict::NoName:
        ExplainText(candidate, key.Get(), InstalledProviders::ServerName, "no-server-name");
        break;
    case Verdict::NoPath:
        ExplainText(candidate, key.Get(), InstalledProviders::ServerPath, "no-server-path");
        break;
    case Verdict::EndsProcess:
        // The name is read first.
        candidate.AddProblem("ends-host", EndsProcess(judged.name.empty() ? InstalledProviders::ServerName
                                                                          : InstalledProviders::ServerPath));
        break;
    case Verdict::SwitchedOff:
    case Verdict::Listed:
        break;
    }
    ExplainConfiguration(candidate, judged.config, judged.verdict == Verdict::SwitchedOff);
    if (candidate.listed)
    {
        ExamineLibrary(candidate, judged);
    }
}

/// The library loads on first use: what is wrong with it then does not keep it from being listed.
void Doctor::ExamineLibrary(DoctorReport::Candidate& candidate, const InstalledProviders::Candidate& judged)
{
    if (judged.config != nullptr && judged.config->m_msSccDllFullPath.size() > InstalledProviders::MaxServerPath)
    {
        candidate.AddProblem("setting-cut", L"MSSCCDllFullPath is cut to " +
                                                std::to_wstring(InstalledProviders::MaxServerPath) + L" characters");
    }
    if (judged.config != nullptr && judged.config->m_msSccDllSearchPath.size() > InstalledProviders::MaxSearchPath)
    {
        candidate.AddProblem("setting-cut", L"MSSCCDllSearchPath is cut to " +
                                                std::to_wstring(InstalledProviders::MaxSearchPath) + L" characters");
    }
    if (!judged.searchPath.empty() && !IsFolder(judged.searchPath))
    {
        candidate.AddProblem("no-search-folder",
                             L"there is no folder " + Quoted(judged.searchPath) + L", which MSSCCDllSearchPath names");
    }
    const DllDirectoryScope directory(judged.searchPath);
    const std::wstring found = FindLibrary(judged.serverPath, judged.searchPath);
    if (!found.empty())
    {
        CheckHeaders(candidate, found);
    }
    Announce(judged.serverPath);
    const UniqueActivationContext context = MakeManifestContext(LibraryModule());
    const UniqueModule module = LoadLibraryIsolated(judged.serverPath.c_str(), context);
    if (const DWORD error = GetLastError(); !module && !found.empty())
    {
        ExplainLoadError(candidate, found, context, error);
        return;
    }
    if (!module)
    {
        candidate.AddProblem("no-library", L"there is no library " + Quoted(judged.serverPath) +
                                               L"; it is listed all the same, and every operation on it fails");
        return;
    }
    for (const char* function : SccFunctions::Names)
    {
        if (GetProcAddress(module.Get(), function) != nullptr)
        {
            continue;
        }
        if (std::string_view(function) == SccFunctions::GetVersion.name)
        {
            candidate.AddProblem("missing-export",
                                 L"it does not export " + Wide(function) + L", without which no operation starts");
        }
        else
        {
            candidate.AddNote("not-offered",
                              L"it does not export " + Wide(function) + L", so the operations that need it fail");
        }
    }
}

void Doctor::Examine32BitView()
{
    const UniqueRegistryKey list = InstalledProviders::OpenList(KEY_WOW64_32KEY);
    for (DWORD index = 0; list; ++index)
    {
        std::wstring keyPath;
        const Step step = InstalledProviders::KeyPathAt(list.Get(), index, keyPath);
        if (step == Step::End)
        {
            return;
        }
        if (step != Step::Found || m_keyPaths.count(PathKey(keyPath)) != 0)
        {
            continue;
        }
        DoctorReport::Candidate& candidate = m_report.candidates.emplace_back();
        candidate.kind = InstalledKind;
        candidate.location = keyPath;
        const UniqueRegistryKey key = InstalledProviders::OpenProvider(keyPath, KEY_WOW64_32KEY);
        std::wstring name;
        if (key && InstalledProviders::ReadText(key.Get(), InstalledProviders::ServerName, name) == Step::Found)
        {
            candidate.name = name;
        }
        if (IsInstalled(name))
        {
            candidate.AddNote("only-32-bit",
                              L"this key is in the 32-bit view of the registry, which a 64-bit host never "
                              L"sees; a library of the same name is registered for those");
        }
        else
        {
            candidate.AddProblem("only-32-bit", L"it is registered only in the 32-bit view of the registry, which a "
                                                L"64-bit host never sees");
        }
    }
}

bool Doctor::IsInstalled(const std::wstring& name) const
{
    return std::any_of(m_report.candidates.begin(), m_report.candidates.end(), [&](const auto& candidate) {
        return candidate.kind == InstalledKind && candidate.listed && PathKey(*candidate.name) == PathKey(name);
    });
}

void Doctor::ExplainConfiguration(DoctorReport::Candidate& candidate, const OrvixProviderConfig* config,
                                  bool switchedOff)
{
    if (config == nullptr)
    {
        return;
    }
    m_used.insert(config);
    const std::wstring ofFile = std::wstring(L" of ") + OrvixProviderConfigManager::FileName;
    if (switchedOff)
    {
        candidate.AddNote("switched-off", SettingsElement(config) + ofFile + L" switches it off");
    }
    else
    {
        candidate.AddNote("configured",
                          SettingsElement(config) + ofFile + L" applies: its Name occurs in the provider's name");
    }
    for (const OrvixProviderConfig* other : m_configs.FindAllConfigs(candidate.name.value_or(L"").c_str()))
    {
        if (other != config)
        {
            m_hiddenBy.emplace(other, config);
            candidate.AddNote("hidden", SettingsElement(other) + ofFile +
                                            L" would apply as well, but the first one is used alone");
        }
    }
}

void Doctor::FindUnusedSettings()
{
    for (const FileDiagnostics::Provider& provider : m_settings.providers)
    {
        if (m_used.count(provider.config) != 0)
        {
            continue;
        }
        DoctorReport::Place& place = m_report.places.front();
        const auto hidden = m_hiddenBy.find(provider.config);
        if (hidden != m_hiddenBy.end())
        {
            place.AddProblem("always-hidden", SettingsElement(provider.config) +
                                                  L" has no effect: wherever it would "
                                                  L"apply, an earlier one does, such as " +
                                                  SettingsElement(hidden->second));
        }
        else
        {
            place.AddProblem("matches-nothing", SettingsElement(provider.config) +
                                                    L" has no effect: its Name occurs in the name of no provider");
        }
    }
}

/// A library that ends the process when it is loaded is the last one announced.
void Doctor::Announce(const std::wstring& library)
{
    if (m_commandLine.verbose)
    {
        m_output.Progress({});
        std::cerr << "orvix: loading " << Printable(library) << std::endl;
    }
    m_output.Progress(L"examining " + library);
}

std::wstring Doctor::SettingsElement(const OrvixProviderConfig* config) const
{
    for (const FileDiagnostics::Provider& provider : m_settings.providers)
    {
        if (provider.config == config)
        {
            return L"provider element " + std::to_wstring(provider.item) + L" (" + Quoted(provider.name) + L")";
        }
    }
    return L"";
}
