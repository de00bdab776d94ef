#include "EntryFactory.h"

#include "AssignText.h"

std::unique_ptr<OrvixFileEntry> MakeEntry(const wchar_t* file, OrvixFileEntry* parent, unsigned long flagsIn,
                                          long long clientPtr)
{
    std::unique_ptr<OrvixFileEntry> entry(new OrvixFileEntry);
    if (!entry)
    {
        return nullptr;
    }
    entry->SetFile(file);
    if (!IsStored(file, entry->GetFile()))
    {
        return nullptr;
    }
    entry->SetFlagsIn(flagsIn);
    entry->SetClientPtr(clientPtr);
    entry->SetParent(parent);
    return entry;
}

std::unique_ptr<OrvixFileEntry> CopyEntry(OrvixFileEntry& source)
{
    std::unique_ptr<OrvixFileEntry> copy(new OrvixFileEntry);
    if (!copy)
    {
        return nullptr;
    }
    const wchar_t* file = source.GetFile();
    copy->SetFile(file);
    if (!IsStored(file, copy->GetFile()))
    {
        return nullptr;
    }
    copy->SetFlagsIn(source.GetFlagsIn());
    copy->SetFlagsOut(source.GetFlagsOut());
    copy->SetClientPtr(source.GetClientPtr());
    copy->SetParent(source.GetParent());
    return copy;
}
