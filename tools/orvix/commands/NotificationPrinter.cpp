#include "NotificationPrinter.h"

#include "NotificationText.h"
#include "OrvixFileList.h"
#include "OrvixNotificationID.h"
#include "OrvixNotifyParams.h"

#include <sstream>

std::uint32_t NotificationPrinter::Notify(OrvixNotifyParams* params, std::int64_t)
{
    std::wostringstream line;
    line << L"notification " << params->GetID() << L" (" << NotificationText::InWords(params->GetID()) << L')';
    if (OrvixFileList* list = params->GetOrvixFileList())
    {
        line << L", files: " << list->NumActiveEntries();
    }
    line << (params->IsCancelled() ? L", cancelled" : L"");
    m_output.Print(line.str());
    return OrvixListenerAnswer::Accept;
}
