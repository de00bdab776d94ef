// The one place that repeats the published numbers. Hosts, plug-ins and files on users' disks carry them, so that a
// name keeps its number and its type for good.

#include "OrvixDialogOption.h"
#include "OrvixFileFlags.h"
#include "OrvixNotificationID.h"
#include "OrvixOperation.h"
#include "OrvixPrompt.h"
#include "OrvixProviderOption.h"
#include "OrvixProviderResult.h"
#include "OrvixProviderSource.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdint>
#include <filesystem>
#include <fstream>
#include <regex>
#include <string>
#include <type_traits>
#include <vector>

namespace
{

/// A name whose number and type are right when this compiles. `Number` has the published type.
template <auto Published, auto Number>
const char* Pin(const char* name)
{
    static_assert(std::is_same_v<decltype(Published), decltype(Number)>, "the type of a published name has changed");
    static_assert(Published == Number, "the number of a published name has changed");
    return name;
}

#define PIN(NAME, ...) Pin<NAME, __VA_ARGS__>(#NAME)

const std::vector<std::string> PinnedNames = {
    PIN(OrvixProviderSource::Plugins, std::uint32_t{0x1}),
    PIN(OrvixProviderSource::InstalledMSSCCI, std::uint32_t{0x2}),

    PIN(OrvixOperation::Notify, std::uint32_t{0x1}),
    PIN(OrvixOperation::CheckIn, std::uint32_t{0x2}),
    PIN(OrvixOperation::Add, std::uint32_t{0x4}),
    PIN(OrvixOperation::GetLatest, std::uint32_t{0x8}),
    PIN(OrvixOperation::CheckOut, std::uint32_t{0x10}),
    PIN(OrvixOperation::UndoCheckOut, std::uint32_t{0x20}),
    PIN(OrvixOperationResult::Cancelled, std::int32_t{0}),
    PIN(OrvixOperationResult::Done, std::int32_t{1}),

    PIN(OrvixFileState::NotControlled, 0x1UL),
    PIN(OrvixFileState::Controlled, 0x2UL),
    PIN(OrvixFileState::CheckedOut, 0x4UL),
    PIN(OrvixFileState::CheckedOutByOther, 0x8UL),
    PIN(OrvixFileState::OutOfDate, 0x10UL),
    PIN(OrvixFileState::Deleted, 0x20UL),
    PIN(OrvixFileState::Modified, 0x80UL),
    PIN(OrvixFilePermission::CheckIn, 0x10000UL),
    PIN(OrvixFilePermission::CheckOut, 0x20000UL),
    PIN(OrvixFilePermission::UndoCheckOut, 0x40000UL),
    PIN(OrvixFilePermission::Compare, 0x80000UL),
    PIN(OrvixFilePermission::Add, 0x100000UL),
    PIN(OrvixFilePermission::GetLatest, 0x200000UL),
    PIN(OrvixFilePermission::ShowHistory, 0x400000UL),
    PIN(OrvixFileSelection::Selected, 0x1UL),
    PIN(OrvixFileSelection::Confirmed, 0x2UL),

    PIN(OrvixProviderOption::KeepCheckedOut, 0x1UL),
    PIN(OrvixProviderOption::GetLatest, 0x2UL),
    PIN(OrvixProviderOption::NoDialog, 0x4UL),
    PIN(OrvixProviderResult::Success, 0),
    PIN(OrvixProviderResult::Failure, -1),
    PIN(OrvixProviderResult::NotOffered, -2),
    PIN(OrvixProviderResult::ReloadFiles, 1),

    PIN(OrvixDialogOption::EntriesCanBeCleared, std::uint32_t{0x1}),
    PIN(OrvixDialogOption::OfferKeepCheckedOut, std::uint32_t{0x4}),
    PIN(OrvixDialogOption::OfferGetLatest, std::uint32_t{0x8}),
    PIN(OrvixDialogOption::OptionChecked, std::uint32_t{0x10}),
    PIN(OrvixDialogOption::OfferRemember, std::uint32_t{0x40}),
    PIN(OrvixDialogOption::RememberChecked, std::uint32_t{0x80}),
    PIN(OrvixDialogOption::OperationMask, std::uint32_t{0x3E00}),
    PIN(OrvixDialogResult::Cancelled, std::int32_t{0}),
    PIN(OrvixDialogResult::Confirmed, std::int32_t{1}),

    PIN(OrvixPromptOption::OnlyOK, std::uint32_t{0x1}),
    PIN(OrvixPromptOption::OfferYesToAll, std::uint32_t{0x2}),
    PIN(OrvixPromptOption::OfferNoToAll, std::uint32_t{0x4}),
    PIN(OrvixPromptOption::InformationIcon, std::uint32_t{0x10}),
    PIN(OrvixPromptOption::WarningIcon, std::uint32_t{0x20}),
    PIN(OrvixPromptOption::ErrorIcon, std::uint32_t{0x30}),
    PIN(OrvixPromptOption::IconMask, std::uint32_t{0x30}),
    PIN(OrvixPromptOption::OfferStopAsking, std::uint32_t{0x100}),
    PIN(OrvixPromptAnswer::No, std::int32_t{0}),
    PIN(OrvixPromptAnswer::Yes, std::int32_t{1}),
    PIN(OrvixPromptAnswer::YesToAll, std::int32_t{2}),
    PIN(OrvixPromptAnswer::NoToAll, std::int32_t{3}),
    PIN(OrvixPromptAction::Ask, std::uint32_t{0x1}),
    PIN(OrvixPromptAction::Yes, std::uint32_t{0x2}),
    PIN(OrvixPromptAction::No, std::uint32_t{0x4}),
    PIN(OrvixPromptAction::YesToAll, std::uint32_t{0x8}),
    PIN(OrvixPromptAction::NoToAll, std::uint32_t{0x10}),
    PIN(OrvixPromptAction::OptionChecked, std::uint32_t{0x8}),
    PIN(OrvixPromptAction::OptionCleared, std::uint32_t{0x10}),
    PIN(OrvixPromptID::None, std::uint32_t{0xFFFFFFFF}),
    PIN(OrvixPromptID::Unset, std::int32_t{-1}),
    PIN(OrvixPromptEditorResult::Unchanged, std::int32_t{0}),
    PIN(OrvixPromptEditorResult::Changed, std::int32_t{1}),

    PIN(OrvixNotificationID::BeforeCheckIn, std::uint32_t{13}),
    PIN(OrvixNotificationID::AfterCheckIn, std::uint32_t{14}),
    PIN(OrvixNotificationID::BeforeCheckOut, std::uint32_t{15}),
    PIN(OrvixNotificationID::AfterCheckOut, std::uint32_t{16}),
    PIN(OrvixNotificationID::BeforeUndoCheckOut, std::uint32_t{17}),
    PIN(OrvixNotificationID::AfterUndoCheckOut, std::uint32_t{18}),
    PIN(OrvixNotificationID::BeforeAdd, std::uint32_t{19}),
    PIN(OrvixNotificationID::AfterAdd, std::uint32_t{20}),
    PIN(OrvixNotificationID::BeforeGetLatest, std::uint32_t{21}),
    PIN(OrvixNotificationID::AfterGetLatest, std::uint32_t{22}),
    PIN(OrvixNotificationID::FilesConfirmed, std::uint32_t{27}),
    PIN(OrvixListenerAnswer::Accept, std::uint32_t{0}),
    PIN(OrvixListenerAnswer::Veto, std::uint32_t{1}),
    PIN(OrvixListenerAnswer::Stop, std::uint32_t{2}),
};

static_assert(OrvixDialogOption::ForOperation(OrvixOperation::CheckIn) == 0x200);
static_assert(OrvixDialogOption::ForOperation(OrvixOperation::Add) == 0x400);
static_assert(OrvixDialogOption::ForOperation(OrvixOperation::GetLatest) == 0x800);
static_assert(OrvixDialogOption::ForOperation(OrvixOperation::CheckOut) == 0x1000);
static_assert(OrvixDialogOption::ForOperation(OrvixOperation::UndoCheckOut) == 0x2000);

/// The constants of all published headers, as "Namespace::Name".
std::vector<std::string> NamesInHeaders()
{
    const std::regex opening(R"(^namespace (\w+)$)");
    const std::regex constant(R"(^inline constexpr .* (\w+) =)");
    std::vector<std::string> names;
    for (const auto& header : std::filesystem::directory_iterator(ORVIX_HEADERS))
    {
        std::ifstream stream(header.path());
        std::string scope;
        std::smatch found;
        for (std::string line; std::getline(stream, line);)
        {
            if (std::regex_search(line, found, opening))
            {
                scope = found[1];
            }
            else if (std::regex_search(line, found, constant))
            {
                names.push_back(scope + "::" + found[1].str());
            }
        }
    }
    return names;
}

} // namespace

TEST(PublishedNames, AreAllPinnedToTheirNumbers)
{
    EXPECT_THAT(NamesInHeaders(), testing::UnorderedElementsAreArray(PinnedNames));
}
