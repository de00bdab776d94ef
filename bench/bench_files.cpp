#include "Measure.h"
#include "OrvixPrompt.h"
#include "OrvixPromptTable.h"
#include "OrvixProviderConfig.h"
#include "PromptFile.h"
#include "ProviderFilters.h"
#include "UpperCase.h"

#include <windows.h>

#include <msxml.h>
#include <oleauto.h>
#include <wrl/client.h>

#include <filesystem>
#include <memory>
#include <string>
#include <vector>

using Microsoft::WRL::ComPtr;

namespace
{

constexpr CLSID ClassDOMDocument = {0xF6D90F11, 0x9C73, 0x11D3, {0xB3, 0x2E, 0x00, 0xC0, 0x4F, 0x99, 0x0B, 0xB4}};
constexpr IID InterfaceDocument = {0x2933BF81, 0x7B36, 0x11D2, {0xB2, 0x0E, 0x00, 0xC0, 0x4F, 0x98, 0x3E, 0x60}};

/// COM for a scope, as the library uses it for each document.
class ComScope
{
public:
    ComScope() { CoInitialize(nullptr); }
    ComScope(const ComScope&) = delete;
    ComScope& operator=(const ComScope&) = delete;
    ~ComScope() { CoUninitialize(); }
};

ComPtr<IXMLDOMDocument> NewDocument()
{
    ComPtr<IXMLDOMDocument> document;
    CoCreateInstance(ClassDOMDocument, nullptr, CLSCTX_INPROC_SERVER, InterfaceDocument,
                     reinterpret_cast<void**>(document.GetAddressOf()));
    return document;
}

VARIANT TextVariant(const wchar_t* text)
{
    VARIANT value;
    V_VT(&value) = VT_BSTR;
    V_BSTR(&value) = SysAllocString(text);
    return value;
}

void LoadByHand(const std::wstring& path)
{
    const ComScope com;
    const ComPtr<IXMLDOMDocument> document = NewDocument();
    document->put_async(VARIANT_FALSE);
    VARIANT source = TextVariant(path.c_str());
    VARIANT_BOOL loaded = VARIANT_FALSE;
    document->load(source, &loaded);
    VariantClear(&source);
}

ComPtr<IXMLDOMNode> AppendByHand(IXMLDOMDocument* document, IXMLDOMNode* parent, const wchar_t* name)
{
    VARIANT type;
    V_VT(&type) = VT_I4;
    V_I4(&type) = NODE_ELEMENT;
    BSTR text = SysAllocString(name);
    ComPtr<IXMLDOMNode> created;
    ComPtr<IXMLDOMNode> appended;
    document->createNode(type, text, nullptr, &created);
    parent->appendChild(created.Get(), &appended);
    SysFreeString(text);
    return appended;
}

void AppendTextByHand(IXMLDOMDocument* document, IXMLDOMNode* parent, const wchar_t* name, const wchar_t* value)
{
    const ComPtr<IXMLDOMNode> element = AppendByHand(document, parent, name);
    BSTR text = SysAllocString(value);
    ComPtr<IXMLDOMText> node;
    document->createTextNode(text, &node);
    element->appendChild(node.Get(), nullptr);
    SysFreeString(text);
}

void SaveByHand(OrvixPromptTable& table, const std::wstring& path)
{
    const ComScope com;
    const ComPtr<IXMLDOMDocument> document = NewDocument();
    const ComPtr<IXMLDOMNode> root = AppendByHand(document.Get(), document.Get(), L"OrvixPrompts");
    for (unsigned int i = 0; i < static_cast<unsigned int>(table.NumPrompts()); ++i)
    {
        const ComPtr<IXMLDOMNode> prompt = AppendByHand(document.Get(), root.Get(), L"Prompt");
        AppendTextByHand(document.Get(), prompt.Get(), L"Text", table.GetPromptText(i));
        AppendTextByHand(document.Get(), prompt.Get(), L"ID", std::to_wstring(table.GetPromptID(i)).c_str());
        AppendTextByHand(document.Get(), prompt.Get(), L"Locked", table.GetLocked(i) ? L"true" : L"false");
        AppendTextByHand(document.Get(), prompt.Get(), L"ActionOpts",
                         std::to_wstring(table.GetPromptOptions(i)).c_str());
        AppendTextByHand(document.Get(), prompt.Get(), L"Action", std::to_wstring(table.GetPrompt(i)).c_str());
    }
    VARIANT target = TextVariant(path.c_str());
    document->save(target);
    VariantClear(&target);
}

void BenchPrompts(MeasureTable& table)
{
    constexpr int Count = 10000;
    const auto folder = std::filesystem::temp_directory_path() / L"orvix-bench";
    std::filesystem::create_directories(folder);
    const std::wstring path = (folder / L"OrvixPrompts.xml").wstring();
    OrvixPromptTable prompts;
    for (int i = 0; i < Count; ++i)
    {
        const std::wstring text = L"The file 'scene " + std::to_wstring(i) + L"' is not checked out. Check it out now?";
        prompts.AddPrompt(i, text.c_str(), OrvixPromptOption::OfferYesToAll | OrvixPromptOption::OfferNoToAll,
                          OrvixPromptAction::Yes, false);
    }
    table.Print(Compare(
        "SavePrompts, 10,000 prompts", 1.2, [&] { WritePromptFile(prompts, path.c_str()); },
        [&] { SaveByHand(prompts, path); }));
    WritePromptFile(prompts, path.c_str());
    OrvixPromptTable loaded;
    table.Print(Compare(
        "LoadPrompts, 10,000 prompts", 1.5, [&] { ReadPromptFile(loaded, path.c_str()); }, [&] { LoadByHand(path); }));
    std::filesystem::remove_all(folder);
}

void BenchFilters(MeasureTable& table)
{
    constexpr int FilterCount = 50;
    constexpr int PathCount = 100000;
    std::vector<std::unique_ptr<ProviderFilters>> owned;
    OrvixProviderConfig config;
    for (int i = 0; i < FilterCount; ++i)
    {
        owned.push_back(std::make_unique<ProviderFilters>());
        ProviderFilters& filter = *owned.back();
        filter.m_name = L"Filter";
        filter.m_folders = {L"C:\\PROJECT\\EXCLUDED " + std::to_wstring(i) + L"\\", L"D:\\CACHE\\"};
        filter.m_fileTypes = {L"TMP" + std::to_wstring(i), L"BAK"};
        // As the file's reader leaves it: once for the name and once for each of the four further elements.
        config.m_filters.insert(config.m_filters.end(), 5, &filter);
    }
    std::vector<std::wstring> paths;
    paths.reserve(PathCount);
    for (int i = 0; i < PathCount; ++i)
    {
        paths.push_back(L"c:\\project\\scenes\\level " + std::to_wstring(i / 100) + L"\\object " + std::to_wstring(i) +
                        L".mesh");
    }

    volatile bool sink = false;
    table.Print(Compare(
        "IsFileExcluded, 50 filters, 100,000 paths", 1.5,
        [&] {
            for (const std::wstring& path : paths)
            {
                sink = config.IsFileExcluded(path.c_str(), nullptr);
            }
        },
        [&] {
            for (const std::wstring& path : paths)
            {
                const std::wstring upper = UpperCase(path);
                const std::wstring_view type = std::wstring_view(upper).substr(upper.rfind(L'.') + 1);
                bool excluded = false;
                for (const auto& filter : owned)
                {
                    for (const std::wstring& folder : filter->m_folders)
                    {
                        excluded |= upper.starts_with(folder);
                    }
                    for (const std::wstring& entry : filter->m_fileTypes)
                    {
                        excluded |= type == entry;
                    }
                }
                sink = excluded;
            }
        }));
    static_cast<void>(sink);
}

} // namespace

void BenchFiles(MeasureTable& table)
{
    BenchPrompts(table);
    BenchFilters(table);
}
