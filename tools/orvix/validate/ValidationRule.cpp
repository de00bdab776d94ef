#include "ValidationRule.h"

#include "ValidationRules.h"

#include <algorithm>
#include <iterator>

namespace
{

constexpr unsigned int Plugin = ValidationRule::Plugin;
constexpr unsigned int MSSCCI = ValidationRule::MSSCCI;

constexpr ValidationRule Rules[] = {
    {"loads", "a 64-bit process loads it, from a path that hosts can use", Plugin | MSSCCI, false,
     ProviderRules::Loads},
    {"exports", "the four functions are exported", Plugin, false, PluginRules::Exports},
    {"exports", "the functions that every host needs are exported", MSSCCI, false, SccRules::Exports},
    {"version", "GetOrvixVersion returns 200", Plugin, false, PluginRules::Version},
    {"version", "SccGetVersion returns 1.0 to 1.3", MSSCCI, false, SccRules::Version},
    {"name", "it has a name, the same on every call", Plugin, false, PluginRules::Name},
    {"objects", "every request returns a provider, and ReleaseIOrvixProvider accepts it", Plugin, false,
     PluginRules::Objects},
    {"capabilities", "the functions that the capability bits promise are exported", MSSCCI, false,
     SccRules::Capabilities},
    {"texts", "no text is written beyond the interface's limits", MSSCCI, false, SccRules::Texts},
    {"input-texts", "input texts and file names stay unchanged", MSSCCI, false, SccRules::InputTexts},
    {"codes", "every function returns a code of the interface", MSSCCI, false, SccRules::Codes},
    {"null-arguments", "null arguments and empty file lists are accepted where the interface allows them", MSSCCI,
     false, SccRules::NullArguments},
    {"info-bits", "SccQueryInfo writes one word of known bits for each file, and no more words", MSSCCI, false,
     SccRules::InfoBits},
    {"text-output", "printed text goes through the callback, as lines of a known kind", MSSCCI, false,
     SccRules::TextOutput},
    {"starts", "Initialize returns 0", Plugin | MSSCCI, false, ProviderRules::Starts},
    {"state", "IsInitialized and IsProjectOpen follow the operations", Plugin | MSSCCI, false, ProviderRules::State},
    {"reserved", "the reserved operations return what the interface lists", Plugin | MSSCCI, false,
     ProviderRules::Reserved},
    {"results", "every operation returns 0, -1 or -2", Plugin | MSSCCI, false, ProviderRules::Results},
    {"bad-input", "the same for invalid paths and unusual comments", Plugin | MSSCCI, false, ProviderRules::BadInput},
    {"empty-list", "a file operation returns -1 for an empty active list, or -2 when it is not offered",
     Plugin | MSSCCI, false, ProviderRules::EmptyList},
    {"status-bits", "QueryStatus sets documented bits of every active entry, and no others", Plugin | MSSCCI, false,
     StatusRules::Bits},
    {"status-failure", "a QueryStatus that fails changes no entry", Plugin | MSSCCI, false, StatusRules::Failure},
    {"status-closed", "without an open project QueryStatus reports every entry as not controlled (0x1)",
     Plugin | MSSCCI, false, StatusRules::Closed},
    {"list-untouched", "no operation changes more of a list than FlagsOut", Plugin | MSSCCI, false,
     ProviderRules::ListUntouched},
    {"stores", "what is added and checked in is controlled, and comes back byte by byte", Plugin | MSSCCI, false,
     WorkRules::Stores},
    {"checks-out", "a file that is checked out may be written, and undoing brings back the old one", Plugin | MSSCCI,
     false, WorkRules::ChecksOut},
    {"status-truth", "the states of a file agree with each other and with the disk", Plugin | MSSCCI, false,
     WorkRules::StatusTruth},
    {"failures", "an operation that fails changes no file", Plugin | MSSCCI, false, WorkRules::Failures},
    {"process", "no operation changes what belongs to the process, or prints from another thread", Plugin | MSSCCI,
     false, ProcessRules::State},
    {"memory", "repeated queries take no more memory", Plugin | MSSCCI, false, ProcessRules::Memory},
    {"sessions", "it can be started and ended many times", Plugin | MSSCCI, false, ProviderRules::Sessions},
    {"reload", "it can be loaded and unloaded many times", Plugin | MSSCCI, false, ProviderRules::Reload},
    {"handles", "sessions, and loading and unloading, leave no handles open", Plugin | MSSCCI, false,
     ProviderRules::Handles},
    {"dialogs", "ShowHistory returns 0, 1, -1 or -2; the other operations with windows return 0, -1 or -2",
     Plugin | MSSCCI, true, ProviderRules::Dialogs},
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
