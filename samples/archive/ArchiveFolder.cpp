#include "ArchiveFolder.h"

#include "ArchiveLock.h"
#include "ArchiveText.h"

namespace
{

constexpr std::string_view Format = "orvix-archive 1\n";
constexpr std::string_view LinkFormat = "orvix-archive-link 1\n";
constexpr std::size_t MaxLinkSize = 1 << 17;
constexpr std::size_t MaxRecordSize = 16 << 20;

constexpr wchar_t Records[] = L"files";
constexpr wchar_t Versions[] = L"contents";

[[noreturn]] void ThrowDamaged(const wchar_t* reason)
{
    throw ArchiveFailure{ArchiveError::Damaged, reason, {}};
}

/// The path of the archive folder in a link file.
std::wstring ReadLink(const std::wstring& file)
{
    const std::string text = ArchiveFiles::ReadText(file, MaxLinkSize).value_or("");
    std::string_view path = text;
    if (!path.starts_with(LinkFormat))
    {
        ThrowDamaged(L"The project's link to its archive cannot be read");
    }
    path.remove_prefix(LinkFormat.size());
    path = path.substr(0, path.find_first_of("\r\n"));
    const std::optional<std::wstring> target = ArchiveText::FromUtf8(path);
    if (!target)
    {
        ThrowDamaged(L"The project's link to its archive cannot be read");
    }
    return *target;
}

/// The path of a project's archive, or of the link to it.
std::wstring ArchivePathIn(const std::wstring& projectFolder)
{
    return projectFolder + L'\\' + std::wstring(ArchivePaths::ArchiveName);
}

} // namespace

bool ArchiveFolder::Exists(const std::wstring& projectFolder)
{
    return ArchiveFiles::Find(ArchivePathIn(projectFolder)).has_value();
}

ArchiveFolder::ArchiveFolder(const std::wstring& projectFolder, std::chrono::milliseconds lockWait)
{
    const std::wstring path = ArchivePathIn(projectFolder);
    const std::optional<ArchiveFiles::Entry> entry = ArchiveFiles::Find(path);
    if (!entry)
    {
        ArchiveFiles::MakeFolder(path);
    }
    m_path = ArchivePaths::FindFolder(entry && !entry->IsFolder() ? ReadLink(path) : path);
    if (!HasFormat())
    {
        Prepare(lockWait);
    }
}

bool ArchiveFolder::HasFormat() const
{
    const std::optional<std::string> format = ArchiveFiles::ReadText(FormatFile(), MaxLinkSize);
    if (format && format != Format)
    {
        ThrowDamaged(L"The format of the archive is not known");
    }
    return format.has_value();
}

void ArchiveFolder::Prepare(std::chrono::milliseconds lockWait) const
{
    const ArchiveLock lock(LockFile(), lockWait);
    if (HasFormat())
    {
        return; // another program has made it in the meantime
    }
    ArchiveFiles::MakeFolder(m_path + L'\\' + Versions);
    ArchiveFiles::MakeFolder(m_path + L'\\' + Records);
    ArchiveFiles::WriteText(FormatFile(), TemporaryFile(), Format);
}

std::wstring ArchiveFolder::PathOf(const wchar_t* kind, const std::string& name) const
{
    const std::wstring wide(name.begin(), name.end());
    return m_path + L'\\' + kind + L'\\' + wide.substr(0, 2) + L'\\' + wide;
}

std::optional<ArchiveRecord> ArchiveFolder::Load(const ArchiveTarget& target) const
{
    return Load(target.key);
}

std::optional<ArchiveRecord> ArchiveFolder::Load(const std::string& key) const
{
    const std::optional<std::string> text = ArchiveFiles::ReadText(PathOf(Records, key), MaxRecordSize);
    if (!text)
    {
        return std::nullopt;
    }
    std::optional<ArchiveRecord> record = ArchiveRecord::Parse(*text);
    if (!record || ArchivePaths::KeyOf(record->path) != key)
    {
        ThrowDamaged(L"The file's record in the archive is damaged");
    }
    return record;
}

std::vector<std::wstring> ArchiveFolder::List(ArchiveFailures& failures) const
{
    std::vector<std::wstring> paths;
    const std::wstring records = m_path + L'\\' + Records;
    for (const ArchiveFiles::Entry& group : ArchiveFiles::List(records))
    {
        if (!group.IsFolder())
        {
            continue;
        }
        for (const ArchiveFiles::Entry& file : ArchiveFiles::List(records + L'\\' + group.name))
        {
            try
            {
                // Another file in this folder has no record under its name.
                if (const std::optional<ArchiveRecord> record = Load(ArchiveText::ToUtf8(file.name)))
                {
                    paths.push_back(record->path);
                }
            }
            catch (ArchiveFailure& failure)
            {
                failure.file = ArchivePaths::ShortForm(records + L'\\' + group.name + L'\\' + file.name);
                failures.push_back(std::move(failure));
            }
        }
    }
    return paths;
}

void ArchiveFolder::Save(const ArchiveTarget& target, const ArchiveRecord& record) const
{
    const std::string text = record.Format();
    if (text.size() > MaxRecordSize)
    {
        throw ArchiveFailure{ArchiveError::Access, L"The file's record in the archive would become too large", {}};
    }
    const std::wstring path = PathOf(Records, target.key);
    ArchiveFiles::MakeFolder(path.substr(0, path.rfind(L'\\')));
    ArchiveFiles::WriteText(path, TemporaryFile(), text);
}

ArchiveFiles::Contents ArchiveFolder::Store(HANDLE source) const
{
    const ArchiveFiles::TemporaryFile temporary(TemporaryFile());
    ArchiveFiles::Contents contents = ArchiveFiles::Copy(source, temporary.Path());
    const auto isWhole = [&](const std::wstring& path) {
        const ArchiveFiles::UniqueHandle file = ArchiveFiles::Open(path, GENERIC_READ, FILE_SHARE_READ, OPEN_EXISTING);
        return file && ArchiveFiles::Read(file.get()).sha256 == contents.sha256;
    };
    if (!isWhole(temporary.Path()))
    {
        ThrowDamaged(L"The stored contents are not what was written");
    }

    // Equal contents are stored once. If the copy in the archive is damaged, the new one replaces it.
    const std::wstring path = PathOf(Versions, contents.sha256);
    if (!isWhole(path))
    {
        ArchiveFiles::MakeFolder(path.substr(0, path.rfind(L'\\')));
        ArchiveFiles::Replace(temporary.Path(), path);
    }
    return contents;
}

void ArchiveFolder::Fetch(const ArchiveVersion& version, const std::wstring& copy) const
{
    const ArchiveFiles::UniqueHandle source =
        ArchiveFiles::Open(PathOf(Versions, version.sha256), GENERIC_READ, FILE_SHARE_READ, OPEN_EXISTING);
    if (!source)
    {
        if (ArchiveFiles::IsMissing(GetLastError()))
        {
            ThrowDamaged(L"The version's contents are missing in the archive");
        }
        ArchiveFiles::ThrowLastError(L"The version's contents cannot be opened");
    }
    const ArchiveFiles::Contents contents = ArchiveFiles::Copy(source.get(), copy, version.lastWrite);
    if (contents.sha256 != version.sha256 || contents.size != version.size)
    {
        ThrowDamaged(L"The version's contents in the archive are damaged");
    }
}
