#pragma once

#include "Output.h"
#include "OutputStyle.h"

#include <ostream>

/// Results for people: lines as they come, then a table with a summary below.
class TextOutput final : public Output
{
public:
    TextOutput(std::ostream& stream, OutputStyle style) : m_stream(stream), m_style(style) {}
    TextOutput(const TextOutput&) = delete;
    TextOutput& operator=(const TextOutput&) = delete;
    ~TextOutput() override { TextOutput::Progress({}); }

    void Say(std::wstring_view text) override;

    /// Shown on a terminal only.
    void Progress(std::wstring_view text) override;

    void Show(const Listing& listing) override;

private:
    std::ostream& m_stream;
    OutputStyle m_style;
    bool m_progressShown = false;
};
