#pragma once

#include <filesystem>
#include <string>
#include <vector>

/// orvix.exe as a shell runs it.
class OrvixTool
{
public:
    struct Result
    {
        unsigned long code; ///< exit code; TimedOut when the program was ended
        std::string output; ///< UTF-8, lines end in LF
        std::string errors;
    };

    static constexpr unsigned long TimedOut = 0xDEAD;

    /// Runs the program with these arguments in a folder, for at most 110 seconds. `scratch` is a folder for its
    /// output.
    static Result Run(const std::filesystem::path& program, const std::filesystem::path& scratch,
                      const std::filesystem::path& folder, const std::vector<std::wstring>& arguments);
};
