#include "ProviderList.h"

#include "CommandOutput.h"
#include "HostSession.h"

ExitCode ListProviders(const CommandLine& commandLine)
{
    return WithOutput(commandLine, [&](CommandOutput& output) {
        HostSession host(commandLine, output.Results());
        host.FindProvider(L""); // throws when there is none
        Listing listing{
            .key = "providers", .columns = {{"index", "Index"}, {"name", "Provider"}}, .rows = {}, .summary = {}};
        for (std::uint32_t index = 0; index < host.Services().GetProviderCount(); ++index)
        {
            const wchar_t* name = host.Services().GetProviderName(index);
            listing.rows.push_back({{std::int64_t{index}}, {std::wstring(name)}});
        }
        output.Results().Show(listing);
        return ExitCode::Success;
    });
}
