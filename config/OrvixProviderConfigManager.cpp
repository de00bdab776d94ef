#include "OrvixProviderConfigManager.h"

#include "ExceptionBarrier.h"
#include "OrvixFileIO.h"
#include "OrvixProviderConfig.h"
#include "ProviderFilters.h"
#include "UpperCase.h"

#include <cwchar>
#include <memory>

namespace
{

/// What one reading of the file has made so far. It frees itself unless the reading succeeds.
struct Reading
{
    std::vector<std::unique_ptr<OrvixProviderConfig>> configs;
    std::vector<std::unique_ptr<ProviderFilters>> filters;
};

bool IsNamed(const std::wstring& name, const wchar_t* wanted)
{
    return _wcsicmp(name.c_str(), wanted) == 0;
}

/// Calls `visit(name, text, child)` for every child element whose name and text can be read, until it
/// returns false.
template <class Visit>
void ForEachReadableElement(OrvixFileIO& file, IXMLDOMNode* parent, Visit&& visit)
{
    OrvixFileIO::Node child;
    std::wstring name;
    std::wstring text;
    for (bool more = file.GetFirstChild(parent, child); more; more = file.GetNextSibling(child))
    {
        if (file.GetNodeName(child.Get(), name) && file.GetNodeText(child.Get(), text) &&
            !visit(name, text, child.Get()))
            return;
    }
}

/// Reads one filter. It is appended to the configuration once for its name and once more for every element
/// behind the name: deliberate, and harmless. A filter whose first element is not its name is dropped.
void ReadFilter(OrvixFileIO& file, IXMLDOMNode* node, OrvixProviderConfig& config, Reading& reading)
{
    auto owned = std::make_unique<ProviderFilters>();
    ProviderFilters* filter = owned.get();
    ForEachReadableElement(file, node, [&](const std::wstring& name, const std::wstring& text, IXMLDOMNode*) {
        if (IsNamed(name, L"Name"))
        {
            filter->m_name = text;
            if (owned)
                reading.filters.push_back(std::move(owned));
        }
        else if (owned)
            return false;
        else if (IsNamed(name, L"Type"))
            filter->m_exclude = IsNamed(text, L"exclude");
        else if (IsNamed(name, L"Folder"))
            filter->m_folders.push_back(UpperCase(text));
        else if (IsNamed(name, L"FileType"))
            filter->m_fileTypes.push_back(UpperCase(text));
        config.m_filters.push_back(filter);
        return true;
    });
}

/// Reads one provider; it is kept when it has a name.
void ReadProvider(OrvixFileIO& file, IXMLDOMNode* node, Reading& reading)
{
    auto config = std::make_unique<OrvixProviderConfig>();
    const std::size_t filtersBefore = reading.filters.size();
    bool named = false;
    ForEachReadableElement(file, node, [&](const std::wstring& name, const std::wstring& text, IXMLDOMNode* child) {
        if (IsNamed(name, L"Name"))
        {
            config->m_name = UpperCase(text);
            named = true;
        }
        else if (IsNamed(name, L"Enabled"))
            config->m_enabled = !IsNamed(text, L"false");
        else if (IsNamed(name, L"FixedProjectRoot"))
            config->m_fixedProjectRoot = text;
        else if (IsNamed(name, L"AltProviderExecutable"))
            config->m_altProviderExecutable = text;
        else if (IsNamed(name, L"MSSCCProjectFile"))
            config->m_msSccProjectFile = text;
        else if (IsNamed(name, L"MSSCCDllSearchPath"))
            config->m_msSccDllSearchPath = text;
        else if (IsNamed(name, L"MSSCCDllFullPath"))
            config->m_msSccDllFullPath = text;
        else if (IsNamed(name, L"Filters"))
        {
            OrvixFileIO::Node filter;
            for (bool more = file.GetFirstChild(child, filter); more; more = file.GetNextSibling(filter))
                ReadFilter(file, filter.Get(), *config, reading);
        }
        return true;
    });
    if (named)
        reading.configs.push_back(std::move(config));
    else
        reading.filters.resize(filtersBefore);
}

/// Finds the root element among the document's children; null when there is none.
OrvixFileIO::Node FindRoot(OrvixFileIO& file, IXMLDOMNode* document)
{
    // By index: not every document type knows its next sibling.
    OrvixFileIO::Node node;
    std::wstring name;
    for (long i = 0; file.GetChildNode(document, i, node); ++i)
    {
        if (file.GetNodeName(node.Get(), name) && IsNamed(name, L"OrvixProviders"))
            return node;
    }
    return nullptr;
}

} // namespace

OrvixProviderConfigManager::OrvixProviderConfigManager() = default;
OrvixProviderConfigManager::~OrvixProviderConfigManager() = default;

bool OrvixProviderConfigManager::LoadConfig(const wchar_t* path)
{
    if (!path)
        return false;
    return WithXmlBarrier(false, [&] {
        OrvixFileIO file;
        if (!file.OpenDocument(path))
            return false;
        const OpenedDocument opened(file);
        const OrvixFileIO::Node* document = file.GetDocumentRoot();
        const OrvixFileIO::Node root = document ? FindRoot(file, document->Get()) : nullptr;
        if (!root)
            return false;

        Reading reading;
        OrvixFileIO::Node provider;
        for (bool more = file.GetFirstChild(root.Get(), provider); more; more = file.GetNextSibling(provider))
            ReadProvider(file, provider.Get(), reading);

        // From here on nothing throws, and what was read lives until the process ends.
        m_configs.reserve(m_configs.size() + reading.configs.size());
        for (auto& config : reading.configs)
            m_configs.push_back(config.release());
        for (auto& filter : reading.filters)
            static_cast<void>(filter.release());
        return true;
    });
}

OrvixProviderConfig* OrvixProviderConfigManager::FindConfig(const wchar_t* providerName) const
{
    if (!providerName)
        return nullptr;
    const std::wstring name = UpperCase(providerName);
    for (OrvixProviderConfig* config : m_configs)
    {
        if (name.find(config->m_name) != std::wstring::npos)
            return config;
    }
    return nullptr;
}
