#pragma once

#include "Files.h"
#include "TempFolder.h"
#include "UniqueHandle.h"

#include <windows.h>

#include <filesystem>
#include <string>
#include <string_view>

inline bool IsReadOnly(const std::filesystem::path& file)
{
    return (GetFileAttributesW(file.c_str()) & FILE_ATTRIBUTE_READONLY) != 0;
}

inline void SetReadOnly(const std::filesystem::path& file, bool readOnly)
{
    SetFileAttributesW(file.c_str(), readOnly ? FILE_ATTRIBUTE_READONLY : FILE_ATTRIBUTE_NORMAL);
}

/// The last-write time that a file has now, so that it can be set again later. It is exact; std::filesystem rounds.
class WriteTime
{
public:
    explicit WriteTime(const std::filesystem::path& file)
    {
        WIN32_FILE_ATTRIBUTE_DATA data{};
        GetFileAttributesExW(file.c_str(), GetFileExInfoStandard, &data);
        m_time = data.ftLastWriteTime;
    }

    /// Sets the time of a file; false when that fails.
    bool Restore(const std::filesystem::path& file) const
    {
        const UniqueFile handle(
            CreateFileW(file.c_str(), FILE_WRITE_ATTRIBUTES, 0, nullptr, OPEN_EXISTING, 0, nullptr));
        return SetFileTime(handle.Get(), nullptr, nullptr, &m_time) != FALSE;
    }

private:
    FILETIME m_time{};
};

/// The folder of a project. It is deleted at the end with its files, read-only ones and long paths included.
class ArchiveProject
{
public:
    ArchiveProject() = default;
    ArchiveProject(const ArchiveProject&) = delete;
    ArchiveProject& operator=(const ArchiveProject&) = delete;
    ~ArchiveProject()
    {
        const std::filesystem::path folder = L"\\\\?\\" + Text();
        std::error_code error;
        for (std::filesystem::recursive_directory_iterator entry(folder, error), end; !error && entry != end;
             entry.increment(error))
        {
            if (!entry->is_directory(error))
            {
                SetReadOnly(entry->path(), false);
            }
        }
        std::filesystem::remove_all(folder, error);
    }

    std::wstring Text() const { return m_folder.Text(); }

    std::filesystem::path Path(std::wstring_view file) const { return m_folder.Path() / file; }

    /// The full path of a file, as a host gives it.
    std::wstring File(std::wstring_view file) const { return Text() + L'\\' + std::wstring(file); }

    /// Writes a file in place, as an editor does, and makes its folders.
    std::wstring Write(std::wstring_view file, std::string_view bytes) const
    {
        std::filesystem::create_directories(Path(file).parent_path());
        WriteBytes(Path(file), bytes);
        return File(file);
    }

    std::string Read(std::wstring_view file) const { return ReadBytes(Path(file)); }

    /// Overwrites a file, which may be read-only, such as one of the archive to damage it.
    void Overwrite(const std::filesystem::path& file, std::string_view bytes) const
    {
        SetReadOnly(file, false);
        WriteBytes(file, bytes);
    }

private:
    TempFolder m_folder;
};
