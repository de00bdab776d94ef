#pragma once

#include "Output.h"

#include <string>

/// Names each library before it is loaded.
class LoadAnnouncer
{
public:
    /// `verbose`: names it also on the error output. `output` shows the progress and must outlive this object.
    LoadAnnouncer(bool verbose, Output& output) : m_verbose(verbose), m_output(output) {}

    void Announce(const std::wstring& library) const;

private:
    bool m_verbose;
    Output& m_output;
};
