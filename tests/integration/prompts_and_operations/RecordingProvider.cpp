#include "RecordingProvider.h"

int RecordingProvider::QueryStatus(OrvixFileList* list, unsigned long options)
{
    return Record("QueryStatus", list, std::to_string(options));
}

int RecordingProvider::Add(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return Record("Add", list, Narrow(comment) + " " + std::to_string(options));
}

int RecordingProvider::CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return Record("CheckIn", list, Narrow(comment) + " " + std::to_string(options));
}

int RecordingProvider::GetLatest(OrvixFileList* list, unsigned long options)
{
    return Record("GetLatest", list, std::to_string(options));
}

int RecordingProvider::CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return Record("CheckOut", list, Narrow(comment) + " " + std::to_string(options));
}

int RecordingProvider::UndoCheckOut(OrvixFileList* list, unsigned long options)
{
    return Record("UndoCheckOut", list, std::to_string(options));
}

int RecordingProvider::Record(const char* operation, OrvixFileList* list, const std::string& arguments)
{
    m_log.push_back(std::string(operation) + " " + ActiveNames(list) + " " + arguments);
    if (onCall)
    {
        onCall(operation, *list);
    }
    return result;
}
