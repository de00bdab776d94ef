#pragma once

#include "ImportHook.h"

#include <string>

/// A heap of which one allocation can be made to fail. Not thread-safe.
class AllocationHeap
{
public:
    AllocationHeap() = default;
    AllocationHeap(const AllocationHeap&) = delete;
    AllocationHeap& operator=(const AllocationHeap&) = delete;
    virtual ~AllocationHeap() = default;

    /// Names the heap in the messages of a failed test.
    virtual std::string Name() const = 0;

    /// Makes the n-th allocation from now fail (1: the very next one), with `forGood` all later ones as well.
    virtual void Fail(long n, bool forGood) = 0;

    /// Ends the failing. True when an allocation has failed since `Fail`.
    virtual bool Stop() = 0;

    /// Blocks in use now. Two readings are compared; the value by itself means nothing.
    virtual long LiveBlocks() const = 0;
};

/// The host's heap, on which records live: braeutil's, with the means of its development build. A failure is
/// noticed only where OrvixCore.dll itself meets it.
class HostHeap final : public AllocationHeap
{
public:
    HostHeap();
    HostHeap(const HostHeap&) = delete;
    HostHeap& operator=(const HostHeap&) = delete;
    ~HostHeap() override;

    std::string Name() const override { return "host heap"; }
    void Fail(long n, bool forGood) override;
    bool Stop() override;
    long LiveBlocks() const override;

private:
    ImportHook m_new;
    ImportHook m_newArray;
};

/// OrvixCore.dll's ordinary allocator: `malloc` and its kin, as the module imports them. Its operator new and
/// its C++ run-time call nothing else.
///
/// Live blocks are those that OrvixCore.dll has allocated since the program began and that neither it nor the
/// program has freed: the storage of a std::wstring may grow in the one and go in the other. The constructor
/// lets the module meet exceptions, so that what its C++ run-time then keeps, for the constructing thread and
/// for the process, counts neither as an allocation of the operation under test nor as a leak.
class LibraryHeap final : public AllocationHeap
{
public:
    LibraryHeap();
    LibraryHeap(const LibraryHeap&) = delete;
    LibraryHeap& operator=(const LibraryHeap&) = delete;
    ~LibraryHeap() override;

    std::string Name() const override { return "OrvixCore.dll's own heap"; }
    void Fail(long n, bool forGood) override;
    bool Stop() override;
    long LiveBlocks() const override;
};
