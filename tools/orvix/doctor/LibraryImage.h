#pragma once

#include "UniqueHandle.h"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

/// What the headers of a library file say. The file is read, never loaded, and nothing in it is trusted.
struct LibraryImage
{
    /// Nothing when the file cannot be read or is no program file of Windows.
    static std::optional<LibraryImage> Read(const std::wstring& path);

    bool IsFor64Bit() const; ///< whether it is made for this kind of process

    std::uint16_t machine = 0;        ///< as the file says, one of IMAGE_FILE_MACHINE_...
    std::vector<std::string> imports; ///< names of the libraries that it needs when it is loaded, in the file's order

    /// A library that another one needs.
    struct Missing
    {
        std::wstring name;
        std::wstring neededBy;
        unsigned long error; ///< of the system
    };

    /// The libraries that are missing for the library of this path, among those that it needs and those that these
    /// need; Windows' own are not looked into. The system searches for them as it does for a library that is being
    /// loaded in this context; none of their code runs.
    static std::vector<Missing> FindMissing(const std::wstring& path, const UniqueActivationContext& context);
};
