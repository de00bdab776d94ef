#include "OrvixProviderResult.h"
#include "ProcessState.h"
#include "ValidationFiles.h"
#include "ValidationOperation.h"
#include "ValidationRules.h"

#include <windows.h>

#include <string>
#include <vector>

namespace
{

using OrvixProviderResult::Success;

/// Throws `RuleBroken` when something has changed since `state`.
void RequireUnchanged(const ProcessState& state, const std::string& operation)
{
    const std::vector<std::string> changes = state.FindChanges();
    Require(changes.empty(), operation + " changes " + (changes.empty() ? "" : changes.front()));
}

/// Bytes that this process has committed for itself. The system's own counters may leave out what was never written to.
std::size_t CommittedBytes()
{
    std::size_t bytes = 0;
    const char* place = nullptr;
    MEMORY_BASIC_INFORMATION region{};
    while (VirtualQuery(place, &region, sizeof region) != 0)
    {
        bytes += region.State == MEM_COMMIT && region.Type == MEM_PRIVATE ? region.RegionSize : 0;
        place = static_cast<const char*>(region.BaseAddress) + region.RegionSize;
    }
    return bytes;
}

} // namespace

void ProcessRules::State(ValidationSubject& subject)
{
    const ProcessState state;
    ValidationProvider provider(subject);
    const auto require = [&](const std::string& operation) {
        RequireUnchanged(state, operation);
        Require(!provider.HasPrintedFromOtherThread(), operation + " prints from another thread than that of the call");
    };
    RequireUnchanged(state, "loading");
    if (provider.Initialize() != Success)
    {
        throw RuleSkipped("Initialize fails");
    }
    require("Initialize");
    if (provider.OpenProject() != Success)
    {
        throw RuleSkipped("OpenProject fails for the scratch project");
    }
    require("OpenProject");
    const std::vector<std::wstring> paths = ValidationFiles::MakeGood(subject);
    for (const ValidationOperation& operation : ValidationOperation::Scenario(0))
    {
        ActiveFiles files(paths);
        operation.Run(subject, provider, files.List());
        require(operation.name);
    }
    provider.CloseProject();
    require("CloseProject");
    provider.Uninitialize();
    require("Uninitialize");
}

void ProcessRules::Memory(ValidationSubject& subject)
{
    constexpr int WarmUp = 3;
    constexpr int Queries = 10;
    constexpr std::size_t Allowed = 1 << 20; // bytes for each query

    ValidationProvider provider(subject);
    provider.Begin();
    const std::vector<std::wstring> paths = ValidationFiles::MakeGood(subject);
    const auto query = [&](int times) {
        for (int i = 0; i < times; ++i)
        {
            ActiveFiles files(paths);
            ValidationOperation::QueryStatus().Run(subject, provider, files.List());
        }
    };
    query(WarmUp);
    const std::size_t before = CommittedBytes();
    query(Queries);
    const std::size_t after = CommittedBytes();
    Require(after < before + Queries * Allowed, std::to_string(Queries) + " queries of the state take " +
                                                    std::to_string((after - before) >> 20) + " MiB that are not freed");
}
