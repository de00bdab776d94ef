#pragma once

#include "Output.h"

#include <ostream>
#include <string>
#include <vector>

/// Results for programs: one JSON object, in UTF-8, as docs/orvix.md describes it.
class JsonOutput final : public Output
{
public:
    explicit JsonOutput(std::ostream& stream) : m_stream(stream) {}

    /// Kept for the object's "lines".
    void Say(std::wstring_view text) override;
    void Progress(std::wstring_view) override {}

    /// Prints the object.
    void Show(const Listing& listing) override;

private:
    std::ostream& m_stream;
    std::vector<std::string> m_lines;
};
