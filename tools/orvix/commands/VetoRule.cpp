#include "VetoRule.h"

#include "FilePath.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixNotifyParams.h"

#include <windows.h>

#include <shlwapi.h>

#include <algorithm>

VetoRule::VetoRule(std::vector<std::wstring> patterns, std::wstring projectFolder)
    : m_patterns(std::move(patterns)), m_projectFolder(std::move(projectFolder))
{
    for (std::wstring& pattern : m_patterns)
    {
        std::replace(pattern.begin(), pattern.end(), L'/', L'\\');
    }
}

std::uint32_t VetoRule::Notify(OrvixNotifyParams* params, std::int64_t)
{
    // Before notifications have the odd identifiers 13 to 21; a cancelled one needs no second veto.
    const bool before = params->GetID() >= 13 && params->GetID() <= 21 && params->GetID() % 2 == 1;
    OrvixFileList* list = params->GetOrvixFileList();
    if (!before || params->IsCancelled() || list == nullptr)
    {
        return 0;
    }
    for (unsigned int i = 0; i < list->NumActiveEntries(); ++i)
    {
        OrvixFileEntry* entry = list->GetActiveFileEntry(i);
        if (Forbids(entry->GetFile()))
        {
            return 1;
        }
    }
    return 0;
}

bool VetoRule::Forbids(const wchar_t* path)
{
    const std::wstring shown = PathBelow(m_projectFolder, path);
    for (const std::wstring& pattern : m_patterns)
    {
        const bool wholePath = pattern.find(L'\\') != std::wstring::npos;
        if (PathMatchSpecW(wholePath ? shown.c_str() : PathFindFileNameW(path), pattern.c_str()))
        {
            m_reason = shown + L" matches " + pattern;
            return true;
        }
    }
    return false;
}
