#include "AllocationSweep.h"
#include "BraeDiagnostics.h"
#include "IOrvixNotifyCallback.h"
#include "OrvixFileList.h"
#include "OrvixNotification.h"
#include "OrvixNotifyParams.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstdint>
#include <deque>
#include <functional>
#include <stdexcept>
#include <string>
#include <vector>

namespace
{

using Answer = std::function<std::uint32_t(OrvixNotifyParams*, std::int64_t)>;

std::uint32_t Accept(OrvixNotifyParams*, std::int64_t)
{
    return 0;
}

Answer Give(std::uint32_t value)
{
    return [value](OrvixNotifyParams*, std::int64_t) { return value; };
}

/// Takes part from its making to its end, unless told otherwise, and writes down its deliveries.
class Listener final : public IOrvixNotifyCallback
{
public:
    Listener(std::string& log, char name, Answer answer = Accept)
        : m_log(log), m_name(name), m_answer(std::move(answer))
    {
    }
    Listener(const Listener&) = delete;
    Listener& operator=(const Listener&) = delete;
    ~Listener() { Leave(); }

    bool Join(std::int64_t data = 0) { return OrvixNotification::RegisterOrvixNotification(this, data); }
    bool Leave() { return OrvixNotification::UnRegisterOrvixNotification(this); }

    std::uint32_t Notify(OrvixNotifyParams* params, std::int64_t data) override
    {
        m_log += m_name;
        if (params->IsCancelled())
        {
            m_log += '!';
        }
        userData.push_back(data);
        return m_answer(params, data);
    }

    std::vector<std::int64_t> userData;

private:
    std::string& m_log;
    char m_name;
    Answer m_answer;
};

/// Deliveries are written down one letter each, with "!" where the record was cancelled.
class Notification : public testing::Test
{
protected:
    Listener& Add(char name, Answer answer = Accept)
    {
        Listener& listener = listeners.emplace_back(log, name, std::move(answer));
        EXPECT_TRUE(listener.Join());
        return listener;
    }

    std::string log;
    std::deque<Listener> listeners;
};

/// Counts calls of its setter.
class CountingParams : public OrvixNotifyParams
{
public:
    void SetCancelled(bool cancelled) override
    {
        ++calls;
        OrvixNotifyParams::SetCancelled(cancelled);
    }

    int calls = 0;
};

std::uint32_t Broadcast(std::uint32_t id = 1, std::uint32_t providerIndex = 0)
{
    return OrvixNotification::BroadcastOrvixNotification(id, providerIndex);
}

std::uint32_t Broadcast(OrvixNotifyParams& params)
{
    return OrvixNotification::BroadcastOrvixNotification(&params);
}

} // namespace

// These stand first: the registry's storage never shrinks, and they fill it to its end.
TEST_F(Notification, AllocationFailureRefusesTheFirstRegistrationOfAll)
{
    LibraryHeap heap;
    for (long n = 1; n <= 5; ++n)
    {
        Listener listener(log, 'A');
        heap.Fail(n, true);
        const bool joined = listener.Join();
        const bool failed = heap.Stop();
        EXPECT_EQ(joined, !failed);
        EXPECT_EQ(listener.Leave(), joined);
    }
}

TEST_F(Notification, AllocationFailureRefusesARegistrationAndKeepsTheOthers)
{
    Add('A');
    LibraryHeap heap;
    const long failures = SweepAllocations([&](AllocationRound& round) {
        std::deque<Listener> added;
        const auto join = [&] { return added.back().Join(static_cast<std::int64_t>(added.size())); };
        heap.Fail(1, true);
        do
        {
            added.emplace_back(log, 'L');
        } while (join());
        heap.Stop();

        const bool accepted = round.Attempt(join);
        EXPECT_EQ(accepted, !round.Failed());
        const std::size_t joined = added.size() - (accepted ? 0 : 1);
        log.clear();
        EXPECT_EQ(Broadcast(), 0u);
        EXPECT_EQ(log, "A" + std::string(joined, 'L'));
        for (std::size_t n = 0; n < joined; ++n)
        {
            EXPECT_EQ(added[n].userData, std::vector<std::int64_t>{static_cast<std::int64_t>(n + 1)});
        }
        EXPECT_TRUE(join());
        EXPECT_TRUE(added.back().Leave());
    });
    EXPECT_GE(failures, 2);
}

