#include "IOrvixNotifyCallback.h"
#include "Measure.h"
#include "OrvixNotification.h"
#include "OrvixNotifyParams.h"

#include <memory>
#include <vector>

namespace
{

class Listener final : public IOrvixNotifyCallback
{
public:
    std::uint32_t Notify(OrvixNotifyParams*, std::int64_t userData) override
    {
        m_sum += userData;
        return 0;
    }

private:
    std::int64_t m_sum = 0;
};

} // namespace

void BenchNotifications(MeasureTable& table)
{
    constexpr int Count = 10000;
    std::vector<std::unique_ptr<Listener>> listeners;
    std::vector<IOrvixNotifyCallback*> callbacks;
    std::vector<std::int64_t> userData;
    for (int i = 0; i < Count; ++i)
    {
        listeners.push_back(std::make_unique<Listener>());
        callbacks.push_back(listeners.back().get());
        userData.push_back(i);
        OrvixNotification::RegisterOrvixNotification(callbacks.back(), i);
    }
    OrvixNotifyParams params;
    constexpr int Repeat = 20;
    table.Print(Compare(
        "broadcast to 10,000 callbacks, 20 times", 1.5,
        [&] {
            for (int i = 0; i < Repeat; ++i)
            {
                OrvixNotification::BroadcastOrvixNotification(&params);
            }
        },
        [&] {
            for (int i = 0; i < Repeat; ++i)
            {
                for (std::size_t j = 0; j < callbacks.size(); ++j)
                {
                    if (callbacks[j]->Notify(&params, userData[j]) != 0)
                    {
                        break;
                    }
                }
            }
        }));
    for (IOrvixNotifyCallback* callback : callbacks)
    {
        OrvixNotification::UnRegisterOrvixNotification(callback);
    }
}
