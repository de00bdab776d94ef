#pragma once

#include <cstdint>
#include <optional>
#include <string>

/// Where an XML file is not well-formed, and why, as the system's XML service says.
struct XmlFault
{
    /// The first fault of a file; nothing when the service names none, and when more than `maxText` characters of texts
    /// and attribute values stand before it, with entities replaced. COM is initialised for the call.
    static std::optional<XmlFault> Find(const std::wstring& path, std::uintmax_t maxText);

    int line = 0;
    int column = 0;
    std::wstring reason;
};
