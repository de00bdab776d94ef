// A provider plug-in to start from: it has a name, a session and a project, and no file is under source control. What
// you do not override, OrvixProviderBase answers with "not offered".

#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixProviderBase.h"
#include "OrvixProviderResult.h"
#include "OrvixVersion.h"

#include <cstdint>
#include <utility>
#include <vector>

namespace
{

class MyProvider final : public OrvixProviderBase
{
public:
    const wchar_t* GetName() override { return L"My provider"; }

    bool IsInitialized() override { return m_initialized; }
    bool IsProjectOpen() override { return m_projectOpen; }

    int Initialize(OrvixClientInfo*) override
    {
        // Start your version-control system here.
        m_initialized = true;
        return OrvixProviderResult::Success;
    }

    int Uninitialize() override
    {
        m_projectOpen = false;
        return Result(std::exchange(m_initialized, false));
    }

    int OpenProject(const wchar_t*, const wchar_t*) override
    {
        // Find, or make, what belongs to the folder here.
        m_projectOpen = m_initialized;
        return Result(m_projectOpen);
    }

    int CloseProject() override { return Result(std::exchange(m_projectOpen, false)); }

    int QueryStatus(OrvixFileList* list, unsigned long) override
    {
        try
        {
            return Result(list != nullptr && WriteStates(*list));
        }
        catch (...) // no exception may leave an operation
        {
            return OrvixProviderResult::Failure;
        }
    }

    // Override next what your system can do: Add, CheckOut, CheckIn, UndoCheckOut, GetLatest, ...

private:
    static int Result(bool done) { return done ? OrvixProviderResult::Success : OrvixProviderResult::Failure; }

    /// False for an empty active list, as in every file operation.
    bool WriteStates(OrvixFileList& list) const
    {
        // First all states, then the first FlagsOut: where a state fails, no entry may change.
        std::vector<unsigned long> states(list.NumActiveEntries(), OrvixFileState::NotControlled);
        for (unsigned int i = 0; m_projectOpen && i < states.size(); ++i)
        {
            states[i] = StateOf(list.GetActiveFileEntry(i)->GetFile());
        }
        for (unsigned int i = 0; i < states.size(); ++i)
        {
            list.GetActiveFileEntry(i)->SetFlagsOut(states[i]);
        }
        return !states.empty();
    }

    /// Bits of OrvixFileState, and of OrvixFilePermission for what you override.
    static unsigned long StateOf(const wchar_t* /*path*/)
    {
        // Ask your version-control system here.
        return OrvixFileState::NotControlled;
    }

    bool m_initialized = false;
    bool m_projectOpen = false;
};

// One object serves every request: a host asks for it several times and expects the same session.
MyProvider theProvider;

} // namespace

extern "C" __declspec(dllexport) std::int32_t GetOrvixVersion()
{
    return ORVIX_PLUGIN_CONTRACT_VERSION;
}

extern "C" __declspec(dllexport) const wchar_t* GetOrvixProviderName()
{
    return theProvider.GetName();
}

extern "C" __declspec(dllexport) IOrvixProvider* GetIOrvixProvider()
{
    return &theProvider;
}

extern "C" __declspec(dllexport) void ReleaseIOrvixProvider(IOrvixProvider*)
{
}
