#pragma once

#include "Process.h"

#include <windows.h>

#include <chrono>
#include <functional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

class OrvixWaitingWindow;

/// Comes before a path in Git's input: the path is a name, not a pattern. The variable GIT_LITERAL_PATHSPECS says the
/// same of all paths, but hooks inherit it, and their own patterns would find nothing.
inline constexpr std::string_view LiteralPath = ":(literal)";

/// A command of Git.
struct GitCommand
{
    std::vector<std::wstring> arguments{}; ///< without "git"; paths are never here
    std::string input{};                   ///< mostly the paths, each with a zero after it
    bool isQuery = false;                  ///< it takes no lock that is not needed
    std::wstring task{};                   ///< what the waiting window says
    std::size_t linesToCome = 0;           ///< lines of output that it prints on its way; 0: it prints its own progress
    bool keepsIndex = false;               ///< it never writes the index
    std::vector<std::wstring> settings{};  ///< of Git, for this command alone: "name=value"
};

/// Runs commands of Git for one operation of the provider: on threads of their own, while the waiting window paints the
/// host. Every failure to run throws `GitFailure`: the user has cancelled it, or it was silent for too long. When the
/// user has cancelled, no further command of the operation starts.
class GitRunner
{
public:
    /// How long a command may print nothing, unless the configuration says otherwise.
    static constexpr std::chrono::seconds DefaultSilence{300};

    /// What a failure says when the user has cancelled.
    static constexpr wchar_t Cancelled[] = L"cancelled";

    /// Prepares to run `program`.
    void SetUp(std::wstring program);

    const std::wstring& Program() const { return m_program; }
    void SetFolder(std::wstring folder) { m_folder = std::move(folder); }
    void SetSilence(std::chrono::seconds silence) { m_silence = silence; }

    /// The window of the operation that begins; null at its end. Not owned. When `unattended`, no program asks the user
    /// for anything.
    void SetWindow(OrvixWaitingWindow* window, bool unattended)
    {
        m_window = window;
        m_unattended = unattended;
    }

    /// True when the user has cancelled the operation that runs.
    bool IsCancelled() const;

    /// Runs a command; it may fail.
    ProcessResult Run(const GitCommand& command) const;

    /// Runs a command; throws `GitFailure` with Git's words when it fails. Returns its output.
    std::string RunOrThrow(const GitCommand& command) const;

    /// Runs commands side by side; the results in their order.
    std::vector<ProcessResult> RunAll(std::span<const GitCommand> commands) const;

    /// Runs work that is no command and may take a while, such as calls for files of a network. It runs to its end,
    /// also when the user cancels. Its exception is thrown here.
    void Work(const std::wstring& task, const std::function<void()>& work) const;

    /// How a command is started.
    ProcessCommand MakeProcess(const GitCommand& command) const;

    /// The variables of the host's environment that name a repository, each without a value. A host that Git itself has
    /// started has them; a program for another repository must not.
    static std::vector<ProcessCommand::Variable> NoRepository();

    /// Git's words about a command that has failed.
    static std::vector<std::wstring> Words(const ProcessResult& result);

private:
    void ShowTask(const std::wstring& task) const;
    void WaitFor(HANDLE end, HANDLE cancel) const;
    void RequireEnd(const GitCommand& command, const ProcessResult& result) const;

    std::wstring m_program;
    std::wstring m_folder;
    bool m_unattended = false;
    std::chrono::milliseconds m_silence = DefaultSilence;
    OrvixWaitingWindow* m_window = nullptr;
};
