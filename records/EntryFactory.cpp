#include "EntryFactory.h"

#include "HostHeap.h"
#include "RecordState.h"

namespace
{

void StoreFile(OrvixFileEntry& entry, const wchar_t* file)
{
    entry.SetFile(file);
    if (!IsStored(file, entry.GetFile()))
    {
        throw std::bad_alloc();
    }
}

} // namespace

std::unique_ptr<OrvixFileEntry> MakeEntry(const wchar_t* file, OrvixFileEntry* parent, unsigned long flagsIn,
                                          long long clientPtr)
{
    auto entry = MakeOnHostHeap<OrvixFileEntry>();
    StoreFile(*entry, file);
    entry->SetFlagsIn(flagsIn);
    entry->SetClientPtr(clientPtr);
    entry->SetParent(parent);
    return entry;
}

std::unique_ptr<OrvixFileEntry> CopyEntry(OrvixFileEntry& source)
{
    auto copy = MakeOnHostHeap<OrvixFileEntry>();
    StoreFile(*copy, source.GetFile());
    copy->SetFlagsIn(source.GetFlagsIn());
    copy->SetFlagsOut(source.GetFlagsOut());
    copy->SetClientPtr(source.GetClientPtr());
    copy->SetParent(source.GetParent());
    return copy;
}
