#include "Terminal.h"

#include <fcntl.h>
#include <io.h>

#include <cstdio>
#include <cstdlib>

namespace
{

constexpr std::size_t LineBuffer = 0x10000; // bytes, more than a line has

} // namespace

Terminal::Terminal()
    : m_output(GetStdHandle(STD_OUTPUT_HANDLE)), m_isTerminal(GetConsoleMode(m_output, &m_previousMode) != 0),
      m_obeysSequences(m_isTerminal &&
                       SetConsoleMode(m_output, m_previousMode | ENABLE_VIRTUAL_TERMINAL_PROCESSING) != 0)
{
    if (m_isTerminal)
    {
        // In text mode the C library writes UTF-8 one byte at a time.
        _setmode(_fileno(stdout), _O_BINARY);
        std::setvbuf(stdout, nullptr, _IOFBF, LineBuffer);
    }
}

Terminal::~Terminal()
{
    if (m_obeysSequences)
    {
        SetConsoleMode(m_output, m_previousMode);
    }
}

OutputStyle Terminal::Style(bool noColor) const
{
    CONSOLE_SCREEN_BUFFER_INFO buffer{};
    std::optional<std::size_t> width;
    if (m_isTerminal && GetConsoleScreenBufferInfo(m_output, &buffer))
    {
        width = static_cast<std::size_t>(buffer.srWindow.Right - buffer.srWindow.Left + 1);
    }
    return OutputStyle::Of(width, m_obeysSequences, _wgetenv(L"NO_COLOR"), noColor);
}
