#include "TextOutput.h"

#include "Text.h"
#include "TextTable.h"

#include <iostream>

namespace
{

void PrintSummary(std::ostream& stream, const std::vector<Listing::Count>& counts)
{
    const char* separator = "";
    for (const Listing::Count& count : counts)
    {
        if (count.count > 0 || &count == &counts.front())
        {
            stream << separator << count.count << ' ' << count.words;
            separator = ", ";
        }
    }
    stream << '\n';
}

} // namespace

void TextOutput::Print(std::wstring_view text)
{
    Progress({});
    m_stream << PrintableLines(text) << '\n' << std::flush;
}

void TextOutput::PrintMessage(std::wstring_view text)
{
    Progress({});
    std::cerr << PrintableLines(text) << std::endl;
}

void TextOutput::Progress(std::wstring_view text)
{
    if (!m_style.width || (text.empty() && !m_progressShown))
    {
        return;
    }
    m_progressShown = !text.empty();
    const std::size_t room = *m_style.width > 0 ? *m_style.width - 1 : 0; // a full line would wrap
    const std::wstring shown = TextTable::Shortened(text, room);
    m_stream << '\r' << Printable(shown) << std::string(room - TextTable::ColumnsOf(shown), ' ') << '\r' << std::flush;
}

void TextOutput::Show(const Listing& listing)
{
    Progress({});
    TextTable(listing).Print(m_stream, m_style);
    if (!listing.summary.empty())
    {
        PrintSummary(m_stream, listing.summary);
    }
}
