#include "PromptAnswer.h"

#include "PromptAction.h"

#include <algorithm>
#include <iterator>

namespace
{

// Bits of a prompt's options.
constexpr std::uint32_t OnlyConfirms = 0x1;
constexpr std::uint32_t OffersYesToAll = 0x2;
constexpr std::uint32_t OffersNoToAll = 0x4;
constexpr std::uint32_t OffersToStopAsking = 0x100;

constexpr struct
{
    std::uint32_t action;
    const wchar_t* words;
} Answers[] = {
    {PromptAction::Ask, L"ask"},           {PromptAction::Answer1, L"yes"},
    {PromptAction::Answer0, L"no"},        {PromptAction::Answer2, L"yes-to-all"},
    {PromptAction::Answer3, L"no-to-all"},
};

/// The one bit that counts in a stored action.
std::uint32_t Meaning(std::uint32_t action)
{
    return (action & PromptAction::Ask) != 0 ? PromptAction::Ask
                                             : PromptAction::FromAnswer(PromptAction::ToAnswer(action));
}

} // namespace

std::wstring PromptAnswer::InWords(std::uint32_t action)
{
    return std::find_if(std::begin(Answers), std::end(Answers),
                        [meaning = Meaning(action)](const auto& answer) { return answer.action == meaning; })
        ->words;
}

std::optional<std::uint32_t> PromptAnswer::Action(const std::wstring& words)
{
    const auto* found =
        std::find_if(std::begin(Answers), std::end(Answers), [&](const auto& answer) { return words == answer.words; });
    return found == std::end(Answers) ? std::nullopt : std::optional(found->action);
}

bool PromptAnswer::IsOffered(std::uint32_t options, std::uint32_t action)
{
    switch (Meaning(action))
    {
    case PromptAction::Answer0:
        return (options & OnlyConfirms) == 0;
    case PromptAction::Answer2:
        return (options & (OnlyConfirms | OffersYesToAll)) == OffersYesToAll;
    case PromptAction::Answer3:
        return (options & (OnlyConfirms | OffersNoToAll)) == OffersNoToAll;
    default:
        return true;
    }
}

std::wstring PromptAnswer::OptionsInWords(std::uint32_t options)
{
    std::wstring words;
    for (const auto& answer : Answers)
    {
        if (answer.action != PromptAction::Ask && IsOffered(options, answer.action))
        {
            words += (words.empty() ? L"" : L", ") + std::wstring(answer.words);
        }
    }
    return words + ((options & OffersToStopAsking) != 0 ? L", can stop asking" : L"");
}
