#pragma once

#include "IOrvixNotifyCallback.h"
#include "Output.h"

/// Prints every notification.
class NotificationPrinter final : public IOrvixNotifyCallback
{
public:
    /// `output` must outlive this object.
    explicit NotificationPrinter(Output& output) : m_output(output) {}

    std::uint32_t Notify(OrvixNotifyParams* params, std::int64_t userData) override;

private:
    Output& m_output;
};
