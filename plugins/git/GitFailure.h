#pragma once

#include <string>
#include <utility>
#include <vector>

/// Thrown by what the provider does when it fails. The lines are for the user; mostly they are Git's own words.
struct GitFailure
{
    explicit GitFailure(std::vector<std::wstring> text) : lines(std::move(text)) {}
    explicit GitFailure(std::wstring line) { lines.push_back(std::move(line)); }

    std::vector<std::wstring> lines;
};
