#include "OrvixFileList.h"

#include "ActiveSequence.h"
#include "EntryFactory.h"
#include "EntryLinks.h"
#include "ExceptionBarrier.h"
#include "RecordState.h"
#include "TreeWalk.h"

#include <algorithm>
#include <cstdint>
#include <utility>
#include <vector>

namespace
{

/// Makes room for one more element. Throws std::bad_alloc with nothing changed.
void ReserveOne(std::vector<OrvixFileEntry*>& entries)
{
    if (entries.size() == entries.capacity())
    {
        entries.reserve(std::max<std::size_t>(2 * entries.size(), 8));
    }
}

/// Tells whether an entry is still there after a host's code has run. Those of a list form a chain, innermost first.
/// An address says nothing, since a new entry may have that of a deleted one.
class Watch
{
public:
    Watch(Watch*& innermost, const OrvixFileEntry* entry) : m_innermost(innermost), m_outer(innermost), m_entry(entry)
    {
        innermost = this;
    }
    Watch(const Watch&) = delete;
    Watch& operator=(const Watch&) = delete;
    ~Watch() { m_innermost = m_outer; }

    bool IsThere() const { return m_entry != nullptr; }
    Watch* Outer() const { return m_outer; }

    /// Called before an entry is deleted, or all are (null).
    void Forget(const OrvixFileEntry* entry)
    {
        if (entry == nullptr || entry == m_entry)
        {
            m_entry = nullptr;
        }
    }

private:
    Watch*& m_innermost;
    Watch* m_outer;
    const OrvixFileEntry* m_entry;
};

} // namespace

struct OrvixFileList::State
{
    /// A number for the next walk. Those of two lists differ, as their addresses do.
    unsigned long long NextWalk()
    {
        constexpr unsigned int CounterBits = 16;
        walks += 2;
        return (static_cast<unsigned long long>(reinterpret_cast<std::uintptr_t>(this)) << CounterBits) + walks;
    }

    /// Where the entry is, which usually is at `index`; the end when the list does not hold it.
    std::vector<OrvixFileEntry*>::iterator Find(const OrvixFileEntry* entry, std::size_t index)
    {
        if (index < entries.size() && entries[index] == entry)
        {
            return entries.begin() + static_cast<std::ptrdiff_t>(index);
        }
        return std::find(entries.begin(), entries.end(), entry);
    }

    bool Holds(const OrvixFileEntry* entry, std::size_t index) { return Find(entry, index) != entries.end(); }

    /// Takes a new entry into the list and under its parent. Throws std::bad_alloc with nothing changed. Null when the
    /// parent's own code has removed the entry again.
    OrvixFileEntry* Append(std::unique_ptr<OrvixFileEntry> made)
    {
        OrvixFileEntry* parent = made->GetParent();
        ReserveOne(entries);
        if (parent == nullptr)
        {
            ReserveOne(roots);
        }
        else
        {
            EntryLinks(parent->m_children, parent->m_numChildren, parent->m_childCapacity).Reserve();
        }

        // From here on nothing runs out of memory.
        OrvixFileEntry* entry = made.release();
        entries.push_back(entry);
        if (parent == nullptr)
        {
            roots.push_back(entry);
            return entry;
        }
        const Watch watch(watches, entry);
        Completes([&] { parent->AddChild(entry); }); // its result is the parent's own affair
        return watch.IsThere() ? entry : nullptr;
    }

    /// Before an entry is deleted, or all are (null).
    void Forget(const OrvixFileEntry* entry)
    {
        for (Watch* watch = watches; watch != nullptr; watch = watch->Outer())
        {
            watch->Forget(entry);
        }
        for (TreeWalk* walk = innermostWalk; walk != nullptr; walk = walk->Outer())
        {
            walk->Forget(entry);
        }
    }

    std::vector<OrvixFileEntry*> entries;
    std::vector<OrvixFileEntry*> roots;
    ActiveSequence active;
    TreeWalk* innermostWalk = nullptr;
    unsigned int walks = 0;
    Watch* watches = nullptr; ///< the innermost one
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
        return StateOf(m_state).Append(std::move(copy));
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
                       [&] { return StateOf(m_state).Append(MakeEntry(file, parent, flagsIn, clientPtr)); });
}

bool OrvixFileList::RemoveEntry(unsigned int index)
{
    if (index >= NumEntries())
    {
        return false;
    }
    OrvixFileEntry* entry = GetFileEntry(index);
    if (m_state == nullptr || !m_state->Holds(entry, index))
    {
        return false;
    }
    State& state = *m_state;
    const Watch watch(state.watches, entry);
    const auto root = std::find(state.roots.begin(), state.roots.end(), entry);
    if (root != state.roots.end())
    {
        state.roots.erase(root);
    }
    const bool detached = Completes([&] {
        TreeWalk walk(state.innermostWalk, state.NextWalk());
        for (unsigned int i = 0; i < NumRootEntries() && watch.IsThere(); ++i)
        {
            if (OrvixFileEntry* remaining = GetRootEntry(i))
            {
                walk.Detach(remaining, entry);
            }
        }
    });
    if (!detached)
    {
        return false;
    }
    if (watch.IsThere())
    {
        RemoveActiveEntry(entry);
    }
    if (watch.IsThere())
    {
        state.Forget(entry);
        state.entries.erase(state.Find(entry, index));
        delete entry;
    }
    return true;
}

bool OrvixFileList::RemoveEntry(OrvixFileEntry* entry)
{
    if (m_state != nullptr)
    {
        const auto found = m_state->Find(entry, 0);
        if (found != m_state->entries.end())
        {
            return RemoveEntry(static_cast<unsigned int>(found - m_state->entries.begin()));
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
        m_state->Forget(nullptr);
        m_state->roots.clear();
        m_state->active.Clear();
        for (OrvixFileEntry* entry : m_state->entries)
        {
            delete entry;
        }
        m_state->entries.clear();
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
        State& state = StateOf(m_state);
        ActiveSequence& active = state.active;
        active.Clear();
        active.Reserve(std::max(NumEntries(), 1U));
        const unsigned int fill = active.Fill();
        // An entry's own code may have filled the sequence anew meanwhile.
        const auto append = [&](OrvixFileEntry* entry, bool isNew) {
            isNew&& active.Fill() == fill ? active.AppendDistinct(entry) : active.Append(entry);
        };
        const auto isSelected = [mask](OrvixFileEntry* entry) { return (entry->GetFlagsIn() & mask) != 0; };
        if (fromRoots)
        {
            TreeWalk walk(state.innermostWalk, state.NextWalk());
            for (unsigned int i = 0; i < NumRootEntries(); ++i)
            {
                if (OrvixFileEntry* root = GetRootEntry(i))
                {
                    walk.PostOrder(root, isSelected,
                                   [&](OrvixFileEntry* entry) { append(entry, !walk.HasRepetition()); });
                }
            }
            return;
        }
        for (unsigned int i = 0; i < NumEntries(); ++i)
        {
            OrvixFileEntry* entry = GetFileEntry(i);
            if (entry != nullptr && isSelected(entry))
            {
                // The list's own entries do not repeat; those that a derived list gives may.
                append(entry, i < state.entries.size() && state.entries[i] == entry);
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
