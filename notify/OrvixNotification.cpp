#include "OrvixNotification.h"

#include "ExceptionBarrier.h"
#include "IOrvixNotifyCallback.h"
#include "OrvixNotificationID.h"
#include "OrvixNotifyParams.h"

#include <algorithm>
#include <cstddef>
#include <memory>
#include <new>
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

/// The process-wide registry; freed when the library is unloaded.
std::unique_ptr<Registry> theRegistry;

/// The registry, made on first use; null when memory runs out.
Registry* GetRegistry()
{
    if (!theRegistry)
    {
        theRegistry.reset(new (std::nothrow) Registry);
    }
    return theRegistry.get();
}

Registry::iterator Find(Registry& registry, const IOrvixNotifyCallback* callback)
{
    return std::find_if(registry.begin(), registry.end(),
                        [callback](const Listener& listener) { return listener.callback == callback; });
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
    const Registry* registry = GetRegistry();
    if (registry == nullptr || params == nullptr)
    {
        return OrvixListenerAnswer::Accept;
    }
    // A listener may register and unregister listeners: the registry is read afresh at every step.
    for (std::size_t i = 0; i < registry->size(); ++i)
    {
        const Listener listener = (*registry)[i];
        const std::uint32_t answer = listener.callback->Notify(params, listener.userData);
        if (answer == OrvixListenerAnswer::Accept)
        {
            continue;
        }
        if (answer == OrvixListenerAnswer::Veto)
        {
            params->SetCancelled(true);
            for (std::size_t j = 0; j < i && j < registry->size(); ++j)
            {
                const Listener earlier = (*registry)[j];
                earlier.callback->Notify(params, earlier.userData);
            }
        }
        return answer;
    }
    return OrvixListenerAnswer::Accept;
}
