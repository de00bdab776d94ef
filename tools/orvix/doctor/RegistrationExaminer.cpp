#include "RegistrationExaminer.h"

#include "ActivationContext.h"
#include "DllDirectoryScope.h"
#include "FilePath.h"
#include "IsolatedLoad.h"
#include "IsolationFindings.h"
#include "LibraryModule.h"
#include "LoadFindings.h"
#include "ModulePath.h"
#include "SccFunctions.h"
#include "Text.h"

#include <algorithm>
#include <filesystem>

namespace
{

using InstalledProviders::Step;

constexpr const char* CandidateKind = "MSSCCI library";

constexpr std::size_t EndingBytes = InstalledProviders::MaxText * sizeof(wchar_t);

std::wstring Quoted(const std::wstring& text)
{
    return L'"' + text + L'"';
}

/// The file of this path or bare name in some folders; for null, where the system searches by itself. Empty when there
/// is none.
std::wstring FindIn(const wchar_t* folders, const std::wstring& path)
{
    constexpr std::size_t LongestPath = 32768; // characters, with the terminator
    std::wstring found(LongestPath, L'\0');
    found.resize(SearchPathW(folders, path.c_str(), L".dll", static_cast<DWORD>(found.size()), found.data(), nullptr));
    return found;
}

/// Where the system finds a library of this path or bare name; empty when it does not. It searches beside the program
/// and in `searchFolder`, if there is one, before it searches anywhere else.
std::wstring FindLibrary(const std::wstring& path, const std::wstring& searchFolder)
{
    const std::wstring programFolder = std::filesystem::path(ModulePath(nullptr)).parent_path().wstring();
    const std::wstring found = searchFolder.empty() ? L"" : FindIn((programFolder + L';' + searchFolder).c_str(), path);
    return found.empty() ? FindIn(nullptr, path) : found;
}

std::wstring EndsProcess(const std::wstring& what)
{
    return what + L" has exactly " + std::to_wstring(EndingBytes) +
           L" bytes, which ends every host process that asks for MSSCCI libraries";
}

std::wstring TooLong(const std::wstring& what, DWORD size)
{
    return what + L" has " + std::to_wstring(size) + L" bytes; the library reads at most " +
           std::to_wstring(EndingBytes - 1);
}

/// Adds why a text of a provider's own key could not be read.
void AddUnreadableText(DoctorReport::Subject& subject, HKEY key, const wchar_t* valueName, const char* missingCode)
{
    DWORD size = 0;
    if (RegQueryValueExW(key, valueName, nullptr, nullptr, nullptr, &size) == ERROR_SUCCESS)
    {
        subject.AddProblem("text-too-long", TooLong(valueName, size));
    }
    else
    {
        subject.AddProblem(missingCode, std::wstring(L"its key has no value ") + valueName);
    }
}

/// Adds why a value of the list was not read. `size`: bytes of its text.
void AddUnreadableValue(DoctorReport::Subject& subject, DWORD size)
{
    if (subject.location.size() >= InstalledProviders::MaxValueName)
    {
        subject.AddProblem("name-too-long", L"the name of the value has " + std::to_wstring(subject.location.size()) +
                                                L" characters; the library reads at most " +
                                                std::to_wstring(InstalledProviders::MaxValueName - 1));
    }
    else
    {
        subject.AddProblem("text-too-long", TooLong(L"the text of the value", size));
    }
}

/// Adds which settings of the library are cut or name no folder.
void AddSettings(DoctorReport::Subject& subject, const InstalledProviders::Candidate& judged)
{
    if (judged.config != nullptr && judged.config->m_msSccDllFullPath.size() > InstalledProviders::MaxServerPath)
    {
        subject.AddProblem("setting-cut", L"MSSCCDllFullPath is cut to " +
                                              std::to_wstring(InstalledProviders::MaxServerPath) + L" characters");
    }
    if (judged.config != nullptr && judged.config->m_msSccDllSearchPath.size() > InstalledProviders::MaxSearchPath)
    {
        subject.AddProblem("setting-cut", L"MSSCCDllSearchPath is cut to " +
                                              std::to_wstring(InstalledProviders::MaxSearchPath) + L" characters");
    }
    if (!judged.searchPath.empty() && !IsFolder(judged.searchPath))
    {
        subject.AddProblem("no-search-folder",
                           L"there is no folder " + Quoted(judged.searchPath) + L", which MSSCCDllSearchPath names");
    }
}

/// What a library cannot do without a function.
struct FunctionUse
{
    const char* name;
    const wchar_t* consequence;
};

constexpr FunctionUse FunctionUses[] = {
    {SccFunctions::Initialize.name, L"so the provider does not start"},
    {SccFunctions::Uninitialize.name, L"so ending a session fails"},
    {SccFunctions::OpenProject.name, L"so no project can be opened"},
    {SccFunctions::CloseProject.name, L"so closing a project fails"},
    {SccFunctions::GetProjPath.name, L"so a project whose stored names the library refuses cannot be opened"},
    {SccFunctions::Get.name, L"so getting the latest version fails"},
    {SccFunctions::Checkout.name, L"so checking out fails"},
    {SccFunctions::Uncheckout.name, L"so undoing a check-out fails"},
    {SccFunctions::Checkin.name, L"so checking in fails"},
    {SccFunctions::Add.name, L"so adding files fails"},
    {SccFunctions::History.name, L"so showing the history fails"},
    {SccFunctions::Properties.name, L"so showing properties fails"},
    {SccFunctions::QueryInfo.name, L"so the state of files is not known, and every operation on files does nothing"},
    {SccFunctions::RunScc.name, L"so starting the provider's own program fails"},
    {SccFunctions::GetCommandOptions.name, L"so it has no options"},
};

void AddMissingExports(DoctorReport::Subject& subject, HMODULE module)
{
    for (const char* function : SccFunctions::Names)
    {
        if (GetProcAddress(module, function) != nullptr)
        {
            continue;
        }
        if (std::string_view(function) == SccFunctions::GetVersion.name)
        {
            subject.AddProblem("missing-export",
                               L"it does not export " + Wide(function) + L", without which no operation starts");
            continue;
        }
        const auto* const use =
            std::find_if(std::begin(FunctionUses), std::end(FunctionUses),
                         [function](const FunctionUse& each) { return std::string_view(function) == each.name; });
        subject.AddNote("not-offered", L"it does not export " + Wide(function) + L", " +
                                           (use != std::end(FunctionUses) ? use->consequence
                                                                          : L"which no operation of OrvixCore needs"));
    }
}

} // namespace

