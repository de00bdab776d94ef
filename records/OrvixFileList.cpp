#include "OrvixFileList.h"

#include "EntryFactory.h"
#include "ExceptionBarrier.h"

#include <algorithm>

namespace
{

/// One step on the way down a tree: an entry and the child to look at next.
struct TreeStep
{
    OrvixFileEntry* entry;
    unsigned int nextChild;
};

/// Appends to the active list, children before their parents, what the mask selects in the tree below `root`.
/// The way down is kept on the heap: a tree may be deeper than the stack.
void AppendTree(OrvixFileEntry* root, unsigned long mask, std::vector<TreeStep>& way, OrvixActiveSequence& active)
{
    way.push_back({root, 0});
    while (!way.empty())
    {
        TreeStep& step = way.back();
        OrvixFileEntry* entry = step.entry;
        if (step.nextChild < entry->NumChildren())
        {
            if (OrvixFileEntry* child = entry->GetChild(step.nextChild++))
            {
                way.push_back({child, 0});
            }
            continue;
        }
        if (entry->GetFlagsIn() & mask)
        {
            active.Append(entry);
        }
        way.pop_back();
    }
}

/// Removes the first occurrence of `target` from every sequence of children below `root`; the siblings behind
/// it are not visited.
void DetachFromTree(OrvixFileEntry* root, OrvixFileEntry* target, std::vector<TreeStep>& way)
{
    way.push_back({root, 0});
    while (!way.empty())
    {
        TreeStep& step = way.back();
        if (step.nextChild >= step.entry->NumChildren())
        {
            way.pop_back();
            continue;
        }
        const unsigned int position = step.nextChild++;
        OrvixFileEntry* child = step.entry->GetChild(position);
        if (child == target)
        {
            step.entry->RemoveChild(position);
            way.pop_back();
        }
        else if (child != nullptr)
        {
            way.push_back({child, 0});
        }
    }
}

/// Puts the entry into the list's sequences and under its parent; null with nothing changed when `entry` is
/// null or memory is exhausted.
OrvixFileEntry* Append(std::vector<OrvixFileEntry*>& entries, std::vector<OrvixFileEntry*>& roots,
                       std::unique_ptr<OrvixFileEntry> entry)
{
    if (!entry)
    {
        return nullptr;
    }
    entries.push_back(entry.get());
    const bool linked = WithBarrier(false, [&] {
        if (OrvixFileEntry* parent = entry->GetParent())
        {
            return parent->AddChild(entry.get()) != 0;
        }
        roots.push_back(entry.get());
        return true;
    });
    if (!linked)
    {
        entries.pop_back();
        return nullptr;
    }
    return entry.release();
}

} // namespace

OrvixFileList::OrvixFileList() = default;

OrvixFileList::~OrvixFileList()
{
    OrvixFileList::RemoveAll();
}

OrvixFileEntry* OrvixFileList::CreateEntry(OrvixFileEntry& source)
{
    return WithBarrier(static_cast<OrvixFileEntry*>(nullptr), [&]() -> OrvixFileEntry* {
        auto copy = CopyEntry(source);
        if (!copy)
        {
            return nullptr;
        }
        for (unsigned int i = 0; i < source.NumChildren(); ++i)
        {
            OrvixFileEntry* child = source.GetChild(i);
            if (child != nullptr && copy->AddChild(child) == 0)
            {
                return nullptr;
            }
        }
        for (unsigned int i = 0; i < source.NumAttachments(); ++i)
        {
            OrvixFileEntry* attachment = source.GetAttachment(i);
            if (attachment != nullptr && copy->AddAttachment(attachment) == 0)
            {
                return nullptr;
            }
        }
        return Append(m_entries, m_roots, std::move(copy));
    });
}

OrvixFileEntry* OrvixFileList::CreateEntry(const wchar_t* file, OrvixFileEntry* parent, unsigned long flagsIn,
                                           long long clientPtr)
{
    if (file == nullptr)
    {
        return nullptr;
    }
    return WithBarrier(static_cast<OrvixFileEntry*>(nullptr),
                       [&] { return Append(m_entries, m_roots, MakeEntry(file, parent, flagsIn, clientPtr)); });
}

bool OrvixFileList::RemoveEntry(unsigned int index)
{
    if (index >= m_entries.size())
    {
        return false;
    }
    OrvixFileEntry* entry = m_entries[index];
    const bool detached = WithBarrier(false, [&] {
        const auto root = std::find(m_roots.begin(), m_roots.end(), entry);
        if (root != m_roots.end())
        {
            m_roots.erase(root);
        }
        std::vector<TreeStep> way;
        for (OrvixFileEntry* remaining : m_roots)
        {
            DetachFromTree(remaining, entry, way);
        }
        return true;
    });
    if (!detached)
    {
        return false;
    }
    RemoveActiveEntry(entry);
    delete entry;
    m_entries.erase(m_entries.begin() + index);
    return true;
}

bool OrvixFileList::RemoveEntry(OrvixFileEntry* entry)
{
    const auto found = std::find(m_entries.begin(), m_entries.end(), entry);
    return RemoveEntry(found == m_entries.end() ? NumEntries() : static_cast<unsigned int>(found - m_entries.begin()));
}

unsigned int OrvixFileList::NumEntries()
{
    return static_cast<unsigned int>(m_entries.size());
}

bool OrvixFileList::RemoveAll()
{
    for (OrvixFileEntry* entry : m_entries)
    {
        delete entry;
    }
    m_entries.clear();
    m_roots.clear();
    m_active.Clear();
    return true;
}

OrvixFileEntry* OrvixFileList::GetFileEntry(unsigned int index)
{
    return index < m_entries.size() ? m_entries[index] : nullptr;
}

unsigned int OrvixFileList::BuildActiveList(unsigned long mask, bool fromRoots)
{
    m_active.Clear();
    const bool built = WithBarrier(false, [&] {
        m_active.Reserve(std::max(NumEntries(), 1U));
        if (fromRoots)
        {
            std::vector<TreeStep> way;
            for (unsigned int i = 0; i < NumRootEntries(); ++i)
            {
                if (OrvixFileEntry* root = GetRootEntry(i))
                {
                    AppendTree(root, mask, way, m_active);
                }
            }
            return true;
        }
        for (unsigned int i = 0; i < NumEntries(); ++i)
        {
            OrvixFileEntry* entry = GetFileEntry(i);
            if (entry != nullptr && (entry->GetFlagsIn() & mask))
            {
                m_active.AppendDistinct(entry);
            }
        }
        return true;
    });
    if (!built)
    {
        m_active.Clear();
    }
    return NumActiveEntries();
}

unsigned int OrvixFileList::AddActiveEntry(OrvixFileEntry* entry)
{
    if (entry != nullptr)
    {
        WithBarrier(false, [&] {
            m_active.Append(entry);
            return true;
        });
    }
    return NumActiveEntries();
}

bool OrvixFileList::RemoveActiveEntry(OrvixFileEntry* entry)
{
    return m_active.Remove(entry);
}

unsigned int OrvixFileList::NumActiveEntries()
{
    return static_cast<unsigned int>(m_active.Size());
}

OrvixFileEntry* OrvixFileList::GetActiveFileEntry(unsigned int index)
{
    return index < m_active.Size() ? m_active.At(index) : nullptr;
}

unsigned int OrvixFileList::NumRootEntries()
{
    return static_cast<unsigned int>(m_roots.size());
}

OrvixFileEntry* OrvixFileList::GetRootEntry(unsigned int index)
{
    return index < m_roots.size() ? m_roots[index] : nullptr;
}
