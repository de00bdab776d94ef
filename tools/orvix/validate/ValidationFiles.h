#pragma once

#include "OrvixFileList.h"
#include "ValidationSubject.h"

#include <string>
#include <tuple>
#include <vector>

/// A file list whose entries are all active.
class ActiveFiles
{
public:
    /// The value of each FlagsOut before an operation. No provider sets it, so an entry without a new value is found.
    static constexpr unsigned long Unwritten = 0x40000100;

    explicit ActiveFiles(const std::vector<std::wstring>& paths);

    OrvixFileList* List() { return &m_list; }

    /// FlagsOut of each entry.
    std::vector<unsigned long> Flags();

    /// One entry: the object, its path, FlagsIn, client value, and the number of its children and attachments.
    using HostPart = std::tuple<OrvixFileEntry*, std::wstring, unsigned long, long long, unsigned int>;

    /// Everything that only the host may change: the entries, and after them those of the active list.
    std::vector<HostPart> HostParts();

private:
    OrvixFileList m_list;
};

/// What a rule passes to the library. All files are in the scratch folder, which is the current folder.
namespace ValidationFiles
{

/// Makes two files of the project. Each number makes other files.
std::vector<std::wstring> MakeGood(const ValidationSubject& subject, unsigned long number = 0);

/// Paths of no file of the project, and texts that are no path.
std::vector<std::wstring> BadPaths(const ValidationSubject& subject);

/// The end of a message about a path: " on " and the path, shortened.
std::string On(const std::wstring& path);

} // namespace ValidationFiles