void RegistrationExaminer::Examine()
{
    ExamineList();
    Examine32BitList();
}

void RegistrationExaminer::ExamineList()
{
    DoctorReport::Subject& location = m_report.locations.emplace_back(
        "registry list", std::wstring(L"HKEY_LOCAL_MACHINE\\") + InstalledProviders::ListPath);
    const UniqueRegistryKey list = InstalledProviders::OpenList();
    if (!list && GetLastError() == ERROR_FILE_NOT_FOUND)
    {
        location.AddNote("no-list", L"there is no such key: no MSSCCI library is registered for 64-bit processes");
    }
    else if (!list)
    {
        location.AddProblem("unreadable-key",
                            L"the key cannot be opened: " + SystemMessage(GetLastError(), location.location));
    }
    for (DWORD index = 0; list; ++index)
    {
        std::wstring keyPath;
        const Step step = InstalledProviders::KeyPathAt(list.Get(), index, keyPath);
        if (step == Step::End)
        {
            return;
        }
        ExamineValue(list.Get(), index, step, keyPath);
    }
}

void RegistrationExaminer::ExamineValue(HKEY list, DWORD index, Step step, const std::wstring& keyPath)
{
    std::wstring name(16384, L'\0'); // the longest name that a value can have, with its terminator
    DWORD nameSize = static_cast<DWORD>(name.size());
    DWORD size = 0;
    const LSTATUS status = RegEnumValueW(list, index, name.data(), &nameSize, nullptr, nullptr, nullptr, &size);
    name.resize(status == ERROR_SUCCESS ? nameSize : 0);

    DoctorReport::Candidate& candidate = m_report.candidates.emplace_back();
    candidate.kind = CandidateKind;
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
        AddUnreadableValue(candidate, size);
    }
}

