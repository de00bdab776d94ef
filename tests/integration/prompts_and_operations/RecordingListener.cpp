#include "RecordingListener.h"

#include <utility>

namespace
{

std::string NameOf(std::uint32_t id)
{
    switch (id)
    {
    case OrvixNotificationID::BeforeCheckIn:
        return "BeforeCheckIn";
    case OrvixNotificationID::AfterCheckIn:
        return "AfterCheckIn";
    case OrvixNotificationID::BeforeCheckOut:
        return "BeforeCheckOut";
    case OrvixNotificationID::AfterCheckOut:
        return "AfterCheckOut";
    case OrvixNotificationID::BeforeUndoCheckOut:
        return "BeforeUndoCheckOut";
    case OrvixNotificationID::AfterUndoCheckOut:
        return "AfterUndoCheckOut";
    case OrvixNotificationID::BeforeAdd:
        return "BeforeAdd";
    case OrvixNotificationID::AfterAdd:
        return "AfterAdd";
    case OrvixNotificationID::BeforeGetLatest:
        return "BeforeGetLatest";
    case OrvixNotificationID::AfterGetLatest:
        return "AfterGetLatest";
    case OrvixNotificationID::FilesConfirmed:
        return "FilesConfirmed";
    default:
        return std::to_string(id);
    }
}

} // namespace

RecordingListener::RecordingListener(Lines& log, std::string name) : m_log(log), m_name(std::move(name))
{
}

void RecordingListener::Answer(std::uint32_t id, std::uint32_t value)
{
    onNotify = [id, value](OrvixNotifyParams& params) {
        return params.GetID() == id ? value : OrvixListenerAnswer::Accept;
    };
}

std::uint32_t RecordingListener::Notify(OrvixNotifyParams* params, std::int64_t)
{
    m_log.push_back(m_name + " " + NameOf(params->GetID()) + " " + ActiveNames(params->GetOrvixFileList()) +
                    (params->IsCancelled() ? " cancelled" : ""));
    return onNotify ? onNotify(*params) : OrvixListenerAnswer::Accept;
}
