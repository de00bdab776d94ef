#include "RecordingProvider.h"

#include "OrvixProviderOption.h"

int RecordingProvider::QueryStatus(OrvixFileList* list, unsigned long options)
{
    return Record("QueryStatus", list, options);
}

int RecordingProvider::Add(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return Record("Add", list, options, comment);
}

int RecordingProvider::CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return Record("CheckIn", list, options, comment);
}

int RecordingProvider::GetLatest(OrvixFileList* list, unsigned long options)
{
    return Record("GetLatest", list, options);
}

int RecordingProvider::CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return Record("CheckOut", list, options, comment);
}

int RecordingProvider::UndoCheckOut(OrvixFileList* list, unsigned long options)
{
    return Record("UndoCheckOut", list, options);
}

int RecordingProvider::Record(const char* operation, OrvixFileList* list, unsigned long options, const wchar_t* comment)
{
    m_log.push_back(std::string(operation) + " " + ActiveNames(list) +
                    (comment != nullptr ? " " + Narrow(comment) : "") +
                    BitNames(options, {{OrvixProviderOption::KeepCheckedOut, "KeepCheckedOut"},
                                       {OrvixProviderOption::GetLatest, "GetLatest"},
                                       {OrvixProviderOption::NoDialog, "NoDialog"}}));
    if (onCall)
    {
        onCall(operation, *list);
    }
    return result;
}
