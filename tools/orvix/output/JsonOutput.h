#pragma once

#include "Output.h"

#include <ostream>
#include <string>
#include <vector>

/// Prints results for programs: one JSON object in UTF-8, which docs/orvix.md describes.
class JsonOutput final : public Output
{
public:
    /// `stream` must outlive this object.
    explicit JsonOutput(std::ostream& stream) : m_stream(stream) {}

    /// Stores the text for the object's "lines".
    void Print(std::wstring_view text) override;

    /// Stores the text for the object's "messages".
    void PrintMessage(std::wstring_view text) override;
    void Progress(std::wstring_view) override {}

    /// Prints the object.
    void Show(const Listing& listing) override;

private:
    std::ostream& m_stream;
    std::vector<std::string> m_lines;
    std::vector<std::string> m_messages;
};