TEST_F(Notification, AllocationFailureIsNotMetByABroadcast)
{
    Add('A');
    Add('B', Give(1));
    const long failures = SweepAllocations([&](AllocationRound& round) {
        OrvixNotifyParams params;
        EXPECT_EQ(round.Attempt([&] { return Broadcast(params) + Broadcast(); }), 2u);
    });
    EXPECT_EQ(failures, 0);
}

TEST_F(Notification, IsAcceptedWithoutListenersAndLeavesTheRecordAlone)
{
    CountingParams params;
    params.SetID(5);
    EXPECT_EQ(Broadcast(params), 0u);
    EXPECT_EQ(params.calls, 0);
    EXPECT_EQ(params.GetID(), 5u);
    EXPECT_FALSE(params.IsCancelled());
    EXPECT_EQ(Broadcast(), 0u);
}

TEST_F(Notification, ReachesListenersInOrderOfRegistration)
{
    for (const char name : {'A', 'B', 'C'})
    {
        Add(name);
    }
    EXPECT_EQ(Broadcast(), 0u);
    EXPECT_EQ(log, "ABC");
    EXPECT_EQ(Broadcast(), 0u);
    EXPECT_EQ(log, "ABCABC");
}

TEST_F(Notification, OfTheShortFormCarriesIdAndProviderIndexAndNothingElse)
{
    std::vector<std::uint32_t> seen;
    bool cancelled = true;
    OrvixFileList somewhere;
    OrvixFileList* list = &somewhere;
    Add('A', [&](OrvixNotifyParams* params, std::int64_t) {
        seen = {params->GetID(), params->GetProviderIndex()};
        cancelled = params->IsCancelled();
        list = params->GetOrvixFileList();
        return 0u;
    });
    EXPECT_EQ(Broadcast(0xFFFFFFFF, 0x80000000), 0u);
    EXPECT_EQ(seen, (std::vector<std::uint32_t>{0xFFFFFFFF, 0x80000000}));
    EXPECT_FALSE(cancelled);
    EXPECT_EQ(list, nullptr);
}

TEST_F(Notification, OfTheShortFormGivesTheResultOfTheDelivery)
{
    Listener& first = Add('A', Give(1));
    EXPECT_EQ(Broadcast(), 1u);
    first.Leave();
    Add('B', Give(0xFFFFFFFF));
    EXPECT_EQ(Broadcast(), 0xFFFFFFFF);
}

TEST_F(Notification, OfARecordDeliversThatVeryRecord)
{
    OrvixFileList list;
    OrvixNotifyParams params;
    OrvixNotifyParams* seen = nullptr;
    Add('A', [&](OrvixNotifyParams* given, std::int64_t) {
        seen = given;
        given->SetOrvixFileList(&list);
        given->SetID(9);
        return 0u;
    });
    EXPECT_EQ(Broadcast(params), 0u);
    EXPECT_EQ(seen, &params);
    EXPECT_EQ(params.GetOrvixFileList(), &list);
    EXPECT_EQ(params.GetID(), 9u);
}

TEST_F(Notification, OfNoRecordReachesNobody)
{
    Add('A', Give(1));
    EXPECT_EQ(OrvixNotification::BroadcastOrvixNotification(nullptr), 0u);
    EXPECT_EQ(log, "");
}

TEST_F(Notification, CancelledByAListenerIsToldToThoseWhoHadAccepted)
{
    Add('A');
    Add('B', Give(1));
    Add('C');
    CountingParams params;
    EXPECT_EQ(Broadcast(params), 1u);
    EXPECT_EQ(log, "ABA!");
    EXPECT_TRUE(params.IsCancelled());
    EXPECT_EQ(params.calls, 1);
}

