// Every XML example of the guides says only what the library reads.

#include "Bridge.h"
#include "Guides.h"
#include "OrvixFileIO.h"
#include "OrvixPromptTable.h"
#include "OrvixProviderConfig.h"
#include "OrvixProviderConfigManager.h"
#include "PromptFile.h"
#include "ProviderFilters.h"
#include "UpperCase.h"

#include <functional>
#include <regex>
#include <set>

namespace
{

/// The text with other words in place of the library's defaults: a default does not show whether it was read.
std::string WithoutDefaults(const std::string& xml)
{
    return std::regex_replace(std::regex_replace(xml, std::regex(">true<"), ">false<"), std::regex(">exclude<"),
                              ">include<");
}

/// The fenced XML of every guide. A fragment without one of the three roots belongs below OrvixProviders.
std::vector<Guides::Fence> Examples()
{
    static const std::regex root("<(OrvixProviders|OrvixPrompts|MSSCCProjectSettings)\\b");
    std::vector<Guides::Fence> examples = Guides::Fences();
    std::erase_if(examples, [](const Guides::Fence& fence) { return fence.language != "xml"; });
    for (Guides::Fence& example : examples)
    {
        example.text = WithoutDefaults(example.text);
        if (!std::regex_search(example.text, root))
        {
            example.text = "<OrvixProviders>" + example.text + "</OrvixProviders>";
        }
    }
    return examples;
}

using Texts = std::vector<std::wstring>;

class XmlExample : public Bridge, public testing::WithParamInterface<Guides::Fence>
{
protected:
    XmlExample() { WriteBytes(m_path, GetParam().text); }

    /// Calls `visit` for the example's document while it is open.
    void WithDocument(const std::function<void(OrvixFileIO& file, IXMLDOMNode* root)>& visit) const
    {
        OrvixFileIO file;
        ASSERT_TRUE(file.OpenDocument(m_path.c_str()));
        const OpenedDocument opened(file);
        OrvixFileIO::Node node;
        std::wstring name;
        for (long i = 0; file.GetChildNode(nullptr, i, node); ++i)
        {
            if (file.GetNodeName(node.Get(), name))
            {
                return visit(file, node.Get());
            }
        }
        ADD_FAILURE() << "not well-formed";
    }

    /// The name of the root element; empty when the example is not well-formed.
    std::wstring Root() const
    {
        std::wstring name;
        WithDocument([&](OrvixFileIO& file, IXMLDOMNode* root) { file.GetNodeName(root, name); });
        return name;
    }

    /// The texts of the elements that hold no others.
    Texts Written() const
    {
        Texts texts;
        const std::function<bool(OrvixFileIO&, IXMLDOMNode*)> visit = [&](OrvixFileIO& file, IXMLDOMNode* node) {
            std::wstring text;
            if (!file.GetNodeName(node, text))
            {
                return false;
            }
            bool holdsElements = false;
            OrvixFileIO::Node child;
            for (bool more = file.GetFirstChild(node, child); more; more = file.GetNextSibling(child))
            {
                holdsElements = visit(file, child.Get()) || holdsElements;
            }
            if (!holdsElements && file.GetNodeText(node, text))
            {
                texts.push_back(UpperCase(text));
            }
            return true;
        };
        WithDocument(visit);
        return texts;
    }

    Texts ReadProviders() const
    {
        OrvixProviderConfigManager manager;
        EXPECT_TRUE(manager.LoadConfig(m_path.c_str()));
        std::set<const OrvixProviderConfig*> configs;
        WithDocument([&](OrvixFileIO& file, IXMLDOMNode* root) {
            OrvixFileIO::Node provider;
            std::wstring name;
            for (bool more = file.GetFirstChild(root, provider); more; more = file.GetNextSibling(provider))
            {
                if (file.FindChildText(provider.Get(), L"Name", name))
                {
                    configs.insert(manager.FindConfig(name.c_str()));
                }
            }
        });
        configs.erase(nullptr);

        Texts texts;
        for (const OrvixProviderConfig* config : configs)
        {
            texts.insert(texts.end(),
                         {config->m_name, config->m_enabled ? L"true" : L"false", config->m_fixedProjectRoot,
                          config->m_altProviderExecutable, config->m_msSccProjectFile, config->m_msSccDllSearchPath,
                          config->m_msSccDllFullPath});
            const std::set<const ProviderFilters*> filters(config->m_filters.begin(), config->m_filters.end());
            for (const ProviderFilters* filter : filters)
            {
                texts.insert(texts.end(), {filter->m_name, filter->m_exclude ? L"exclude" : L"include"});
                texts.insert(texts.end(), filter->m_folders.begin(), filter->m_folders.end());
                texts.insert(texts.end(), filter->m_fileTypes.begin(), filter->m_fileTypes.end());
            }
        }
        return texts;
    }

    Texts ReadPrompts() const
    {
        OrvixPromptTable table;
        EXPECT_TRUE(ReadPromptFile(table, m_path.c_str()));
        Texts texts;
        for (unsigned i = 0; i < static_cast<unsigned>(table.NumPrompts()); ++i)
        {
            texts.insert(texts.end(),
                         {table.GetPromptText(i), std::to_wstring(table.GetPromptID(i)),
                          table.GetLocked(i) ? L"true" : L"false", std::to_wstring(table.GetPromptOptions(i)),
                          std::to_wstring(table.GetPrompt(i))});
        }
        return texts;
    }

    /// The texts that a library gets when the project is opened.
    Texts ReadProjectSettings()
    {
        Texts texts;
        m_recorder.openProject = [&](LPVOID, HWND, LPSTR, LPCSTR name, LPCSTR, LPSTR auxPath, LPCSTR, LPTEXTOUTPROC,
                                     LONG) {
            texts = {std::filesystem::path(name).wstring(), std::filesystem::path(auxPath).wstring()};
            return SCC_OK;
        };
        m_bridge->SetProjectSettingsFile(m_path.filename().wstring());
        StartAndOpen();
        return texts;
    }

    std::filesystem::path m_path = m_folder.Path() / L"example.xml";
};

} // namespace

TEST_P(XmlExample, SaysOnlyWhatTheLibraryReads)
{
    const std::wstring root = Root();
    const Texts written = Written(); // before it is opened as a project's settings, which overwrites it
    Texts read = root == L"OrvixProviders"         ? ReadProviders()
                 : root == L"OrvixPrompts"         ? ReadPrompts()
                 : root == L"MSSCCProjectSettings" ? ReadProjectSettings()
                                                   : Texts();
    for (std::wstring& text : read)
    {
        text = UpperCase(text);
    }
    EXPECT_FALSE(written.empty());
    EXPECT_THAT(written, testing::IsSubsetOf(read));
}

INSTANTIATE_TEST_SUITE_P(Guides, XmlExample, testing::ValuesIn(Examples()), [](const auto& example) {
    return std::regex_replace(example.param.guide, std::regex("\\W"), "_") + "_" + std::to_string(example.index);
});
