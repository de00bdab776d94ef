#pragma once

#include <ostream>
#include <sstream>

/// The standard output, reserved for one document. What anything else in the process prints there goes to the error
/// output, from the construction of this object to the end of the process.
class ReservedOutput
{
public:
    ReservedOutput();
    ReservedOutput(const ReservedOutput&) = delete;
    ReservedOutput& operator=(const ReservedOutput&) = delete;
    ~ReservedOutput();

    /// The stream for the document, which is UTF-8.
    std::ostream& Stream() { return m_document; }

    /// Prints the document. Called once. False when it cannot be written.
    bool Print();

private:
    std::ostringstream m_document;
    int m_output; // descriptor of the standard output; negative when there is none
};
