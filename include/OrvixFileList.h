#pragma once

#include "BraeHeapOperators.h"
#include "OrvixExport.h"

class OrvixFileEntry;

/// The files of an operation: the entries that this list created and owns, the roots among them, and the
/// active list, the subset on which the next operation works.
///
/// Created and owned by the host. Indexes run from 0; a getter given an index out of range returns null.
/// Entries are valid until they are removed or the list is destroyed. All operations: [library, main-thread].
class ORVIX_API OrvixFileList : public BraeHeapOperators
{
public:
    /// Makes an empty list; allocates nothing.
    OrvixFileList();
    OrvixFileList(const OrvixFileList&) = delete;
    OrvixFileList& operator=(const OrvixFileList&) = delete;

    /// Deletes every entry that the list created.
    virtual ~OrvixFileList();

    ORVIX_OVERLOADS_IN_SLOT_ORDER(
        /// Appends a copy of an entry; the list owns it. Copies path, flags, client value and parent link, and the
        /// attachments one level deep. The children are shared: the same objects, whose parent links still name
        /// the source. The copy is added to the children of the source's parent, or to the roots when there is
        /// none. Returns the copy; null with the list unchanged when memory runs out. The result of the parent's
        /// `AddChild` is not looked at. Null, too, when the parent's own code has removed the copy again.
        virtual OrvixFileEntry* CreateEntry(OrvixFileEntry& source),
        /// Appends an entry made from a path and values; the list owns it. It is added to the children of
        /// `parent`, which need not belong to this list, or to the roots when `parent` is null. Returns the entry;
        /// null with the list unchanged when `file` is null or memory runs out, and as in the other form.
        virtual OrvixFileEntry* CreateEntry(const wchar_t* file, OrvixFileEntry* parent, unsigned long flagsIn,
                                            long long clientPtr));

    ORVIX_OVERLOADS_IN_SLOT_ORDER(
        /// Removes the entry at `index` of the list, as the other form does; false for an index out of range.
        virtual bool RemoveEntry(unsigned int index),
        /// Removes an entry from the list, the roots, the active list and the children of the entries that can be
        /// reached from the roots, and deletes it with its attachments. Its own children stay in the list as they
        /// are: they are no roots, and their parent links name the deleted entry; the host removes or links them
        /// itself. False when the list does not hold the entry. When memory runs out while a tree is searched:
        /// false, and the entry stays in the list to be removed later, though some links to it may be gone
        /// already.
        virtual bool RemoveEntry(OrvixFileEntry* entry));

    /// Number of entries.
    virtual unsigned int NumEntries();

    /// Deletes every entry and empties roots and active list; always true.
    virtual bool RemoveAll();

    /// The entry at `index` in order of creation, owned by the list; null for an index out of range.
    virtual OrvixFileEntry* GetFileEntry(unsigned int index);

    /// Rebuilds the active list from the entries whose FlagsIn shares a bit with `mask`: in order of creation,
    /// or with `fromRoots` the trees below the roots, children before their parents. Returns
    /// `NumActiveEntries()`. When memory runs out the active list is empty.
    virtual unsigned int BuildActiveList(unsigned long mask, bool fromRoots);

    /// Appends an entry, which need not belong to this list, to the active list; null is ignored. Returns
    /// `NumActiveEntries()` in every case.
    virtual unsigned int AddActiveEntry(OrvixFileEntry* entry);

    /// Removes the first occurrence of the entry from the active list; false when it is not there.
    virtual bool RemoveActiveEntry(OrvixFileEntry* entry);

    /// Number of active entries.
    virtual unsigned int NumActiveEntries();

    /// The active entry at `index`, in the order of the active list; null for an index out of range.
    virtual OrvixFileEntry* GetActiveFileEntry(unsigned int index);

    /// Number of roots: the entries created without a parent.
    virtual unsigned int NumRootEntries();

    /// The root at `index` in order of creation; null for an index out of range.
    virtual OrvixFileEntry* GetRootEntry(unsigned int index);

private:
    // What the library alone knows; null until something is stored.
    struct State;
    State* m_state = nullptr;
};

static_assert(sizeof(OrvixFileList) == 16, "host and library must agree about the size of a record");
