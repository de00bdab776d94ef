#include "VetoRule.h"

#include "FilePath.h"
#include "NotificationText.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixNotificationID.h"
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
    OrvixFileList* list = params->GetOrvixFileList();
    if (!NotificationText::IsBeforeOperation(params->GetID()) || params->IsCancelled() || list == nullptr)
    {
        return OrvixListenerAnswer::Accept;
    }
    for (unsigned int i = 0; i < list->NumActiveEntries(); ++i)
    {
        OrvixFileEntry* entry = list->GetActiveFileEntry(i);
        if (Forbids(entry->GetFile()))
        {
            return OrvixListenerAnswer::Veto;
        }
    }
    return OrvixListenerAnswer::Accept;
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
