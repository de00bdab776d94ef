#include "OrvixVersion.h"
#include "PluginCandidate.h"
#include "ValidationProvider.h"
#include "ValidationRules.h"

#include <cstdint>
#include <string>

namespace
{
constexpr int Requests = 3;
} // namespace

void PluginRules::Exports(ValidationSubject& subject)
{
    const ValidationLibrary library(subject);
    std::string missing;
    for (const char* name : PluginCandidate::Exports)
    {
        missing += library.Find<void()>(name) == nullptr ? std::string(" ") + name : "";
    }
    if (!missing.empty())
    {
        throw RuleBroken("it lacks" + missing);
    }
}

void PluginRules::Version(ValidationSubject& subject)
{
    const ValidationLibrary library(subject);
    const std::int32_t version = subject.Call("GetOrvixVersion", library.Need<std::int32_t()>("GetOrvixVersion"));
    if (version != ORVIX_PLUGIN_CONTRACT_VERSION)
    {
        throw RuleBroken("GetOrvixVersion gives " + std::to_string(version));
    }
}

void PluginRules::Name(ValidationSubject& subject)
{
    const ValidationLibrary library(subject);
    auto* const getName = library.Need<const wchar_t*()>("GetOrvixProviderName");
    std::wstring first;
    for (int request = 0; request < Requests; ++request)
    {
        const wchar_t* const name = subject.Call("GetOrvixProviderName", getName);
        if (name == nullptr || *name == L'\0')
        {
            throw RuleBroken("GetOrvixProviderName gives no name");
        }
        if (request != 0 && name != first)
        {
            throw RuleBroken("GetOrvixProviderName gives another name when it is asked again");
        }
        first = name;
    }
}

void PluginRules::Objects(ValidationSubject& subject)
{
    const ValidationLibrary library(subject);
    auto* const get = library.Need<IOrvixProvider*()>("GetIOrvixProvider");
    auto* const release = library.Need<void(IOrvixProvider*)>("ReleaseIOrvixProvider");
    IOrvixProvider* providers[Requests] = {};
    for (IOrvixProvider*& provider : providers)
    {
        provider = subject.Call("GetIOrvixProvider", get);
        if (provider == nullptr)
        {
            throw RuleBroken("GetIOrvixProvider gives null");
        }
        const wchar_t* const name = subject.Call("GetName", [provider] { return provider->GetName(); });
        if (name == nullptr)
        {
            throw RuleBroken("GetName gives null");
        }
    }
    for (IOrvixProvider* provider : providers)
    {
        subject.Call("ReleaseIOrvixProvider", [&] { release(provider); });
    }
}
