#include "ValidationSubject.h"

#include "Text.h"

#include <windows.h>

#include <filesystem>
#include <fstream>

ValidationSubject::ValidationSubject(std::wstring library, bool isMSSCCI, const std::wstring& scratch,
                                     std::set<std::string> hanging)
    : m_library(std::move(library)), m_isMSSCCI(isMSSCCI), m_project(scratch + L"\\project"),
      m_outside(scratch + L"\\outside"), m_hanging(std::move(hanging))
{
    std::filesystem::create_directory(m_project);
    std::filesystem::create_directory(m_outside);
}

std::wstring ValidationSubject::Write(const std::wstring& name, std::string_view text) const
{
    std::wstring path = m_project + L'\\' + name;
    SetFileAttributesW(path.c_str(), FILE_ATTRIBUTE_NORMAL); // a provider may have made it read-only
    std::ofstream(std::filesystem::path(path), std::ios::binary) << text;
    return path;
}

void ValidationSubject::SkipWhatHangs(const std::string& what) const
{
    if (m_hanging.contains(OperationOf(what)))
    {
        throw RuleSkipped(OperationOf(what) + " hangs, as another rule has found");
    }
}
