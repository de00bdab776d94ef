#pragma once

#include "Listener.h"

/// Prints every notification.
class NotificationPrinter final : public Listener
{
public:
    std::uint32_t Notify(OrvixNotifyParams* params, std::int64_t userData) override;
};
