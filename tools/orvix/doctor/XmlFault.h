#pragma once

#include <cstdint>
#include <optional>
#include <string>

/// A place where an XML file is not well-formed, and the reason, from the system's XML service.
struct XmlFault
{
    /// The first fault of a file. Empty when the service reports none, and when more than `maxText` characters of texts
    /// and attribute values, with entities replaced, come before it. COM is initialised for the call.
    static std::optional<XmlFault> Find(const std::wstring& path, std::uintmax_t maxText);

    int line = 0;
    int column = 0;
    std::wstring reason;
};
