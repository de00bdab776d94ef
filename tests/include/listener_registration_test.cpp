#include "AllocationFailure.h"
#include "IOrvixNotifyCallback.h"
#include "OrvixListenerRegistration.h"
#include "OrvixNotificationID.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <deque>
#include <optional>
#include <utility>
#include <vector>

using testing::ElementsAre;
using testing::IsEmpty;

namespace
{

constexpr std::uint32_t HostNotification = 1000;

/// Notes the user data of every notification.
class Listener final : public IOrvixNotifyCallback
{
public:
    std::uint32_t Notify(OrvixNotifyParams*, std::int64_t data) override
    {
        userData.push_back(data);
        return OrvixListenerAnswer::Accept;
    }

    std::vector<std::int64_t> userData;
};

void Broadcast()
{
    OrvixNotification::BroadcastOrvixNotification(HostNotification, 0);
}

/// Whether somebody has registered the listener. It is not registered afterwards.
bool WasRegistered(Listener& listener)
{
    return OrvixNotification::UnRegisterOrvixNotification(&listener);
}

} // namespace

TEST(ListenerRegistration, RegistersWithItsUserDataUntilItsEnd)
{
    Listener listener;
    {
        const OrvixListenerRegistration registration(listener, 42);
        EXPECT_TRUE(registration.IsRegistered());
        Broadcast();
    }
    Broadcast();
    EXPECT_THAT(listener.userData, ElementsAre(42));
    EXPECT_FALSE(WasRegistered(listener));
}

TEST(ListenerRegistration, PassesZeroWithoutUserData)
{
    Listener listener;
    const OrvixListenerRegistration registration(listener);
    Broadcast();
    EXPECT_THAT(listener.userData, ElementsAre(0));
}

TEST(ListenerRegistration, IsEmptyByDefaultAndThenUnregistersNobody)
{
    Listener other;
    const OrvixListenerRegistration ofOther(other);
    {
        const OrvixListenerRegistration empty;
        EXPECT_FALSE(empty.IsRegistered());
    }
    EXPECT_TRUE(WasRegistered(other));
}

TEST(ListenerRegistration, MovesToANewOwner)
{
    Listener listener;
    std::optional<OrvixListenerRegistration> from(std::in_place, listener, 1);
    {
        const OrvixListenerRegistration to(std::move(*from));
        EXPECT_TRUE(to.IsRegistered());
        EXPECT_FALSE(from->IsRegistered());
        from.reset();
        Broadcast();
        EXPECT_THAT(listener.userData, ElementsAre(1)) << "the old owner has unregistered the listener";
    }
    EXPECT_FALSE(WasRegistered(listener));
}

TEST(ListenerRegistration, MovesIntoAnEmptyOne)
{
    Listener listener;
    OrvixListenerRegistration registration;
    registration = OrvixListenerRegistration(listener, 7);
    EXPECT_TRUE(registration.IsRegistered());
    Broadcast();
    EXPECT_THAT(listener.userData, ElementsAre(7));
}

TEST(ListenerRegistration, UnregistersTheOldListenerWhenItTakesAnother)
{
    Listener first;
    Listener second;
    OrvixListenerRegistration registration(first, 1);
    registration = OrvixListenerRegistration(second, 2);
    Broadcast();
    EXPECT_THAT(first.userData, IsEmpty());
    EXPECT_THAT(second.userData, ElementsAre(2));
}

TEST(ListenerRegistration, IsEmptyWhenMemoryIsExhausted)
{
    // The registry has room left from time to time: these fill it until it asks for more.
    std::deque<Listener> listeners;
    std::deque<OrvixListenerRegistration> registrations;
    LibraryHeap heap;
    heap.Fail(1, true);
    do
    {
        registrations.emplace_back(listeners.emplace_back());
    } while (registrations.back().IsRegistered());
    EXPECT_TRUE(heap.Stop());

    registrations.clear();
    Broadcast();
    for (const Listener& listener : listeners)
    {
        EXPECT_THAT(listener.userData, IsEmpty());
    }
}
