#include "LoadAnnouncer.h"

#include "Text.h"

#include <iostream>

void LoadAnnouncer::Announce(const std::wstring& library) const
{
    if (m_verbose)
    {
        m_output.Progress({});
        std::cerr << "orvix: loading " << Printable(library) << std::endl;
    }
    m_output.Progress(L"examining " + library);
}
