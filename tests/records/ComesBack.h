#pragma once

#include <thread>

/// Runs `body` on a thread of its own; true when it came back. The thread, and it alone, ends where the stack
/// overflows under Wine, whereas a main thread may take the process with it and report success.
template <typename Body>
bool ComesBack(Body body)
{
    bool cameBack = false;
    std::thread([&] {
        body();
        cameBack = true;
    }).join();
    return cameBack;
}
