#pragma once

#include "IOrvixClientAccess.h"

/// The console as the library and its providers see it.
class ClientAccess final : public IOrvixClientAccess
{
public:
    explicit ClientAccess(bool unattended) : m_unattended(unattended) {}

    /// Prints the text on the standard output.
    void OutputText(const wchar_t* text, int kind) override;
    std::intptr_t RelayA(void*, void*, void*, void*) override { return 0; }
    std::uint32_t GetColor(std::int32_t index) override;
    bool IsUnattended() override { return m_unattended; }
    std::intptr_t RelayB(void*, void*, void*, void*) override { return 0; }

private:
    bool m_unattended;
};
