#include "OrvixUserList.h"

#include "ExceptionBarrier.h"
#include "HostHeap.h"
#include "OrvixUserEntry.h"
#include "RecordState.h"

#include <algorithm>
#include <vector>

namespace
{

/// Stores a text. Throws std::bad_alloc when memory is exhausted.
void Store(OrvixUserEntry& entry, void (OrvixUserEntry::*set)(const wchar_t*), const wchar_t* (OrvixUserEntry::*get)(),
           const wchar_t* text)
{
    (entry.*set)(text);
    if (!IsStored(text, (entry.*get)()))
    {
        throw std::bad_alloc();
    }
}

/// Appends the entry. Throws std::bad_alloc with the list unchanged.
OrvixUserEntry* Append(std::vector<OrvixUserEntry*>& entries, std::unique_ptr<OrvixUserEntry> entry)
{
    entries.push_back(entry.get());
    return entry.release();
}

} // namespace

struct OrvixUserList::State
{
    std::vector<OrvixUserEntry*> entries;
};

OrvixUserList::OrvixUserList() = default;

OrvixUserList::~OrvixUserList()
{
    OrvixUserList::RemoveAll();
    delete m_state;
}

OrvixUserEntry* OrvixUserList::CreateEntry(OrvixUserEntry& source)
{
    return WithBarrier(static_cast<OrvixUserEntry*>(nullptr), [&] {
        auto entry = MakeOnHostHeap<OrvixUserEntry>();
        Store(*entry, &OrvixUserEntry::SetUserName, &OrvixUserEntry::GetUserNameW, source.GetUserNameW());
        Store(*entry, &OrvixUserEntry::SetFirstName, &OrvixUserEntry::GetFirstName, source.GetFirstName());
        Store(*entry, &OrvixUserEntry::SetLastName, &OrvixUserEntry::GetLastName, source.GetLastName());
        Store(*entry, &OrvixUserEntry::SetEmail, &OrvixUserEntry::GetEmail, source.GetEmail());
        return Append(StateOf(m_state).entries, std::move(entry));
    });
}

OrvixUserEntry* OrvixUserList::CreateEntry(const wchar_t* userName)
{
    if (userName == nullptr)
    {
        return nullptr;
    }
    return WithBarrier(static_cast<OrvixUserEntry*>(nullptr), [&] {
        auto entry = MakeOnHostHeap<OrvixUserEntry>();
        Store(*entry, &OrvixUserEntry::SetUserName, &OrvixUserEntry::GetUserNameW, userName);
        return Append(StateOf(m_state).entries, std::move(entry));
    });
}

bool OrvixUserList::RemoveEntry(unsigned int index)
{
    if (m_state == nullptr || index >= m_state->entries.size())
    {
        return false;
    }
    auto& entries = m_state->entries;
    delete entries[index];
    entries.erase(entries.begin() + index);
    return true;
}

bool OrvixUserList::RemoveEntry(OrvixUserEntry* entry)
{
    if (m_state == nullptr)
    {
        return false;
    }
    const auto& entries = m_state->entries;
    const auto found = std::find(entries.begin(), entries.end(), entry);
    return found != entries.end() && RemoveEntry(static_cast<unsigned int>(found - entries.begin()));
}

unsigned int OrvixUserList::NumEntries()
{
    return m_state != nullptr ? static_cast<unsigned int>(m_state->entries.size()) : 0;
}

bool OrvixUserList::RemoveAll()
{
    if (m_state != nullptr)
    {
        for (OrvixUserEntry* entry : m_state->entries)
        {
            delete entry;
        }
        m_state->entries.clear();
    }
    return true;
}

OrvixUserEntry* OrvixUserList::GetUserEntry(unsigned int index)
{
    return m_state != nullptr && index < m_state->entries.size() ? m_state->entries[index] : nullptr;
}
