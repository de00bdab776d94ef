#include "CommandOutput.h"

#include "JsonOutput.h"
#include "TextOutput.h"

#include <iostream>

CommandOutput::CommandOutput(const CommandLine& commandLine) : m_style(m_terminal.Style(commandLine.noColor))
{
    if (commandLine.json)
    {
        m_document.emplace();
        m_output = std::make_unique<JsonOutput>(Stream());
    }
    else
    {
        m_output = std::make_unique<TextOutput>(Stream(), m_style);
    }
}

std::ostream& CommandOutput::Stream()
{
    return m_document ? m_document->Stream() : std::cout;
}

void CommandOutput::Finish()
{
    if (m_document && !m_document->Print())
    {
        throw ToolError(ExitCode::Failed, L"the output cannot be written");
    }
}
