#include "PromptFileEditor.h"

#include "FilePath.h"
#include "HostSession.h"
#include "OrvixPrompt.h"
#include "PromptAnswer.h"
#include "PromptFile.h"
#include "ToolError.h"

#include <windows.h>

#include <algorithm>
#include <limits>
#include <numeric>
#include <optional>

namespace
{

/// An ID, a decimal number of 32 bits with or without a sign. Throws `ToolError` for any other text.
int ParseID(const std::wstring& text)
{
    const bool negative = text.starts_with(L'-');
    const std::wstring digits = text.substr(negative ? 1 : 0);
    const bool isNumber = !digits.empty() && digits.size() <= 10 &&
                          std::all_of(digits.begin(), digits.end(), [](wchar_t c) { return c >= L'0' && c <= L'9'; });
    const long long value = isNumber ? std::stoll(text) : std::numeric_limits<long long>::max();
    if (value < std::numeric_limits<std::int32_t>::min() || value > std::numeric_limits<std::uint32_t>::max())
    {
        throw ToolError(ExitCode::BadUsage, L"a prompt's ID is a number of 32 bits, not " + text);
    }
    return static_cast<int>(value);
}

} // namespace

PromptFileEditor::PromptFileEditor(const CommandLine& commandLine, Output& output)
    : m_commandLine(commandLine), m_output(output)
{
    const std::wstring folder = HostSession::ConfigFolder(commandLine);
    if (!IsFolder(folder))
    {
        throw ToolError(ExitCode::NotFound, L"no such configuration folder: " + folder);
    }
    m_path = folder + L'\\' + PromptFileName;
    if (!ReadPromptFile(m_table, m_path.c_str(), &m_diagnostics) && PathExists(m_path))
    {
        throw ToolError(ExitCode::Failed, L"the stored answers cannot be read and stay as they are: " + m_path);
    }
}

void PromptFileEditor::List()
{
    Show(AllRows());
}

void PromptFileEditor::Set()
{
    const Rows rows = NamedRows();
    const std::optional<std::uint32_t> action = PromptAnswer::Action(m_commandLine.answer);
    if (!action)
    {
        throw ToolError(ExitCode::BadUsage,
                        L"an answer is ask, yes, no, yes-to-all or no-to-all, not " + m_commandLine.answer);
    }
    SetRows(rows, *action);
    Show(rows);
}

void PromptFileEditor::Reset()
{
    Rows rows = m_commandLine.all ? AllRows() : NamedRows();
    if (m_commandLine.all)
    {
        m_leftLocked =
            static_cast<unsigned int>(std::erase_if(rows, [this](unsigned int row) { return m_table.GetLocked(row); }));
    }
    SetRows(rows, OrvixPromptAction::Ask);
    Show(rows);
}

void PromptFileEditor::Lock()
{
    LockRows(true);
}

void PromptFileEditor::Unlock()
{
    LockRows(false);
}

PromptFileEditor::Rows PromptFileEditor::AllRows()
{
    Rows rows(static_cast<std::size_t>(m_table.NumPrompts()));
    std::iota(rows.begin(), rows.end(), 0U);
    return rows;
}

PromptFileEditor::Rows PromptFileEditor::NamedRows()
{
    const int id = ParseID(m_commandLine.prompt);
    Rows rows = AllRows();
    std::erase_if(rows, [&](unsigned int row) { return m_table.GetPromptID(row) != id; });
    if (rows.empty())
    {
        throw ToolError(ExitCode::NotFound, L"no such prompt: " + m_commandLine.prompt + L" (see orvix prompts list)");
    }
    return rows;
}

void PromptFileEditor::SetRows(const Rows& rows, std::uint32_t action)
{
    for (const unsigned int row : rows)
    {
        CheckOffered(row, action);
    }
    for (const unsigned int row : rows)
    {
        m_table.SetPrompt(row, action);
    }
    Save();
}

void PromptFileEditor::CheckOffered(unsigned int row, std::uint32_t action)
{
    if (m_table.GetLocked(row))
    {
        throw ToolError(ExitCode::Failed, L"prompt " + m_commandLine.prompt + L" is locked");
    }
    const std::uint32_t options = m_table.GetPromptOptions(row);
    const bool isStored = PromptAnswer::InWords(m_table.GetPrompt(row)) == PromptAnswer::InWords(action);
    if (!isStored && !PromptAnswer::IsOffered(options, action))
    {
        throw ToolError(ExitCode::Failed, L"prompt " + m_commandLine.prompt + L" does not offer " +
                                              PromptAnswer::InWords(action) + L" but " +
                                              PromptAnswer::OptionsInWords(options));
    }
}

void PromptFileEditor::LockRows(bool locked)
{
    const Rows rows = NamedRows();
    for (const unsigned int row : rows)
    {
        m_table.SetLocked(row, locked);
    }
    Save();
    Show(rows);
}

void PromptFileEditor::Save()
{
    const auto losses = std::count_if(m_diagnostics.diagnostics.begin(), m_diagnostics.diagnostics.end(),
                                      [](const FileDiagnostics::Diagnostic& diagnostic) {
                                          return diagnostic.kind != FileDiagnostics::Kind::UnknownValue;
                                      });
    if (losses > 0)
    {
        throw ToolError(ExitCode::Failed, L"nothing is changed: what the library ignores would be lost (" +
                                              std::to_wstring(losses) + L", see orvix doctor) in " + m_path);
    }
    if (m_table.NumPrompts() == 0)
    {
        return;
    }
    if (!WritePromptFile(m_table, m_path.c_str()))
    {
        throw ToolError(ExitCode::Failed, L"the stored answers cannot be saved: " + m_path);
    }
}

void PromptFileEditor::Show(const Rows& rows)
{
    Listing listing{
        .key = "prompts",
        .columns =
            {{"id", "ID"}, {"answer", "Answer"}, {"options", "Options"}, {"locked", "Locked"}, {"text", "Prompt"}},
        .rows = {},
        .summary = {{"prompts", rows.size() == 1 ? "prompt" : "prompts", static_cast<unsigned int>(rows.size())},
                    {"leftLocked", "left as they are, locked", m_leftLocked}}};
    for (const unsigned int row : rows)
    {
        const bool locked = m_table.GetLocked(row);
        listing.rows.push_back({{std::int64_t{m_table.GetPromptID(row)}},
                                {PromptAnswer::InWords(m_table.GetPrompt(row))},
                                {PromptAnswer::OptionsInWords(m_table.GetPromptOptions(row))},
                                {locked, locked ? Listing::Tone::Bad : Listing::Tone::Plain},
                                {std::wstring(m_table.GetPromptText(row))}});
    }
    m_output.Show(listing);
}
