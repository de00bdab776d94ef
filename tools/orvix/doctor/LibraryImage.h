#pragma once

#include "UniqueHandle.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// The headers of a library file. The file is read, never loaded, and nothing in it is trusted.
struct LibraryImage
{
    /// Reads the file of this path. Empty when it cannot be read or is not a Windows program file.
    static std::optional<LibraryImage> Read(const std::wstring& path);

    /// Whether the file of this path is a 32-bit library that exports the function of this name.
    static bool Is32BitWith(const std::wstring& path, std::string_view name);

    /// Whether a 64-bit (x64) process can load it.
    bool IsFor64Bit() const;

    std::uint16_t machine = 0;        ///< one of IMAGE_FILE_MACHINE_...
    std::vector<std::string> imports; ///< names of the libraries that it needs when it is loaded, in the file's order

    /// A library that another one needs.
    struct Missing
    {
        std::wstring name;
        std::wstring neededBy;
        unsigned long error; ///< the system's, when it is loaded
    };

    /// The libraries that are missing for the library of this path, among those that it needs and those that these
    /// need. What Windows' own libraries need is not examined. The system searches for them as it does when it loads a
    /// library in this context; none of their code runs.
    static std::vector<Missing> FindMissing(const std::wstring& path, const UniqueActivationContext& context);
};
