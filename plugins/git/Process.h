#pragma once

#include "Handles.h"

#include <chrono>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

/// How a program is to run.
struct ProcessCommand
{
    /// A variable of the environment; without a value it is removed.
    using Variable = std::pair<std::wstring, std::optional<std::wstring>>;

    std::wstring program;                ///< full path
    std::vector<std::wstring> arguments; ///< without the program; no shell sees them
    std::wstring folder;                 ///< where it runs
    std::vector<Variable> environment;   ///< what differs from the environment of this process
    std::string input;                   ///< what it reads
    std::chrono::milliseconds silence{}; ///< a program that prints and reads nothing for so long is ended
};

/// What became of it.
struct ProcessResult
{
    enum class End
    {
        Exited,
        Silent,   ///< ended after a time without a sign of life
        Cancelled ///< ended when the caller wished
    };

    End end = End::Exited;
    unsigned long exitCode = 0;
    std::string output;
    std::string errors;

    bool Succeeded() const { return end == End::Exited && exitCode == 0; }
};

/// A program that runs without a window. Both of its outputs are read while they come and its input is written
/// meanwhile, however long each is. It is ended together with the programs that it has started. Used on one thread.
class Process
{
public:
    /// What a listener is told: new bytes of the output or of the errors.
    enum class Stream
    {
        Output,
        Errors
    };
    using Listener = std::function<void(Stream, std::string_view)>;

    /// Starts it. Throws `GitFailure` when Windows cannot. `listener` may be empty; it is called within `Step`.
    explicit Process(ProcessCommand command, Listener listener = {});
    Process(const Process&) = delete;
    Process& operator=(const Process&) = delete;

    /// A program that still runs is ended at once.
    ~Process();

    /// Works on the streams until something has happened or `timeout` (milliseconds) is over. When `cancel` is
    /// signalled (it may be null), the program is asked to end and, when it does not within a few seconds, ended. False
    /// when it has ended and the result is complete.
    bool Step(unsigned long timeout, HANDLE cancel);

    /// What there is; complete when `Step` has returned false.
    const ProcessResult& Result() const;

    /// Runs a program to its end.
    static ProcessResult Run(ProcessCommand command, HANDLE cancel, Listener listener = {});

    /// Starts a program that lives on by itself, with windows of its own. Throws `GitFailure` when it cannot be started
    /// and when it fails at once. `environment` is what differs from the environment of this process.
    static void StartAlone(const std::wstring& program, const std::vector<std::wstring>& arguments,
                           const std::wstring& folder, const std::vector<ProcessCommand::Variable>& environment);

private:
    class Running;
    std::unique_ptr<Running> m_running;
};
