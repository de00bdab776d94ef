#pragma once

#include "UniqueHandle.h"

#include <string>

class OrvixProviderConfig;
class OrvixProviderConfigManager;

/// The registry's list of installed MSSCCI libraries, and what the key of one library says.
///
/// Texts have at most 2047 bytes; a longer one is a failed read. One of exactly 2048 bytes, which the fixed buffers
/// of this contract cannot terminate, makes the services object end the process (`EndProcess`).
namespace InstalledProviders
{

// The layout, below HKEY_LOCAL_MACHINE. Each text of the list is the path of a provider's own key, which holds the
// other two.
inline constexpr wchar_t ListPath[] = L"Software\\SourceCodeControlProvider\\InstalledSCCProviders";
inline constexpr wchar_t ServerName[] = L"SCCServerName";
inline constexpr wchar_t ServerPath[] = L"SCCServerPath";
inline constexpr std::size_t MaxValueName = 1024; // characters, terminator included
inline constexpr std::size_t MaxText = 1024;      // characters, terminator included

// Where the settings of an MSSCCI library are cut, in characters.
inline constexpr std::size_t MaxSearchPath = 260;
inline constexpr std::size_t MaxServerPath = 1024;

/// The list; null when it cannot be opened, and the thread's last error then says why. `view` may ask for the 32-bit
/// view of the registry (KEY_WOW64_32KEY), which no 64-bit host sees.
UniqueRegistryKey OpenList(REGSAM view = 0);

/// The result of reading one text.
enum class Step
{
    Found,
    Unreadable, ///< missing, too long, or no access
    NoString,   ///< a value of the list that has another type
    EndsProcess,
    End ///< of the list
};

/// The path of the provider's key that the value at `index` holds. Throws std::bad_alloc.
Step KeyPathAt(HKEY list, DWORD index, std::wstring& path);

/// The provider's own key; null as above.
UniqueRegistryKey OpenProvider(const std::wstring& path, REGSAM view = 0);

/// A value of the provider's key, whatever its type. Throws std::bad_alloc.
Step ReadText(HKEY provider, const wchar_t* valueName, std::wstring& text);

/// Whether a library of the list is a provider, and if not, the reason.
enum class Verdict
{
    Listed,
    NoKey,
    NoName,
    SwitchedOff,
    NoPath,
    EndsProcess
};

/// A library of the list, as far as the judgement got.
struct Candidate
{
    Verdict verdict = Verdict::NoKey;
    std::wstring name;
    OrvixProviderConfig* config = nullptr; ///< not owned
    std::wstring searchPath;
    std::wstring serverPath;
};

/// Judges the library of a provider's key. Loads nothing. Throws std::bad_alloc.
Candidate Judge(const std::wstring& keyPath, const OrvixProviderConfigManager& configs);

/// Ends the process with the reason on the debug output; no code of it runs afterwards.
[[noreturn]] void EndProcess();

} // namespace InstalledProviders
