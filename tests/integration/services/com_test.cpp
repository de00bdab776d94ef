#include "AllocationFailure.h"
#include "ServicesTest.h"

#include <comdef.h>
#include <objbase.h>

#include <functional>
#include <thread>

namespace
{

/// The thread's COM apartment; APTTYPE_CURRENT when it is in none.
APTTYPE Apartment()
{
    APTTYPE type = APTTYPE_CURRENT;
    APTTYPEQUALIFIER qualifier{};
    return CoGetApartmentType(&type, &qualifier) == S_OK ? type : APTTYPE_CURRENT;
}

/// Runs `before`, which may initialise COM, and then `work` on a thread of its own. True when COM on the thread is
/// afterwards as `before` left it.
bool LeavesComAlone(const std::function<HRESULT()>& before, const std::function<void()>& work)
{
    bool unchanged = false;
    std::thread thread([&] {
        const bool initialized = before && SUCCEEDED(before());
        const APTTYPE apartment = Apartment();
        work();
        unchanged = Apartment() == apartment;
        if (initialized)
        {
            CoUninitialize();
        }
        // A thread that is in no apartment can enter either kind, and gets S_OK as the first to do so.
        unchanged = unchanged && CoInitializeEx(nullptr, COINIT_MULTITHREADED) == S_OK;
        CoUninitialize();
    });
    thread.join();
    return unchanged;
}

HRESULT NoApartment()
{
    return E_FAIL;
}

HRESULT SingleThreaded()
{
    return CoInitialize(nullptr);
}

HRESULT Multithreaded()
{
    return CoInitializeEx(nullptr, COINIT_MULTITHREADED);
}

class ComOfTheThread : public ServicesTest
{
protected:
    ComOfTheThread()
    {
        WriteProviders("<a><Name>P</Name></a>");
        WritePrompts({{.id = "1", .action = InFile(Action::Yes)}});
    }

    /// Loads and saves both files with an object of its own.
    std::function<void()> LoadAndSave(std::uint32_t* action = nullptr)
    {
        return [this, action] {
            const OrvixServicesPointer services = MakeOrvixServices();
            services->Initialize(&m_info, 0);
            if (action != nullptr)
            {
                *action = services->GetPromptAction(1);
            }
            services->RegisterPrompt(2, L"second", Action::No, 0, true);
            services->Shutdown();
        };
    }
};

/// Watches the documents of OrvixCore.dll: it holds a pointer of its own to the latest, and counts the other pointers
/// when the library leaves COM.
class DocumentWatch
{
public:
    DocumentWatch()
        : m_create(Library(), "CoCreateInstance", reinterpret_cast<void*>(&Create)),
          m_leave(Library(), "CoUninitialize", reinterpret_cast<void*>(&Leave))
    {
        s_watch = this;
    }
    DocumentWatch(const DocumentWatch&) = delete;
    DocumentWatch& operator=(const DocumentWatch&) = delete;
    ~DocumentWatch() { s_watch = nullptr; }

    int documents = 0;
    int closed = 0;
    ULONG pointersAfterEnd = 0;

private:
    static HMODULE Library() { return GetModuleHandleW(L"OrvixCore.dll"); }

    static HRESULT WINAPI Create(REFCLSID classId, IUnknown* outer, DWORD context, REFIID interfaceId, void** object)
    {
        const HRESULT result =
            s_watch->m_create.Original<decltype(CoCreateInstance)>()(classId, outer, context, interfaceId, object);
        if (SUCCEEDED(result))
        {
            ++s_watch->documents;
            s_watch->m_document = static_cast<IUnknown*>(*object);
            s_watch->m_document->AddRef();
        }
        return result;
    }

    static void WINAPI Leave()
    {
        if (IUnknown* document = std::exchange(s_watch->m_document, nullptr))
        {
            ++s_watch->closed;
            s_watch->pointersAfterEnd += document->Release();
        }
        s_watch->m_leave.Original<decltype(CoUninitialize)>()();
    }

    static inline DocumentWatch* s_watch = nullptr;

