#include "Registration.h"

#include "FilePath.h"
#include "InstalledProviders.h"
#include "IsolatedLoad.h"
#include "SccFunctions.h"
#include "ToolError.h"

#include <algorithm>
#include <array>

namespace
{

using InstalledProviders::ListPath;
using InstalledProviders::ServerName;
using InstalledProviders::ServerPath;
using InstalledProviders::Step;

constexpr wchar_t OwnKeys[] = L"Software\\OrvixCore\\MSSCCI\\";
constexpr std::size_t MaxName = 255; // characters in the name of a key

// A longer text fills the library's buffer, which ends the process of every host.
constexpr std::size_t MaxPath = InstalledProviders::MaxText - 2;

void Check(LSTATUS status)
{
    if (status == ERROR_ACCESS_DENIED)
    {
        throw ToolError(ExitCode::Failed, L"the registry cannot be changed without administrator rights: "
                                          L"run orvix as administrator");
    }
    if (status != ERROR_SUCCESS)
    {
        throw ToolError(ExitCode::Failed, L"the registry cannot be changed: error " + std::to_wstring(status));
    }
}

bool EqualNames(const std::wstring& left, const std::wstring& right)
{
    return PathKey(left) == PathKey(right);
}

/// A text of a provider's key; empty when the library would not read it.
std::optional<std::wstring> ReadText(const std::wstring& keyPath, const wchar_t* valueName)
{
    const UniqueRegistryKey key = InstalledProviders::OpenProvider(keyPath);
    std::wstring text;
    const bool found = key && InstalledProviders::ReadText(key.Get(), valueName, text) == Step::Found;
    return found ? std::optional(text) : std::nullopt;
}

/// Writes a text and, where it is missing, its key.
LSTATUS WriteText(const wchar_t* keyPath, const wchar_t* valueName, const std::wstring& text)
{
    return RegSetKeyValueW(HKEY_LOCAL_MACHINE, keyPath, valueName, REG_SZ, text.c_str(),
                           static_cast<DWORD>((text.size() + 1) * sizeof(wchar_t)));
}

} // namespace

Registration::Registration(const std::wstring& name) : m_name(name), m_keyPath(OwnKeys + name)
{
    const auto isForbidden = [](wchar_t c) { return c == L'\\' || c < 0x20 || (c >= 0x7F && c < 0xA0); };
    if (name.empty() || name.size() > MaxName || std::any_of(name.begin(), name.end(), isForbidden))
    {
        throw ToolError(ExitCode::BadUsage, L"a provider's name has 1 to " + std::to_wstring(MaxName) +
                                                L" characters, and no backslash or control character among them");
    }
}

void Registration::CheckLibrary(const std::wstring& path)
{
    if (!PathExists(path) || IsFolder(path))
    {
        throw ToolError(ExitCode::NotFound, L"no such library: " + path);
    }
    SetThreadErrorMode(SEM_FAILCRITICALERRORS, nullptr); // no message box for a damaged file
    const UniqueModule module(LoadLibraryExW(path.c_str(), nullptr, DONT_RESOLVE_DLL_REFERENCES));
    if (!module)
    {
        throw ToolError(ExitCode::NotFound, L"not a 64-bit library: " + path);
    }
    if (GetProcAddress(module.Get(), SccFunctions::GetVersion.name) == nullptr)
    {
        throw ToolError(ExitCode::NotFound, L"no MSSCCI library, it has no SccGetVersion: " + path);
    }
}

std::optional<std::wstring> Registration::Set(const std::wstring& library)
{
    if (library.size() > MaxPath)
    {
        throw ToolError(ExitCode::BadUsage,
                        L"the path of the library is longer than " + std::to_wstring(MaxPath) + L" characters");
    }
    CheckLibrary(library);
    return Set([&library] { return library; });
}

