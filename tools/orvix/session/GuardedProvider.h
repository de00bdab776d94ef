#pragma once

#include "GuardedCall.h"
#include "IOrvixProvider.h"
#include "OrvixFileEntry.h"
#include "OrvixKnownFiles.h"
#include "Text.h"

#include <string>

/// A provider as the tool lets it work. Each call is announced to the parent process before it is made, and afterwards
/// the state of the process is restored.
class GuardedProvider final : public IOrvixProvider
{
public:
    /// `provider` must outlive this object. `name`: of the provider, for messages.
    GuardedProvider(IOrvixProvider& provider, const std::wstring& name) : m_provider(provider), m_name(Utf8(name)) {}

    /// From now on `QueryStatus` takes a permission from the files that are on the disk in one of these states: bits of
    /// `OrvixFilePermission` and `OrvixFileState`.
    void Withhold(unsigned long permission, unsigned long states)
    {
        m_withheld = permission;
        m_withheldFrom = states;
    }

    /// Whether the last operation asked the provider to keep the files checked out.
    bool KeepsCheckedOut() const { return m_keepsCheckedOut; }

    /// Whether the last `QueryStatus` succeeded.
    bool KnowsStatus() const { return m_knowsStatus; }

    /// Calls the plug-in's optional export, see `OrvixKnownFilesFunction`. `NotOffered` without the export.
    int NameKnownFiles(const wchar_t* folder, OrvixKnownFileCallback callback, void* callerData);

    const wchar_t* GetName() override;
    int ReservedA() override;
    bool IsInitialized() override;
    bool IsProjectOpen() override;
    int Initialize(OrvixClientInfo* info) override;
    int Uninitialize() override;
    int OpenProject(const wchar_t* localPath, const wchar_t* comment) override;
    int CloseProject() override;
    int ReservedB() override;
    int ReservedC() override;
    int CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;

    /// As the provider, except that a file that is missing on the disk and not checked out is got: it has no check-out
    /// to undo.
    int UndoCheckOut(OrvixFileList* list, unsigned long options) override;
    int GetLatest(OrvixFileList* list, unsigned long options) override;
    int ReservedD(void* argument, unsigned long* first, unsigned long* second) override;
    int ReservedE() override;
    int Add(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int ShowHistory(OrvixFileList* list) override;
    int ShowProperties(OrvixFileList* list) override;

    /// As the provider answers, except that a status word of -1, in which a library says that it does not know the
    /// state, becomes no state at all instead of every state, and that a file of the project that is missing on the
    /// disk can be brought back.
    int QueryStatus(OrvixFileList* list, unsigned long options) override;
    int ReservedF() override;
    int ReservedG() override;
    int ShowOptions() override;
    int RunProviderClient() override;
    int ReservedH() override;
    bool ReservedI() override;

private:
    unsigned long CorrectedFlags(OrvixFileEntry& entry) const;

    template <typename Call>
    auto Guarded(const char* operation, Call call)
    {
        return GuardedCall(operation + (" of " + m_name), call);
    }

    IOrvixProvider& m_provider;
    std::string m_name;
    unsigned long m_withheld = 0;
    unsigned long m_withheldFrom = 0;
    bool m_knowsStatus = false;
    bool m_keepsCheckedOut = false;
};
