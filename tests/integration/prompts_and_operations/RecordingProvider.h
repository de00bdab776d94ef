#pragma once

#include "FakeProvider.h"
#include "Log.h"

#include <functional>

/// A provider that logs every call with the names of its options: "Add [a b] comment NoDialog".
class RecordingProvider final : public FakeProvider
{
public:
    explicit RecordingProvider(Lines& log) : FakeProvider(L"Recording"), m_log(log) {}

    /// Runs after a call is logged, with the operation's name; may throw.
    std::function<void(const std::string& operation, OrvixFileList& list)> onCall;

    /// What every operation returns.
    int result = OrvixProviderResult::Success;

    int QueryStatus(OrvixFileList* list, unsigned long options) override;
    int Add(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int GetLatest(OrvixFileList* list, unsigned long options) override;
    int CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int UndoCheckOut(OrvixFileList* list, unsigned long options) override;

private:
    int Record(const char* operation, OrvixFileList* list, unsigned long options, const wchar_t* comment = nullptr);

    Lines& m_log;
};