TEST_F(Notification, CancelledByTheFirstListenerCallsNobodyAgain)
{
    Add('A', Give(1));
    Add('B');
    OrvixNotifyParams params;
    EXPECT_EQ(Broadcast(params), 1u);
    EXPECT_EQ(log, "A");
    EXPECT_TRUE(params.IsCancelled());
}

TEST_F(Notification, CancelledIsToldInAscendingOrderWhateverTheAnswers)
{
    bool first = true;
    for (const char name : {'A', 'B', 'C'})
    {
        Add(name, [&](OrvixNotifyParams* params, std::int64_t) { return params->IsCancelled() ? 1u : 0u; });
    }
    Add('D', [&](OrvixNotifyParams*, std::int64_t) { return first ? 1u : 0u; });
    Add('E');
    EXPECT_EQ(Broadcast(), 1u);
    EXPECT_EQ(log, "ABCDA!B!C!");
}

TEST_F(Notification, StoppedByAnotherValueGivesThatValueAndDoesNotCancel)
{
    for (const std::uint32_t value : {2u, 0x80000001u, UINT_MAX})
    {
        log.clear();
        listeners.clear();
        Add('A');
        Add('B', Give(value));
        Add('C');
        CountingParams params;
        EXPECT_EQ(Broadcast(params), value);
        EXPECT_EQ(log, "AB");
        EXPECT_FALSE(params.IsCancelled());
        EXPECT_EQ(params.calls, 0);
    }
}

TEST_F(Notification, StoppedByTheFirstListenerReachesNobodyElse)
{
    Add('A', Give(2));
    Add('B');
    Add('C');
    OrvixNotifyParams params;
    EXPECT_EQ(Broadcast(params), 2u);
    EXPECT_EQ(log, "A");
    EXPECT_FALSE(params.IsCancelled());
}

TEST_F(Notification, OfARecordThatIsCancelledAlreadyIsDeliveredAllTheSame)
{
    Add('A');
    Add('B');
    OrvixNotifyParams params;
    params.SetCancelled(true);
    EXPECT_EQ(Broadcast(params), 0u);
    EXPECT_EQ(log, "A!B!");
}

TEST_F(Notification, CallsTheFirstSlotOfAListener)
{
    struct Seen
    {
        void* const* table;
        OrvixNotifyParams* params;
        std::int64_t userData;
    };
    using NotifyFunction = std::uint32_t (*)(Seen*, OrvixNotifyParams*, std::int64_t);
    const NotifyFunction notify = [](Seen* self, OrvixNotifyParams* params, std::int64_t userData) -> std::uint32_t {
        self->params = params;
        self->userData = userData;
        return 0x12345678;
    };
    void* const table[] = {reinterpret_cast<void*>(notify)};
    Seen seen{table, nullptr, 0};
    auto* callback = reinterpret_cast<IOrvixNotifyCallback*>(&seen);
    OrvixNotifyParams params;
    ASSERT_TRUE(OrvixNotification::RegisterOrvixNotification(callback, LLONG_MIN));
    EXPECT_EQ(Broadcast(params), 0x12345678u);
    EXPECT_TRUE(OrvixNotification::UnRegisterOrvixNotification(callback));
    EXPECT_EQ(seen.params, &params);
    EXPECT_EQ(seen.userData, LLONG_MIN);
}

TEST_F(Notification, MayBeBroadcastWithinABroadcast)
{
    Add('A', [](OrvixNotifyParams* params, std::int64_t) { return params->GetID() == 1 ? Broadcast(2) : 0; });
    Add('B');
    EXPECT_EQ(Broadcast(1), 0u);
    EXPECT_EQ(log, "AABB");
}

TEST_F(Notification, KeepsListenersAndUserDataThroughTheHostsHeapUntouched)
{
    const long blocks = BraeDiagnostics::LiveBlocks();
    Add('A');
    Broadcast();
    listeners.clear();
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
}

TEST_F(Notification, RefusesToRegisterNull)
{
    EXPECT_FALSE(OrvixNotification::RegisterOrvixNotification(nullptr, 1));
    EXPECT_EQ(Broadcast(), 0u);
}

