#pragma once

#include "SccArguments.h"
#include "SharedMemory.h"
#include "UniqueHandle.h"

#include <functional>
#include <mutex>

/// The handles that the host's process gives to the library's process.
struct InheritedHandles
{
    UniqueKernelHandle memory;
    UniqueKernelHandle requested;          ///< host: a request or an answer to a callback is there
    UniqueKernelHandle replied;            ///< library: a reply or a callback of the running call is there
    UniqueKernelHandle backgroundAsked;    ///< library: a callback from another thread is there
    UniqueKernelHandle backgroundAnswered; ///< host: the answer to it is there
};

/// The process of one isolated library. It performs the requests of the host on the thread that made this object, and
/// shows the library's windows meanwhile. One object in a process.
class LibraryHost
{
public:
    explicit LibraryHost(InheritedHandles handles);
    LibraryHost(const LibraryHost&) = delete;
    LibraryHost& operator=(const LibraryHost&) = delete;
    ~LibraryHost();

    /// Performs requests until the host wants no more. False when the host broke the rules of messages.
    bool Run();

private:
    static LONG Output(LPCSTR text, LONG kind);
    static BOOL Populate(LPVOID callerData, BOOL add, LONG status, LPSTR fileName);

    bool Perform();
    void Load(MessageReader& request, MessageWriter& reply);
    static void DispatchOneMessage();

    /// Asks the host, from any thread, and returns its answer. `fallback` when the question does not fit.
    LONG Ask(MessageKind kind, LONG fallback, const std::function<void(MessageWriter&)>& write);

    /// Waits on the library's thread, whose windows answer other threads meanwhile.
    void Wait(HANDLE event) const;

    static LibraryHost* s_host;

    InheritedHandles m_handles;
    Wire::SharedMemory m_memory;
    UniqueModule m_library;
    LibrarySide m_side;
    DWORD m_thread = GetCurrentThreadId();
    bool m_isCalling = false; // used on that thread, as is the next one
    bool m_isAsking = false;
    std::mutex m_background;
};
