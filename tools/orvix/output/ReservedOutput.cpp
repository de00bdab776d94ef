#include "ReservedOutput.h"

#include <windows.h>

#include <io.h>

#include <algorithm>
#include <cstdio>
#include <string>

namespace
{

// File descriptors of the C library.
constexpr int StandardOutput = 1;
constexpr int StandardError = 2;

constexpr std::size_t MaxPiece = 0x10000; // bytes written at once

} // namespace

ReservedOutput::ReservedOutput() : m_output(_dup(StandardOutput))
{
    std::fflush(stdout);
    _dup2(StandardError, StandardOutput);
    // Every C library in the process uses this handle for its own standard output.
    SetStdHandle(STD_OUTPUT_HANDLE, GetStdHandle(STD_ERROR_HANDLE));
}

ReservedOutput::~ReservedOutput()
{
    if (m_output >= 0)
    {
        _close(m_output);
    }
}

bool ReservedOutput::Print()
{
    const std::string document = m_document.str();
    std::size_t printed = 0;
    while (m_output >= 0 && printed < document.size())
    {
        const auto piece = static_cast<unsigned int>(std::min(document.size() - printed, MaxPiece));
        const int written = _write(m_output, document.data() + printed, piece);
        if (written <= 0)
        {
            return false;
        }
        printed += static_cast<std::size_t>(written);
    }
    return m_output >= 0;
}