TEST_F(Notification, RefusesToUnregisterNullAndStrangers)
{
    EXPECT_FALSE(OrvixNotification::UnRegisterOrvixNotification(nullptr));
    Listener stranger(log, 'X');
    EXPECT_FALSE(stranger.Leave());
    Add('A');
    EXPECT_FALSE(stranger.Leave());
    EXPECT_FALSE(OrvixNotification::UnRegisterOrvixNotification(nullptr));
    Broadcast();
    EXPECT_EQ(log, "A");
}

TEST_F(Notification, GivesEveryListenerItsOwnUserData)
{
    const std::int64_t values[] = {LLONG_MIN, -1, 0, 1, LLONG_MAX};
    for (const std::int64_t value : values)
    {
        EXPECT_TRUE(listeners.emplace_back(log, 'L').Join(value));
    }
    listeners.emplace_back(log, 'V', Give(1)).Join(7);
    Broadcast();
    for (std::size_t n = 0; n < std::size(values); ++n)
    {
        EXPECT_EQ(listeners[n].userData, (std::vector<std::int64_t>{values[n], values[n]}));
    }
    EXPECT_EQ(listeners.back().userData, std::vector<std::int64_t>{7});
}

TEST_F(Notification, KeepsOneEntryWithTheFirstUserDataForAListenerRegisteredTwice)
{
    Listener listener(log, 'A');
    EXPECT_TRUE(listener.Join(1));
    EXPECT_TRUE(listener.Join(2));
    Broadcast();
    EXPECT_EQ(listener.userData, std::vector<std::int64_t>{1});
    EXPECT_TRUE(listener.Leave());
    EXPECT_FALSE(listener.Leave());
}

TEST_F(Notification, ForgetsUserDataWithItsListener)
{
    Listener a(log, 'A');
    Listener b(log, 'B');
    a.Join(1);
    b.Join(2);
    EXPECT_TRUE(a.Leave());
    Broadcast();
    EXPECT_EQ(b.userData, std::vector<std::int64_t>{2});
    EXPECT_TRUE(a.Join(3));
    Broadcast();
    EXPECT_EQ(log, "BBA");
    EXPECT_EQ(a.userData, std::vector<std::int64_t>{3});
    EXPECT_EQ(b.userData, (std::vector<std::int64_t>{2, 2}));
}

TEST_F(Notification, KeepsTheOrderOfTheOthersWhenOneLeaves)
{
    for (const char name : {'A', 'B', 'C', 'D'})
    {
        Add(name);
    }
    EXPECT_TRUE(listeners[1].Leave());
    Broadcast();
    EXPECT_EQ(log, "ACD");
}

TEST_F(Notification, ReachesAListenerThatIsRegisteredMeanwhile)
{
    Listener late(log, 'L');
    Add('A', [&](OrvixNotifyParams*, std::int64_t) {
        late.Join(5);
        return 0u;
    });
    EXPECT_EQ(Broadcast(), 0u);
    EXPECT_EQ(log, "AL");
    EXPECT_EQ(late.userData, std::vector<std::int64_t>{5});
}

TEST_F(Notification, ReachesTenThousandListenersThatAreRegisteredMeanwhile)
{
    constexpr int Count = 10'000;
    std::deque<Listener> many;
    for (int n = 0; n < Count; ++n)
    {
        many.emplace_back(log, 'L');
    }
    Add('A', [&](OrvixNotifyParams*, std::int64_t) {
        for (int n = 0; n < Count; ++n)
        {
            many[static_cast<std::size_t>(n)].Join(n);
        }
        return 0u;
    });
    EXPECT_EQ(Broadcast(), 0u);
    EXPECT_EQ(log, "A" + std::string(Count, 'L'));
    for (int n = 0; n < Count; ++n)
    {
        ASSERT_EQ(many[static_cast<std::size_t>(n)].userData, std::vector<std::int64_t>{n});
    }
}

