#include "StatusCommand.h"

#include "FilePath.h"
#include "OrvixFileFlags.h"

void StatusCommand::RunOnFiles()
{
    QueryStatus();
    for (unsigned int i = 0; i < List().NumEntries(); ++i)
    {
        OrvixFileEntry* entry = List().GetFileEntry(i);
        const bool known = (entry->GetFlagsOut() & OrvixFileState::Controlled) != 0 || PathExists(entry->GetFile());
        if (known || IsNamed(*entry))
        {
            Report(known ? Done : Refused, *entry);
        }
        else
        {
            CountOtherState();
        }
    }
}
