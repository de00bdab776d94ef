#pragma once

#include <string>
#include <string_view>
#include <vector>

/// What "git status" says, from its output in the form "--porcelain=v2 -z --branch --no-renames".
struct GitStatus
{
    /// A file that differs from the last commit, or that Git does not track.
    struct File
    {
        enum class Kind
        {
            Changed,
            Conflicted,
            Untracked
        };

        std::string path; ///< below the top folder, with "/"
        Kind kind = Kind::Changed;
        char staged = '.'; ///< what the index has: "." (no change), "M", "T", "A", "D"
        char onDisk = '.'; ///< what the disk has, against the index

        bool IsAdded() const { return staged == 'A' || onDisk == 'A'; }
        bool IsDeleted() const { return staged == 'D' || onDisk == 'D'; }
    };

    std::wstring branch;   ///< "(detached)" when there is none
    std::wstring upstream; ///< such as "origin/main"; empty when there is none
    int ahead = 0;
    int behind = 0;
    std::vector<File> files;

    /// Reads the output.
    static GitStatus Read(std::string_view printed);

    /// What the state of a changed file is called.
    static std::wstring Word(const File& file);
};
