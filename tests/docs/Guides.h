#pragma once

#include "Files.h"

#include <algorithm>
#include <ostream>
#include <sstream>
#include <string>
#include <vector>

/// The fenced examples of every Markdown file of the tree outside build/, as examples.py reads them.
namespace Guides
{

struct Fence
{
    std::string guide; ///< path below the tree
    int line;          ///< of the text
    std::string language;
    std::string text; ///< whole lines, with LF

    std::string Place() const { return guide + ":" + std::to_string(line); }
};

inline void PrintTo(const Fence& fence, std::ostream* stream)
{
    *stream << fence.Place() << ":\n" << fence.text;
}

/// Paths below the tree.
inline std::vector<std::filesystem::path> Files()
{
    const std::filesystem::path root = ORVIX_ROOT;
    std::vector<std::filesystem::path> files;
    for (std::filesystem::recursive_directory_iterator entry(root), end; entry != end; ++entry)
    {
        const std::filesystem::path file = entry->path().lexically_relative(root);
        if (file == L"build" || file == L".git")
        {
            entry.disable_recursion_pending();
        }
        else if (file.extension() == L".md")
        {
            files.push_back(file);
        }
    }
    std::sort(files.begin(), files.end());
    return files;
}

inline std::vector<Fence> Fences()
{
    constexpr std::string_view mark = "```";
    std::vector<Fence> fences;
    for (const std::filesystem::path& file : Files())
    {
        std::istringstream lines(ReadBytes(ORVIX_ROOT / file));
        bool inside = false;
        int number = 0;
        for (std::string line; std::getline(lines, line);)
        {
            ++number;
            if (line.ends_with('\r'))
            {
                line.pop_back();
            }
            if (line.starts_with(mark))
            {
                inside = !inside;
                if (inside)
                {
                    fences.push_back({file.generic_string(), number + 1, line.substr(mark.size()), {}});
                }
            }
            else if (inside)
            {
                fences.back().text += line + '\n';
            }
        }
    }
    return fences;
}

} // namespace Guides
