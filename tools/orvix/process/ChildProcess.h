#pragma once

#include "UniqueHandle.h"

#include <chrono>
#include <string>
#include <string_view>

/// This program, started once more to run code of others: what crashes, hangs or ends the process there does no harm
/// here. The child writes lines to a pipe (`ParentLink`).
class ChildProcess
{
public:
    /// Where the standard input and output of the child go.
    enum class Streams
    {
        Shared, ///< to those of this process
        None,   ///< nowhere
    };

    /// Starts the child. `arguments`: the rest of its command line, quoted where needed. `folder`: its current folder;
    /// empty for the one of this process. Throws `ToolError` when the system refuses.
    ChildProcess(const std::wstring& arguments, const std::wstring& folder, Streams streams);
    ChildProcess(const ChildProcess&) = delete;
    ChildProcess& operator=(const ChildProcess&) = delete;

    /// Ends the child and every process that it has started, unless `LeaveDescendants` was called.
    ~ChildProcess();

    /// Waits until the child has ended, at most `time`. True when it has ended.
    bool Wait(std::chrono::milliseconds time) const;

    /// What the child has written since the last call, without waiting. May end within a line.
    std::string Read() const;

    /// Valid when the child has ended.
    unsigned long ExitCode() const;

    /// Ends the child and every process that it has started, and waits for the child's end.
    void End();

    /// From now on the processes that the child has started live on.
    void LeaveDescendants();

    /// Whether a process is the child or was started by it.
    bool Contains(unsigned long processID) const;

private:
    UniqueKernelHandle m_job; // ends its processes when it is closed
    UniqueFile m_pipe;        // to read from
    UniqueKernelHandle m_process;
};

/// An argument as the C run-time reads it from a command line.
std::wstring QuotedArgument(std::wstring_view argument);

/// How a process ended without saying so, as the end of a sentence: "crashes the process with exception ..." or "ends
/// the process with exit code ...".
std::string DescribeProcessEnd(unsigned long exitCode);
