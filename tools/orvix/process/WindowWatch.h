#pragma once

#include <set>
#include <string>
#include <vector>

class ChildProcess;

/// The windows that a child process shows.
class WindowWatch
{
public:
    struct Window
    {
        void* handle; ///< HWND
        std::wstring title;
        std::wstring text; ///< of its labels, one line
    };

    /// `child` must outlive this object.
    explicit WindowWatch(const ChildProcess& child) : m_child(child) {}

    /// The visible windows that have appeared since the last call.
    std::vector<Window> FindNew();

    /// Presses Cancel in a window; No where it has only that; otherwise closes it.
    static void Cancel(const Window& window);

private:
    const ChildProcess& m_child;
    std::set<void*> m_seen;
};
