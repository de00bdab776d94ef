#include "HistoryCommand.h"

#include "OrvixFileFlags.h"
#include "OrvixProviderResult.h"

void HistoryCommand::RunOnFiles()
{
    QueryStatus();
    for (unsigned int i = 0; i < List().NumEntries(); ++i)
    {
        OrvixFileEntry* entry = List().GetFileEntry(i);
        if ((entry->GetFlagsOut() & OrvixFilePermission::ShowHistory) != 0)
        {
            continue;
        }
        List().RemoveActiveEntry(entry);
        if (IsNamed(*entry))
        {
            Report(Refused, *entry);
        }
        else
        {
            CountOtherState();
        }
    }
    if (List().NumActiveEntries() > 0 && Project().Provider().ShowHistory(&List()) < OrvixProviderResult::Success)
    {
        throw ToolError(ExitCode::Failed, L"the provider cannot show the history");
    }
    Count(Done, List().NumActiveEntries());
}
