#pragma once

#include <cstdint>

/// A stored prompt action is a set of these bits.
namespace PromptAction
{

constexpr std::uint32_t Ask = 0x1;
constexpr std::uint32_t Answer1 = 0x2;
constexpr std::uint32_t Answer0 = 0x4;
constexpr std::uint32_t Answer2 = 0x8;
constexpr std::uint32_t Answer3 = 0x10;

/// Where a prompt ID means that there is no prompt.
constexpr std::uint32_t NoPrompt = 0xFFFFFFFF;

/// The answer that an action stands for: 1 before 2 before 3, else 0.
constexpr std::int32_t ToAnswer(std::uint32_t action)
{
    return action & Answer1 ? 1 : action & Answer2 ? 2 : action & Answer3 ? 3 : 0;
}

/// The action that stores an answer.
constexpr std::uint32_t FromAnswer(std::int32_t answer)
{
    return answer == 1 ? Answer1 : answer == 0 ? Answer0 : answer == 2 ? Answer2 : Answer3;
}

} // namespace PromptAction
