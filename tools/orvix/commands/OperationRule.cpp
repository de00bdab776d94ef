#include "OperationRule.h"

bool OperationRule::IsReached(unsigned long flags, bool kept) const
{
    const bool isCheckedOut = (flags & OrvixFileState::CheckedOut) != 0;
    unsigned long ended = ends;
    if (kept)
    {
        ended &= ~OrvixFileState::CheckedOut;
    }
    if (!isCheckedOut)
    {
        ended |= endsUnlessCheckedOut;
    }
    return (flags & leadsTo) != 0 && (flags & ended) == 0 && (!kept || isCheckedOut);
}
