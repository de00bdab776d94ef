#pragma once

#include "IOrvixNotifyCallback.h"
#include "OrvixNotification.h"

/// A callback that is registered as long as it lives.
class Listener : public IOrvixNotifyCallback
{
public:
    Listener() { OrvixNotification::RegisterOrvixNotification(this, 0); }
    Listener(const Listener&) = delete;
    Listener& operator=(const Listener&) = delete;

protected:
    ~Listener() { OrvixNotification::UnRegisterOrvixNotification(this); }
};
