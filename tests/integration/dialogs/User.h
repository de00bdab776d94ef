#pragma once

#include "DialogWindow.h"

#include <functional>
#include <optional>
#include <string>
#include <thread>

/// A user at the screen, on a thread of its own. It waits for the dialog with a title, which the constructing thread
/// shows next, and calls `handle` with it. The test fails when no dialog appears, when the dialog is still open after
/// `handle`, and when `handle` throws; the dialog is then closed. The destructor waits for the thread.
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

/// Waits for a visible window of a thread, by title; nothing when none appears. The thread is one for which a `User`
/// has been made.
std::optional<DialogWindow> AwaitWindow(DWORD thread, const std::wstring& title);
