#pragma once

#include "OrvixNotification.h"

#include <utility>

/// Registers a listener and unregisters it at the end. The listener must outlive this object, and nothing else may
/// register or unregister it: a listener is registered once, whoever does it.
class OrvixListenerRegistration
{
public:
    /// Registers nothing.
    OrvixListenerRegistration() = default;

    /// `userData` is passed back with every notification.
    explicit OrvixListenerRegistration(IOrvixNotifyCallback& listener, std::int64_t userData = 0)
        : m_listener(OrvixNotification::RegisterOrvixNotification(&listener, userData) ? &listener : nullptr)
    {
    }

    /// Takes the registration of `other`, which is empty afterwards.
    OrvixListenerRegistration(OrvixListenerRegistration&& other) noexcept
        : m_listener(std::exchange(other.m_listener, nullptr))
    {
    }

    /// Exchanges the two registrations.
    OrvixListenerRegistration& operator=(OrvixListenerRegistration&& other) noexcept
    {
        std::swap(m_listener, other.m_listener);
        return *this;
    }

    OrvixListenerRegistration(const OrvixListenerRegistration&) = delete;
    OrvixListenerRegistration& operator=(const OrvixListenerRegistration&) = delete;
    /// Ends the registration. The listener stays with its owner. [library, main-thread]
    ~OrvixListenerRegistration() { OrvixNotification::UnRegisterOrvixNotification(m_listener); }

    /// False when memory was exhausted, and for an empty registration.
    bool IsRegistered() const { return m_listener != nullptr; }

private:
    IOrvixNotifyCallback* m_listener = nullptr;
};
