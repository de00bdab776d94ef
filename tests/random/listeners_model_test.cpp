#include "IOrvixNotifyCallback.h"
#include "OrvixNotification.h"
#include "OrvixNotificationID.h"
#include "OrvixNotifyParams.h"
#include "RandomModel.h"

#include <algorithm>
#include <array>
#include <functional>
#include <vector>

namespace
{

constexpr unsigned int NumListeners = 12;
constexpr std::uint32_t StrangeAnswer = 0xFFFFFFFF;

/// What a listener got.
struct Delivery
{
    unsigned int listener;
    std::int64_t userData;
    bool cancelled;

    bool operator==(const Delivery&) const = default;
};

/// What a listener does in a broadcast, each time that it is called.
struct Behaviour
{
    enum Kind
    {
        Nothing,
        Joins,
        Leaves
    };
    Kind kind = Nothing;
    unsigned int whom = 0; ///< the listener that joins or leaves
    std::uint32_t answer = OrvixListenerAnswer::Accept;
};

class Listener final : public IOrvixNotifyCallback
{
public:
    std::uint32_t Notify(OrvixNotifyParams* params, std::int64_t userData) override
    {
        return notified(params, userData);
    }

    std::function<std::uint32_t(OrvixNotifyParams*, std::int64_t)> notified;
};

class ListenersModel : public RandomModel
{
public:
    explicit ListenersModel(RandomNumbers& random) : RandomModel(random)
    {
        for (unsigned int i = 0; i < NumListeners; ++i)
        {
            m_listeners[i].notified = [this, i](OrvixNotifyParams* params, std::int64_t userData) {
                m_delivered.push_back({i, userData, params->IsCancelled()});
                const Behaviour& behaviour = m_behaviours[i];
                Act(
                    behaviour, [this](unsigned int whom) { Join(whom, -1); },
                    [this](unsigned int whom) { Leave(whom); });
                return behaviour.answer;
            };
        }
    }
    ListenersModel(const ListenersModel&) = delete;
    ListenersModel& operator=(const ListenersModel&) = delete;
    ~ListenersModel()
    {
        for (Listener& listener : m_listeners)
        {
            OrvixNotification::UnRegisterOrvixNotification(&listener);
        }
    }

    void Step()
    {
        const unsigned int whom = m_random.Below(NumListeners);
        switch (m_random.Below(8))
        {
        case 0:
        case 1:
        case 2: {
            const std::int64_t userData = static_cast<std::int64_t>(m_random.Below(1000)) << 40;
            Expect(Join(whom, userData), "RegisterOrvixNotification");
            JoinModel(whom, userData);
            break;
        }
        case 3:
            Expect(Leave(whom) == LeaveModel(whom), "UnRegisterOrvixNotification");
            break;
        case 4:
            Expect(!OrvixNotification::RegisterOrvixNotification(nullptr, 1), "registration of null");
            Expect(!OrvixNotification::UnRegisterOrvixNotification(nullptr), "unregistration of null");
            break;
        default:
            Broadcast();
        }
    }

private:
    struct Registered
    {
        unsigned int listener;
        std::int64_t userData;
    };

    bool Join(unsigned int whom, std::int64_t userData)
    {
        return OrvixNotification::RegisterOrvixNotification(&m_listeners[whom], userData);
    }

    bool Leave(unsigned int whom) { return OrvixNotification::UnRegisterOrvixNotification(&m_listeners[whom]); }

    std::vector<Registered>::iterator Find(unsigned int whom)
    {
        return std::find_if(m_registered.begin(), m_registered.end(),
                            [whom](const Registered& registered) { return registered.listener == whom; });
    }

    void JoinModel(unsigned int whom, std::int64_t userData)
    {
        if (Find(whom) == m_registered.end())
        {
            m_registered.push_back({whom, userData});
        }
    }

    bool LeaveModel(unsigned int whom)
    {
        const auto found = Find(whom);
        const bool isThere = found != m_registered.end();
        if (isThere)
        {
            m_registered.erase(found);
        }
        return isThere;
    }

    template <typename Join, typename Leave>
    static void Act(const Behaviour& behaviour, const Join& join, const Leave& leave)
    {
        if (behaviour.kind == Behaviour::Joins)
        {
            join(behaviour.whom);
        }
        else if (behaviour.kind == Behaviour::Leaves)
        {
            leave(behaviour.whom);
        }
    }

    std::uint32_t Deliver(std::size_t index, bool cancelled, std::vector<Delivery>& deliveries)
    {
        const Registered registered = m_registered[index];
        deliveries.push_back({registered.listener, registered.userData, cancelled});
        const Behaviour& behaviour = m_behaviours[registered.listener];
        Act(
            behaviour, [this](unsigned int whom) { JoinModel(whom, -1); },
            [this](unsigned int whom) { LeaveModel(whom); });
        return behaviour.answer;
    }

    std::uint32_t BroadcastModel(std::vector<Delivery>& deliveries)
    {
        for (std::size_t i = 0; i < m_registered.size(); ++i)
        {
            const std::uint32_t answer = Deliver(i, false, deliveries);
            if (answer == OrvixListenerAnswer::Veto)
            {
                for (std::size_t j = 0; j < i && j < m_registered.size(); ++j)
                {
                    Deliver(j, true, deliveries);
                }
            }
            if (answer != OrvixListenerAnswer::Accept)
            {
                return answer;
            }
        }
        return OrvixListenerAnswer::Accept;
    }

    void Broadcast()
    {
        constexpr std::array<std::uint32_t, 8> Answers = {OrvixListenerAnswer::Accept, OrvixListenerAnswer::Accept,
                                                          OrvixListenerAnswer::Accept, OrvixListenerAnswer::Accept,
                                                          OrvixListenerAnswer::Accept, OrvixListenerAnswer::Veto,
                                                          OrvixListenerAnswer::Stop,   StrangeAnswer};
        for (Behaviour& behaviour : m_behaviours)
        {
            behaviour = {};
            if (m_random.OneIn(4))
            {
                behaviour.kind = m_random.OneIn(2) ? Behaviour::Joins : Behaviour::Leaves;
                behaviour.whom = m_random.Below(NumListeners);
            }
            if (m_random.OneIn(4))
            {
                behaviour.answer = m_random.From(Answers);
            }
        }
        m_delivered.clear();
        OrvixNotifyParams params;
        const std::uint32_t answer = OrvixNotification::BroadcastOrvixNotification(&params);
        std::vector<Delivery> expected;
        Expect(answer == BroadcastModel(expected), "answer of a broadcast");
        Expect(m_delivered == expected, "deliveries of a broadcast");
        Expect(params.IsCancelled() == (answer == OrvixListenerAnswer::Veto), "the record's mark");
    }

    std::array<Listener, NumListeners> m_listeners;
    std::array<Behaviour, NumListeners> m_behaviours;
    std::vector<Registered> m_registered; ///< the model
    std::vector<Delivery> m_delivered;
};

} // namespace

TEST(RandomSteps, OfListenersKeepTheRegistryLikeItsModel)
{
    RunModel<ListenersModel>();
}