TEST_F(Notification, ReachesAChainOfListenersOfWhichEachRegistersTheNext)
{
    Answer addAnother;
    addAnother = [&](OrvixNotifyParams*, std::int64_t) {
        if (listeners.size() < 1'000)
        {
            Add('L', addAnother);
        }
        return 0u;
    };
    Add('L', addAnother);
    EXPECT_EQ(Broadcast(), 0u);
    EXPECT_EQ(log, std::string(1'000, 'L'));
}

TEST_F(Notification, SkipsTheListenerBehindOneThatLeavesDuringItsDelivery)
{
    Listener* self = nullptr;
    Add('A');
    self = &Add('B', [&](OrvixNotifyParams*, std::int64_t) {
        self->Leave();
        return 0u;
    });
    Add('C');
    Add('D');
    EXPECT_EQ(Broadcast(), 0u);
    EXPECT_EQ(log, "ABD");
    Broadcast();
    EXPECT_EQ(log, "ABDACD");
}

TEST_F(Notification, DoesNotReachAListenerThatWasRemovedBeforeItsTurn)
{
    Add('A', [&](OrvixNotifyParams*, std::int64_t) {
        listeners[1].Leave();
        return 0u;
    });
    Add('B');
    Add('C');
    EXPECT_EQ(Broadcast(), 0u);
    EXPECT_EQ(log, "AC");
}

TEST_F(Notification, EndsWhenAListenerRemovesEverybody)
{
    Add('A');
    Add('B', [&](OrvixNotifyParams*, std::int64_t) {
        for (Listener& listener : listeners)
        {
            listener.Leave();
        }
        return 0u;
    });
    Add('C');
    EXPECT_EQ(Broadcast(), 0u);
    EXPECT_EQ(log, "AB");
    EXPECT_EQ(Broadcast(), 0u);
    EXPECT_EQ(log, "AB");
}

TEST_F(Notification, CancelledByAListenerThatRemovesEverybodyCallsNobodyAgain)
{
    Add('A');
    Add('B');
    Add('C', [&](OrvixNotifyParams*, std::int64_t) {
        for (Listener& listener : listeners)
        {
            listener.Leave();
        }
        return 1u;
    });
    OrvixNotifyParams params;
    EXPECT_EQ(Broadcast(params), 1u);
    EXPECT_EQ(log, "ABC");
    EXPECT_TRUE(params.IsCancelled());
}

TEST_F(Notification, SurvivesThatEverybodyIsRemovedWhileACancelIsTold)
{
    Add('A', [&](OrvixNotifyParams* params, std::int64_t) {
        if (params->IsCancelled())
        {
            for (Listener& listener : listeners)
            {
                listener.Leave();
            }
        }
        return 0u;
    });
    Add('B');
    Add('C');
    Add('D', Give(1));
    EXPECT_EQ(Broadcast(), 1u);
    EXPECT_EQ(log, "ABCDA!");
}

TEST_F(Notification, LetsAListenersExceptionOut)
{
    Add('A');
    Add('B', [](OrvixNotifyParams*, std::int64_t) -> std::uint32_t { throw std::runtime_error("from B"); });
    Add('C');
    const long blocks = BraeDiagnostics::LiveBlocks();
    EXPECT_THROW(Broadcast(), std::runtime_error);
    EXPECT_EQ(log, "AB");
    OrvixNotifyParams params;
    EXPECT_THROW(Broadcast(params), std::runtime_error);
    EXPECT_FALSE(params.IsCancelled());
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_TRUE(listeners[1].Leave());
    log.clear();
    EXPECT_EQ(Broadcast(), 0u);
    EXPECT_EQ(log, "AC");
}

TEST_F(Notification, LetsAnExceptionOutThatIsThrownWhileACancelIsTold)
{
    Add('A', [](OrvixNotifyParams* params, std::int64_t) {
        if (params->IsCancelled())
        {
            throw std::runtime_error("from A");
        }
        return 0u;
    });
    Add('B', Give(1));
    OrvixNotifyParams params;
    EXPECT_THROW(Broadcast(params), std::runtime_error);
    EXPECT_EQ(log, "ABA!");
    EXPECT_TRUE(params.IsCancelled());
}
