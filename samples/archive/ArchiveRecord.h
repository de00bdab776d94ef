#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// One stored version of a file.
struct ArchiveVersion
{
    std::string time; ///< of the check-in, ISO 8601 in UTC
    std::wstring user;
    std::string sha256;          ///< of the contents, 64 lower-case hexadecimal digits
    std::uint64_t size = 0;      ///< of the contents, in bytes
    std::uint64_t lastWrite = 0; ///< the file's own time when it was stored, as FILETIME
    std::wstring comment;
};

/// A check-out of a file.
struct ArchiveCheckOut
{
    std::string time; ///< ISO 8601 in UTC
    std::wstring user;
    std::wstring comment;
};

/// The record of one file. docs/archive-format.md describes its text form.
struct ArchiveRecord
{
    /// Relative to the project folder, with "/" between the names.
    std::wstring path;

    std::optional<ArchiveCheckOut> checkOut;

    /// Oldest first, version n at index n - 1. A stored record has at least one.
    std::vector<ArchiveVersion> versions;

    const ArchiveVersion& Latest() const { return versions.back(); }

    /// Reads the text form. Nothing when the text is not exactly in the form that `Format` writes.
    static std::optional<ArchiveRecord> Parse(std::string_view text);

    std::string Format() const;
};
