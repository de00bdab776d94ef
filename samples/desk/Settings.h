#pragma once

#include <string>

/// What the program remembers about the user, in the registry key HKEY_CURRENT_USER\Software\OrvixDesk. A value that
/// cannot be read counts as missing; one that cannot be written is lost.
namespace Settings
{

/// The name of the provider that the user chose last; empty for none.
std::wstring Provider();
void StoreProvider(const std::wstring& name);

/// Whether this program may use the provider with this name; true until the user clears it.
bool IsProviderUsed(const std::wstring& name);
void StoreProviderUsed(const std::wstring& name, bool used);

/// Whether the user wants dark colours.
bool IsDark();
void StoreDark(bool dark);

} // namespace Settings