std::optional<std::wstring> Registration::Set(const std::function<std::wstring()>& make)
{
    const std::vector<Entry> list = ReadList();
    RefuseForeign(list);
    const bool isListed = std::any_of(list.begin(), list.end(), [this](const Entry& entry) { return IsOwn(entry); });
    const Previous previous{ReadText(m_keyPath, ServerName), ReadText(m_keyPath, ServerPath)};
    const std::wstring library = make();
    try
    {
        Write(library, isListed);
    }
    catch (const ToolError&)
    {
        Restore(previous, isListed);
        throw;
    }
    return previous.path;
}

void Registration::Write(const std::wstring& library, bool isListed)
{
    Check(WriteText(m_keyPath.c_str(), ServerName, m_name));
    Check(WriteText(m_keyPath.c_str(), ServerPath, library));
    if (!isListed)
    {
        Check(WriteText(ListPath, m_name.c_str(), m_keyPath));
    }
}

void Registration::Restore(const Previous& previous, bool isListed)
{
    if (previous.name)
    {
        WriteText(m_keyPath.c_str(), ServerName, *previous.name);
    }
    if (previous.path)
    {
        WriteText(m_keyPath.c_str(), ServerPath, *previous.path);
    }
    if (!isListed && !previous.name && !previous.path)
    {
        RegDeleteTreeW(HKEY_LOCAL_MACHINE, m_keyPath.c_str());
    }
}

void Registration::Remove()
{
    const std::vector<Entry> list = ReadList();
    // An interrupted run may have left the key without a value in the list.
    bool known = static_cast<bool>(InstalledProviders::OpenProvider(m_keyPath));
    for (const Entry& entry : list)
    {
        if (IsOwn(entry))
        {
            known = true;
            Check(RegDeleteKeyValueW(HKEY_LOCAL_MACHINE, ListPath, entry.valueName.c_str()));
        }
    }
    if (!known)
    {
        RefuseForeign(list);
        throw ToolError(ExitCode::NotFound, L"no such registration: " + m_name);
    }
    const LSTATUS status = RegDeleteTreeW(HKEY_LOCAL_MACHINE, m_keyPath.c_str());
    Check(status == ERROR_FILE_NOT_FOUND ? ERROR_SUCCESS : status);
}

std::vector<Registration::Entry> Registration::ReadList()
{
    std::vector<Entry> list;
    const UniqueRegistryKey key = InstalledProviders::OpenList();
    if (!key && GetLastError() == ERROR_FILE_NOT_FOUND)
    {
        return list;
    }
    Check(key ? ERROR_SUCCESS : static_cast<LSTATUS>(GetLastError()));
    std::array<wchar_t, InstalledProviders::MaxValueName> name{};
    for (DWORD index = 0;; ++index)
    {
        std::wstring keyPath;
        if (InstalledProviders::KeyPathAt(key.Get(), index, keyPath) == Step::End)
        {
            return list;
        }
        DWORD size = static_cast<DWORD>(name.size());
        // The library does not read a value with a longer name either.
        if (RegEnumValueW(key.Get(), index, name.data(), &size, nullptr, nullptr, nullptr, nullptr) == ERROR_SUCCESS)
        {
            list.push_back({name.data(), keyPath});
        }
    }
}

bool Registration::IsOwn(const Entry& entry) const
{
    return EqualNames(entry.keyPath, m_keyPath);
}

void Registration::RefuseForeign(const std::vector<Entry>& list) const
{
    for (const Entry& entry : list)
    {
        const std::wstring serverName = ReadText(entry.keyPath, ServerName).value_or(L"");
        if (!IsOwn(entry) && (EqualNames(entry.valueName, m_name) || EqualNames(serverName, m_name)))
        {
            throw ToolError(ExitCode::Failed, m_name +
                                                  L" is registered by another program and stays as it is: "
                                                  L"HKEY_LOCAL_MACHINE\\" +
                                                  entry.keyPath);
        }
    }
}
