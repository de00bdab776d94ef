#pragma once

#include "IOrvixNotifyCallback.h"
#include "Log.h"
#include "OrvixListenerRegistration.h"
#include "OrvixNotificationID.h"
#include "OrvixNotifyParams.h"

#include <functional>

/// A listener, registered while it lives, that logs every notification: "Notify BeforeCheckIn [a b]", with " cancelled"
/// at the end when the record is cancelled.
class RecordingListener final : public IOrvixNotifyCallback
{
public:
    explicit RecordingListener(Lines& log, std::string name = "Notify");
    RecordingListener(const RecordingListener&) = delete;
    RecordingListener& operator=(const RecordingListener&) = delete;
    ~RecordingListener() = default;

    /// The listener's answer; accepts where none is set. May throw.
    std::function<std::uint32_t(OrvixNotifyParams&)> onNotify;

    /// Answers one notification with a value and accepts every other.
    void Answer(std::uint32_t id, std::uint32_t value);

    std::uint32_t Notify(OrvixNotifyParams* params, std::int64_t userData) override;

private:
    Lines& m_log;
    std::string m_name;
    OrvixListenerRegistration m_registration{*this};
};
