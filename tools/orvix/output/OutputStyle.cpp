#include "OutputStyle.h"

namespace
{

const char* Sequence(Listing::Tone tone)
{
    switch (tone)
    {
    case Listing::Tone::Good:
        return "\x1b[32m";
    case Listing::Tone::Bad:
        return "\x1b[31m";
    case Listing::Tone::Quiet:
        return "\x1b[90m";
    case Listing::Tone::Heading:
        return "\x1b[1m";
    default:
        return "";
    }
}

} // namespace

std::string OutputStyle::Coloured(const std::string& text, Listing::Tone tone) const
{
    return colour && tone != Listing::Tone::Plain ? Sequence(tone) + text + "\x1b[0m" : text;
}

void OutputStyle::PrintLine(std::ostream& stream, const std::string& line) const
{
    stream << line << '\n';
    if (width)
    {
        stream.flush(); // line by line: a terminal loses a character whose bytes arrive in two writes
    }
}
