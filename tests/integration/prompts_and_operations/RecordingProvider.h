#pragma once

#include "FakeProvider.h"
#include "Log.h"

#include <functional>

/// A provider that writes down every call: "Add [a b] comment 4".
class RecordingProvider final : public FakeProvider
{
public:
    explicit RecordingProvider(Lines& log) : FakeProvider(L"Recording"), m_log(log) {}

    /// What a call does besides, given the operation's name; may throw.
    std::function<void(const std::string& operation, OrvixFileList& list)> onCall;

    /// What every operation returns.
    int result = 0;

    int QueryStatus(OrvixFileList* list, unsigned long options) override;
    int Add(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int GetLatest(OrvixFileList* list, unsigned long options) override;
    int CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options) override;
    int UndoCheckOut(OrvixFileList* list, unsigned long options) override;

private:
    int Record(const char* operation, OrvixFileList* list, const std::string& arguments);

    Lines& m_log;
};
