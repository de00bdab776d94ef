// A provider plug-in that breaks one rule of the contract, which `Defect` names, and keeps all others. It remembers the
// state of files while it is loaded, and their bytes in a `DiskStore`.

#include "Defect.h"
#include "DiskStore.h"
#include "FakeProvider.h"
#include "IOrvixClientAccess.h"
#include "OrvixClientInfo.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixProviderOption.h"
#include "OrvixVersion.h"

#include <cstdint>
#include <map>
#include <stdexcept>
#include <string>
#include <thread>

namespace
{

using OrvixProviderResult::Failure;
using OrvixProviderResult::NotOffered;
using OrvixProviderResult::Success;

// What the contract does not know.
constexpr int UnknownResult = 7;
constexpr int UnknownResultOfBadInput = 3;
constexpr int UnknownResultOfDialog = 9;
constexpr unsigned long UnknownState = 0x40;

constexpr unsigned long CheckedOut = OrvixFileState::Controlled | OrvixFileState::CheckedOut;

class DefectiveProvider final : public FakeProvider
{
public:
    DefectiveProvider() : FakeProvider(L"Defective") {}

    bool IsInitialized() override { return m_initialized; }
    bool IsProjectOpen() override { return m_open || (m_wasOpen && Defect::Is(L"state")); }

    int Initialize(OrvixClientInfo* info) override
    {
        ++m_starts;
        m_client = info->GetIOrvixClientAccess();
        if (Defect::Is(L"handles"))
        {
            CreateEventW(nullptr, FALSE, FALSE, nullptr);
        }
        if (Defect::Is(L"starts") || (Defect::Is(L"sessions") && m_starts == 4))
        {
            return Failure;
        }
        m_initialized = true;
        return Success;
    }

    int Uninitialize() override
    {
        m_initialized = false;
        m_open = false;
        m_wasOpen = false;
        return Success;
    }

    int OpenProject(const wchar_t* localPath, const wchar_t*) override
    {
        if (Defect::Is(L"needs-marker") &&
            GetFileAttributesW((std::wstring(localPath) + L"\\marker.txt").c_str()) == INVALID_FILE_ATTRIBUTES)
        {
            return Failure;
        }
        m_open = true;
        m_wasOpen = true;
        m_disk.Open(localPath);
        m_project = std::wstring(localPath) + L"\\";
        return Success;
    }

    int CloseProject() override
    {
        if (Defect::Is(L"prints-late"))
        {
            std::thread([this] { m_client->OutputText(L"closed", 0); }).join();
        }
        m_open = false;
        return Success;
    }

    int Add(OrvixFileList* list, const wchar_t*, unsigned long options) override
    {
        Report("Add", options);
        return Become(list, OrvixFileState::Controlled, [this](const wchar_t* file) { m_disk.Store(file, false); });
    }

    int CheckOut(OrvixFileList* list, const wchar_t*, unsigned long options) override
    {
        Report("CheckOut", options);
        if (Defect::Is(L"option-bit") && (options & OrvixProviderOption::NoDialog) != 0)
        {
            return Failure;
        }
        if (Defect::Is(L"bad-input") && std::wstring(Last(list)).find(L'?') != std::wstring::npos)
        {
            return UnknownResultOfBadInput;
        }
        if (Defect::Is(L"prints-from-thread"))
        {
            std::thread([this] { m_client->OutputText(L"taken", 0); }).join();
        }
        if (Defect::Is(L"changes-folder"))
        {
            SetCurrentDirectoryW(L"C:\\windows");
        }
        return Become(list, CheckedOut, [](const wchar_t* file) { DiskStore::SetWritable(file, true); });
    }

    int CheckIn(OrvixFileList* list, const wchar_t*, unsigned long options) override
    {
        Report("CheckIn", options);
        if (Defect::Is(L"list-untouched") && list->NumActiveEntries() != 0)
        {
            list->GetActiveFileEntry(0)->SetFlagsIn(0);
        }
        if (Defect::Is(L"checkin-fails"))
        {
            return Failure;
        }
        const wchar_t* last = Last(list);
        if (Defect::Is(L"destroys") && *last != L'\0' && !m_states.contains(last))
        {
            DeleteFileW(last);
            return Failure;
        }
        return Become(list, OrvixFileState::Controlled, [this](const wchar_t* file) {
            if (!Defect::Is(L"stores-nothing"))
            {
                m_disk.Store(file, false);
            }
        });
    }

    int UndoCheckOut(OrvixFileList* list, unsigned long options) override
    {
        Report("UndoCheckOut", options);
        const int result = Become(list, OrvixFileState::Controlled, [this](const wchar_t* file) {
            if (!Defect::Is(L"undoes-nothing"))
            {
                m_disk.Fetch(file);
            }
        });
        return Defect::Is(L"results") && options != 0 ? UnknownResult : result;
    }

    int GetLatest(OrvixFileList* list, unsigned long options) override
    {
        Report("GetLatest", options);
        for (unsigned int i = 0; i < list->NumActiveEntries(); ++i)
        {
            m_disk.Fetch(list->GetActiveFileEntry(i)->GetFile());
        }
        return list->NumActiveEntries() == 0 && !Defect::Is(L"empty-list") ? Failure : Success;
    }

    int ShowHistory(OrvixFileList* list) override
    {
        return list->NumActiveEntries() == 0 ? Failure : OrvixProviderResult::ReloadFiles;
    }
    int ShowProperties(OrvixFileList* list) override { return list->NumActiveEntries() == 0 ? Failure : Success; }

