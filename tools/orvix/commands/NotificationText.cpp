#include "NotificationText.h"

#include "OrvixNotificationID.h"

#include <algorithm>
#include <iterator>

namespace
{

struct Notification
{
    std::uint32_t id;
    const char* words;
    bool beforeOperation;
};

constexpr Notification Notifications[] = {
    {OrvixNotificationID::BeforeCheckIn, "before check-in", true},
    {OrvixNotificationID::AfterCheckIn, "after check-in", false},
    {OrvixNotificationID::BeforeCheckOut, "before check-out", true},
    {OrvixNotificationID::AfterCheckOut, "after check-out", false},
    {OrvixNotificationID::BeforeUndoCheckOut, "before undo check-out", true},
    {OrvixNotificationID::AfterUndoCheckOut, "after undo check-out", false},
    {OrvixNotificationID::BeforeAdd, "before add", true},
    {OrvixNotificationID::AfterAdd, "after add", false},
    {OrvixNotificationID::BeforeGetLatest, "before get latest", true},
    {OrvixNotificationID::AfterGetLatest, "after get latest", false},
    {OrvixNotificationID::FilesConfirmed, "files confirmed", false},
};

Notification Find(std::uint32_t id)
{
    const auto* found = std::find_if(std::begin(Notifications), std::end(Notifications),
                                     [id](const Notification& notification) { return notification.id == id; });
    return found == std::end(Notifications) ? Notification{id, "unknown", false} : *found;
}

} // namespace

const char* NotificationText::InWords(std::uint32_t id)
{
    return Find(id).words;
}

bool NotificationText::IsBeforeOperation(std::uint32_t id)
{
    return Find(id).beforeOperation;
}
