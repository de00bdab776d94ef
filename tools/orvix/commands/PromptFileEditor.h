#pragma once

#include "CommandLine.h"
#include "FileDiagnostics.h"
#include "OrvixPromptTable.h"
#include "Output.h"

#include <string>
#include <vector>

/// Shows and changes the stored answers of a configuration folder. They are read and written with the library's own
/// code.
///
/// Each operation shows the prompts that it concerns. It throws `ToolError`, and the file stays as it was, when there
/// is no such prompt, when the prompt is locked or does not offer the answer, and when the change cannot be saved
/// without loss.
class PromptFileEditor
{
public:
    /// Reads the stored answers. The arguments must outlive this object. Throws `ToolError` when the folder does not
    /// exist, and when the file exists but cannot be read.
    PromptFileEditor(const CommandLine& commandLine, Output& output);

    void List();
    void Set();
    void Reset();
    void Lock();
    void Unlock();

private:
    using Rows = std::vector<unsigned int>;

    Rows AllRows();

    /// The rows with the ID of the command line: several rows may have the same ID, and the command concerns them all.
    Rows NamedRows();

    void SetRows(const Rows& rows, std::uint32_t action);
    void CheckOffered(unsigned int row, std::uint32_t action);
    void LockRows(bool locked);
    void Save();
    void Show(const Rows& rows);

    const CommandLine& m_commandLine;
    Output& m_output;
    std::wstring m_path;
    OrvixPromptTable m_table;
    FileDiagnostics m_diagnostics; // of the file: what is lost when it is saved
    unsigned int m_leftLocked = 0; // number of prompts that stay as they are
};
