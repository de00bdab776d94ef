#include "AllocationFailure.h"

#include "BraeDiagnostics.h"
#include "OrvixPromptTable.h"

#include <cstddef>
#include <limits>
#include <memory_resource>
#include <mutex>
#include <new>
#include <stdexcept>
#include <unordered_set>

namespace
{

#if defined(_MSC_VER)
constexpr const char* HostNewImport = "??2BraeHeapOperators@@SAPEAX_K@Z";
constexpr const char* HostNewArrayImport = "??_UBraeHeapOperators@@SAPEAX_K@Z";
#else
constexpr const char* HostNewImport = "_ZN17BraeHeapOperatorsnwEy";
constexpr const char* HostNewArrayImport = "_ZN17BraeHeapOperatorsnaEy";
#endif

HMODULE Library()
{
    const HMODULE module = GetModuleHandleW(L"OrvixCore.dll");
    if (module == nullptr)
    {
        throw std::runtime_error("OrvixCore.dll is not loaded");
    }
    return module;
}

template <typename Function>
void* Address(Function* function)
{
    return reinterpret_cast<void*>(function);
}

/// Which allocations are to fail, and how many have.
struct Failing
{
    bool Strikes()
    {
        if (remaining == 0)
        {
            return false;
        }
        if (countdown > 1)
        {
            --countdown;
            return false;
        }
        --remaining;
        ++failures;
        return true;
    }

    long countdown = 1;
    long remaining = 0;
    long failures = 0;
};

void* (*g_hostNew)(std::size_t);
void* (*g_hostNewArray)(std::size_t);
long g_hostFailures;

void* Noticed(void* block)
{
    if (block == nullptr)
    {
        ++g_hostFailures;
    }
    return block;
}

void* HostNew(std::size_t size)
{
    return Noticed(g_hostNew(size));
}

void* HostNewArray(std::size_t size)
{
    return Noticed(g_hostNewArray(size));
}

/// Keeps the record of blocks apart from the heaps that are watched.
class ProcessHeap final : public std::pmr::memory_resource
{
    void* do_allocate(std::size_t size, std::size_t) override
    {
        void* block = HeapAlloc(GetProcessHeap(), 0, size);
        if (block == nullptr)
        {
            throw std::bad_alloc();
        }
        return block;
    }
    void do_deallocate(void* block, std::size_t, std::size_t) override { HeapFree(GetProcessHeap(), 0, block); }
    bool do_is_equal(const memory_resource& other) const noexcept override { return this == &other; }
};

/// The blocks that the library has in use. Locked, since threads of the test program free memory as well.
class Blocks
{
public:
    void* Add(void* block)
    {
        const std::lock_guard lock(m_mutex);
        if (block != nullptr)
        {
            m_blocks.insert(block);
        }
        return block;
    }
    void Remove(void* block)
    {
        const std::lock_guard lock(m_mutex);
        m_blocks.erase(block);
    }
    long Count()
    {
        const std::lock_guard lock(m_mutex);
        return static_cast<long>(m_blocks.size());
    }

private:
    std::mutex m_mutex;
    ProcessHeap m_heap;
    std::pmr::unordered_set<void*> m_blocks{&m_heap};
};

/// The library's allocator under watch, from the beginning of the program to its end: storage that lives
/// longer than a test (the registry of listeners) is known when it is replaced.
struct WatchedAllocator
{
    static void* Malloc(std::size_t size);
    static void* Calloc(std::size_t count, std::size_t size);
    static void* Realloc(void* block, std::size_t size);
    static void Free(void* block);
    static void ProgramFree(void* block);

    Failing failing;
    Blocks blocks;
    ImportHook malloc{Library(), "malloc", Address(&Malloc)};
    ImportHook calloc{Library(), "calloc", Address(&Calloc)};
    ImportHook realloc{Library(), "realloc", Address(&Realloc)};
    ImportHook free{Library(), "free", Address(&Free)};
    ImportHook programFree{GetModuleHandleW(nullptr), "free", Address(&ProgramFree)};
};

WatchedAllocator g_watched;

void* WatchedAllocator::Malloc(std::size_t size)
{
    if (g_watched.failing.Strikes())
    {
        return nullptr;
    }
    return g_watched.blocks.Add(g_watched.malloc.Original<void*(std::size_t)>()(size));
}

void* WatchedAllocator::Calloc(std::size_t count, std::size_t size)
{
    if (g_watched.failing.Strikes())
    {
        return nullptr;
    }
    return g_watched.blocks.Add(g_watched.calloc.Original<void*(std::size_t, std::size_t)>()(count, size));
}

void* WatchedAllocator::Realloc(void* block, std::size_t size)
{
    if (g_watched.failing.Strikes())
    {
        return nullptr;
    }
    void* moved = g_watched.realloc.Original<void*(void*, std::size_t)>()(block, size);
    if (moved != nullptr || size == 0)
    {
        g_watched.blocks.Remove(block);
    }
    return g_watched.blocks.Add(moved);
}

void WatchedAllocator::Free(void* block)
{
    g_watched.blocks.Remove(block);
    g_watched.free.Original<void(void*)>()(block);
}

void WatchedAllocator::ProgramFree(void* block)
{
    g_watched.blocks.Remove(block);
    g_watched.programFree.Original<void(void*)>()(block);
}

} // namespace

HostHeap::HostHeap()
    : m_new(Library(), HostNewImport, Address(&HostNew)),
      m_newArray(Library(), HostNewArrayImport, Address(&HostNewArray))
{
    if (!m_new.IsActive())
    {
        throw std::runtime_error("OrvixCore.dll does not import the host's operator new");
    }
    g_hostNew = m_new.Original<void*(std::size_t)>();
    g_hostNewArray = m_newArray.Original<void*(std::size_t)>();
}

HostHeap::~HostHeap()
{
    BraeDiagnostics::FailAllocation(0, false);
}

void HostHeap::Fail(long n, bool forGood)
{
    g_hostFailures = 0;
    BraeDiagnostics::FailAllocation(n, forGood);
}

bool HostHeap::Stop()
{
    BraeDiagnostics::FailAllocation(0, false);
    return g_hostFailures != 0;
}

long HostHeap::LiveBlocks() const
{
    return BraeDiagnostics::LiveBlocks();
}

LibraryHeap::LibraryHeap()
{
    if (!g_watched.malloc.IsActive() || !g_watched.free.IsActive())
    {
        throw std::runtime_error("OrvixCore.dll does not import malloc and free");
    }

    // What the C++ run-time makes for a thread when it is first needed to throw there.
    g_watched.failing = {1, 1, 0};
    OrvixPromptTable().AddPrompt(1, L"", 0, 0, false);
    g_watched.failing = {};
}

LibraryHeap::~LibraryHeap()
{
    g_watched.failing = {};
}

void LibraryHeap::Fail(long n, bool forGood)
{
    g_watched.failing = {n, forGood ? std::numeric_limits<long>::max() : 1, 0};
}

bool LibraryHeap::Stop()
{
    const bool failed = g_watched.failing.failures != 0;
    g_watched.failing = {};
    return failed;
}

long LibraryHeap::LiveBlocks() const
{
    return g_watched.blocks.Count();
}
