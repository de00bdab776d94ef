#pragma once

#include "DiskStore.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixProviderBase.h"
#include "OrvixProviderOption.h"

/// The least provider that works, on a `DiskStore`. A file is checked out while it may be written.
class DiskProvider : public OrvixProviderBase
{
public:
    explicit DiskProvider(const wchar_t* name) : m_name(name) {}

    const wchar_t* GetName() override { return m_name; }
    bool IsInitialized() override { return m_initialized; }
    bool IsProjectOpen() override { return m_store.IsOpen(); }

    int Initialize(OrvixClientInfo*) override
    {
        m_initialized = true;
        return OrvixProviderResult::Success;
    }

    int Uninitialize() override
    {
        m_initialized = false;
        return CloseProject();
    }

    int OpenProject(const wchar_t* localPath, const wchar_t*) override
    {
        return m_store.Open(localPath) ? OrvixProviderResult::Success : OrvixProviderResult::Failure;
    }

    int CloseProject() override
    {
        m_store.Close();
        return OrvixProviderResult::Success;
    }

    int Add(OrvixFileList* list, const wchar_t*, unsigned long options) override { return Store(list, options); }
    int CheckIn(OrvixFileList* list, const wchar_t*, unsigned long options) override { return Store(list, options); }

    int CheckOut(OrvixFileList* list, const wchar_t*, unsigned long) override
    {
        return ForEachEntry(list, [](auto& entry) { return DiskStore::SetWritable(entry.GetFile(), true); });
    }

    int UndoCheckOut(OrvixFileList* list, unsigned long) override { return Fetch(list); }
    int GetLatest(OrvixFileList* list, unsigned long) override { return Fetch(list); }

    int QueryStatus(OrvixFileList* list, unsigned long) override
    {
        return ForEachEntry(list, [this](auto& entry) {
            entry.SetFlagsOut(FlagsOf(entry.GetFile()));
            return true;
        });
    }

protected:
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

private:
    int Store(OrvixFileList* list, unsigned long options)
    {
        const bool keep = (options & OrvixProviderOption::KeepCheckedOut) != 0;
        return ForEachEntry(list, [&](auto& entry) { return m_store.Store(entry.GetFile(), keep); });
    }

    int Fetch(OrvixFileList* list)
    {
        return ForEachEntry(list, [this](auto& entry) { return m_store.Fetch(entry.GetFile()); });
    }

    unsigned long FlagsOf(const wchar_t* file) const
    {
        if (!m_store.IsOpen())
        {
            return OrvixFileState::NotControlled;
        }
        if (!m_store.Has(file))
        {
            return OrvixFileState::NotControlled | OrvixFilePermission::Add;
        }
        const unsigned long state = DiskStore::IsWritable(file)
                                        ? OrvixFileState::CheckedOut | OrvixFilePermission::CheckIn |
                                              OrvixFilePermission::UndoCheckOut | OrvixFilePermission::Compare
                                        : OrvixFilePermission::CheckOut;
        return state | OrvixFileState::Controlled | OrvixFilePermission::GetLatest | OrvixFilePermission::ShowHistory |
               (m_store.IsModified(file) ? OrvixFileState::Modified : 0);
    }

    const wchar_t* m_name;
    DiskStore m_store;
    bool m_initialized = false;
};
