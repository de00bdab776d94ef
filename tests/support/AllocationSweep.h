#pragma once

#include "AllocationFailure.h"
#include "BraeDiagnostics.h"

#include <gtest/gtest.h>

#include <array>
#include <string>
#include <utility>

/// One round of `SweepAllocations`: allocation n of one heap fails.
class AllocationRound
{
public:
    AllocationRound(AllocationHeap& heap, long n, bool forGood) : m_heap(heap), m_n(n), m_forGood(forGood) {}

    /// Runs the operation under test, and nothing else, with the failure in force; returns its result. Once a
    /// round. An exception that leaves the operation leaves this as well and fails the test.
    template <typename Operation>
    decltype(auto) Attempt(Operation&& operation)
    {
        const Failing failing(*this);
        return std::forward<Operation>(operation)();
    }

    /// Whether an allocation failed during `Attempt`. Where none did, the operation must have succeeded.
    bool Failed() const { return m_failed; }

private:
    class Failing
    {
    public:
        explicit Failing(AllocationRound& round) : m_round(round) { round.m_heap.Fail(round.m_n, round.m_forGood); }
        Failing(const Failing&) = delete;
        Failing& operator=(const Failing&) = delete;
        ~Failing() { m_round.m_failed = m_round.m_heap.Stop(); }

    private:
        AllocationRound& m_round;
    };

    AllocationHeap& m_heap;
    long m_n;
    bool m_forGood;
    bool m_failed = false;
};

/// Fails allocation n = 1, 2, 3, ... of the host's heap and then of the library's own, once and for good,
/// until `body` runs through without meeting a failure. Returns how many rounds met one.
///
/// `body` is called with an `AllocationRound&` for every round. It makes fresh objects, runs the operation in
/// `round.Attempt(...)`, checks result and objects for both outcomes, shows that the objects still work, and
/// destroys everything that it made. The sweep itself checks that no block stays allocated on either heap and
/// that no block was freed on the wrong one. It ends at the first round in which an expectation fails.
///
///     const long failures = SweepAllocations([](AllocationRound& round) {
///         OrvixFileList list;
///         OrvixFileEntry* entry = round.Attempt([&] { return list.CreateEntry(path, nullptr, 0, 0); });
///         EXPECT_EQ(entry == nullptr, round.Failed());
///         EXPECT_EQ(list.NumEntries(), round.Failed() ? 0u : 1u);
///         EXPECT_NE(list.CreateEntry(path, nullptr, 0, 0), nullptr);
///     });
///     EXPECT_GE(failures, 4);
///
/// Where an operation keeps storage beyond its objects (a registry, say), call it once before the sweep: storage
/// that is there already and grows is no leak.
template <typename Body>
long SweepAllocations(Body body)
{
    HostHeap hostHeap;
    LibraryHeap libraryHeap;
    const std::array<AllocationHeap*, 2> heaps = {&hostHeap, &libraryHeap};
    long failures = 0;
    for (AllocationHeap* heap : heaps)
    {
        for (const bool forGood : {false, true})
        {
            for (long n = 1;; ++n)
            {
                SCOPED_TRACE(heap->Name() + ", allocation " + std::to_string(n) + (forGood ? " and later" : ""));
                const long hostBlocks = hostHeap.LiveBlocks();
                const long libraryBlocks = libraryHeap.LiveBlocks();
                const long foreignFrees = BraeDiagnostics::ForeignFrees();
                AllocationRound round(*heap, n, forGood);
                body(round);
                EXPECT_EQ(hostHeap.LiveBlocks(), hostBlocks) << "leak on the host heap";
                EXPECT_EQ(libraryHeap.LiveBlocks(), libraryBlocks) << "leak on the library's own heap";
                EXPECT_EQ(BraeDiagnostics::ForeignFrees(), foreignFrees) << "block freed on the wrong heap";
                if (testing::Test::HasFailure())
                {
                    return failures;
                }
                if (!round.Failed())
                {
                    break;
                }
                ++failures;
            }
        }
    }
    return failures;
}
