#include "OrvixNotification.h"

#include "ExceptionBarrier.h"
#include "IOrvixNotifyCallback.h"
#include "OrvixNotifyParams.h"

#include <algorithm>
#include <cstddef>
#include <memory>
#include <new>
#include <vector>

namespace
{

constexpr std::uint32_t Cancel = 1;

/// The listeners in order of registration; entry i of one array belongs to entry i of the other.
struct Registry
{
    std::vector<IOrvixNotifyCallback*> callbacks;
    std::vector<std::int64_t> userData;
};

/// The process-wide registry; freed when the library is unloaded.
std::unique_ptr<Registry> theRegistry;

/// The registry, made on first use; null when memory is exhausted.
Registry* GetRegistry()
{
    if (!theRegistry)
    {
        theRegistry.reset(new (std::nothrow) Registry);
    }
    return theRegistry.get();
}

} // namespace

bool OrvixNotification::RegisterOrvixNotification(IOrvixNotifyCallback* callback, std::int64_t userData)
{
    Registry* registry = GetRegistry();
    if (registry == nullptr || callback == nullptr)
    {
        return false;
    }
    auto& callbacks = registry->callbacks;
    if (std::find(callbacks.begin(), callbacks.end(), callback) != callbacks.end())
    {
        return true;
    }
    return WithBarrier(false, [&] {
        callbacks.push_back(callback);
        const bool complete = WithBarrier(false, [&] {
            registry->userData.push_back(userData);
            return true;
        });
        if (!complete)
        {
            callbacks.pop_back();
        }
        return complete;
    });
}

bool OrvixNotification::UnRegisterOrvixNotification(IOrvixNotifyCallback* callback)
{
    Registry* registry = GetRegistry();
    if (registry == nullptr || callback == nullptr)
    {
        return false;
    }
    const auto found = std::find(registry->callbacks.begin(), registry->callbacks.end(), callback);
    if (found == registry->callbacks.end())
    {
        return false;
    }
    registry->userData.erase(registry->userData.begin() + (found - registry->callbacks.begin()));
    registry->callbacks.erase(found);
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
        return 0;
    }
    // A listener may register and unregister listeners: the arrays are read afresh at every step.
    for (std::size_t i = 0; i < registry->callbacks.size(); ++i)
    {
        const std::uint32_t answer = registry->callbacks[i]->Notify(params, registry->userData[i]);
        if (answer == 0)
        {
            continue;
        }
        if (answer == Cancel)
        {
            params->SetCancelled(true);
            for (std::size_t j = 0; j < i && j < registry->callbacks.size(); ++j)
            {
                registry->callbacks[j]->Notify(params, registry->userData[j]);
            }
        }
        return answer;
    }
    return 0;
}
