#pragma once

#include <cstdint>
#include <optional>
#include <string>

/// The words of `orvix prompts` for the bits that a prompt table stores.
namespace PromptAnswer
{

/// The word for a stored action (bits of `OrvixPromptAction`): "ask", "yes", "no", "yes-to-all" or "no-to-all".
std::wstring InWords(std::uint32_t action);

/// The action that stores the answer of this word; empty when there is no such word.
std::optional<std::uint32_t> Action(const std::wstring& words);

/// Whether a prompt with these options (bits of `OrvixPromptOption`) offers the answer of an action. Asking is always
/// offered.
bool IsOffered(std::uint32_t options, std::uint32_t action);

/// The words for the answers that the options offer.
std::wstring OptionsInWords(std::uint32_t options);

} // namespace PromptAnswer
