#pragma once

#include "OrvixFileIO.h"

#include <string>
#include <vector>

class OrvixProviderConfig;

/// What a reader of an XML file found: what it ignores in silence, and where. The library reads without it; a program
/// that explains a file to people reads with it.
struct FileDiagnostics
{
    enum class Kind
    {
        NoName,         ///< a provider or a filter without a name
        NameNotFirst,   ///< a filter whose first element is not its name
        UnknownElement, ///< an element that nobody reads
        NoText,         ///< an element whose text cannot be read
        UnknownValue,   ///< a text that counts as the other of two choices
        MissingElement, ///< a prompt without one of its elements
        TextCut         ///< a prompt whose text is too long
    };

    struct Diagnostic
    {
        Kind kind;
        unsigned int item;     ///< number of the element below the root (a provider, a prompt), from 1
        unsigned int filter;   ///< number of the filter in it, from 1; 0 outside of filters
        std::wstring element;  ///< name of the element, or of the missing element
        std::wstring text;     ///< the unknown value
        std::wstring countsAs; ///< the known value that the unknown one counts as
    };

    /// A provider element that is in use.
    struct Provider
    {
        const OrvixProviderConfig* config; ///< lives until the process ends
        unsigned int item;                 ///< as in `Diagnostic`
        std::wstring name;                 ///< as written
    };

    OrvixFileIO::Content content = OrvixFileIO::Content::Missing;
    bool hasRoot = false; ///< the root element is where the library looks for it
    std::wstring root;    ///< name of the root element, whatever it is
    std::vector<Diagnostic> diagnostics;
    std::vector<Provider> providers;
};

/// Knows where a reader is, and adds what it finds there to the diagnostics. Does nothing when they are null.
class DiagnosticReporter
{
public:
    explicit DiagnosticReporter(FileDiagnostics* diagnostics) : m_diagnostics(diagnostics) {}

    void EnterItem()
    {
        ++m_item;
        m_filter = m_numFilters = 0;
    }
    void EnterFilter() { m_filter = ++m_numFilters; }
    void LeaveFilter() { m_filter = 0; }

    void Report(FileDiagnostics::Kind kind, const wchar_t* element = L"", const wchar_t* text = L"",
                const wchar_t* countsAs = L"") const
    {
        if (m_diagnostics != nullptr)
        {
            m_diagnostics->diagnostics.push_back({kind, m_item, m_filter, element, text, countsAs});
        }
    }

    void AddProvider(const OrvixProviderConfig* config, const std::wstring& name) const
    {
        if (m_diagnostics != nullptr)
        {
            m_diagnostics->providers.push_back({config, m_item, name});
        }
    }

private:
    FileDiagnostics* m_diagnostics;
    unsigned int m_item = 0;
    unsigned int m_filter = 0;
    unsigned int m_numFilters = 0;
};
