#include "IsolatedFolder.h"

#include "FilePath.h"
#include "IsolationSettings.h"
#include "ModulePath.h"
#include "Text.h"
#include "ToolError.h"
#include "UniqueHandle.h"

#include <windows.h>

#include <sddl.h>
#include <shlobj.h>

#include <cstdio>
#include <system_error>
#include <vector>

namespace
{

constexpr wchar_t Root[] = L"OrvixCore Isolation";
constexpr wchar_t Proxy[] = L"scc_proxy.dll";
constexpr wchar_t Program32[] = L"scc_host32.exe";
constexpr wchar_t Program64[] = L"scc_host64.exe";

// Owned by the administrators. They and the system may do everything, all others may read and run; nothing is inherited
// from the folder above, where every user may make files.
constexpr wchar_t Access[] = L"O:BAD:P(A;OICI;FA;;;BA)(A;OICI;FA;;;SY)(A;OICI;GRGX;;;WD)";

std::filesystem::path ProgramData()
{
    PWSTR path = nullptr;
    const HRESULT result = SHGetKnownFolderPath(FOLDERID_ProgramData, 0, nullptr, &path);
    std::filesystem::path folder = result == S_OK ? path : L"";
    CoTaskMemFree(path);
    return folder;
}

/// A name as that of a folder: other characters than letters, digits, blanks and a few signs become their number.
std::wstring FolderName(const std::wstring& name)
{
    std::wstring folder;
    for (const wchar_t c : name)
    {
        const bool isPlain = c == L' ' || c == L'-' || c == L'_' || c == L'(' || c == L')' || c > 0x9F ||
                             (c >= L'0' && c <= L'9') || (c >= L'A' && c <= L'Z') || (c >= L'a' && c <= L'z');
        wchar_t number[8];
        std::swprintf(number, std::size(number), L"%%%02X", static_cast<unsigned int>(c));
        folder += isPlain ? std::wstring(1, c) : std::wstring(number);
    }
    while (folder.ends_with(L' ')) // which Windows would drop
    {
        folder.replace(folder.size() - 1, 1, L"%20");
    }
    return folder;
}

bool IsLink(const std::filesystem::path& folder)
{
    const DWORD attributes = GetFileAttributesW(folder.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0;
}

std::vector<std::filesystem::path> FilesIn(const std::filesystem::path& folder, std::error_code& error)
{
    std::vector<std::filesystem::path> files;
    for (std::filesystem::directory_iterator entry(folder, error), end; !error && entry != end; entry.increment(error))
    {
        files.push_back(entry->path());
    }
    return files;
}

[[noreturn]] void Fail(const std::wstring& what, const std::filesystem::path& file, DWORD error)
{
    if (error == ERROR_ACCESS_DENIED)
    {
        throw ToolError(ExitCode::Failed, what +
                                              L" without administrator rights: run orvix as administrator, and "
                                              L"close the programs that use " +
                                              file.wstring());
    }
    throw ToolError(ExitCode::Failed, what + L": " + SystemMessage(error, file.wstring()));
}

/// Makes a folder that only administrators may change.
void MakeFolder(const std::filesystem::path& folder)
{
    UniqueLocalMemory descriptor;
    if (!ConvertStringSecurityDescriptorToSecurityDescriptorW(Access, SDDL_REVISION_1, descriptor.Out(), nullptr))
    {
        Fail(L"the library cannot be isolated", folder, GetLastError());
    }
    SECURITY_ATTRIBUTES attributes = {sizeof attributes, descriptor.Get(), FALSE};
    if (CreateDirectoryW(folder.c_str(), &attributes))
    {
        return;
    }
    // Another user may have made it before, as a link to another folder too.
    const DWORD error = GetLastError();
    if (error != ERROR_ALREADY_EXISTS)
    {
        Fail(L"the library cannot be isolated", folder, error);
    }
    if (IsLink(folder))
    {
        throw ToolError(ExitCode::Failed,
                        L"the library cannot be isolated, since this folder is a link: " + folder.wstring());
    }
    if (!SetFileSecurityW(folder.c_str(),
                          OWNER_SECURITY_INFORMATION | DACL_SECURITY_INFORMATION | PROTECTED_DACL_SECURITY_INFORMATION,
                          descriptor.Get()))
    {
        Fail(L"the library cannot be isolated", folder, GetLastError());
    }
}

/// Removes what is in the folder. The proxy is the first, because it cannot be removed while a host uses it; then
/// everything stays. Folders in it must be empty: no user who made them leads the removal to another place.
void Empty(const std::filesystem::path& folder, const std::wstring& failure)
{
    std::error_code error;
    std::filesystem::remove(folder / Proxy, error);
    const auto files = error ? std::vector<std::filesystem::path>() : FilesIn(folder, error);
    for (auto file = files.begin(); !error && file != files.end(); ++file)
    {
        if (!std::filesystem::remove(*file, error) && IsFolder(file->wstring()))
        {
            throw ToolError(ExitCode::Failed, failure + L": remove the folder " + file->wstring() + L" first");
        }
    }
    if (error)
    {
        Fail(failure, folder, static_cast<DWORD>(error.value()));
    }
}

/// The file beside this program that the folder gets a copy of.
std::filesystem::path SourceOf(const wchar_t* file)
{
    return std::filesystem::path(ModulePath(nullptr)).replace_filename(file);
}

void CheckSource(const wchar_t* file)
{
    if (!PathExists(SourceOf(file).wstring()))
    {
        Fail(L"the library cannot be isolated", SourceOf(file), ERROR_FILE_NOT_FOUND);
    }
}

void CopyHere(const wchar_t* file, const std::filesystem::path& folder)
{
    const std::filesystem::path source = SourceOf(file);
    if (CopyFileW(source.c_str(), (folder / file).c_str(), FALSE) == FALSE)
    {
        Fail(L"the library cannot be isolated, since " + source.wstring() + L" cannot be copied", folder / file,
             GetLastError());
    }
}

} // namespace

IsolatedFolder::IsolatedFolder(const std::wstring& name)
    : m_name(name), m_path(ProgramData() / Root / FolderName(PathKey(name)))
{
}

std::wstring IsolatedFolder::Make(const std::wstring& library, int bits, std::chrono::seconds patience) const
{
    const wchar_t* const program = bits == 32 ? Program32 : Program64;
    CheckSource(Proxy); // before the files that work are removed
    CheckSource(program);
    MakeFolder(m_path.parent_path());
    MakeFolder(m_path);
    // Whoever made the folder before may have put libraries there, or files that he may still change.
    Empty(m_path, L"the library cannot be isolated");
    IsolationSettings settings;
    settings.name = m_name;
    settings.library = library;
    settings.bits = bits;
    settings.patience = patience;
    CopyHere(Proxy, m_path);
    CopyHere(program, m_path);
    if (!settings.Write(m_path))
    {
        Fail(L"the library cannot be isolated", m_path / IsolationSettings::FileName, ERROR_WRITE_FAULT);
    }
    return m_path / Proxy;
}

IsolationSettings IsolatedFolder::Settings() const
{
    return IsolationSettings::Read(m_path);
}

bool IsolatedFolder::Exists() const
{
    return IsFolder(m_path.wstring());
}

void IsolatedFolder::Remove() const
{
    constexpr wchar_t Failure[] = L"the files of the isolated library cannot be removed";
    if (!Exists())
    {
        return;
    }
    if (!IsLink(m_path))
    {
        Empty(m_path, Failure);
    }
    std::error_code error;
    if (!std::filesystem::remove(m_path, error))
    {
        Fail(Failure, m_path, static_cast<DWORD>(error.value()));
    }
    std::filesystem::remove(m_path.parent_path(), error); // when it was the last one
}
