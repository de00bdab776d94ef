#pragma once

#include "SharedMemory.h"
#include "UniqueHandle.h"

#include <atomic>
#include <filesystem>
#include <memory>
#include <string>

/// The process of one isolated library, as the host's process has it. The process ends with this object, and with the
/// host's process.
class LibraryProcess
{
public:
    /// Starts `program`. Null when the system refuses; the thread's last error then says why.
    static std::shared_ptr<LibraryProcess> Start(const std::filesystem::path& program);

    LibraryProcess(const LibraryProcess&) = delete;
    LibraryProcess& operator=(const LibraryProcess&) = delete;
    ~LibraryProcess() { End(); }

    Wire::SharedMemory& Memory() { return m_memory; }
    HANDLE Process() const { return m_process.Get(); }
    DWORD Id() const { return m_id; }

    // See InheritedHandles.
    HANDLE Requested() const { return m_requested.Get(); }
    HANDLE Replied() const { return m_replied.Get(); }
    HANDLE BackgroundAsked() const { return m_backgroundAsked.Get(); }
    HANDLE BackgroundAnswered() const { return m_backgroundAnswered.Get(); }

    /// Ends the process at once and waits for its end, for a few seconds at most.
    void End();

    /// The process has ended by itself: how, as a part of a sentence such as "crashed in SccGet: ...".
    std::wstring WhyEnded(const std::wstring& function) const;

    /// True while the process shows a window.
    bool ShowsWindow() const;

    /// Notes a sign of life that is no answer to a call. [any-thread]
    void NoteSign() { ++m_signs; }

    /// The number of such signs.
    unsigned int Signs() const { return m_signs; }

private:
    explicit LibraryProcess(UniqueKernelHandle section);
    bool Run(const std::filesystem::path& program);

    UniqueKernelHandle m_section;
    Wire::SharedMemory m_memory;
    UniqueKernelHandle m_requested;
    UniqueKernelHandle m_replied;
    UniqueKernelHandle m_backgroundAsked;
    UniqueKernelHandle m_backgroundAnswered;
    UniqueKernelHandle m_job; // ends the process when it is closed
    UniqueKernelHandle m_process;
    DWORD m_id = 0;
    std::atomic<unsigned int> m_signs = 0;
};
