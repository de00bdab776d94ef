#include "OrvixFileEntry.h"

#include "AssignText.h"
#include "EntryFactory.h"

#include <memory>

namespace
{

/// //server/share becomes \\server/share. A path of just the two slashes stays: the bound is intended.
void ReplaceLeadingDoubleSlash(std::wstring& file)
{
    if (file.size() > 2 && file[0] == L'/' && file[1] == L'/')
    {
        file[0] = file[1] = L'\\';
    }
}

/// Appends what `make` gives; false with nothing changed when that is null or memory is exhausted.
template <typename Make>
bool AppendNew(std::vector<OrvixFileEntry*>& entries, Make&& make)
{
    return WithBarrier(false, [&] {
        std::unique_ptr<OrvixFileEntry> entry = make();
        if (!entry)
        {
            return false;
        }
        entries.push_back(entry.get());
        entry.release();
        return true;
    });
}

} // namespace

OrvixFileEntry::OrvixFileEntry() = default;

OrvixFileEntry::~OrvixFileEntry()
{
    OrvixFileEntry::RemoveAllAttachments();
}

const wchar_t* OrvixFileEntry::GetFile()
{
    return m_file.c_str();
}

void OrvixFileEntry::SetFile(const wchar_t* file)
{
    AssignText(m_file, file);
    ReplaceLeadingDoubleSlash(m_file);
}

unsigned long OrvixFileEntry::GetFlagsIn()
{
    return m_flagsIn;
}

void OrvixFileEntry::SetFlagsIn(unsigned long flags)
{
    m_flagsIn = flags;
}

long long OrvixFileEntry::GetClientPtr()
{
    return m_clientPtr;
}

void OrvixFileEntry::SetClientPtr(long long value)
{
    m_clientPtr = value;
}

unsigned long OrvixFileEntry::GetFlagsOut()
{
    return m_flagsOut;
}

void OrvixFileEntry::SetFlagsOut(unsigned long flags)
{
    m_flagsOut = flags;
}

unsigned int OrvixFileEntry::AddChild(OrvixFileEntry* child)
{
    if (child == nullptr)
    {
        return 0;
    }
    const bool added = WithBarrier(false, [&] {
        m_children.push_back(child);
        return true;
    });
    return added ? NumChildren() : 0;
}

unsigned int OrvixFileEntry::NumChildren()
{
    return static_cast<unsigned int>(m_children.size());
}

OrvixFileEntry* OrvixFileEntry::GetChild(unsigned int index)
{
    return index < m_children.size() ? m_children[index] : nullptr;
}

bool OrvixFileEntry::RemoveChild(unsigned int index)
{
    if (index >= m_children.size())
    {
        return false;
    }
    m_children.erase(m_children.begin() + index);
    return true;
}

bool OrvixFileEntry::RemoveAllChildren()
{
    m_children.clear();
    return true;
}

unsigned int OrvixFileEntry::AddAttachment(OrvixFileEntry* source)
{
    if (source == nullptr)
    {
        return 0;
    }
    return AppendNew(m_attachments, [&] { return CopyEntry(*source); }) ? NumAttachments() : 0;
}

unsigned int OrvixFileEntry::AddAttachment(const wchar_t* file, OrvixFileEntry* parent, unsigned long flagsIn,
                                           long long clientPtr)
{
    if (file == nullptr)
    {
        return 0;
    }
    return AppendNew(m_attachments, [&] { return MakeEntry(file, parent, flagsIn, clientPtr); }) ? NumAttachments() : 0;
}

unsigned int OrvixFileEntry::NumAttachments()
{
    return static_cast<unsigned int>(m_attachments.size());
}

OrvixFileEntry* OrvixFileEntry::GetAttachment(unsigned int index)
{
    return index < m_attachments.size() ? m_attachments[index] : nullptr;
}

bool OrvixFileEntry::RemoveAttachment(unsigned int index)
{
    if (index >= m_attachments.size())
    {
        return false;
    }
    delete m_attachments[index];
    m_attachments.erase(m_attachments.begin() + index);
    return true;
}

bool OrvixFileEntry::RemoveAllAttachments()
{
    for (OrvixFileEntry* attachment : m_attachments)
    {
        delete attachment;
    }
    m_attachments.clear();
    return true;
}

void OrvixFileEntry::SetParent(OrvixFileEntry* parent)
{
    m_parent = parent;
}

OrvixFileEntry* OrvixFileEntry::GetParent()
{
    return m_parent;
}
