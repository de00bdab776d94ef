#include "ArchiveReport.h"

#include <windows.h>

#include <lmcons.h>

#include <algorithm>

namespace
{

/// Adds the lines of a text. Empty lines after the first are left out.
void Append(ArchiveReport::Lines& lines, const std::wstring& text)
{
    for (std::size_t begin = 0; begin <= text.size();)
    {
        const std::size_t end = std::min(text.find_first_of(L"\r\n", begin), text.size());
        if (end > begin || begin == 0)
        {
            lines.push_back((begin > 0 ? L"     " : L"") + text.substr(begin, end - begin));
        }
        begin = end + 1;
    }
}

std::wstring Wide(const std::string& ascii)
{
    return {ascii.begin(), ascii.end()};
}

} // namespace

ArchiveReport::Lines ArchiveReport::Failure(const ArchiveFailure& failure)
{
    Lines lines;
    Append(lines, failure.file.empty() ? failure.reason : failure.file + L": " + failure.reason);
    return lines;
}

ArchiveReport::Lines ArchiveReport::History(const ArchiveRecord& record)
{
    Lines lines;
    Append(lines, record.path);
    for (std::size_t number = record.versions.size(); number > 0; --number)
    {
        const ArchiveVersion& version = record.versions[number - 1];
        Append(lines, L"  " + std::to_wstring(number) + L"  " + Wide(version.time) + L"  " + version.user + L"  " +
                          version.comment);
    }
    return lines;
}

ArchiveReport::Lines ArchiveReport::Properties(const ArchiveRecord& record)
{
    const ArchiveVersion& latest = record.Latest();
    Lines lines;
    Append(lines, record.path);
    Append(lines, L"  version      " + std::to_wstring(record.versions.size()));
    Append(lines, L"  stored       " + Wide(latest.time) + L"  " + latest.user);
    Append(lines, L"  comment      " + latest.comment);
    Append(lines, L"  size         " + std::to_wstring(latest.size) + L" bytes");
    Append(lines, L"  SHA-256      " + Wide(latest.sha256));
    Append(lines, L"  checked out  " +
                      (record.checkOut ? Wide(record.checkOut->time) + L"  " + record.checkOut->user : L"no"));
    return lines;
}

std::wstring ArchiveReport::WindowsUser()
{
    wchar_t name[UNLEN + 1];
    DWORD size = static_cast<DWORD>(std::size(name));
    return ::GetUserNameW(name, &size) ? name : L"";
}
