#pragma once

#include "BraeHeapOperators.h"
#include "OrvixExport.h"

/// One file: its path, its flags, its place in a tree of files, and its attachments (secondary files that
/// belong to it).
///
/// Created by an `OrvixFileList` (which then owns it), by an entry as an attachment (which then owns it),
/// or by the host. An entry never owns its children or its parent. Indexes run from 0; a getter given an
/// index out of range returns null. All operations: [library, main-thread].
class ORVIX_API OrvixFileEntry : public BraeHeapOperators
{
public:
    /// Makes an entry without a path, flags and links; allocates nothing.
    OrvixFileEntry();
    OrvixFileEntry(const OrvixFileEntry&) = delete;
    OrvixFileEntry& operator=(const OrvixFileEntry&) = delete;

    /// Deletes the attachments; leaves the children alone.
    virtual ~OrvixFileEntry();

    /// The path; never null, empty by default, of any length. Valid until it is set again.
    virtual const wchar_t* GetFile();

    /// Copies the path; null leaves the old one, and so does exhausted memory. A path longer than two characters
    /// that starts with two forward slashes gets two backslashes in their place; nothing else is changed.
    virtual void SetFile(const wchar_t* file);

    /// Flags set by the host, on which `OrvixFileList::BuildActiveList` selects; 0 by default.
    /// `OrvixFileSelection::Selected` is set by `IOrvixServices::RunFileListOperation` on the entries that fit.
    virtual unsigned long GetFlagsIn();
    /// Sets the host's flags; every value is stored as it is.
    virtual void SetFlagsIn(unsigned long flags);

    /// A value that the host keeps with the entry; never interpreted, 0 by default.
    virtual long long GetClientPtr();
    /// Sets the host's value.
    virtual void SetClientPtr(long long value);

    /// State flags written by a provider (see `IOrvixProvider::QueryStatus`); 0 by default. The file-list dialog
    /// overwrites `OrvixFileSelection::Confirmed` with the user's choice.
    virtual unsigned long GetFlagsOut();
    /// Sets the state flags; every value is stored as it is.
    virtual void SetFlagsOut(unsigned long flags);

    /// Appends a child, which is not owned; its parent link is not touched and duplicates are not looked for. A list
    /// does not follow links that form a cycle; a host that walks the tree itself would not end. Returns
    /// `NumChildren()`, or 0 with nothing changed for null and when memory runs out.
    virtual unsigned int AddChild(OrvixFileEntry* child);

    /// Number of children.
    virtual unsigned int NumChildren();

    /// The child at `index`, not owned; null for an index out of range.
    virtual OrvixFileEntry* GetChild(unsigned int index);

    /// Unlinks a child without deleting it or touching its parent link; false for an index out of range.
    virtual bool RemoveChild(unsigned int index);

    /// Unlinks every child; always true.
    virtual bool RemoveAllChildren();

    ORVIX_OVERLOADS_IN_SLOT_ORDER(
        /// Appends an attachment, a new entry that this entry owns: a copy of `source`'s path, flags, client
        /// value and parent link, not of its children and attachments. Returns `NumAttachments()`, or 0 with
        /// nothing changed when `source` is null or memory runs out.
        virtual unsigned int AddAttachment(OrvixFileEntry* source),
        /// Appends an attachment made from a path and values. `parent` is stored as given; this entry does not
        /// become the attachment's parent. Returns `NumAttachments()`, or 0 with nothing changed when `file` is
        /// null or memory runs out.
        virtual unsigned int AddAttachment(const wchar_t* file, OrvixFileEntry* parent, unsigned long flagsIn,
                                           long long clientPtr));

    /// Number of attachments.
    virtual unsigned int NumAttachments();

    /// The attachment at `index`, owned by this entry and valid until it is removed; null for an index out of range.
    virtual OrvixFileEntry* GetAttachment(unsigned int index);

    /// Deletes one attachment; false for an index out of range.
    virtual bool RemoveAttachment(unsigned int index);

    /// Deletes every attachment; always true.
    virtual bool RemoveAllAttachments();

    /// Sets the parent link, which is not owned; null for none. The parent's children do not change.
    virtual void SetParent(OrvixFileEntry* parent);

    /// The parent link; null by default.
    virtual OrvixFileEntry* GetParent();

private:
    friend class OrvixFileList; // makes room for a child before it changes anything
    friend class TreeWalk;      // marks the entries that it has reached

    // Plain members of fixed size, so that host and library agree about every object. Null: empty.
    wchar_t* m_file = nullptr;
    unsigned long m_flagsIn = 0;
    unsigned long m_flagsOut = 0;
    unsigned long long m_walkMark = 0;
    long long m_clientPtr = 0;
    OrvixFileEntry** m_children = nullptr;
    unsigned int m_numChildren = 0;
    unsigned int m_childCapacity = 0;
    OrvixFileEntry* m_parent = nullptr;
    OrvixFileEntry** m_attachments = nullptr;
    unsigned int m_numAttachments = 0;
    unsigned int m_attachmentCapacity = 0;
};

static_assert(sizeof(OrvixFileEntry) == 80, "host and library must agree about the size of a record");
