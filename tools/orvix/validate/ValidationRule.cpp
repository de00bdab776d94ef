#include "ValidationRule.h"

#include "ValidationRules.h"

#include <algorithm>
#include <iterator>

namespace
{

constexpr unsigned int Plugin = ValidationRule::Plugin;
constexpr unsigned int MSSCCI = ValidationRule::MSSCCI;

constexpr ValidationRule Rules[] = {
    {"loads", "a 64-bit process loads it, under a path that a host can use", Plugin | MSSCCI, false,
     ProviderRules::Loads},
    {"exports", "the four functions are exported", Plugin, false, PluginRules::Exports},
    {"exports", "the functions that no host can do without are exported", MSSCCI, false, SccRules::Exports},
    {"version", "GetOrvixVersion gives 200", Plugin, false, PluginRules::Version},
    {"version", "SccGetVersion gives 1.0 to 1.3", MSSCCI, false, SccRules::Version},
    {"name", "it has a name, the same whenever it is asked", Plugin, false, PluginRules::Name},
    {"objects", "every request gets a provider, and ReleaseIOrvixProvider takes it", Plugin, false,
     PluginRules::Objects},
    {"capabilities", "what the capability bits promise is exported", MSSCCI, false, SccRules::Capabilities},
    {"texts", "no text is written beyond the interface's limits", MSSCCI, false, SccRules::Texts},
    {"input-texts", "texts and file names that are only read stay as they are", MSSCCI, false, SccRules::InputTexts},
    {"codes", "every function's result is a code of the interface", MSSCCI, false, SccRules::Codes},
    {"null-arguments", "what the interface lets be null or without files may be", MSSCCI, false,
     SccRules::NullArguments},
    {"info-bits", "SccQueryInfo fills every word with known bits, and no more words than files", MSSCCI, false,
     SccRules::InfoBits},
    {"text-output", "what is printed goes through the callback, as lines of a known kind", MSSCCI, false,
     SccRules::TextOutput},
    {"starts", "Initialize gives 0", Plugin | MSSCCI, false, ProviderRules::Starts},
    {"state", "IsInitialized and IsProjectOpen follow the operations", Plugin | MSSCCI, false, ProviderRules::State},
    {"reserved", "the reserved operations return what the interface lists", Plugin | MSSCCI, false,
     ProviderRules::Reserved},
    {"results", "every operation gives 0, -1 or -2", Plugin | MSSCCI, false, ProviderRules::Results},
    {"bad-input", "the same on paths and comments that nobody should give", Plugin | MSSCCI, false,
     ProviderRules::BadInput},
    {"empty-list", "a file operation fails with -1 on an empty active list", Plugin | MSSCCI, false,
     ProviderRules::EmptyList},
    {"status-bits", "QueryStatus sets documented bits of every active entry, and no others", Plugin | MSSCCI, false,
     ProviderRules::StatusBits},
    {"status-failure", "a QueryStatus that fails changes no entry", Plugin | MSSCCI, false,
     ProviderRules::StatusFailure},
    {"status-closed", "without an open project QueryStatus gives every entry 0x1", Plugin | MSSCCI, false,
     ProviderRules::StatusClosed},
    {"list-untouched", "of a list nothing is changed but FlagsOut", Plugin | MSSCCI, false,
     ProviderRules::ListUntouched},
    {"sessions", "it can be started and ended again and again", Plugin | MSSCCI, false, ProviderRules::Sessions},
    {"reload", "it can be loaded and unloaded again and again", Plugin | MSSCCI, false, ProviderRules::Reload},
    {"handles", "sessions, and loading and unloading, leave no handles open", Plugin | MSSCCI, false,
     ProviderRules::Handles},
    {"dialogs", "ShowHistory gives 0, 1, -1 or -2, and what else shows windows 0, -1 or -2", Plugin | MSSCCI, true,
     ProviderRules::Dialogs},
};

} // namespace

std::span<const ValidationRule> ValidationRule::All()
{
    return Rules;
}

const ValidationRule* ValidationRule::Find(const std::string& name, unsigned int kind)
{
    const auto* found = std::find_if(std::begin(Rules), std::end(Rules), [&](const ValidationRule& rule) {
        return rule.name == name && (rule.kinds & kind) != 0;
    });
    return found == std::end(Rules) ? nullptr : found;
}
