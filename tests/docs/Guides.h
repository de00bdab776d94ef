#pragma once

#include "Files.h"

#include <algorithm>
#include <ostream>
#include <sstream>
#include <string>
#include <vector>

/// The fenced examples of README.md, docs/ and samples/, as examples.py reads them.
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
    std::vector<std::filesystem::path> files = {L"README.md"};
    for (const wchar_t* folder : {L"docs", L"samples"})
    {
        for (const auto& entry : std::filesystem::recursive_directory_iterator(root / folder))
        {
            if (entry.path().extension() == L".md")
            {
                files.push_back(entry.path().lexically_relative(root));
            }
        }
    }
    std::sort(files.begin() + 1, files.end());
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
