#pragma once

#include "IOrvixClientAccess.h"

#include <functional>
#include <string>
#include <utility>
#include <vector>

/// The host's side, which notes the text output that it gets.
class OutputHost final : public IOrvixClientAccess
{
public:
    using Line = std::pair<std::wstring, int>;

    std::vector<Line> lines;

    /// Runs at every output; may throw.
    std::function<void()> onOutput;

    void OutputText(const wchar_t* text, int kind) override
    {
        lines.emplace_back(text != nullptr ? text : L"(null)", kind);
        if (onOutput)
        {
            onOutput();
        }
    }
    std::intptr_t RelayA(void*, void*, void*, void*) override { return 0; }
    std::uint32_t GetColor(std::int32_t) override { return 0; }
    bool IsUnattended() override { return false; }
    std::intptr_t RelayB(void*, void*, void*, void*) override { return 0; }
};
