#include "InstalledProviders.h"

#include "OrvixProviderConfig.h"
#include "OrvixProviderConfigManager.h"

#include <array>
#include <utility>

namespace
{

using InstalledProviders::MaxText;

constexpr UINT FailFast = 0xC0000409; // the system's code for a process that stops itself

using Buffer = std::array<wchar_t, MaxText>;

/// The text of `size` bytes in a buffer, up to its first zero; half a character at the end is dropped.
InstalledProviders::Step TextOf(Buffer& buffer, DWORD size, std::wstring& text)
{
    if (size >= sizeof(buffer))
    {
        return InstalledProviders::Step::EndsProcess;
    }
    buffer[size / sizeof(wchar_t)] = L'\0';
    text = buffer.data();
    return InstalledProviders::Step::Found;
}

UniqueRegistryKey OpenKey(const wchar_t* path, REGSAM view)
{
    HKEY key = nullptr;
    const LSTATUS status = RegOpenKeyExW(HKEY_LOCAL_MACHINE, path, 0, KEY_READ | view, &key);
    SetLastError(static_cast<DWORD>(status));
    return UniqueRegistryKey(status == ERROR_SUCCESS ? key : nullptr);
}

} // namespace

UniqueRegistryKey InstalledProviders::OpenList(REGSAM view)
{
    return OpenKey(ListPath, view);
}

InstalledProviders::Step InstalledProviders::KeyPathAt(HKEY list, DWORD index, std::wstring& path)
{
    std::array<wchar_t, MaxValueName> name = {};
    Buffer data = {};
    DWORD nameSize = static_cast<DWORD>(name.size());
    DWORD dataSize = sizeof(data);
    DWORD type = REG_NONE;
    const LSTATUS status = RegEnumValueW(list, index, name.data(), &nameSize, nullptr, &type,
                                         reinterpret_cast<BYTE*>(data.data()), &dataSize);
    // A key that is deleted during the walk answers every index with this error.
    if (status == ERROR_NO_MORE_ITEMS || status == ERROR_KEY_DELETED)
    {
        return Step::End;
    }
    if (status != ERROR_SUCCESS)
    {
        return Step::Unreadable;
    }
    return type == REG_SZ ? TextOf(data, dataSize, path) : Step::NoString;
}

UniqueRegistryKey InstalledProviders::OpenProvider(const std::wstring& path, REGSAM view)
{
    return OpenKey(path.c_str(), view);
}

InstalledProviders::Step InstalledProviders::ReadText(HKEY provider, const wchar_t* valueName, std::wstring& text)
{
    Buffer data = {};
    DWORD size = sizeof(data);
    if (RegQueryValueExW(provider, valueName, nullptr, nullptr, reinterpret_cast<BYTE*>(data.data()), &size) !=
        ERROR_SUCCESS)
    {
        return Step::Unreadable;
    }
    return TextOf(data, size, text);
}

InstalledProviders::Candidate InstalledProviders::Judge(const std::wstring& keyPath,
                                                        const OrvixProviderConfigManager& configs)
{
    Candidate candidate;
    const auto reject = [&candidate](Step step, Verdict verdict) {
        candidate.verdict = step == Step::EndsProcess ? Verdict::EndsProcess : verdict;
        return std::move(candidate);
    };
    const UniqueRegistryKey key = OpenProvider(keyPath);
    if (!key)
    {
        return candidate;
    }
    const Step name = ReadText(key.Get(), ServerName, candidate.name);
    if (name != Step::Found)
    {
        return reject(name, Verdict::NoName);
    }
    candidate.config = configs.FindConfig(candidate.name.c_str());
    if (candidate.config != nullptr && !candidate.config->m_enabled)
    {
        return reject(name, Verdict::SwitchedOff);
    }
    if (candidate.config != nullptr)
    {
        candidate.searchPath = candidate.config->m_msSccDllSearchPath.substr(0, MaxSearchPath);
        candidate.serverPath = candidate.config->m_msSccDllFullPath.substr(0, MaxServerPath);
    }
    if (candidate.serverPath.empty())
    {
        const Step path = ReadText(key.Get(), ServerPath, candidate.serverPath);
        if (path != Step::Found)
        {
            return reject(path, Verdict::NoPath);
        }
    }
    candidate.verdict = Verdict::Listed;
    return candidate;
}

void InstalledProviders::EndProcess()
{
    OutputDebugStringW(L"OrvixCore: the process ends: a text of an installed MSSCCI provider in the registry has 2048 "
                       L"bytes and cannot be terminated.\n");
    for (;;)
    {
        TerminateProcess(GetCurrentProcess(), FailFast);
    }
}