    ImportHook m_create;
    ImportHook m_leave;
    IUnknown* m_document = nullptr;
};

/// Makes the allocation of the n-th text, or array of bytes, fail that OrvixCore.dll passes to COM.
class TextAllocationFailure
{
public:
    explicit TextAllocationFailure(long n, bool forGood = false)
        : m_hook(GetModuleHandleW(L"OrvixCore.dll"), "SysAllocString", reinterpret_cast<void*>(&Allocate)),
          m_arrayHook(GetModuleHandleW(L"OrvixCore.dll"), "SafeArrayCreateVector",
                      reinterpret_cast<void*>(&AllocateArray)),
          m_countdown(n), m_forGood(forGood)
    {
        s_failure = this;
    }
    TextAllocationFailure(const TextAllocationFailure&) = delete;
    TextAllocationFailure& operator=(const TextAllocationFailure&) = delete;
    ~TextAllocationFailure() { s_failure = nullptr; }

    bool IsActive() const { return m_hook.IsActive() && m_arrayHook.IsActive(); }
    bool HasFailed() const { return m_countdown <= 0; }

private:
    bool FailsNow()
    {
        --m_countdown;
        return m_countdown == 0 || (m_countdown < 0 && m_forGood);
    }
    static BSTR WINAPI Allocate(const OLECHAR* text)
    {
        return s_failure->FailsNow() ? nullptr : s_failure->m_hook.Original<decltype(SysAllocString)>()(text);
    }
    static SAFEARRAY* WINAPI AllocateArray(VARTYPE type, LONG first, ULONG count)
    {
        const auto create = s_failure->m_arrayHook.Original<decltype(SafeArrayCreateVector)>();
        return s_failure->FailsNow() ? nullptr : create(type, first, count);
    }

    static inline TextAllocationFailure* s_failure = nullptr;

    ImportHook m_hook;
    ImportHook m_arrayHook;
    long m_countdown;
    bool m_forGood;
};

using ComError = ServicesTest;

} // namespace

TEST_F(ComOfTheThread, IsNeitherNeededNorLeftInitialised)
{
    std::uint32_t action = 0;
    EXPECT_TRUE(LeavesComAlone(NoApartment, LoadAndSave(&action)));
    EXPECT_EQ(action, Action::Yes);
    EXPECT_NE(SavedPrompts().find("second"), std::string::npos);
}

TEST_F(ComOfTheThread, StaysInItsOwnApartment)
{
    std::uint32_t action = 0;
    EXPECT_TRUE(LeavesComAlone(SingleThreaded, LoadAndSave(&action)));
    EXPECT_EQ(action, Action::Yes);
    EXPECT_NE(SavedPrompts().find("second"), std::string::npos);
}

TEST_F(ComOfTheThread, ThatIsMultithreadedReadsAndSavesNothing)
{
    const std::string before = ReadBytes(PromptsFile());
    std::uint32_t action = 0;
    EXPECT_TRUE(LeavesComAlone(Multithreaded, LoadAndSave(&action)));
    EXPECT_EQ(action, 0u);
    EXPECT_EQ(ReadBytes(PromptsFile()), before);
}

TEST_F(ComOfTheThread, IsLeftAsItWasByFilesThatAreMissingOrBroken)
{
    std::filesystem::remove(m_config.Path() / L"OrvixProviders.xml");
    std::filesystem::remove(PromptsFile());
    EXPECT_TRUE(LeavesComAlone(NoApartment, LoadAndSave()));
    WriteBytes(m_config.Path() / L"OrvixProviders.xml", "<broken");
    WriteBytes(PromptsFile(), "<broken");
    EXPECT_TRUE(LeavesComAlone(NoApartment, LoadAndSave()));
    WriteBytes(m_config.Path() / L"OrvixProviders.xml", "<Other/>");
    WriteBytes(PromptsFile(), "<OnlyOneNode/>");
    EXPECT_TRUE(LeavesComAlone(NoApartment, LoadAndSave()));
}

TEST_F(ComOfTheThread, IsLeftAsItWasWhenTheFileCannotBeWritten)
{
    m_info.SetConfigFilePath((m_config.Text() + L"\\missing").c_str());
    EXPECT_TRUE(LeavesComAlone(NoApartment, LoadAndSave()));
}

