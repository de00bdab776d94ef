#pragma once

#include "ParentLink.h"
#include "ProcessState.h"

#include <string>

/// Tells the parent process at the end of a scope that a call is over.
class CallEnd
{
public:
    CallEnd() = default;
    CallEnd(const CallEnd&) = delete;
    CallEnd& operator=(const CallEnd&) = delete;
    ~CallEnd() { ParentLink::Send(ParentLink::Return); }
};

/// Calls code of others and returns its result. The call is announced to the parent process as `what`, and afterwards
/// the state of this process is restored.
template <typename Call>
auto GuardedCall(const std::string& what, Call call)
{
    ParentLink::Send(ParentLink::Step, what);
    const CallEnd end;
    const ProcessStateScope state;
    return call();
}
