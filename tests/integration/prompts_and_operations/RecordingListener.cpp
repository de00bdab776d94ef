#include "RecordingListener.h"

#include "OrvixNotification.h"

#include <utility>

RecordingListener::RecordingListener(Lines& log, std::string name) : m_log(log), m_name(std::move(name))
{
    OrvixNotification::RegisterOrvixNotification(this, 0);
}

RecordingListener::~RecordingListener()
{
    OrvixNotification::UnRegisterOrvixNotification(this);
}

void RecordingListener::Answer(std::uint32_t id, std::uint32_t value)
{
    onNotify = [id, value](OrvixNotifyParams& params) { return params.GetID() == id ? value : 0; };
}

std::uint32_t RecordingListener::Notify(OrvixNotifyParams* params, std::int64_t)
{
    m_log.push_back(m_name + " " + std::to_string(params->GetID()) + " " + ActiveNames(params->GetOrvixFileList()) +
                    (params->IsCancelled() ? " cancelled" : ""));
    return onNotify ? onNotify(*params) : 0;
}
