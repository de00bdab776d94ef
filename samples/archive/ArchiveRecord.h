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

/// Who holds a file.
struct ArchiveCheckOut
{
    std::string time; ///< ISO 8601 in UTC
    std::wstring user;
    std::wstring comment;
};

/// Everything that the archive knows of one file. Its text form is described in docs/archive-format.md.
struct ArchiveRecord
{
    /// Relative to the project folder, with "/" between the names.
    std::wstring path;

    std::optional<ArchiveCheckOut> checkOut;

    /// Oldest first and never empty in a stored record; version n stands at index n - 1.
    std::vector<ArchiveVersion> versions;

    const ArchiveVersion& Latest() const { return versions.back(); }

    /// Reads the text form; nothing when it is not exactly as `Format` writes it.
    static std::optional<ArchiveRecord> Parse(std::string_view text);

    std::string Format() const;
};
