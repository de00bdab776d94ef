#include "OrvixProviderConfigManager.h"

#include "ExceptionBarrier.h"
#include "FileDiagnostics.h"
#include "OrvixFileIO.h"
#include "OrvixProviderConfig.h"
#include "ProviderFilters.h"
#include "UpperCase.h"

#include <algorithm>
#include <cwchar>
#include <iterator>
#include <memory>
#include <optional>

namespace
{

using Kind = FileDiagnostics::Kind;

/// What one reading of the file has made so far. It frees itself unless the reading succeeds.
struct Reading
{
    std::vector<std::unique_ptr<OrvixProviderConfig>> configs;
    std::vector<std::unique_ptr<ProviderFilters>> filters;
    DiagnosticReporter reporter;
};

bool IsNamed(const std::wstring& name, const wchar_t* wanted)
{
    return _wcsicmp(name.c_str(), wanted) == 0;
}

/// Calls `visit(name, child)` for every child element until it returns false.
template <typename Visit>
void ForEachElement(OrvixFileIO& file, IXMLDOMNode* parent, Visit&& visit)
{
    OrvixFileIO::Node child;
    std::wstring name;
    for (bool more = file.GetFirstChild(parent, child); more; more = file.GetNextSibling(child))
    {
        if (file.GetNodeName(child.Get(), name) && !visit(name, child.Get()))
        {
            return;
        }
    }
}

/// Calls `visit(name, text, child)` for every child element whose name and text can be read, until it
/// returns false.
template <typename Visit>
void ForEachReadableElement(OrvixFileIO& file, IXMLDOMNode* parent, const DiagnosticReporter& reporter, Visit&& visit)
{
    std::wstring text;
    ForEachElement(file, parent, [&](const std::wstring& name, IXMLDOMNode* child) {
        if (file.GetNodeText(child, text))
        {
            return visit(name, text, child);
        }
        reporter.Report(Kind::NoText, name.c_str());
        return true;
    });
}

/// Whether a text is the first of two choices; any text but the first is the second.
bool IsFirstChoice(const std::wstring& element, const std::wstring& text, const wchar_t* first, const wchar_t* second,
                   const DiagnosticReporter& reporter)
{
    if (IsNamed(text, first))
    {
        return true;
    }
    if (!IsNamed(text, second))
    {
        reporter.Report(Kind::UnknownValue, element.c_str(), text.c_str(), second);
    }
    return false;
}

/// Reads one filter. It is appended to the configuration once for its name and once more for every element after the
/// name; the repetitions give the same verdict. A filter whose first element is not its name is dropped.
void ReadFilter(OrvixFileIO& file, IXMLDOMNode* node, OrvixProviderConfig& config, Reading& reading)
{
    auto owned = std::make_unique<ProviderFilters>();
    ProviderFilters* filter = owned.get();
    Kind dropped = Kind::NoName;
    ForEachReadableElement(
        file, node, reading.reporter, [&](const std::wstring& name, const std::wstring& text, IXMLDOMNode*) {
            if (IsNamed(name, L"Name"))
            {
                filter->m_name = text;
                if (owned)
                {
                    reading.filters.push_back(std::move(owned));
                }
            }
            else if (owned)
            {
                dropped = Kind::NameNotFirst;
                return false;
            }
            else if (IsNamed(name, L"Type"))
            {
                filter->m_exclude = IsFirstChoice(name, text, L"exclude", L"include", reading.reporter);
            }
            else if (IsNamed(name, L"Folder"))
            {
                filter->m_folders.push_back(UpperCase(text));
            }
            else if (IsNamed(name, L"FileType"))
            {
                filter->m_fileTypes.push_back(UpperCase(text));
            }
            else
            {
                reading.reporter.Report(Kind::UnknownElement, name.c_str());
            }
            config.m_filters.push_back(filter);
            return true;
        });
    if (owned)
    {
        reading.reporter.Report(dropped);
    }
}

/// Reads one provider; it is kept when it has a name.
void ReadProvider(OrvixFileIO& file, IXMLDOMNode* node, Reading& reading)
{
    auto config = std::make_unique<OrvixProviderConfig>();
    const std::size_t filtersBefore = reading.filters.size();
    std::optional<std::wstring> writtenName;
    ForEachReadableElement(file, node, reading.reporter,
                           [&](const std::wstring& name, const std::wstring& text, IXMLDOMNode* child) {
                               if (IsNamed(name, L"Name"))
                               {
                                   config->m_name = UpperCase(text);
                                   writtenName = text;
                               }
                               else if (IsNamed(name, L"Enabled"))
                               {
                                   config->m_enabled = !IsFirstChoice(name, text, L"false", L"true", reading.reporter);
                               }
                               else if (IsNamed(name, L"FixedProjectRoot"))
                               {
                                   config->m_fixedProjectRoot = text;
                               }
                               else if (IsNamed(name, L"AltProviderExecutable"))
                               {
                                   config->m_altProviderExecutable = text;
                               }
                               else if (IsNamed(name, L"MSSCCProjectFile"))
                               {
                                   config->m_msSccProjectFile = text;
                               }
                               else if (IsNamed(name, L"MSSCCDllSearchPath"))
                               {
                                   config->m_msSccDllSearchPath = text;
                               }
                               else if (IsNamed(name, L"MSSCCDllFullPath"))
                               {
                                   config->m_msSccDllFullPath = text;
                               }
                               else if (IsNamed(name, L"Filters"))
                               {
                                   ForEachElement(file, child, [&](const std::wstring&, IXMLDOMNode* filter) {
                                       reading.reporter.EnterFilter();
                                       ReadFilter(file, filter, *config, reading);
                                       return true;
                                   });
                                   reading.reporter.LeaveFilter();
                               }
                               else
                               {
                                   reading.reporter.Report(Kind::UnknownElement, name.c_str());
                               }
                               return true;
                           });
    if (writtenName)
    {
        reading.reporter.AddProvider(config.get(), *writtenName);
        reading.configs.push_back(std::move(config));
    }
    else
    {
        reading.reporter.Report(Kind::NoName);
        reading.filters.resize(filtersBefore);
    }
}

/// Whether the configuration applies to a provider of this name, which is in upper case.
bool Applies(const OrvixProviderConfig& config, const std::wstring& providerName)
{
    return providerName.find(config.m_name) != std::wstring::npos;
}

} // namespace

