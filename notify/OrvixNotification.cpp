#include "OrvixNotification.h"

#include "ExceptionBarrier.h"
#include "GuardedBroadcast.h"
#include "IOrvixNotifyCallback.h"
#include "OrvixNotificationID.h"
#include "OrvixNotifyParams.h"

#include <algorithm>
#include <cstddef>
#include <new>
#include <utility>
#include <vector>

namespace
{

struct Listener
{
    IOrvixNotifyCallback* callback;
    std::int64_t userData;
};

/// In order of registration.
using Registry = std::vector<Listener>;

Registry* theRegistry = nullptr;

/// Frees the process-wide registry when the library is unloaded. A host's library that unregisters its listeners even
/// later finds an empty one.
struct RegistryEnd
{
    RegistryEnd() = default;
    RegistryEnd(const RegistryEnd&) = delete;
    RegistryEnd& operator=(const RegistryEnd&) = delete;
    ~RegistryEnd() { delete std::exchange(theRegistry, nullptr); }
} const RegistryEndInstance;

/// The registry, made on first use; null when memory runs out.
Registry* GetRegistry()
{
    if (theRegistry == nullptr)
    {
        theRegistry = new (std::nothrow) Registry;
    }
    return theRegistry;
}

Registry::iterator Find(Registry& registry, const IOrvixNotifyCallback* callback)
{
    return std::find_if(registry.begin(), registry.end(),
                        [callback](const Listener& listener) { return listener.callback == callback; });
}

/// Delivers a record through `notify`, which calls one listener.
template <typename Notify>
std::uint32_t Deliver(OrvixNotifyParams& params, const Notify& notify)
{
    const Registry* registry = GetRegistry();
    if (registry == nullptr)
    {
        return OrvixListenerAnswer::Accept;
    }
    // A listener may register and unregister listeners: the registry is read afresh at every step.
    for (std::size_t i = 0; i < registry->size(); ++i)
    {
        const Listener listener = (*registry)[i];
        const std::uint32_t answer = notify(listener);
        if (answer == OrvixListenerAnswer::Accept)
        {
            continue;
        }
        if (answer == OrvixListenerAnswer::Veto)
        {
            params.SetCancelled(true);
            for (std::size_t j = 0; j < i && j < registry->size(); ++j)
            {
                const Listener earlier = (*registry)[j];
                notify(earlier);
            }
        }
        return answer;
    }
    return OrvixListenerAnswer::Accept;
}

} // namespace

bool OrvixNotification::RegisterOrvixNotification(IOrvixNotifyCallback* callback, std::int64_t userData)
{
    Registry* registry = GetRegistry();
    if (registry == nullptr || callback == nullptr)
    {
        return false;
    }
    return Find(*registry, callback) != registry->end() || Completes([&] {
               registry->push_back({callback, userData});
           });
}

bool OrvixNotification::UnRegisterOrvixNotification(IOrvixNotifyCallback* callback)
{
    Registry* registry = GetRegistry();
    if (registry == nullptr || callback == nullptr)
    {
        return false;
    }
    const auto found = Find(*registry, callback);
    if (found == registry->end())
    {
        return false;
    }
    registry->erase(found);
    return true;
}

std::uint32_t OrvixNotification::BroadcastOrvixNotification(std::uint32_t id, std::uint32_t providerIndex)
{
    OrvixNotifyParams params;
    params.SetID(id);
    params.SetProviderIndex(providerIndex);
    return BroadcastOrvixNotification(&params);
}

std::uint32_t OrvixNotification::BroadcastOrvixNotification(OrvixNotifyParams* params)
{
    if (params == nullptr)
    {
        return OrvixListenerAnswer::Accept;
    }
    return Deliver(*params,
                   [params](const Listener& listener) { return listener.callback->Notify(params, listener.userData); });
}

std::uint32_t BroadcastGuarded(OrvixNotifyParams& params, std::uint32_t answerForException)
{
    return Deliver(params, [&](const Listener& listener) {
        return WithBarrier(answerForException, [&] { return listener.callback->Notify(&params, listener.userData); });
    });
}
