#pragma once

#include "Listener.h"

#include <string>
#include <vector>

/// Vetoes an operation before it runs when one of its files matches a pattern.
class VetoRule final : public Listener
{
public:
    /// Patterns with "*" and "?", compared without regard to case: with a backslash or slash against the path
    /// below `projectFolder`, otherwise against the file's name alone.
    VetoRule(std::vector<std::wstring> patterns, std::wstring projectFolder);

    std::uint32_t Notify(OrvixNotifyParams* params, std::int64_t userData) override;

    /// The file that caused a veto and the pattern that it matches; empty as long as there was none.
    const std::wstring& Reason() const { return m_reason; }

private:
    bool Forbids(const wchar_t* path);

    std::vector<std::wstring> m_patterns;
    std::wstring m_projectFolder;
    std::wstring m_reason;
};
