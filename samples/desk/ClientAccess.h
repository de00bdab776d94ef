#pragma once

#include "IOrvixClientAccess.h"
#include "OutputPane.h"
#include "Theme.h"

/// What the library asks of this program while it works.
class ClientAccess final : public IOrvixClientAccess
{
public:
    /// `output` and `theme` outlive this object.
    ClientAccess(OutputPane& output, const Theme& theme, bool unattended)
        : m_output(output), m_theme(theme), m_unattended(unattended)
    {
    }

    /// Shows a provider's text in the output. May come from any thread.
    void OutputText(const wchar_t* text, int kind) override;

    std::uint32_t GetColor(std::int32_t index) override { return m_theme.Color(index); }
    bool IsUnattended() override { return m_unattended; }

    // What the two relays mean is agreed with the user-interface library. The reference library calls neither. A
    // library of your own may use them as they are here.

    /// Shows the text `a` (const wchar_t*) in the output; returns 1, or 0 for null.
    std::intptr_t RelayA(void* a, void* b, void* c, void* d) override;

    /// Returns the program's main window (HWND), the owner for further windows.
    std::intptr_t RelayB(void* a, void* b, void* c, void* d) override;

private:
    OutputPane& m_output;
    const Theme& m_theme;
    bool m_unattended;
};
