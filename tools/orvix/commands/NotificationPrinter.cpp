#include "NotificationPrinter.h"

#include "OrvixFileList.h"
#include "OrvixNotifyParams.h"

#include <sstream>

namespace
{

const char* NotificationName(std::uint32_t id)
{
    switch (id)
    {
    case 13:
        return "before check-in";
    case 14:
        return "after check-in";
    case 15:
        return "before check-out";
    case 16:
        return "after check-out";
    case 17:
        return "before undo check-out";
    case 18:
        return "after undo check-out";
    case 19:
        return "before add";
    case 20:
        return "after add";
    case 21:
        return "before get latest";
    case 22:
        return "after get latest";
    case 27:
        return "files confirmed";
    default:
        return "unknown";
    }
}

} // namespace

std::uint32_t NotificationPrinter::Notify(OrvixNotifyParams* params, std::int64_t)
{
    std::wostringstream line;
    line << L"notification " << params->GetID() << L" (" << NotificationName(params->GetID()) << L')';
    if (OrvixFileList* list = params->GetOrvixFileList())
    {
        line << L", files: " << list->NumActiveEntries();
    }
    line << (params->IsCancelled() ? L", cancelled" : L"");
    m_output.Say(line.str());
    return 0;
}
