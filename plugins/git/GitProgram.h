#pragma once

#include <string>
#include <string_view>

/// Where Git is.
namespace GitProgram
{

/// The full path of git.exe: the administrator's alternative executable (may be empty), otherwise the registered
/// installation of Git for Windows, otherwise the first one in the absolute folders of PATH. The current folder is
/// never searched. Throws `GitFailure` when there is none.
std::wstring Find(const std::wstring& alternative);

/// The first git.exe in the absolute folders of a list in the form of PATH; empty when there is none.
std::wstring FindInFolders(std::wstring_view folders);

/// Throws `GitFailure` unless the output of "git version" names a version that has what the provider uses.
void CheckVersion(std::string_view printed);

} // namespace GitProgram
