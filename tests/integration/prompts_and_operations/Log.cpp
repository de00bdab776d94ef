#include "Log.h"

#include "OrvixFileEntry.h"
#include "OrvixFileList.h"

#include <sstream>

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

std::string BitNames(unsigned long bits, std::initializer_list<NamedBit> names)
{
    std::string text;
    for (const NamedBit& named : names)
    {
        if ((bits & named.bit) != 0)
        {
            text += std::string(" ") + named.name;
            bits &= ~named.bit;
        }
    }
    if (bits != 0)
    {
        std::ostringstream rest;
        rest << " 0x" << std::hex << bits;
        text += rest.str();
    }
    return text;
}
