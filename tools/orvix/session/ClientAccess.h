#pragma once

#include "CommandLine.h"
#include "IOrvixClientAccess.h"
#include "Output.h"

/// The console as the library and its providers see it.
class ClientAccess final : public IOrvixClientAccess
{
public:
    /// `output` prints the text of providers, and must outlive this object.
    ClientAccess(const CommandLine& commandLine, Output& output)
        : m_unattended(commandLine.unattended), m_textIsResult(commandLine.providerTextIsResult), m_output(output)
    {
    }

    void OutputText(const wchar_t* text, int kind) override;
    std::intptr_t RelayA(void*, void*, void*, void*) override { return 0; }
    std::uint32_t GetColor(std::int32_t index) override;
    bool IsUnattended() override { return m_unattended; }
    std::intptr_t RelayB(void*, void*, void*, void*) override { return 0; }

private:
    bool m_unattended;
    bool m_textIsResult;
    Output& m_output;
};
