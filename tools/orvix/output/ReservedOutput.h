#pragma once

#include <ostream>
#include <sstream>

/// The standard output, reserved for one document: what anybody else in the process prints there, from the beginning of
/// this object to the end of the process, goes to the error output.
class ReservedOutput
{
public:
    ReservedOutput();
    ReservedOutput(const ReservedOutput&) = delete;
    ReservedOutput& operator=(const ReservedOutput&) = delete;
    ~ReservedOutput();

    /// Where the document is written, in UTF-8.
    std::ostream& Stream() { return m_document; }

    /// Prints the document; called once. False when it cannot be written.
    bool Print();

private:
    std::ostringstream m_document;
    int m_output; // descriptor of the standard output; negative when there is none
};
