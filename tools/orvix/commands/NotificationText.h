#pragma once

#include <cstdint>

/// The words for the library's notifications (`OrvixNotificationID`).
namespace NotificationText
{

/// Such as "before check-in"; "unknown" for the notification of a host.
const char* InWords(std::uint32_t id);

/// Whether the notification comes before an operation, so that a listener may veto.
bool IsBeforeOperation(std::uint32_t id);

} // namespace NotificationText
