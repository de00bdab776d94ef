#include "ValidationFiles.h"

#include "FileMark.h"
#include "OrvixFileEntry.h"
#include "Text.h"

ActiveFiles::ActiveFiles(const std::vector<std::wstring>& paths)
{
    for (const std::wstring& path : paths)
    {
        m_list.CreateEntry(path.c_str(), nullptr, FileMark::Chosen, static_cast<long long>(path.size()))
            ->SetFlagsOut(Unwritten);
    }
    m_list.BuildActiveList(FileMark::Chosen, false);
}

std::vector<unsigned long> ActiveFiles::Flags()
{
    std::vector<unsigned long> flags;
    for (unsigned int i = 0; i < m_list.NumEntries(); ++i)
    {
        OrvixFileEntry* entry = m_list.GetFileEntry(i);
        flags.push_back(entry->GetFlagsOut());
    }
    return flags;
}

std::vector<ActiveFiles::HostPart> ActiveFiles::HostParts()
{
    std::vector<HostPart> parts;
    for (unsigned int i = 0; i < m_list.NumEntries(); ++i)
    {
        OrvixFileEntry* entry = m_list.GetFileEntry(i);
        parts.emplace_back(entry, entry->GetFile(), entry->GetFlagsIn(), entry->GetClientPtr(),
                           entry->NumChildren() + entry->NumAttachments());
    }
    for (unsigned int i = 0; i < m_list.NumActiveEntries(); ++i)
    {
        OrvixFileEntry* entry = m_list.GetActiveFileEntry(i);
        parts.emplace_back(entry, L"", 0, 0, 0);
    }
    return parts;
}

std::vector<std::wstring> ValidationFiles::MakeGood(const ValidationSubject& subject, unsigned long number)
{
    return {subject.Write(L"first" + std::to_wstring(number) + L".txt", "first\r\n"),
            subject.Write(L"with blanks " + std::to_wstring(number) + L".bin", std::string("\0\xFF", 2))};
}

std::vector<std::wstring> ValidationFiles::BadPaths(const ValidationSubject& subject)
{
    const std::wstring& project = subject.Project();
    return {L"",
            L"relative.txt",
            project,
            project + L"\\missing.txt",
            project + L"\\missing\\missing.txt",
            project + L"\\*.txt",
            project + L"\\what?.txt",
            project + L"\\<>|\".txt",
            project + L"\\..\\outside\\other.txt",
            project + L"\\trailing. ",
            project + L"\\first0.txt:stream",
            project + L"\\\u5009\u5EAB.txt",
            project + L"\\\xD800.txt",
            subject.Outside() + L"\\other.txt",
            project + L'\\' + std::wstring(250, L'x') + L".txt",
            project + L'\\' + std::wstring(40000, L'x')};
}

std::string ValidationFiles::On(const std::wstring& path)
{
    constexpr std::size_t Shown = 60; // characters
    return " on \"" + (path.size() > Shown ? "..." + Utf8(path.substr(path.size() - Shown)) : Utf8(path)) + '"';
}
