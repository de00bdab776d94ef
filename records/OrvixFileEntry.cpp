#include "OrvixFileEntry.h"

#include "EntryFactory.h"
#include "EntryLinks.h"
#include "ExceptionBarrier.h"

#include <cwchar>
#include <utility>

namespace
{

/// //server/share becomes \\server/share. A path of just the two slashes stays as it is, as the interface promises.
void ReplaceLeadingDoubleSlash(wchar_t* file)
{
    if (file[0] == L'/' && file[1] == L'/' && file[2] != L'\0')
    {
        file[0] = file[1] = L'\\';
    }
}

/// Appends the new entry that `make` gives; false with nothing changed when memory is exhausted.
template <typename Make>
bool AppendNew(EntryLinks links, const Make& make)
{
    return Completes([&] {
        auto entry = make();
        links.Append(entry.get());
        entry.release();
    });
}

} // namespace

OrvixFileEntry::OrvixFileEntry() = default;

OrvixFileEntry::~OrvixFileEntry()
{
    OrvixFileEntry::RemoveAllAttachments();
    delete[] m_attachments;
    delete[] m_children;
    delete[] m_file;
}

const wchar_t* OrvixFileEntry::GetFile()
{
    return m_file != nullptr ? m_file : L"";
}

void OrvixFileEntry::SetFile(const wchar_t* file)
{
    if (file == nullptr)
    {
        return;
    }
    const std::size_t size = std::wcslen(file) + 1;
    Completes([&] {
        auto* copy = new wchar_t[size];
        std::wmemcpy(copy, file, size);
        ReplaceLeadingDoubleSlash(copy);
        delete[] std::exchange(m_file, copy);
    });
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
    const bool added = Completes([&] { EntryLinks(m_children, m_numChildren, m_childCapacity).Append(child); });
    return added ? NumChildren() : 0;
}

unsigned int OrvixFileEntry::NumChildren()
{
    return m_numChildren;
}

OrvixFileEntry* OrvixFileEntry::GetChild(unsigned int index)
{
    return index < m_numChildren ? m_children[index] : nullptr;
}

bool OrvixFileEntry::RemoveChild(unsigned int index)
{
    if (index >= m_numChildren)
    {
        return false;
    }
    EntryLinks(m_children, m_numChildren, m_childCapacity).Remove(index);
    return true;
}

bool OrvixFileEntry::RemoveAllChildren()
{
    m_numChildren = 0;
    return true;
}

unsigned int OrvixFileEntry::AddAttachment(OrvixFileEntry* source)
{
    if (source == nullptr)
    {
        return 0;
    }
    const EntryLinks links(m_attachments, m_numAttachments, m_attachmentCapacity);
    return AppendNew(links, [&] { return CopyEntry(*source); }) ? NumAttachments() : 0;
}

unsigned int OrvixFileEntry::AddAttachment(const wchar_t* file, OrvixFileEntry* parent, unsigned long flagsIn,
                                           long long clientPtr)
{
    if (file == nullptr)
    {
        return 0;
    }
    const EntryLinks links(m_attachments, m_numAttachments, m_attachmentCapacity);
    return AppendNew(links, [&] { return MakeEntry(file, parent, flagsIn, clientPtr); }) ? NumAttachments() : 0;
}

unsigned int OrvixFileEntry::NumAttachments()
{
    return m_numAttachments;
}

OrvixFileEntry* OrvixFileEntry::GetAttachment(unsigned int index)
{
    return index < m_numAttachments ? m_attachments[index] : nullptr;
}

bool OrvixFileEntry::RemoveAttachment(unsigned int index)
{
    if (index >= m_numAttachments)
    {
        return false;
    }
    delete m_attachments[index];
    EntryLinks(m_attachments, m_numAttachments, m_attachmentCapacity).Remove(index);
    return true;
}

bool OrvixFileEntry::RemoveAllAttachments()
{
    for (unsigned int i = 0; i < m_numAttachments; ++i)
    {
        delete m_attachments[i];
    }
    m_numAttachments = 0;
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
