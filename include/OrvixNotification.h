#pragma once

#include "OrvixExport.h"

#include <cstdint>

class IOrvixNotifyCallback;
class OrvixNotifyParams;

/// The process-wide registry of listeners, and the broadcast that calls them in order of registration and
/// lets them veto. It has no lock: all four operations belong to the host's main thread. Listeners still
/// registered when the library is unloaded are forgotten.
class ORVIX_API OrvixNotification
{
public:
    OrvixNotification() = delete;

    /// Adds a listener at the end. `callback` is not owned and must stay alive until it is unregistered;
    /// `userData` is passed back unchanged on every delivery to it. Registering a listener again gives true
    /// and changes nothing: the first user data stays. False for null and when memory runs out.
    /// [library, main-thread]
    static bool RegisterOrvixNotification(IOrvixNotifyCallback* callback, std::int64_t userData);

    /// Removes a listener with its user data; false when it is null or not registered.
    /// [library, main-thread]
    static bool UnRegisterOrvixNotification(IOrvixNotifyCallback* callback);

    /// Delivers a record made for the call, with this identifier and provider index, not cancelled and
    /// without a file list. Result as for the other form. [library, main-thread]
    static std::uint32_t BroadcastOrvixNotification(std::uint32_t id, std::uint32_t providerIndex);

    /// Delivers the caller's record, which listeners may read and change. `params` is not owned; null gives 0 and
    /// reaches no listener.
    ///
    /// Returns 0 when every listener accepted (or there is none), 1 when one cancelled: the record is then
    /// marked cancelled and the listeners before that one were called once more. Any other value is that of
    /// the listener that stopped the delivery. A listener's exception leaves this function.
    /// [library, main-thread]
    static std::uint32_t BroadcastOrvixNotification(OrvixNotifyParams* params);
};
