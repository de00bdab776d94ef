#pragma once

#include <cstdint>

class OrvixNotifyParams;

/// A listener for notifications.
///
/// Implemented by: host, or any client of the library. Registered with `OrvixNotification`; it must stay
/// alive until it is unregistered. The registry never deletes it.
class IOrvixNotifyCallback
{
public:
    /// Receives one notification. `params` belongs to the sender and lives only for the call; `userData` is the value
    /// given at registration.
    ///
    /// Returns an `OrvixListenerAnswer`; any other value counts as `Stop`. When a later listener vetoes, this one is
    /// called a second time for the same record, with `params->IsCancelled()` true; that result is ignored. The
    /// listener may register and unregister listeners, itself included. An exception leaves the broadcast. [host,
    /// main-thread]
    virtual std::uint32_t Notify(OrvixNotifyParams* params, std::int64_t userData) = 0;

protected:
    /// Not public: nobody deletes the object through this interface.
    ~IOrvixNotifyCallback() = default;
};
