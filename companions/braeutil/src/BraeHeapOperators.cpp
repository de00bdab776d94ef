#include "BraeHeapOperators.h"

#include "BraeDiagnostics.h"

#include <windows.h>

#include <cstdint>

namespace
{

/// Precedes every block. It has 16 bytes, so that the block has the alignment of the heap.
struct BlockHeader
{
    std::uint64_t mark;
    std::uint64_t unused;
};

static_assert(sizeof(BlockHeader) == 16);

constexpr std::uint64_t LiveMark = 0x4B4C425F45415242; // "BRAE_BLK"
constexpr std::uint64_t FreedMark = 0x444545525F424C4B;

struct Heap
{
    HANDLE handle = HeapCreate(0, 0, 0);
    long liveBlocks = 0;
    long foreignFrees = 0;
    long failCountdown = 0;
    bool failForGood = false;
};

Heap& TheHeap()
{
    static Heap heap;
    return heap;
}

bool MustFail(Heap& heap)
{
    if (heap.failCountdown == 0)
    {
        return false;
    }
    if (heap.failCountdown > 1)
    {
        --heap.failCountdown;
        return false;
    }
    if (!heap.failForGood)
    {
        heap.failCountdown = 0;
    }
    return true;
}

void* Allocate(std::size_t size) noexcept
{
    Heap& heap = TheHeap();
    if (MustFail(heap) || size > SIZE_MAX - sizeof(BlockHeader))
    {
        return nullptr;
    }
    auto* header = static_cast<BlockHeader*>(HeapAlloc(heap.handle, 0, sizeof(BlockHeader) + size));
    if (header == nullptr)
    {
        return nullptr;
    }
    header->mark = LiveMark;
    InterlockedIncrement(&heap.liveBlocks);
    return header + 1;
}

void Free(void* block) noexcept
{
    if (block == nullptr)
    {
        return;
    }
    Heap& heap = TheHeap();
    auto* header = static_cast<BlockHeader*>(block) - 1;
    if (header->mark != LiveMark)
    {
        InterlockedIncrement(&heap.foreignFrees);
        return;
    }
    header->mark = FreedMark;
    InterlockedDecrement(&heap.liveBlocks);
    HeapFree(heap.handle, 0, header);
}

} // namespace

void* BraeHeapOperators::operator new(std::size_t size) noexcept
{
    return Allocate(size);
}

void* BraeHeapOperators::operator new[](std::size_t size) noexcept
{
    return Allocate(size);
}

void BraeHeapOperators::operator delete(void* block) noexcept
{
    Free(block);
}

void BraeHeapOperators::operator delete[](void* block) noexcept
{
    Free(block);
}

long BraeDiagnostics::LiveBlocks() noexcept
{
    return TheHeap().liveBlocks;
}

long BraeDiagnostics::ForeignFrees() noexcept
{
    return TheHeap().foreignFrees;
}

void BraeDiagnostics::FailAllocation(long countdown, bool forGood) noexcept
{
    TheHeap().failCountdown = countdown;
    TheHeap().failForGood = forGood;
}
