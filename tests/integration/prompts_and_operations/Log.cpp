#include "Log.h"

#include "OrvixFileEntry.h"
#include "OrvixFileList.h"

std::string ActiveNames(OrvixFileList* list)
{
    if (list == nullptr)
    {
        return "no list";
    }
    std::string names = "[";
    for (unsigned int i = 0; i < list->NumActiveEntries(); ++i)
    {
        if (i != 0)
        {
            names += ' ';
        }
        OrvixFileEntry* entry = list->GetActiveFileEntry(i);
        names += entry != nullptr ? Narrow(entry->GetFile()) : "null";
    }
    return names + "]";
}

std::string Narrow(const wchar_t* text)
{
    std::string narrow;
    for (; *text != L'\0'; ++text)
    {
        narrow += static_cast<char>(*text);
    }
    return narrow;
}