void RegistrationExaminer::ExamineKey(DoctorReport::Candidate& candidate, const std::wstring& keyPath)
{
    using InstalledProviders::Verdict;

    const InstalledProviders::Candidate judged = InstalledProviders::Judge(keyPath, m_settings.Configs());
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
        AddUnreadableText(candidate, key.Get(), InstalledProviders::ServerName, "no-server-name");
        break;
    case Verdict::NoPath:
        AddUnreadableText(candidate, key.Get(), InstalledProviders::ServerPath, "no-server-path");
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
    m_settings.Explain(candidate, judged.config, judged.verdict == Verdict::SwitchedOff);
    if (candidate.listed)
    {
        // Hosts load the library on first use, so a library that does not load is listed.
        AddSettings(candidate, judged);
        const bool isReplaced = judged.config != nullptr && !judged.config->m_msSccDllFullPath.empty();
        if (!isReplaced && judged.serverPath.find_first_of(L"\\/") == std::wstring::npos)
        {
            candidate.AddProblem("no-path-folder", L"the path " + Quoted(judged.serverPath) +
                                                       L" names no folder, so each host searches for it in folders "
                                                       L"of its own");
        }
        m_exams.AddLibrary(judged.serverPath, judged.searchPath);
    }
}

CandidateExams::About RegistrationExaminer::ExamineLibrary(const std::wstring& serverPath,
                                                           const std::wstring& searchPath,
                                                           void (*report)(const DoctorReport::Subject& findings))
{
    DoctorReport::Subject headers;
    const DllDirectoryScope directory(searchPath);
    const std::wstring path = FindLibrary(serverPath, searchPath);
    if (!path.empty())
    {
        LoadFindings::AddHeaders(headers, path);
    }
    report(headers);
    DoctorReport::Subject findings;
    const UniqueActivationContext context = MakeManifestContext(LibraryModule());
    const UniqueModule module = LoadLibraryIsolated(serverPath.c_str(), context);
    const DWORD error = GetLastError();
    if (!module && !path.empty())
    {
        LoadFindings::AddLoadError(findings, path, context, error);
    }
    else if (!module)
    {
        findings.AddProblem("no-library", L"there is no library " + Quoted(serverPath) +
                                              L"; it is listed anyway, and every operation on it fails");
    }
    else
    {
        AddMissingExports(findings, module.Get());
        IsolationFindings::Add(findings, ModulePath(module.Get()), searchPath);
    }
    if (module || error != ERROR_MOD_NOT_FOUND)
    {
        LoadFindings::AddCurrentFolder(findings, path, context);
    }
    report(findings);
    CandidateExams::About about;
    if (module)
    {
        about.library = ModulePath(module.Get());
    }
    return about;
}

void RegistrationExaminer::Examine32BitList()
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
        if (step == Step::Found && !m_keyPaths.contains(PathKey(keyPath)))
        {
            Add32BitCandidate(keyPath);
        }
    }
}

void RegistrationExaminer::Add32BitCandidate(const std::wstring& keyPath)
{
    const UniqueRegistryKey key = InstalledProviders::OpenProvider(keyPath, KEY_WOW64_32KEY);
    std::wstring name;
    const bool hasName =
        key && InstalledProviders::ReadText(key.Get(), InstalledProviders::ServerName, name) == Step::Found;
    const bool isListed = IsListed(name);

    DoctorReport::Candidate& candidate = m_report.candidates.emplace_back();
    candidate.kind = CandidateKind;
    candidate.location = keyPath;
    if (hasName)
    {
        candidate.name = name;
    }
    if (isListed)
    {
        candidate.AddNote("only-32-bit", L"this key is in the 32-bit view of the registry, which a 64-bit host never "
                                         L"sees; a library of the same name is registered for 64-bit hosts");
    }
    else
    {
        candidate.AddProblem("only-32-bit", L"it is registered only in the 32-bit view of the registry, which a 64-bit "
                                            L"host never sees; orvix register PATH NAME --isolated makes the library "
                                            L"available to it");
    }
}

bool RegistrationExaminer::IsListed(const std::wstring& name) const
{
    return std::any_of(m_report.candidates.begin(), m_report.candidates.end(), [&](const auto& candidate) {
        return candidate.kind == CandidateKind && candidate.listed && PathKey(*candidate.name) == PathKey(name);
    });
}
