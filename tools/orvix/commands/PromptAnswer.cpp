#include "PromptAnswer.h"

#include "OrvixPrompt.h"

#include <algorithm>
#include <iterator>

namespace
{

constexpr struct
{
    std::uint32_t action;
    const wchar_t* words;
} Answers[] = {
    {OrvixPromptAction::Ask, L"ask"},
    {OrvixPromptAction::Yes, L"yes"},
    {OrvixPromptAction::No, L"no"},
    {OrvixPromptAction::YesToAll, L"yes-to-all"},
    {OrvixPromptAction::NoToAll, L"no-to-all"},
};

/// The one bit of a stored action that counts.
std::uint32_t DecidingBit(std::uint32_t action)
{
    return (action & OrvixPromptAction::Ask) != 0 ? OrvixPromptAction::Ask
                                                  : OrvixPromptAction::FromAnswer(OrvixPromptAction::ToAnswer(action));
}

} // namespace

std::wstring PromptAnswer::InWords(std::uint32_t action)
{
    return std::find_if(std::begin(Answers), std::end(Answers),
                        [bit = DecidingBit(action)](const auto& answer) { return answer.action == bit; })
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
    switch (DecidingBit(action))
    {
    case OrvixPromptAction::No:
        return (options & OrvixPromptOption::OnlyOK) == 0;
    case OrvixPromptAction::YesToAll:
        return (options & (OrvixPromptOption::OnlyOK | OrvixPromptOption::OfferYesToAll)) ==
               OrvixPromptOption::OfferYesToAll;
    case OrvixPromptAction::NoToAll:
        return (options & (OrvixPromptOption::OnlyOK | OrvixPromptOption::OfferNoToAll)) ==
               OrvixPromptOption::OfferNoToAll;
    default:
        return true;
    }
}

std::wstring PromptAnswer::OptionsInWords(std::uint32_t options)
{
    std::wstring words;
    for (const auto& answer : Answers)
    {
        if (answer.action != OrvixPromptAction::Ask && IsOffered(options, answer.action))
        {
            words += (words.empty() ? L"" : L", ") + std::wstring(answer.words);
        }
    }
    return words + ((options & OrvixPromptOption::OfferStopAsking) != 0 ? L", can stop asking" : L"");
}