TEST_F(ComOfTheThread, NoDocumentOutlivesIt)
{
    DocumentWatch watch;
    LoadAndSave()();
    EXPECT_EQ(watch.documents, 3) << "two files read, one written";
    EXPECT_EQ(watch.closed, 3);
    EXPECT_EQ(watch.pointersAfterEnd, 0u);
}

TEST_F(ComOfTheThread, NoDocumentOfABrokenFileOutlivesIt)
{
    WriteBytes(m_config.Path() / L"OrvixProviders.xml", "<broken");
    WriteBytes(PromptsFile(), "<broken");
    DocumentWatch watch;
    EXPECT_FALSE(Initialize(0));
    EXPECT_EQ(watch.documents, 2);
    EXPECT_EQ(watch.closed, 2);
    EXPECT_EQ(watch.pointersAfterEnd, 0u);
}

TEST_F(ComError, LeavesInitializeAndTheObjectStaysUsable)
{
    AddPlugin(L"good");
    WriteProviders("<a><Name>Depot</Name><FixedProjectRoot>root</FixedProjectRoot></a>");
    WritePrompts({{.id = "1", .action = InFile(Action::Yes)}});
    const std::string before = SavedPrompts();
    long n = 1;
    for (bool failed = true; failed; ++n)
    {
        m_services = MakeOrvixServices();
        TextAllocationFailure failure(n);
        ASSERT_TRUE(failure.IsActive());
        try
        {
            Initialize();
        }
        catch (const _com_error& error)
        {
            EXPECT_EQ(error.Error(), E_OUTOFMEMORY);
            EXPECT_TRUE(failure.HasFailed());
        }
        failed = failure.HasFailed();
        if (failed)
        {
            m_services->Shutdown();
            EXPECT_EQ(SavedPrompts(), before);
            EXPECT_TRUE(Initialize());
        }
        EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes);
    }
    EXPECT_GT(n, 3) << "two files are read";
}

TEST_F(ComError, LeavesShutdownAndNothingStoredIsLost)
{
    WritePrompts({{.text = "first", .id = "1", .action = InFile(Action::Yes)},
                  {.text = "second", .id = "2", .action = InFile(Action::No)}});
    Initialize(0);
    m_services->SetPromptAction(1, Action::YesToAll);
    const std::string before = ReadBytes(PromptsFile());
    const std::string after = PromptsXml({{.text = "first", .id = "1", .action = InFile(Action::YesToAll)},
                                          {.text = "second", .id = "2", .action = InFile(Action::No)}});
    long errors = 0;
    for (long n = 1;; ++n)
    {
        TextAllocationFailure failure(n);
        try
        {
            m_services->Shutdown();
        }
        catch (const _com_error& error)
        {
            EXPECT_EQ(error.Error(), E_OUTOFMEMORY);
            ++errors;
        }
        if (!failure.HasFailed())
        {
            break;
        }
        ASSERT_EQ(ReadBytes(PromptsFile()), before) << "text " << n;
    }
    EXPECT_GT(errors, 10);
    EXPECT_EQ(SavedPrompts(), after);
}

TEST_F(ComError, DoesNotLeaveTheRelease)
{
    const std::filesystem::path good = AddPlugin(L"good");
    Initialize();
    m_services->RegisterPrompt(1, L"text", Action::Yes, 0, false);
    const TextAllocationFailure failure(1, true);
    m_services.reset();
    EXPECT_TRUE(failure.HasFailed());
    EXPECT_FALSE(IsLoaded(good));
    EXPECT_FALSE(std::filesystem::exists(PromptsFile()));
}

TEST_F(ComError, OfASecondInitializeKeepsTheProvidersOfTheFirst)
{
    const std::filesystem::path good = AddPlugin(L"good");
    WriteProviders("<a><Name>Depot</Name></a>");
    ASSERT_TRUE(Initialize());
    {
        const TextAllocationFailure failure(1);
        EXPECT_THROW(Initialize(), _com_error);
    }
    EXPECT_EQ(ProviderNames(), Names{L"Fake Depot"});
    m_services.reset();
    EXPECT_FALSE(IsLoaded(good));
}
