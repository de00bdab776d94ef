#include "ArchivePaths.h"

#include "ArchiveText.h"
#include "Sha256.h"

#include <algorithm>

namespace
{

constexpr std::size_t MaxPathLength = 32767;
constexpr std::wstring_view LongPrefix = L"\\\\?\\";
constexpr std::wstring_view LongSharePrefix = L"\\\\?\\UNC\\";
constexpr wchar_t LinkReason[] = L"Links are not supported";
constexpr wchar_t Outside[] = L"The file is outside the project folder";

[[noreturn]] void Refuse(const wchar_t* reason)
{
    throw ArchiveFailure{ArchiveError::InvalidPath, reason, {}};
}

[[noreturn]] void RefuseOwnFile()
{
    throw ArchiveFailure{ArchiveError::OwnFile, L"The file belongs to the archive itself", {}};
}

bool TakePrefix(std::wstring_view& text, std::wstring_view prefix)
{
    if (!text.starts_with(prefix))
    {
        return false;
    }
    text.remove_prefix(prefix.size());
    return true;
}

void CheckName(std::wstring_view name)
{
    if (name == L"..")
    {
        Refuse(L"Paths with \"..\" are not allowed");
    }
    const bool hasBadCharacter = std::any_of(name.begin(), name.end(), [](wchar_t character) {
        return character < L' ' || wcschr(L"<>:\"|?*", character) != nullptr;
    });
    if (hasBadCharacter || name.back() == L'.' || name.back() == L' ')
    {
        Refuse(L"Not a valid file name");
    }
}

/// A full path with the prefix "\\?\": Windows then neither limits its length nor changes its names.
std::wstring LongForm(const std::wstring& given)
{
    if (given.size() > MaxPathLength || !ArchiveText::IsValid(given))
    {
        Refuse(L"Not a valid path");
    }
    std::wstring path = given;
    std::replace(path.begin(), path.end(), L'/', L'\\');

    std::wstring_view rest = path;
    const bool isLongShare = TakePrefix(rest, LongSharePrefix);
    const bool isLong = !isLongShare && TakePrefix(rest, LongPrefix);
    std::wstring result;
    if (isLongShare || (!isLong && !rest.starts_with(L"\\\\.\\") && TakePrefix(rest, L"\\\\")))
    {
        result = L"\\\\?\\UNC";
    }
    else if (rest.size() >= 3 && ((rest[0] | 0x20) >= L'a' && (rest[0] | 0x20) <= L'z') && rest[1] == L':' &&
             rest[2] == L'\\')
    {
        result.append(LongPrefix).append(rest.substr(0, 2));
        rest.remove_prefix(3);
    }
    else
    {
        Refuse(L"Not a full path");
    }

    while (!rest.empty())
    {
        const std::wstring_view name = rest.substr(0, rest.find(L'\\'));
        rest.remove_prefix(std::min(rest.size(), name.size() + 1));
        if (name.empty() || name == L".")
        {
            continue;
        }
        CheckName(name);
        result.append(1, L'\\').append(name);
    }
    return result;
}

/// The system's own path of an existing folder, without a separator at the end. Empty on failure; `error` is the
/// reason.
std::wstring FinalPath(const std::wstring& folder, DWORD& error)
{
    std::wstring path(MAX_PATH, L'\0');
    DWORD length = 0;
    // With the separator at its end the root of a drive can be opened, too.
    const ArchiveFiles::UniqueHandle handle =
        ArchiveFiles::Open(folder + L'\\', FILE_READ_ATTRIBUTES, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                           OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS);
    while (handle && (length = GetFinalPathNameByHandleW(handle.get(), path.data(), static_cast<DWORD>(path.size()),
                                                         FILE_NAME_NORMALIZED)) > path.size())
    {
        path.resize(length);
    }
    error = GetLastError();
    path.resize(length);
    if (path.ends_with(L'\\'))
    {
        path.pop_back();
    }
    return path;
}

/// The path of a folder, which need not exist, with links and short names resolved. Empty on failure; `error` is the
/// reason. The system resolves the longest part that it can: some systems cannot resolve a long path. Links in the
/// rest are refused.
std::wstring ResolvePath(const std::wstring& path, DWORD& error)
{
    std::size_t end = path.size();
    std::wstring resolved;
    while ((resolved = FinalPath(path.substr(0, end), error)).empty())
    {
        end = path.rfind(L'\\', end - 1);
        if (end < LongPrefix.size())
        {
            return {};
        }
    }
    while (end < path.size())
    {
        const std::size_t begin = end + 1;
        end = std::min(path.find(L'\\', begin), path.size());
        const std::wstring name = path.substr(begin, end - begin);
        const std::optional<ArchiveFiles::Entry> entry = ArchiveFiles::Find(resolved + L'\\' + name);
        if (entry && entry->isLink)
        {
            Refuse(LinkReason);
        }
        resolved.append(1, L'\\').append(entry ? entry->name : name);
    }
    return resolved;
}

bool IsInside(const std::wstring& foldedPath, const std::wstring& foldedFolder)
{
    return foldedPath.starts_with(foldedFolder) &&
           (foldedPath.size() == foldedFolder.size() || foldedPath[foldedFolder.size()] == L'\\');
}

} // namespace

