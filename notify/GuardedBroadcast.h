#pragma once

#include <cstdint>

class OrvixNotifyParams;

/// Broadcasts as `OrvixNotification::BroadcastOrvixNotification` does, for the library's own operations: a listener
/// that throws counts as one that gives this answer.
std::uint32_t BroadcastGuarded(OrvixNotifyParams& params, std::uint32_t answerForException);
