#pragma once

#include "OrvixFileIO.h"

#include <string>
#include <vector>

class OrvixProviderConfig;

/// What the readers of the XML files find and pass over in silence. The library reads without one; a program that
/// explains a file to people reads with one.
struct ReadingLog
{
    enum class Why
    {
        NoName,       ///< a provider or a filter without one
        NameNotFirst, ///< a filter
        UnknownElement,
        NoText,       ///< an element whose text cannot be read
        UnknownValue, ///< a text that counts as the other choice
        LacksElement, ///< a prompt
        TextCut       ///< of a prompt
    };

    struct Remark
    {
        Why why;
        unsigned int item;     ///< number of the element below the root (a provider, a prompt), from 1
        unsigned int filter;   ///< number of the filter in it, from 1; 0 outside of filters
        std::wstring element;  ///< name of the element that is meant, or that lacks
        std::wstring text;     ///< of an unknown value, ...
        std::wstring countsAs; ///< ... and the known one that it counts as
    };

    /// A provider element that is in use.
    struct Provider
    {
        const OrvixProviderConfig* config; ///< lives until the process ends
        unsigned int item;
        std::wstring name; ///< as written
    };

    OrvixFileIO::Content content = OrvixFileIO::Content::Missing;
    bool hasRoot = false; ///< where the library looks for it
    std::wstring root;    ///< name of the root element, also when it is another than the wanted one
    std::vector<Remark> remarks;
    std::vector<Provider> providers;
};

/// A reader's access to a log that may be null, and where the reader is. Does nothing without a log.
class ReadingPlace
{
public:
    explicit ReadingPlace(ReadingLog* log) : m_log(log) {}

    void EnterItem()
    {
        ++m_item;
        m_filter = m_numFilters = 0;
    }
    void EnterFilter() { m_filter = ++m_numFilters; }
    void LeaveFilter() { m_filter = 0; }

    void Remark(ReadingLog::Why why, const wchar_t* element = L"", const wchar_t* text = L"",
                const wchar_t* countsAs = L"") const
    {
        if (m_log != nullptr)
        {
            m_log->remarks.push_back({why, m_item, m_filter, element, text, countsAs});
        }
    }

    void Use(const OrvixProviderConfig* config, const std::wstring& name) const
    {
        if (m_log != nullptr)
        {
            m_log->providers.push_back({config, m_item, name});
        }
    }

private:
    ReadingLog* m_log;
    unsigned int m_item = 0;
    unsigned int m_filter = 0;
    unsigned int m_numFilters = 0;
};
