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
    /// Receives one notification. `params` is the sender's and lives only for the call; `userData` is the
    /// value given at registration.
    ///
    /// Returns 0 to accept and let delivery continue, 1 to cancel, any other value to stop delivery without
    /// cancelling. When a later listener cancels, this one is called a second time for the same record, with
    /// `params->IsCancelled()` true; that result is ignored. The listener may register and unregister
    /// listeners, itself included. An exception leaves the broadcast. [host, main-thread]
    virtual std::uint32_t Notify(OrvixNotifyParams* params, std::int64_t userData) = 0;

protected:
    ~IOrvixNotifyCallback() = default;
};
