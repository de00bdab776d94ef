#pragma once

#include "IOrvixNotifyCallback.h"
#include "Log.h"
#include "OrvixNotifyParams.h"

#include <functional>

/// A listener, registered as long as it lives, that writes down every notification: "Notify 13 [a b]", with
/// " cancelled" at the end where the record says so.
class RecordingListener final : public IOrvixNotifyCallback
{
public:
    explicit RecordingListener(Lines& log, std::string name = "Notify");
    RecordingListener(const RecordingListener&) = delete;
    RecordingListener& operator=(const RecordingListener&) = delete;
    ~RecordingListener();

    /// The listener's answer, 0 where none is set; may throw.
    std::function<std::uint32_t(OrvixNotifyParams&)> onNotify;

    /// Answers one notification with a value and accepts every other.
    void Answer(std::uint32_t id, std::uint32_t value);

    std::uint32_t Notify(OrvixNotifyParams* params, std::int64_t userData) override;

private:
    Lines& m_log;
    std::string m_name;
};
