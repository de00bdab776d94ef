#include "OrvixUserList.h"

#include "AssignText.h"
#include "ExceptionBarrier.h"
#include "OrvixUserEntry.h"

#include <algorithm>
#include <memory>

namespace
{

/// Appends the entry; null with the list unchanged when `entry` is null or memory is exhausted.
OrvixUserEntry* Append(std::vector<OrvixUserEntry*>& entries, std::unique_ptr<OrvixUserEntry> entry)
{
    return WithBarrier(static_cast<OrvixUserEntry*>(nullptr), [&] {
        if (entry)
        {
            entries.push_back(entry.get());
        }
        return entry.release();
    });
}

} // namespace

OrvixUserList::OrvixUserList() = default;

OrvixUserList::~OrvixUserList()
{
    OrvixUserList::RemoveAll();
}

OrvixUserEntry* OrvixUserList::CreateEntry(OrvixUserEntry& source)
{
    std::unique_ptr<OrvixUserEntry> entry(new OrvixUserEntry);
    if (!entry)
    {
        return nullptr;
    }
    const wchar_t* userName = source.GetUserNameW();
    entry->SetUserName(userName);
    const wchar_t* firstName = source.GetFirstName();
    entry->SetFirstName(firstName);
    const wchar_t* lastName = source.GetLastName();
    entry->SetLastName(lastName);
    const wchar_t* email = source.GetEmail();
    entry->SetEmail(email);
    if (!IsStored(userName, entry->GetUserNameW()) || !IsStored(firstName, entry->GetFirstName()) ||
        !IsStored(lastName, entry->GetLastName()) || !IsStored(email, entry->GetEmail()))
    {
        return nullptr;
    }
    return Append(m_entries, std::move(entry));
}

OrvixUserEntry* OrvixUserList::CreateEntry(const wchar_t* userName)
{
    if (userName == nullptr)
    {
        return nullptr;
    }
    std::unique_ptr<OrvixUserEntry> entry(new OrvixUserEntry);
    if (!entry)
    {
        return nullptr;
    }
    entry->SetUserName(userName);
    if (!IsStored(userName, entry->GetUserNameW()))
    {
        return nullptr;
    }
    return Append(m_entries, std::move(entry));
}

bool OrvixUserList::RemoveEntry(unsigned int index)
{
    if (index >= m_entries.size())
    {
        return false;
    }
    delete m_entries[index];
    m_entries.erase(m_entries.begin() + index);
    return true;
}

bool OrvixUserList::RemoveEntry(OrvixUserEntry* entry)
{
    const auto found = std::find(m_entries.begin(), m_entries.end(), entry);
    if (found == m_entries.end())
    {
        return false;
    }
    return RemoveEntry(static_cast<unsigned int>(found - m_entries.begin()));
}

unsigned int OrvixUserList::NumEntries()
{
    return static_cast<unsigned int>(m_entries.size());
}

bool OrvixUserList::RemoveAll()
{
    for (OrvixUserEntry* entry : m_entries)
    {
        delete entry;
    }
    m_entries.clear();
    return true;
}

OrvixUserEntry* OrvixUserList::GetUserEntry(unsigned int index)
{
    return index < m_entries.size() ? m_entries[index] : nullptr;
}
