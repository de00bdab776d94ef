#pragma once

#include "CommandLine.h"
#include "Output.h"
#include "ReservedOutput.h"
#include "Terminal.h"
#include "ToolError.h"

#include <memory>
#include <optional>
#include <ostream>

/// The output of one command: text on the standard output, or with --json one document at the end.
class CommandOutput
{
public:
    explicit CommandOutput(const CommandLine& commandLine);

    /// Prints the result. Valid as long as this object.
    Output& Results() { return *m_output; }

    /// For results that are no listing: where they go, and in which style. With --json the stream takes the document.
    std::ostream& Stream();
    const OutputStyle& Style() const { return m_style; }

    /// Writes the document, where there is one. Called once, at the end. Throws `ToolError` with `ExitCode::Failed`
    /// when it cannot be written.
    void Finish();

private:
    Terminal m_terminal;
    OutputStyle m_style;
    std::optional<ReservedOutput> m_document; // with --json
    std::unique_ptr<Output> m_output;
};

/// Calls `work` with an output and finishes the output after it. Returns what `work` returns.
template <typename Work>
ExitCode WithOutput(const CommandLine& commandLine, Work work)
{
    CommandOutput output(commandLine);
    const ExitCode code = work(output);
    output.Finish();
    return code;
}
