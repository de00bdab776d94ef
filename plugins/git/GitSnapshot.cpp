#include "GitSnapshot.h"

#include "GitText.h"

GitSnapshot::GitSnapshot(std::string_view status, std::shared_ptr<const std::string> tracked)
    : m_status(GitStatus::Read(status)), m_tracked(std::move(tracked))
{
    const std::vector<std::string_view> paths = GitText::Split(*m_tracked, '\0');
    m_items.reserve(paths.size() + m_status.files.size());
    for (const std::string_view path : paths)
    {
        m_items[path].isTracked = true;
    }
    for (const GitStatus::File& file : m_status.files)
    {
        Item& item = m_items[file.path];
        // A file that is deleted in the index and still on the disk comes twice; the first one is the change.
        if (item.changed == nullptr)
        {
            item.changed = &file;
        }
        item.isTracked |= file.kind != GitStatus::File::Kind::Untracked;
    }
}

const GitSnapshot::Entry* GitSnapshot::Find(const std::string& path) const
{
    if (const auto exact = m_items.find(path); exact != m_items.end())
    {
        return &*exact;
    }
    if (m_folded.empty())
    {
        for (const Entry& entry : m_items)
        {
            m_folded.emplace(GitText::Fold(GitText::FromUtf8(entry.first)), &entry);
        }
    }
    const auto alike = m_folded.find(GitText::Fold(GitText::FromUtf8(path)));
    return alike != m_folded.end() ? alike->second : nullptr;
}

void GitSnapshot::SetOutOfDate(std::string printed)
{
    m_upstreamChanges = std::move(printed);
    for (const std::string_view path : GitText::Split(m_upstreamChanges, '\0'))
    {
        m_outOfDate.insert(path);
    }
}
