#pragma once

#include "IOrvixNotifyCallback.h"

#include <string>
#include <vector>

/// Vetoes an operation before it runs when the path of one of its files matches a pattern.
class VetoRule final : public IOrvixNotifyCallback
{
public:
    /// `patterns` may hold "*" and "?"; letter case does not count. A pattern with a backslash or slash is compared
    /// with the path below `projectFolder`, any other with the name of the file.
    VetoRule(std::vector<std::wstring> patterns, std::wstring projectFolder);

    std::uint32_t Notify(OrvixNotifyParams* params, std::int64_t userData) override;

    /// The file that caused a veto and the pattern that it matches; empty while there was no veto.
    const std::wstring& Reason() const { return m_reason; }

private:
    bool Forbids(const wchar_t* path);

    std::vector<std::wstring> m_patterns;
    std::wstring m_projectFolder;
    std::wstring m_reason;
};
