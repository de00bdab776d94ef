#pragma once

#include "DialogWindow.h"

#include <functional>
#include <string>
#include <thread>

/// Somebody at the screen, on a thread of their own: waits for the dialog with a title, which the constructing thread
/// is about to show, and handles it. A dialog that does not come, one that stays open, and an exception of the handling
/// fail the test; the dialog is closed then. The destructor waits for the end.
class User
{
public:
    User(std::wstring title, std::function<void(const DialogWindow&)> handle);
    User(const User&) = delete;
    User& operator=(const User&) = delete;
    ~User() { m_thread.join(); }

private:
    std::thread m_thread;
};
