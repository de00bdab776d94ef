#pragma once

#include "IOrvixClientAccess.h"

#include <functional>
#include <string>
#include <vector>

/// The host's side: writes down what it is asked and answers as it is told.
class RecordingHost final : public IOrvixClientAccess
{
public:
    struct Relay
    {
        std::string operation;
        std::vector<void*> arguments;

        bool operator==(const Relay&) const = default;
    };

    std::vector<Relay> relays;
    std::vector<std::int32_t> colors;
    std::intptr_t relayResult = 0;
    std::uint32_t color = 0;
    bool unattended = false;

    /// Runs at every question whether somebody can answer; may throw.
    std::function<void()> onUnattended;

    void OutputText(const wchar_t*, int) override {}
    std::intptr_t RelayA(void* a, void* b, void* c, void* d) override
    {
        relays.push_back({"A", {a, b, c, d}});
        return relayResult;
    }
    std::uint32_t GetColor(std::int32_t index) override
    {
        colors.push_back(index);
        return color;
    }
    bool IsUnattended() override
    {
        if (onUnattended)
        {
            onUnattended();
        }
        return unattended;
    }
    std::intptr_t RelayB(void* a, void* b, void* c, void* d) override
    {
        relays.push_back({"B", {a, b, c, d}});
        return relayResult;
    }
};
