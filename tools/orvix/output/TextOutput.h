#pragma once

#include "Output.h"
#include "OutputStyle.h"

#include <ostream>

/// Prints results for people: texts when they arrive, then a table with a summary below it.
class TextOutput final : public Output
{
public:
    /// `stream` must outlive this object.
    TextOutput(std::ostream& stream, OutputStyle style) : m_stream(stream), m_style(style) {}
    TextOutput(const TextOutput&) = delete;
    TextOutput& operator=(const TextOutput&) = delete;
    ~TextOutput() override { TextOutput::Progress({}); }

    void Print(std::wstring_view text) override;

    /// Prints the text on the error output.
    void PrintMessage(std::wstring_view text) override;

    /// Shows the text on a terminal only.
    void Progress(std::wstring_view text) override;

    void Show(const Listing& listing) override;

private:
    std::ostream& m_stream;
    OutputStyle m_style;
    bool m_progressShown = false;
};
