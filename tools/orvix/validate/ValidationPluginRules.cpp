#include "OrvixVersion.h"
#include "PluginCandidate.h"
#include "ValidationProvider.h"
#include "ValidationRules.h"

#include <cstdint>
#include <string>

namespace
{

constexpr int Requests = 3;

[[noreturn]] void Break(const char* function, const std::string& how)
{
    throw RuleBroken(function + (' ' + how));
}

} // namespace

void PluginRules::Exports(ValidationSubject& subject)
{
    const ValidationLibrary library(subject);
    std::string missing;
    for (const char* name : PluginCandidate::Exports)
    {
        missing += library.Has(name) ? "" : std::string(" ") + name;
    }
    if (!missing.empty())
    {
        throw RuleBroken("it does not export" + missing);
    }
}

void PluginRules::Version(ValidationSubject& subject)
{
    const ValidationLibrary library(subject);
    const std::int32_t version =
        subject.Call(PluginCandidate::GetVersion, library.Need<std::int32_t()>(PluginCandidate::GetVersion));
    if (version != ORVIX_PLUGIN_CONTRACT_VERSION)
    {
        Break(PluginCandidate::GetVersion,
              "returns " + std::to_string(version) + ", not " + std::to_string(ORVIX_PLUGIN_CONTRACT_VERSION));
    }
}

void PluginRules::Name(ValidationSubject& subject)
{
    const ValidationLibrary library(subject);
    auto* const getName = library.Need<const wchar_t*()>(PluginCandidate::GetName);
    std::wstring first;
    for (int request = 0; request < Requests; ++request)
    {
        const wchar_t* const name = subject.Call(PluginCandidate::GetName, getName);
        if (name == nullptr || *name == L'\0')
        {
            Break(PluginCandidate::GetName, "returns no name");
        }
        if (request != 0 && name != first)
        {
            Break(PluginCandidate::GetName, "returns another name on a later call");
        }
        first = name;
    }
}

void PluginRules::Objects(ValidationSubject& subject)
{
    const ValidationLibrary library(subject);
    auto* const get = library.Need<IOrvixProvider*()>(PluginCandidate::GetProvider);
    auto* const release = library.Need<void(IOrvixProvider*)>(PluginCandidate::ReleaseProvider);
    IOrvixProvider* providers[Requests] = {};
    for (IOrvixProvider*& provider : providers)
    {
        provider = subject.Call(PluginCandidate::GetProvider, get);
        if (provider == nullptr)
        {
            Break(PluginCandidate::GetProvider, "returns null");
        }
        const wchar_t* const name = subject.Call("GetName", [provider] { return provider->GetName(); });
        if (name == nullptr)
        {
            Break("GetName", "returns null");
        }
    }
    for (IOrvixProvider* provider : providers)
    {
        subject.Call(PluginCandidate::ReleaseProvider, [&] { release(provider); });
    }
}
