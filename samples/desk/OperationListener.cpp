#include "OperationListener.h"

#include "OrvixFileList.h"
#include "OrvixNotificationID.h"
#include "OrvixNotifyParams.h"

namespace
{

/// What has been tried; null for a notification of another kind.
const wchar_t* Tried(std::uint32_t id)
{
    switch (id)
    {
    case OrvixNotificationID::AfterAdd:
        return L"Added";
    case OrvixNotificationID::AfterCheckOut:
        return L"Checked out";
    case OrvixNotificationID::AfterCheckIn:
        return L"Checked in";
    case OrvixNotificationID::AfterUndoCheckOut:
        return L"Check-out undone";
    case OrvixNotificationID::AfterGetLatest:
        return L"Latest version";
    default:
        return nullptr;
    }
}

} // namespace

std::uint32_t OperationListener::Notify(OrvixNotifyParams* params, std::int64_t)
{
    if (params->GetID() == OrvixNotificationID::BeforeCheckIn && !params->IsCancelled() && m_frozen)
    {
        m_output.Add(L"Code freeze: nothing is checked in. Tools, Code freeze ends it.");
        return OrvixListenerAnswer::Veto;
    }
    const wchar_t* tried = Tried(params->GetID());
    if (tried != nullptr && params->GetOrvixFileList() != nullptr)
    {
        const unsigned int count = params->GetOrvixFileList()->NumActiveEntries();
        m_output.Add(std::wstring(tried) + L": " + std::to_wstring(count) + (count == 1 ? L" file" : L" files"));
    }
    return OrvixListenerAnswer::Accept;
}
