#pragma once

#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixProviderBase.h"
#include "OrvixProviderOption.h"

#include <windows.h>

#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>

/// The least provider that works: the folder .disk of the project holds the latest version of each file, under its
/// name. A file is checked out while it may be written.
class DiskProvider : public OrvixProviderBase
{
public:
    explicit DiskProvider(const wchar_t* name) : m_name(name) {}

    const wchar_t* GetName() override { return m_name; }
    bool IsInitialized() override { return m_initialized; }
    bool IsProjectOpen() override { return !m_project.empty(); }

    int Initialize(OrvixClientInfo*) override
    {
        m_initialized = true;
        return OrvixProviderResult::Success;
    }

    int Uninitialize() override
    {
        m_initialized = false;
        m_project.clear();
        return OrvixProviderResult::Success;
    }

    int OpenProject(const wchar_t* localPath, const wchar_t*) override
    {
        m_project = localPath;
        std::error_code error;
        std::filesystem::create_directories(m_project / L".disk", error);
        return error ? OrvixProviderResult::Failure : OrvixProviderResult::Success;
    }

    int CloseProject() override
    {
        m_project.clear();
        return OrvixProviderResult::Success;
    }

    int Add(OrvixFileList* list, const wchar_t*, unsigned long options) override { return Store(list, options); }
    int CheckIn(OrvixFileList* list, const wchar_t*, unsigned long options) override { return Store(list, options); }

    int CheckOut(OrvixFileList* list, const wchar_t*, unsigned long) override
    {
        return ForEach(list, [](const std::filesystem::path& file) {
            return SetFileAttributesW(file.c_str(), FILE_ATTRIBUTE_NORMAL) != 0;
        });
    }

    int UndoCheckOut(OrvixFileList* list, unsigned long) override { return Fetch(list); }
    int GetLatest(OrvixFileList* list, unsigned long) override { return Fetch(list); }

    int QueryStatus(OrvixFileList* list, unsigned long) override
    {
        return ForEachEntry(list, [this](OrvixFileEntry& entry) {
            entry.SetFlagsOut(FlagsOf(entry.GetFile()));
            return true;
        });
    }

protected:
    const std::filesystem::path& Project() const { return m_project; }
    std::filesystem::path StoredFile(const std::filesystem::path& file) const
    {
        return m_project / L".disk" / file.filename();
    }

    template <typename Work>
    static int ForEachEntry(OrvixFileList* list, Work work)
    {
        bool succeeded = list->NumActiveEntries() != 0;
        for (unsigned int i = 0; i < list->NumActiveEntries(); ++i)
        {
            succeeded = work(*list->GetActiveFileEntry(i)) && succeeded;
        }
        return succeeded ? OrvixProviderResult::Success : OrvixProviderResult::Failure;
    }

    template <typename Work>
    static int ForEach(OrvixFileList* list, Work work)
    {
        return ForEachEntry(list, [work](OrvixFileEntry& entry) { return work(entry.GetFile()); });
    }

private:
    static std::string Bytes(const std::filesystem::path& file)
    {
        std::ostringstream bytes;
        bytes << std::ifstream(file, std::ios::binary).rdbuf();
        return bytes.str();
    }

    static bool IsWritable(const std::filesystem::path& file)
    {
        const DWORD attributes = GetFileAttributesW(file.c_str());
        return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_READONLY) == 0;
    }

    static bool Replace(const std::filesystem::path& from, const std::filesystem::path& to, bool writable)
    {
        SetFileAttributesW(to.c_str(), FILE_ATTRIBUTE_NORMAL);
        return CopyFileW(from.c_str(), to.c_str(), FALSE) &&
               SetFileAttributesW(to.c_str(), writable ? FILE_ATTRIBUTE_NORMAL : FILE_ATTRIBUTE_READONLY);
    }

    int Store(OrvixFileList* list, unsigned long options)
    {
        const bool kept = (options & OrvixProviderOption::KeepCheckedOut) != 0;
        return ForEach(list, [this, kept](const std::filesystem::path& file) {
            return Replace(file, StoredFile(file), true) &&
                   SetFileAttributesW(file.c_str(), kept ? FILE_ATTRIBUTE_NORMAL : FILE_ATTRIBUTE_READONLY);
        });
    }

    int Fetch(OrvixFileList* list)
    {
        return ForEach(list,
                       [this](const std::filesystem::path& file) { return Replace(StoredFile(file), file, false); });
    }

    unsigned long FlagsOf(const std::filesystem::path& file) const
    {
        if (m_project.empty())
        {
            return OrvixFileState::NotControlled;
        }
        if (!std::filesystem::exists(StoredFile(file)))
        {
            return OrvixFileState::NotControlled | OrvixFilePermission::Add;
        }
        const unsigned long state = IsWritable(file)
                                        ? OrvixFileState::CheckedOut | OrvixFilePermission::CheckIn |
                                              OrvixFilePermission::UndoCheckOut | OrvixFilePermission::Compare
                                        : OrvixFilePermission::CheckOut;
        const bool modified = Bytes(file) != Bytes(StoredFile(file));
        return state | OrvixFileState::Controlled | OrvixFilePermission::GetLatest | OrvixFilePermission::ShowHistory |
               (modified ? OrvixFileState::Modified | OrvixFilePermission::Compare : 0);
    }

    const wchar_t* m_name;
    std::filesystem::path m_project;
    bool m_initialized = false;
};
