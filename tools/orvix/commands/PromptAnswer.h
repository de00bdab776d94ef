#pragma once

#include <cstdint>
#include <optional>
#include <string>

/// The words of `orvix prompts` for what a prompt table stores in bits.
namespace PromptAnswer
{

/// What a stored action stands for: "ask", "yes", "no", "yes-to-all" or "no-to-all".
std::wstring InWords(std::uint32_t action);

/// The action that stores an answer given in these words; nothing when they name none.
std::optional<std::uint32_t> Action(const std::wstring& words);

/// Whether the options that go with a prompt (bits of `IOrvixServices::ShowPrompt`) offer what an action stands for, as
/// docs/ui-contract.md says. Asking always is offered.
bool IsOffered(std::uint32_t options, std::uint32_t action);

/// What the options offer.
std::wstring OptionsInWords(std::uint32_t options);

} // namespace PromptAnswer
