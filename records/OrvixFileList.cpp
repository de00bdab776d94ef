#include "OrvixFileList.h"

#include "ActiveSequence.h"
#include "EntryFactory.h"
#include "ExceptionBarrier.h"
#include "RecordState.h"

#include <algorithm>
#include <utility>
#include <vector>

namespace
{

/// One step on the path down a tree: an entry and the child to look at next.
struct TreeStep
{
    OrvixFileEntry* entry;
    unsigned int nextChild;
};

/// Appends to the active list, children before their parents, what the mask selects in the tree below `root`.
/// The path down is kept on the heap: a tree may be deeper than the stack.
void AppendTree(OrvixFileEntry* root, unsigned long mask, std::vector<TreeStep>& path, ActiveSequence& active)
{
    path.push_back({root, 0});
    while (!path.empty())
    {
        TreeStep& step = path.back();
        OrvixFileEntry* entry = step.entry;
        if (step.nextChild < entry->NumChildren())
        {
            if (OrvixFileEntry* child = entry->GetChild(step.nextChild++))
            {
                path.push_back({child, 0});
            }
            continue;
        }
        if (entry->GetFlagsIn() & mask)
        {
            active.Append(entry);
        }
        path.pop_back();
    }
}

/// Removes the first occurrence of `target` from every sequence of children below `root`; the siblings after it are
/// not visited.
void DetachFromTree(OrvixFileEntry* root, OrvixFileEntry* target, std::vector<TreeStep>& path)
{
    path.push_back({root, 0});
    while (!path.empty())
    {
        TreeStep& step = path.back();
        if (step.nextChild >= step.entry->NumChildren())
        {
            path.pop_back();
            continue;
        }
        const unsigned int position = step.nextChild++;
        OrvixFileEntry* child = step.entry->GetChild(position);
        if (child == target)
        {
            step.entry->RemoveChild(position);
            path.pop_back();
        }
        else if (child != nullptr)
        {
            path.push_back({child, 0});
        }
    }
}

/// Puts the entry into the list's sequences and under its parent; null with nothing changed when the parent cannot take
/// it. Throws std::bad_alloc with nothing changed.
OrvixFileEntry* Append(std::vector<OrvixFileEntry*>& entries, std::vector<OrvixFileEntry*>& roots,
                       std::unique_ptr<OrvixFileEntry> entry)
{
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

struct OrvixFileList::State
{
    std::vector<OrvixFileEntry*> entries;
    std::vector<OrvixFileEntry*> roots;
    ActiveSequence active;
};

OrvixFileList::OrvixFileList() = default;

OrvixFileList::~OrvixFileList()
{
    OrvixFileList::RemoveAll();
    delete m_state;
}

OrvixFileEntry* OrvixFileList::CreateEntry(OrvixFileEntry& source)
{
    return WithBarrier(static_cast<OrvixFileEntry*>(nullptr), [&]() -> OrvixFileEntry* {
        auto copy = CopyEntry(source);
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
        return Append(StateOf(m_state).entries, StateOf(m_state).roots, std::move(copy));
    });
}

OrvixFileEntry* OrvixFileList::CreateEntry(const wchar_t* file, OrvixFileEntry* parent, unsigned long flagsIn,
                                           long long clientPtr)
{
    if (file == nullptr)
    {
        return nullptr;
    }
    return WithBarrier(static_cast<OrvixFileEntry*>(nullptr), [&] {
        return Append(StateOf(m_state).entries, StateOf(m_state).roots, MakeEntry(file, parent, flagsIn, clientPtr));
    });
}

bool OrvixFileList::RemoveEntry(unsigned int index)
{
    if (m_state == nullptr || index >= m_state->entries.size())
    {
        return false;
    }
    OrvixFileEntry* entry = m_state->entries[index];
    const bool detached = Completes([&] {
        auto& roots = m_state->roots;
        const auto root = std::find(roots.begin(), roots.end(), entry);
        if (root != roots.end())
        {
            roots.erase(root);
        }
        std::vector<TreeStep> path;
        for (OrvixFileEntry* remaining : roots)
        {
            DetachFromTree(remaining, entry, path);
        }
    });
    if (!detached)
    {
        return false;
    }
    RemoveActiveEntry(entry);
    delete entry;
    m_state->entries.erase(m_state->entries.begin() + index);
    return true;
}

bool OrvixFileList::RemoveEntry(OrvixFileEntry* entry)
{
    if (m_state != nullptr)
    {
        const auto& entries = m_state->entries;
        const auto found = std::find(entries.begin(), entries.end(), entry);
        if (found != entries.end())
        {
            return RemoveEntry(static_cast<unsigned int>(found - entries.begin()));
        }
    }
    return RemoveEntry(NumEntries());
}

unsigned int OrvixFileList::NumEntries()
{
    return m_state != nullptr ? static_cast<unsigned int>(m_state->entries.size()) : 0;
}

bool OrvixFileList::RemoveAll()
{
    if (m_state != nullptr)
    {
        for (OrvixFileEntry* entry : m_state->entries)
        {
            delete entry;
        }
        m_state->entries.clear();
        m_state->roots.clear();
        m_state->active.Clear();
    }
    return true;
}

OrvixFileEntry* OrvixFileList::GetFileEntry(unsigned int index)
{
    return m_state != nullptr && index < m_state->entries.size() ? m_state->entries[index] : nullptr;
}

unsigned int OrvixFileList::BuildActiveList(unsigned long mask, bool fromRoots)
{
    const bool built = Completes([&] {
        ActiveSequence& active = StateOf(m_state).active;
        active.Clear();
        active.Reserve(std::max(NumEntries(), 1U));
        if (fromRoots)
        {
            std::vector<TreeStep> path;
            for (unsigned int i = 0; i < NumRootEntries(); ++i)
            {
                if (OrvixFileEntry* root = GetRootEntry(i))
                {
                    AppendTree(root, mask, path, active);
                }
            }
            return;
        }
        for (unsigned int i = 0; i < NumEntries(); ++i)
        {
            OrvixFileEntry* entry = GetFileEntry(i);
            if (entry != nullptr && (entry->GetFlagsIn() & mask) != 0)
            {
                active.AppendDistinct(entry);
            }
        }
    });
    if (!built && m_state != nullptr)
    {
        m_state->active.Clear();
    }
    return NumActiveEntries();
}

unsigned int OrvixFileList::AddActiveEntry(OrvixFileEntry* entry)
{
    if (entry != nullptr)
    {
        Completes([&] { StateOf(m_state).active.Append(entry); });
    }
    return NumActiveEntries();
}

bool OrvixFileList::RemoveActiveEntry(OrvixFileEntry* entry)
{
    return m_state != nullptr && m_state->active.Remove(entry);
}

unsigned int OrvixFileList::NumActiveEntries()
{
    return m_state != nullptr ? static_cast<unsigned int>(m_state->active.Size()) : 0;
}

OrvixFileEntry* OrvixFileList::GetActiveFileEntry(unsigned int index)
{
    return m_state != nullptr && index < m_state->active.Size() ? m_state->active.At(index) : nullptr;
}

unsigned int OrvixFileList::NumRootEntries()
{
    return m_state != nullptr ? static_cast<unsigned int>(m_state->roots.size()) : 0;
}

OrvixFileEntry* OrvixFileList::GetRootEntry(unsigned int index)
{
    return m_state != nullptr && index < m_state->roots.size() ? m_state->roots[index] : nullptr;
}