OrvixProviderConfigManager::OrvixProviderConfigManager() = default;
OrvixProviderConfigManager::~OrvixProviderConfigManager() = default;

bool OrvixProviderConfigManager::LoadConfig(const wchar_t* path, FileDiagnostics* diagnostics)
{
    if (path == nullptr)
    {
        return false;
    }
    return WithXmlBarrier(false, [&] {
        OrvixFileIO file;
        if (!file.OpenDocument(path))
        {
            return false;
        }
        const OpenedDocument opened(file);
        OrvixFileIO::Node root;
        std::wstring rootName;
        const bool hasRoot = file.GetRootElement(root, rootName) && IsNamed(rootName, RootName);
        if (diagnostics != nullptr)
        {
            diagnostics->content = file.GetContent();
            diagnostics->hasRoot = hasRoot;
            diagnostics->root = rootName;
        }
        if (!hasRoot)
        {
            return false;
        }

        Reading reading{{}, {}, DiagnosticReporter(diagnostics)};
        ForEachElement(file, root.Get(), [&](const std::wstring&, IXMLDOMNode* provider) {
            reading.reporter.EnterItem();
            ReadProvider(file, provider, reading);
            return true;
        });

        // From here on nothing throws, and what was read lives until the process ends.
        m_configs.reserve(m_configs.size() + reading.configs.size());
        for (auto& config : reading.configs)
        {
            m_configs.push_back(config.release());
        }
        for (auto& filter : reading.filters)
        {
            static_cast<void>(filter.release());
        }
        return true;
    });
}

OrvixProviderConfig* OrvixProviderConfigManager::FindConfig(const wchar_t* providerName) const
{
    if (providerName == nullptr)
    {
        return nullptr;
    }
    const std::wstring name = UpperCase(providerName);
    for (OrvixProviderConfig* config : m_configs)
    {
        if (Applies(*config, name))
        {
            return config;
        }
    }
    return nullptr;
}

std::vector<OrvixProviderConfig*> OrvixProviderConfigManager::FindAllConfigs(const wchar_t* providerName) const
{
    const std::wstring name = UpperCase(providerName);
    std::vector<OrvixProviderConfig*> found;
    std::copy_if(m_configs.begin(), m_configs.end(), std::back_inserter(found),
                 [&](const OrvixProviderConfig* config) { return Applies(*config, name); });
    return found;
}
