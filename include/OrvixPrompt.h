#pragma once

#include <cstdint>

/// What a prompt shows: bits of `options` in `IOrvixServices::ShowPrompt`, stored with the prompt as its action
/// options.
namespace OrvixPromptOption
{

inline constexpr std::uint32_t OnlyOK = 0x1;            ///< one button, OK
inline constexpr std::uint32_t OfferYesToAll = 0x2;     ///< a button Yes to all; not with `OnlyOK`
inline constexpr std::uint32_t OfferNoToAll = 0x4;      ///< a button No to all; not with `OnlyOK`
inline constexpr std::uint32_t InformationIcon = 0x10;  ///< one of the three values of `IconMask`
inline constexpr std::uint32_t WarningIcon = 0x20;      ///< one of the three values of `IconMask`
inline constexpr std::uint32_t ErrorIcon = 0x30;        ///< one of the three values of `IconMask`
inline constexpr std::uint32_t IconMask = 0x30;         ///< the two bits that choose the icon
inline constexpr std::uint32_t OfferStopAsking = 0x100; ///< a box Do not ask again

} // namespace OrvixPromptOption

/// What a prompt returns.
namespace OrvixPromptAnswer
{

inline constexpr std::int32_t No = 0;       ///< declined
inline constexpr std::int32_t Yes = 1;      ///< also OK
inline constexpr std::int32_t YesToAll = 2; ///< yes, also for what follows
inline constexpr std::int32_t NoToAll = 3;  ///< no, also for what follows

} // namespace OrvixPromptAnswer

/// A stored answer: bits of an action. Of several answers the first in the order yes, yes to all, no to all counts;
/// without any it is no.
namespace OrvixPromptAction
{

inline constexpr std::uint32_t Ask = 0x1;      ///< ask; the answer counts only where nobody can be asked
inline constexpr std::uint32_t Yes = 0x2;      ///< answers `OrvixPromptAnswer::Yes`
inline constexpr std::uint32_t No = 0x4;       ///< answers `OrvixPromptAnswer::No`
inline constexpr std::uint32_t YesToAll = 0x8; ///< answers `OrvixPromptAnswer::YesToAll`
inline constexpr std::uint32_t NoToAll = 0x10; ///< answers `OrvixPromptAnswer::NoToAll`

inline constexpr std::uint32_t OptionChecked = YesToAll; ///< in the prompt of a dialog's option: checked
inline constexpr std::uint32_t OptionCleared = NoToAll;  ///< in the prompt of a dialog's option: cleared

/// The answer (`OrvixPromptAnswer`) that an action stores.
constexpr std::int32_t ToAnswer(std::uint32_t action)
{
    if ((action & Yes) != 0)
    {
        return OrvixPromptAnswer::Yes;
    }
    if ((action & YesToAll) != 0)
    {
        return OrvixPromptAnswer::YesToAll;
    }
    return (action & NoToAll) != 0 ? OrvixPromptAnswer::NoToAll : OrvixPromptAnswer::No;
}

/// The action that stores an answer; `NoToAll` for a value that is no answer.
constexpr std::uint32_t FromAnswer(std::int32_t answer)
{
    switch (answer)
    {
    case OrvixPromptAnswer::Yes:
        return Yes;
    case OrvixPromptAnswer::No:
        return No;
    case OrvixPromptAnswer::YesToAll:
        return YesToAll;
    default:
        return NoToAll;
    }
}

} // namespace OrvixPromptAction

/// Prompt IDs belong to the host, except the one that means "no prompt".
namespace OrvixPromptID
{

inline constexpr std::uint32_t None = 0xFFFFFFFF; ///< for `IOrvixServices`
inline constexpr std::int32_t Unset = -1;         ///< the same in `OrvixFileListDialogParams`, which has signed IDs

} // namespace OrvixPromptID

/// What `IOrvixServices::EditPrompts` and `IOrvixCoreUI::EditPrompts` return.
namespace OrvixPromptEditorResult
{

inline constexpr std::int32_t Unchanged = 0; ///< the table is as it was
inline constexpr std::int32_t Changed = 1;   ///< the table has new answers, which are to be saved

} // namespace OrvixPromptEditorResult