ArchivePaths::ArchivePaths(const std::wstring& projectFolder, const std::wstring& archiveFolder)
    : m_project(projectFolder), m_foldedProject(ArchiveText::Fold(projectFolder)),
      m_foldedArchive(ArchiveText::Fold(archiveFolder))
{
}

std::wstring ArchivePaths::FindFolder(const std::wstring& path)
{
    const std::wstring longForm = LongForm(path);
    DWORD error = GetFileAttributesW((longForm + L'\\').c_str()) == INVALID_FILE_ATTRIBUTES ? GetLastError() : 0;
    std::wstring resolved = error == 0 ? ResolvePath(longForm, error) : L"";
    if (resolved.empty())
    {
        ArchiveFiles::ThrowError(L"The folder cannot be opened", error);
    }
    return resolved;
}

std::wstring ArchivePaths::ShortForm(const std::wstring& path)
{
    std::wstring_view rest = path;
    if (TakePrefix(rest, LongSharePrefix))
    {
        return L"\\\\" + std::wstring(rest);
    }
    TakePrefix(rest, LongPrefix);
    return std::wstring(rest);
}

bool ArchivePaths::IsReserved(std::wstring_view path)
{
    static const std::wstring archiveName = ArchiveText::Fold(ArchiveName);
    static const std::wstring temporaryName = ArchiveText::Fold(TemporaryName);
    const std::wstring folded = ArchiveText::Fold(path);
    for (std::wstring_view rest = folded; !rest.empty();)
    {
        const std::wstring_view name = rest.substr(0, rest.find(L'\\'));
        if (name == archiveName || name == temporaryName)
        {
            return true;
        }
        rest.remove_prefix(std::min(rest.size(), name.size() + 1));
    }
    return false;
}

ArchiveTarget ArchivePaths::Resolve(const std::wstring& path)
{
    const std::wstring longForm = LongForm(path);
    const std::size_t separator = longForm.rfind(L'\\');
    const std::wstring& folder = ResolveFolder(longForm.substr(0, separator));

    ArchiveTarget target;
    const std::wstring name = longForm.substr(separator + 1);
    target.entry = ArchiveFiles::Find(folder + L'\\' + name);
    target.path = folder + L'\\' + (target.entry ? target.entry->name : name);
    target.relative = target.path.substr(m_project.size() + 1);
    if (IsReserved(target.relative))
    {
        RefuseOwnFile();
    }
    if (target.entry && target.entry->IsFolder())
    {
        Refuse(L"A folder is not a file");
    }
    if (target.entry && target.entry->isLink)
    {
        Refuse(LinkReason);
    }

    std::replace(target.relative.begin(), target.relative.end(), L'\\', L'/');
    target.key = KeyOf(target.relative);
    return target;
}

std::wstring ArchivePaths::RelativeFolder(const std::wstring& path)
{
    std::wstring relative = ResolveFolder(LongForm(path)).substr(m_project.size()) + L'\\';
    relative.erase(0, 1);
    std::replace(relative.begin(), relative.end(), L'\\', L'/');
    return relative;
}

std::string ArchivePaths::KeyOf(std::wstring_view relative)
{
    const std::string identity = ArchiveText::ToUtf8(ArchiveText::Fold(relative));
    Sha256 sha256;
    sha256.Add(identity.data(), identity.size());
    return sha256.Finish();
}

void ArchivePaths::MakeFolders(const ArchiveTarget& target) const
{
    for (std::size_t end = m_project.size(); (end = target.path.find(L'\\', end + 1)) != std::wstring::npos;)
    {
        ArchiveFiles::MakeFolder(target.path.substr(0, end));
    }
}

const std::wstring& ArchivePaths::ResolveFolder(const std::wstring& path)
{
    const auto known = m_folders.find(path);
    if (known != m_folders.end())
    {
        return known->second;
    }

    DWORD error = 0;
    const std::wstring resolved = ResolvePath(path, error);
    if (resolved.empty() && IsInside(ArchiveText::Fold(path), m_foldedProject))
    {
        ArchiveFiles::ThrowError(L"The file's folder cannot be opened", error);
    }
    const std::wstring foldedPath = ArchiveText::Fold(resolved);
    if (IsInside(foldedPath, m_foldedArchive))
    {
        RefuseOwnFile();
    }
    if (!IsInside(foldedPath, m_foldedProject))
    {
        Refuse(Outside);
    }
    return m_folders.emplace(path, resolved).first->second;
}
