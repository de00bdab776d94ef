#pragma once

#include <windows.h>

#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>

/// The least store of files that works: the folder .disk of a project holds the latest version of each file, under its
/// name.
class DiskStore
{
public:
    /// Uses a project; false when its store cannot be made.
    bool Open(const std::filesystem::path& project)
    {
        m_project = project;
        CreateDirectoryW((m_project / L".disk").c_str(), nullptr);
        const DWORD attributes = GetFileAttributesW((m_project / L".disk").c_str());
        return attributes != INVALID_FILE_ATTRIBUTES;
    }

    void Close() { m_project.clear(); }
    bool IsOpen() const { return !m_project.empty(); }

    /// Stores the file as the latest version, and makes it read-only unless it is kept for writing.
    bool Store(const std::filesystem::path& file, bool keep) const
    {
        return Replace(file, Stored(file)) && SetWritable(file, keep);
    }

    /// Replaces the file by the latest version, read-only.
    bool Fetch(const std::filesystem::path& file) const
    {
        return Replace(Stored(file), file) && SetWritable(file, false);
    }

    static bool SetWritable(const std::filesystem::path& file, bool writable)
    {
        return SetFileAttributesW(file.c_str(), writable ? FILE_ATTRIBUTE_NORMAL : FILE_ATTRIBUTE_READONLY) != 0;
    }

    static bool IsWritable(const std::filesystem::path& file)
    {
        const DWORD attributes = GetFileAttributesW(file.c_str());
        return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_READONLY) == 0;
    }

    bool Has(const std::filesystem::path& file) const
    {
        return file.has_filename() && GetFileAttributesW(Stored(file).c_str()) != INVALID_FILE_ATTRIBUTES;
    }

    bool IsModified(const std::filesystem::path& file) const { return Bytes(file) != Bytes(Stored(file)); }

private:
    std::filesystem::path Stored(const std::filesystem::path& file) const
    {
        return m_project / L".disk" / file.filename();
    }

    static std::string Bytes(const std::filesystem::path& file)
    {
        std::ostringstream bytes;
        bytes << std::ifstream(file, std::ios::binary).rdbuf();
        return bytes.str();
    }

    static bool Replace(const std::filesystem::path& from, const std::filesystem::path& to)
    {
        SetFileAttributesW(to.c_str(), FILE_ATTRIBUTE_NORMAL);
        return CopyFileW(from.c_str(), to.c_str(), FALSE) != FALSE &&
               SetFileAttributesW(to.c_str(), FILE_ATTRIBUTE_NORMAL) != FALSE;
    }

    std::filesystem::path m_project;
};
