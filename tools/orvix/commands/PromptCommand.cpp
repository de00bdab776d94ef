#include "PromptCommand.h"

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

namespace
{

/// The 32 bits of an ID in decimal, with or without a sign.
int ParseId(const std::wstring& text)
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

PromptCommand::PromptCommand(const CommandLine& commandLine, Output& output)
    : m_commandLine(commandLine), m_output(output)
{
    const std::wstring folder = HostSession::ConfigFolder(commandLine);
    if (!IsFolder(folder))
    {
        throw ToolError(ExitCode::NoProject, L"no such configuration folder: " + folder);
    }
    m_path = folder + L'\\' + PromptFileName;
    if (!ReadPromptFile(m_table, m_path.c_str(), &m_log) && PathExists(m_path))
    {
        throw ToolError(ExitCode::Failed, L"the stored answers cannot be read and stay as they are: " + m_path);
    }
}

void PromptCommand::Run()
{
    const std::wstring& action = m_commandLine.action;
    Rows rows = action == L"list" || m_commandLine.all ? All() : Named();
    if (action == L"set")
    {
        const auto answer = PromptAnswer::Action(m_commandLine.answer);
        if (!answer)
        {
            throw ToolError(ExitCode::BadUsage,
                            L"an answer is ask, yes, no, yes-to-all or no-to-all, not " + m_commandLine.answer);
        }
        Set(rows, *answer);
    }
    else if (action == L"reset" && m_commandLine.all)
    {
        rows = ResetAll();
    }
    else if (action == L"reset")
    {
        Set(rows, OrvixPromptAction::Ask);
    }
    else if (action != L"list")
    {
        Lock(rows, action == L"lock");
    }
    Show(rows);
}

PromptCommand::Rows PromptCommand::All()
{
    Rows rows(static_cast<std::size_t>(m_table.NumPrompts()));
    std::iota(rows.begin(), rows.end(), 0U);
    return rows;
}

PromptCommand::Rows PromptCommand::Named()
{
    const int id = ParseId(m_commandLine.prompt);
    Rows rows = All();
    std::erase_if(rows, [&](unsigned int row) { return m_table.GetPromptID(row) != id; });
    if (rows.empty())
    {
        throw ToolError(ExitCode::NoProject, L"no such prompt: " + m_commandLine.prompt + L" (see orvix prompts list)");
    }
    return rows;
}

void PromptCommand::Set(const Rows& rows, std::uint32_t action)
{
    for (const unsigned int row : rows)
    {
        if (m_table.GetLocked(row))
        {
            throw ToolError(ExitCode::Failed, L"prompt " + m_commandLine.prompt + L" is locked");
        }
        const std::uint32_t options = m_table.GetPromptOptions(row);
        const bool hasIt = PromptAnswer::InWords(m_table.GetPrompt(row)) == PromptAnswer::InWords(action);
        if (!hasIt && !PromptAnswer::IsOffered(options, action))
        {
            throw ToolError(ExitCode::Failed, L"prompt " + m_commandLine.prompt + L" does not offer " +
                                                  PromptAnswer::InWords(action) + L" but " +
                                                  PromptAnswer::OptionsInWords(options));
        }
    }
    for (const unsigned int row : rows)
    {
        m_table.SetPrompt(row, action);
    }
    Save();
}

PromptCommand::Rows PromptCommand::ResetAll()
{
    Rows rows = All();
    m_leftLocked =
        static_cast<unsigned int>(std::erase_if(rows, [this](unsigned int row) { return m_table.GetLocked(row); }));
    Set(rows, OrvixPromptAction::Ask);
    return rows;
}

void PromptCommand::Lock(const Rows& rows, bool locked)
{
    for (const unsigned int row : rows)
    {
        m_table.SetLocked(row, locked);
    }
    Save();
}

void PromptCommand::Save()
{
    const auto losses = std::count_if(m_log.diagnostics.begin(), m_log.diagnostics.end(), [](const FileDiagnostics::Diagnostic& diagnostic) {
        return diagnostic.kind != FileDiagnostics::Kind::UnknownValue;
    });
    if (losses > 0)
    {
        throw ToolError(ExitCode::Failed, L"nothing is changed: what the library passes over would be lost (" +
                                              std::to_wstring(losses) + L", see orvix doctor) in " + m_path);
    }
    if (m_table.NumPrompts() == 0)
    {
        return;
    }
    // Written beside it first: the old file stays whole until the new one is.
    const std::wstring written = m_path + L".new";
    if (!WritePromptFile(m_table, written.c_str()) ||
        !ReplaceFileW(m_path.c_str(), written.c_str(), nullptr, 0, nullptr, nullptr))
    {
        // A replacement that fails half-way may have taken the old file away already.
        if (PathExists(m_path))
        {
            DeleteFileW(written.c_str());
        }
        throw ToolError(ExitCode::Failed, L"the stored answers cannot be saved: " + m_path);
    }
}

void PromptCommand::Show(const Rows& rows)
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
