#include "Measure.h"
#include "OrvixPrompt.h"
#include "OrvixPromptTable.h"
#include "OrvixServicesPointer.h"
#include "PromptFile.h"
#include "UniqueHandle.h"

#include <windows.h>

#include <msxml.h>
#include <oleauto.h>
#include <wrl/client.h>

#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <numeric>
#include <random>
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

/// The names and typed values of all that is below the root, kept in one text.
void ReadByHand(IXMLDOMDocument* document)
{
    std::wstring text;
    ComPtr<IXMLDOMElement> root;
    document->get_documentElement(&root);
    ComPtr<IXMLDOMNode> prompt;
    root->get_firstChild(&prompt);
    while (prompt != nullptr)
    {
        ComPtr<IXMLDOMNode> field;
        prompt->get_firstChild(&field);
        while (field != nullptr)
        {
            BSTR name = nullptr;
            VARIANT value = {};
            field->get_nodeName(&name);
            field->get_nodeTypedValue(&value);
            text.assign(V_BSTR(&value), SysStringLen(V_BSTR(&value)));
            SysFreeString(name);
            VariantClear(&value);
            ComPtr<IXMLDOMNode> next;
            field->get_nextSibling(&next);
            field = next;
        }
        ComPtr<IXMLDOMNode> next;
        prompt->get_nextSibling(&next);
        prompt = next;
    }
}

/// Loads the file and calls `read` with the document.
template <typename Read>
void LoadByHand(const std::wstring& path, const Read& read)
{
    const ComScope com;
    const ComPtr<IXMLDOMDocument> document = NewDocument();
    document->put_async(VARIANT_FALSE);
    VARIANT source = TextVariant(path.c_str());
    VARIANT_BOOL loaded = VARIANT_FALSE;
    document->load(source, &loaded);
    VariantClear(&source);
    read(document.Get());
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

/// Writes the document's bytes to a file and onto the disk.
void WriteByHand(IXMLDOMDocument* document, const std::wstring& path)
{
    ComPtr<IStream> stream;
    CreateStreamOnHGlobal(nullptr, TRUE, &stream);
    VARIANT target;
    V_VT(&target) = VT_UNKNOWN;
    V_UNKNOWN(&target) = stream.Get();
    document->save(target);
    HGLOBAL memory = nullptr;
    STATSTG status = {};
    GetHGlobalFromStream(stream.Get(), &memory);
    stream->Stat(&status, STATFLAG_NONAME);
    const UniqueFile file(
        CreateFileW(path.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
    DWORD written = 0;
    WriteFile(file.Get(), GlobalLock(memory), static_cast<DWORD>(status.cbSize.QuadPart), &written, nullptr);
    GlobalUnlock(memory);
    FlushFileBuffers(file.Get());
}

void SaveByHand(OrvixPromptTable& table, const std::wstring& path)
{
    const ComScope com;
    const ComPtr<IXMLDOMDocument> document = NewDocument();
    BSTR name = SysAllocString(L"xml");
    BSTR content = SysAllocString(L"version=\"1.0\" standalone=\"yes\"");
    ComPtr<IXMLDOMProcessingInstruction> declaration;
    document->createProcessingInstruction(name, content, &declaration);
    document->appendChild(declaration.Get(), nullptr);
    SysFreeString(name);
    SysFreeString(content);
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
    const std::wstring beside = path + L".new";
    WriteByHand(document.Get(), beside);
    ReplaceFileW(path.c_str(), beside.c_str(), nullptr, 0, nullptr, nullptr);
}

constexpr int Count = 10000;

std::wstring PromptText(int i)
{
    return L"The file 'scene " + std::to_wstring(i) + L"' is not checked out. Check it out now?";
}

void PrintFiles(MeasureTable& table)
{
    const auto folder = std::filesystem::temp_directory_path() / L"orvix-bench";
    std::filesystem::create_directories(folder);
    const std::wstring path = (folder / L"OrvixPrompts.xml").wstring();
    OrvixPromptTable prompts;
    for (int i = 0; i < Count; ++i)
    {
        prompts.AddPrompt(i, PromptText(i).c_str(), OrvixPromptOption::OfferYesToAll | OrvixPromptOption::OfferNoToAll,
                          OrvixPromptAction::Yes, false);
    }
    WritePromptFile(prompts, path.c_str());
    table.Print(Compare(
        "saving 10,000 prompts", 1.1, [&] { WritePromptFile(prompts, path.c_str()); },
        [&] { SaveByHand(prompts, path); }));
    WritePromptFile(prompts, path.c_str());
    OrvixPromptTable loaded;
    const auto load = [&] { ReadPromptFile(loaded, path.c_str()); };
    const auto empty = [&] { loaded.RemoveAll(); };
    table.Print(Compare(
        "loading 10,000 prompts", 1.1, load, [&] { LoadByHand(path, ReadByHand); }, empty));
    table.Print(Compare(
        "loading 10,000 prompts, load alone", 1.5, load, [&] { LoadByHand(path, [](IXMLDOMDocument*) {}); }, empty));
    std::filesystem::remove_all(folder);
}

/// Every ID once, in random order.
std::vector<int> MixedIDs()
{
    std::vector<int> ids(Count);
    std::iota(ids.begin(), ids.end(), 1000);
    std::shuffle(ids.begin(), ids.end(), std::mt19937(1));
    return ids;
}

void PrintAnswers(MeasureTable& table)
{
    const std::vector<int> ids = MixedIDs();
    std::vector<std::wstring> texts;
    texts.reserve(ids.size());
    for (const int id : ids)
    {
        texts.push_back(PromptText(id));
    }
    OrvixServicesPointer services;
    table.Print({"registering 10,000 prompts, in milliseconds",
                 BestTime(
                     [&] {
                         for (std::size_t i = 0; i < ids.size(); ++i)
                         {
                             services->RegisterPrompt(static_cast<std::uint32_t>(ids[i]), texts[i].c_str(),
                                                      OrvixPromptAction::Ask, 0, true);
                         }
                     },
                     [&] { services = MakeOrvixServices(); }),
                 1.0, 5.0});

    const std::vector<int> asked = MixedIDs();
    std::vector<std::uint32_t> actions(ids.size(), OrvixPromptAction::Yes);
    const auto actionByHand = [&](int id) -> std::uint32_t& {
        return actions[static_cast<std::size_t>(std::find(ids.begin(), ids.end(), id) - ids.begin())];
    };
    table.Print(Compare(
        "GetPromptAction in 10,000 rows, each once", 1.5,
        [&] {
            for (const int id : asked)
            {
                Keep(services->GetPromptAction(static_cast<std::uint32_t>(id)));
            }
        },
        [&] {
            for (const int id : asked)
            {
                Keep(actionByHand(id));
            }
        }));
    table.Print(Compare(
        "SetPromptAction in 10,000 rows, each once", 1.5,
        [&] {
            for (const int id : asked)
            {
                services->SetPromptAction(static_cast<std::uint32_t>(id), OrvixPromptAction::No);
            }
        },
        [&] {
            for (const int id : asked)
            {
                actionByHand(id) = OrvixPromptAction::No;
            }
        }));
}

} // namespace

void BenchPrompts(MeasureTable& table)
{
    PrintFiles(table);
    PrintAnswers(table);
}