    int QueryStatus(OrvixFileList* list, unsigned long) override
    {
        if (Defect::Is(L"leaks"))
        {
            VirtualAlloc(nullptr, 2 << 20, MEM_COMMIT | MEM_RESERVE, PAGE_READWRITE);
        }
        const unsigned int count = list->NumActiveEntries();
        for (unsigned int i = 0; i < count; ++i)
        {
            const std::wstring file = list->GetActiveFileEntry(i)->GetFile();
            if (m_open && file.compare(0, m_project.size(), m_project) != 0)
            {
                return Failure;
            }
            if (!Defect::Is(L"status-failure"))
            {
                continue;
            }
            list->GetActiveFileEntry(i)->SetFlagsOut(OrvixFileState::NotControlled); // too early
        }
        for (unsigned int i = 0; i < count; ++i)
        {
            if (!Defect::Is(L"status-left-out") || !m_open || i + 1 < count)
            {
                list->GetActiveFileEntry(i)->SetFlagsOut(FlagsOf(*list->GetActiveFileEntry(i)));
            }
        }
        return count == 0 ? Failure : Success;
    }

    int ReservedC() override
    {
        if (Defect::Is(L"exception"))
        {
            throw std::runtime_error("defect");
        }
        return Defect::Is(L"reserved") ? Success : NotOffered;
    }

    int ReservedD(void* argument, unsigned long* first, unsigned long* second) override
    {
        return Defect::Is(L"reserved-pointers") ? NotOffered : FakeProvider::ReservedD(argument, first, second);
    }

    int ReservedE() override
    {
        if (Defect::Is(L"crash"))
        {
            Defect::Crash();
        }
        return NotOffered;
    }

    int ReservedF() override
    {
        if (Defect::Is(L"hang"))
        {
            Defect::Hang();
        }
        if (Defect::Is(L"window"))
        {
            MessageBoxW(nullptr, L"Who are you?", L"Defective Provider", MB_OK);
        }
        return NotOffered;
    }

    int ReservedG() override
    {
        if (Defect::Is(L"exit"))
        {
            ExitProcess(7);
        }
        return NotOffered;
    }

    int ReservedH() override
    {
        if (Defect::Is(L"descendant"))
        {
            Defect::StartDescendant();
        }
        return NotOffered;
    }

    bool ReservedI() override { return !Defect::Is(L"reserved-false"); }

    int ShowOptions() override { return Defect::Is(L"dialogs") ? UnknownResultOfDialog : NotOffered; }

private:
    /// Reports the first session only: the rules that go through many sessions pass fewer options.
    void Report(const char* operation, unsigned long options) const
    {
        if (m_starts == 1)
        {
            Defect::Report(operation, options);
        }
    }

    static const wchar_t* Last(OrvixFileList* list)
    {
        const unsigned int count = list->NumActiveEntries();
        return count == 0 ? L"" : list->GetActiveFileEntry(count - 1)->GetFile();
    }

    template <typename Work>
    int Become(OrvixFileList* list, unsigned long state, Work work)
    {
        for (unsigned int i = 0; i < list->NumActiveEntries(); ++i)
        {
            OrvixFileEntry* entry = list->GetActiveFileEntry(i);
            m_states[entry->GetFile()] = state;
            work(entry->GetFile());
        }
        return list->NumActiveEntries() == 0 ? Failure : Success;
    }

    unsigned long FlagsOf(OrvixFileEntry& entry)
    {
        if (!m_open)
        {
            return Defect::Is(L"status-closed") ? OrvixFileState::NotControlled | OrvixFilePermission::Add
                                                : OrvixFileState::NotControlled;
        }
        const auto found = m_states.find(entry.GetFile());
        const unsigned long state = found == m_states.end() ? OrvixFileState::NotControlled : found->second;
        if (Defect::Is(L"status-lies") && state == OrvixFileState::NotControlled)
        {
            return state | OrvixFileState::OutOfDate;
        }
        if (Defect::Is(L"status-contradiction"))
        {
            return state | OrvixFileState::NotControlled | OrvixFileState::Controlled;
        }
        return Defect::Is(L"status-bits") && state == CheckedOut ? state | UnknownState : state;
    }

    std::map<std::wstring, unsigned long> m_states;
    std::wstring m_project;
    DiskStore m_disk;
    IOrvixClientAccess* m_client = nullptr;
    bool m_initialized = false;
    bool m_open = false;
    bool m_wasOpen = false;
    int m_starts = 0;
};

// Outside a function: GCC guards an object inside one, and each load would leave the guard's handles open.
DefectiveProvider provider;

} // namespace

extern "C" {

std::int32_t GetOrvixVersion()
{
    return Defect::Is(L"version") ? ORVIX_PLUGIN_CONTRACT_VERSION + 1 : ORVIX_PLUGIN_CONTRACT_VERSION;
}

IOrvixProvider* GetIOrvixProvider()
{
    static int requests = 0;
    return Defect::Is(L"objects") && ++requests == 2 ? nullptr : &provider;
}

void ReleaseIOrvixProvider(IOrvixProvider*)
{
}

const wchar_t* GetOrvixProviderName()
{
    static int requests = 0;
    return Defect::Is(L"name")              ? nullptr
           : Defect::Is(L"name-that-turns") ? (++requests % 2 == 0 ? L"Even" : L"Odd")
                                            : L"Defective";
}

} // extern "C"

BOOL WINAPI DllMain(HINSTANCE, DWORD reason, void*)
{
    if (reason != DLL_PROCESS_ATTACH)
    {
        return TRUE;
    }
    if (Defect::Is(L"crash-at-load"))
    {
        Defect::Crash();
    }
    if (Defect::Is(L"program-moves"))
    {
        Defect::MoveProgram();
    }
    return !Defect::Is(L"reload") || Defect::Count(L"ORVIX_DEFECT_LOADS") != 5 ? TRUE : FALSE;
}
