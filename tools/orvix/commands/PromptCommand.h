#pragma once

#include "CommandLine.h"
#include "OrvixPromptTable.h"
#include "Output.h"
#include "FileDiagnostics.h"

#include <functional>
#include <string>
#include <vector>

/// `orvix prompts`: shows and changes the stored answers of a configuration folder. They are read and written by the
/// library's own code.
class PromptCommand
{
public:
    /// Reads the stored answers. Throws `ToolError` when there is no such folder, and when the file is there but cannot
    /// be read. The arguments must outlive this object.
    PromptCommand(const CommandLine& commandLine, Output& output);

    /// Carries the command out and shows the prompts that it concerns. Throws `ToolError`, with the file as it was,
    /// when there is no such prompt, when it is locked or does not offer the answer, and when the change cannot be
    /// saved without loss.
    void Run();

private:
    using Rows = std::vector<unsigned int>;

    Rows All();

    /// The rows with the ID on the command line: an ID need not be unique, and all of its rows are meant.
    Rows Named();

    void Set(const Rows& rows, std::uint32_t action);
    Rows ResetAll();
    void Lock(const Rows& rows, bool locked);
    void Save();
    void Show(const Rows& rows);

    const CommandLine& m_commandLine;
    Output& m_output;
    std::wstring m_path;
    OrvixPromptTable m_table;
    FileDiagnostics m_log;              // what the file would lose by being saved
    unsigned int m_leftLocked = 0; // prompts that were left as they are
};
