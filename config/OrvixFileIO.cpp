#include "OrvixFileIO.h"

#include "ComString.h"
#include "ComVariant.h"
#include "XmlProlog.h"

#include <memory>
#include <utility>

using Microsoft::WRL::ComPtr;

namespace
{

// MSXML's version-independent document class and the interfaces used, as its published headers give them.
constexpr CLSID ClassDOMDocument = {0xF6D90F11, 0x9C73, 0x11D3, {0xB3, 0x2E, 0x00, 0xC0, 0x4F, 0x99, 0x0B, 0xB4}};
constexpr IID InterfaceDocument = {0x2933BF81, 0x7B36, 0x11D2, {0xB2, 0x0E, 0x00, 0xC0, 0x4F, 0x98, 0x3E, 0x60}};
constexpr IID InterfaceNode = {0x2933BF80, 0x7B36, 0x11D2, {0xB2, 0x0E, 0x00, 0xC0, 0x4F, 0x98, 0x3E, 0x60}};
constexpr IID InterfaceElement = {0x2933BF86, 0x7B36, 0x11D2, {0xB2, 0x0E, 0x00, 0xC0, 0x4F, 0x98, 0x3E, 0x60}};

constexpr long ElementType = 1; // NODE_ELEMENT of createNode

ComPtr<IXMLDOMElement> AsElement(IXMLDOMNode* node)
{
    ComPtr<IXMLDOMElement> element;
    if (node != nullptr)
    {
        node->QueryInterface(InterfaceElement, reinterpret_cast<void**>(element.GetAddressOf()));
    }
    return element;
}

/// The text with every code unit that XML 1.0 cannot carry replaced by U+FFFD.
std::wstring XmlText(const wchar_t* text)
{
    const auto isHigh = [](wchar_t c) { return c >= 0xD800 && c <= 0xDBFF; };
    const auto isLow = [](wchar_t c) { return c >= 0xDC00 && c <= 0xDFFF; };
    std::wstring result(text);
    for (std::size_t i = 0; i < result.size(); ++i)
    {
        const wchar_t c = result[i];
        if (isHigh(c) && i + 1 < result.size() && isLow(result[i + 1]))
        {
            ++i;
        }
        else if ((c < 0x20 && c != L'\t' && c != L'\n' && c != L'\r') || (c >= 0xD800 && c <= 0xDFFF) || c >= 0xFFFE)
        {
            result[i] = 0xFFFD;
        }
    }
    return result;
}

/// Whether the document refers to an entity that it declares: a reference of a few characters can expand to gigabytes
/// of text. Looks at every node, but only in a document with a document type, which is where entities are declared.
bool UsesEntities(IXMLDOMDocument* document)
{
    ComPtr<IXMLDOMDocumentType> type;
    if (document->get_doctype(&type) != S_OK || type == nullptr)
    {
        return false;
    }
    ComPtr<IXMLDOMElement> root;
    document->get_documentElement(&root);
    ComPtr<IXMLDOMNode> node = root;
    while (node != nullptr)
    {
        DOMNodeType kind = NODE_INVALID;
        if (SUCCEEDED(node->get_nodeType(&kind)) && kind == NODE_ENTITY_REFERENCE)
        {
            return true;
        }
        ComPtr<IXMLDOMNode> next;
        node->get_firstChild(&next);
        while (next == nullptr && node != nullptr)
        {
            node->get_nextSibling(&next);
            if (next == nullptr)
            {
                ComPtr<IXMLDOMNode> parent;
                node->get_parentNode(&parent);
                node = std::move(parent);
            }
        }
        node = std::move(next);
    }
    return false;
}

} // namespace

OrvixFileIO::OrvixFileIO() = default;

OrvixFileIO::~OrvixFileIO()
{
    m_documentNode.Reset();
    m_document.Reset();
    m_rootNode.Reset();
}

/// Initialises COM and makes an empty document.
bool OrvixFileIO::MakeDocument()
{
    if (FAILED(CoInitialize(nullptr)))
    {
        return false;
    }
    m_usesCom = true;
    return SUCCEEDED(CoCreateInstance(ClassDOMDocument, nullptr, CLSCTX_INPROC_SERVER, InterfaceDocument,
                                      reinterpret_cast<void**>(m_document.ReleaseAndGetAddressOf())));
}

bool OrvixFileIO::CreateDocument()
{
    if (!MakeDocument() || FAILED(m_document->QueryInterface(
                               InterfaceNode, reinterpret_cast<void**>(m_documentNode.ReleaseAndGetAddressOf()))))
    {
        return false;
    }
    ComPtr<IXMLDOMProcessingInstruction> declaration;
    if (FAILED(m_document->createProcessingInstruction(
            ComString(L"xml").Get(), ComString(L"version=\"1.0\" standalone=\"yes\"").Get(), &declaration)))
    {
        return false;
    }
    m_documentNode->appendChild(declaration.Get(), nullptr);
    return true;
}

bool OrvixFileIO::OpenDocument(const wchar_t* path)
{
    m_content = Content::Missing;
    std::string bytes;
    switch (path != nullptr ? FileBytes::Read(path, MaxFileSize, bytes) : FileBytes::Found::Missing)
    {
    case FileBytes::Found::Missing:
        return true;
    case FileBytes::Found::Unreadable:
        m_content = Content::Unreadable;
        return true;
    case FileBytes::Found::TooLarge:
        m_content = Content::TooLarge;
        return true;
    case FileBytes::Found::Bytes:
        break;
    }
    if (XmlProlog::MayDeclareEntities(bytes))
    {
        m_content = Content::UsesEntities;
        return true;
    }
    m_content = Content::Unreadable;
    if (!MakeDocument())
    {
        return false;
    }
    Parse(bytes);
    if (FAILED(m_document->QueryInterface(InterfaceNode,
                                          reinterpret_cast<void**>(m_documentNode.ReleaseAndGetAddressOf()))))
    {
        return false;
    }
    m_rootNode = m_documentNode;
    return true;
}

void OrvixFileIO::Parse(std::string_view bytes)
{
    m_document->put_async(VARIANT_FALSE);
    m_document->put_validateOnParse(VARIANT_FALSE);
    m_document->put_resolveExternals(VARIANT_FALSE);
    VARIANT_BOOL loaded = VARIANT_FALSE;
    if (!bytes.empty())
    {
        m_document->load(ComVariant(bytes).Get(), &loaded);
    }
    m_content = loaded ? Content::Document : Content::Malformed;
    if (UsesEntities(m_document.Get()))
    {
        m_document->loadXML(ComString(L"").Get(), &loaded);
        m_content = Content::UsesEntities;
    }
}

bool OrvixFileIO::SaveDocument(const wchar_t* path, FileBytes::Previous previous)
{
    ComPtr<IStream> stream;
    HGLOBAL memory = nullptr;
    STATSTG status = {};
    if (m_document == nullptr || path == nullptr || FAILED(CreateStreamOnHGlobal(nullptr, TRUE, &stream)) ||
        FAILED(m_document->save(ComVariant(stream.Get()).Get())) || FAILED(stream->Stat(&status, STATFLAG_NONAME)) ||
        FAILED(GetHGlobalFromStream(stream.Get(), &memory)))
    {
        return false;
    }
    const char* data = static_cast<const char*>(GlobalLock(memory));
    if (data == nullptr)
    {
        return false;
    }
    const std::string bytes(data, static_cast<std::size_t>(status.cbSize.QuadPart));
    GlobalUnlock(memory);
    return FileBytes::Replace(path, bytes, previous);
}

bool OrvixFileIO::CloseDocument()
{
    // All three before COM goes: the root node is the document as well.
    m_rootNode.Reset();
    m_documentNode.Reset();
    m_document.Reset();
    if (std::exchange(m_usesCom, false))
    {
        CoUninitialize();
    }
    return true;
}

OrvixFileIO::Node* OrvixFileIO::GetDocumentRoot()
{
    return m_rootNode != nullptr ? std::addressof(m_rootNode) : nullptr;
}

bool OrvixFileIO::GetRootElement(Node& root, std::wstring& name)
{
    ComPtr<IXMLDOMElement> element;
    if (m_document == nullptr || FAILED(m_document->get_documentElement(&element)) || element == nullptr)
    {
        return false;
    }
    root = element;
    return GetNodeName(root.Get(), name);
}

long OrvixFileIO::NumChildNodes(IXMLDOMNode* node)
{
    ComPtr<IXMLDOMNodeList> children;
    long length = 0;
    if (SUCCEEDED(node->get_childNodes(&children)) && children != nullptr)
    {
        children->get_length(&length);
    }
    return length;
}

bool OrvixFileIO::GetChildNode(IXMLDOMNode* parent, long index, Node& child)
{
    IXMLDOMNode* node = ParentOrDocument(parent);
    ComPtr<IXMLDOMNodeList> children;
    long length = 0;
    if (node == nullptr || FAILED(node->get_childNodes(&children)) || children == nullptr)
    {
        return false;
    }
    children->get_length(&length);
    return index >= 0 && index < length && SUCCEEDED(children->get_item(index, child.ReleaseAndGetAddressOf())) &&
           child != nullptr;
}

bool OrvixFileIO::GetFirstChild(IXMLDOMNode* parent, Node& child)
{
    IXMLDOMNode* node = ParentOrDocument(parent);
    return node != nullptr && SUCCEEDED(node->get_firstChild(child.ReleaseAndGetAddressOf())) && child != nullptr;
}

bool OrvixFileIO::GetNextSibling(Node& node)
{
    Node next;
    node->get_nextSibling(&next);
    node = std::move(next);
    return node != nullptr;
}

bool OrvixFileIO::GetNodeName(IXMLDOMNode* node, std::wstring& name)
{
    const ComPtr<IXMLDOMElement> element = AsElement(node);
    ComString text;
    if (element == nullptr || FAILED(element->get_nodeName(text.Out())) || text.Get() == nullptr)
    {
        return false;
    }
    name = text.View();
    return true;
}

bool OrvixFileIO::GetNodeText(IXMLDOMNode* node, std::wstring& text)
{
    // An element may declare a data type: its typed value is then no string.
    ComVariant value;
    if (FAILED(node->get_nodeTypedValue(value.Out())) || value.String() == nullptr)
    {
        return false;
    }
    text.assign(value.String(), SysStringLen(value.String()));
    return true;
}

bool OrvixFileIO::FindChildText(IXMLDOMNode* node, const wchar_t* name, std::wstring& text)
{
    const std::wstring_view wanted = name;
    return FindChildTexts(node, {&wanted, 1}, {&text, 1});
}

bool OrvixFileIO::FindChildTexts(IXMLDOMNode* node, std::span<const std::wstring_view> names,
                                 std::span<std::wstring> texts)
{
    std::uint32_t missing = static_cast<std::uint32_t>((std::uint64_t{1} << names.size()) - 1);
    Node child;
    for (bool more = GetFirstChild(node, child); more; more = (missing != 0) && GetNextSibling(child))
    {
        ComString name;
        if (FAILED(child->get_nodeName(name.Out())))
        {
            continue;
        }
        for (std::size_t i = 0; i < names.size(); ++i)
        {
            if ((missing >> i & 1) && name.View() == names[i] && GetNodeText(child.Get(), texts[i]))
            {
                missing &= ~(1U << i);
            }
        }
    }
    return missing == 0;
}

bool OrvixFileIO::AddElement(IXMLDOMNode* parent, const wchar_t* name, Node& element, bool insertFirst)
{
    IXMLDOMNode* node = ParentOrDocument(parent);
    Node created;
    m_document->createNode(ComVariant(ElementType).Get(), ComString(name).Get(), nullptr, &created);
    Node first;
    if (insertFirst && GetFirstChild(node, first))
    {
        node->insertBefore(created.Get(), ComVariant(first.Get()).Get(), element.ReleaseAndGetAddressOf());
    }
    else
    {
        node->appendChild(created.Get(), element.ReleaseAndGetAddressOf());
    }
    return true;
}

bool OrvixFileIO::AddTextElement(IXMLDOMNode* parent, const wchar_t* name, const wchar_t* text)
{
    Node element;
    AddElement(parent, name, element, false);
    return AppendText(element.Get(), text);
}

bool OrvixFileIO::AppendText(IXMLDOMNode* node, const wchar_t* text)
{
    const ComPtr<IXMLDOMElement> element = AsElement(node);
    if (element == nullptr)
    {
        return false;
    }
    const std::wstring allowed = XmlText(text);
    const auto isSpace = [](wchar_t c) { return c == L' ' || c == L'\t' || c == L'\n' || c == L'\r'; };
    if (!allowed.empty() &&
        (isSpace(allowed.front()) || isSpace(allowed.back()) || allowed.find(L'\r') != std::wstring::npos))
    {
        SetAttribute(node, L"xml:space", L"preserve");
    }
    std::size_t start = 0;
    for (std::size_t end = 0; (end = allowed.find(L'\r', start)) != std::wstring::npos; start = end + 1)
    {
        if (end > start)
        {
            AppendTextNode(*element.Get(), allowed.substr(start, end - start));
        }
        ComPtr<IXMLDOMEntityReference> reference;
        if (SUCCEEDED(m_document->createEntityReference(ComString(L"#13").Get(), &reference)) && reference != nullptr)
        {
            element->appendChild(reference.Get(), nullptr);
        }
        else
        {
            AppendTextNode(*element.Get(), L"\r"); // which a reader takes for a line feed
        }
    }
    if (start == 0 || start < allowed.size())
    {
        AppendTextNode(*element.Get(), allowed.substr(start));
    }
    return true;
}

void OrvixFileIO::AppendTextNode(IXMLDOMElement& element, const std::wstring& text)
{
    ComPtr<IXMLDOMText> node;
    m_document->createTextNode(ComString(text.c_str()).Get(), &node);
    element.appendChild(node.Get(), nullptr);
}

bool OrvixFileIO::SetAttribute(IXMLDOMNode* node, const wchar_t* name, const wchar_t* value)
{
    const ComPtr<IXMLDOMElement> element = AsElement(node);
    if (element == nullptr)
    {
        return false;
    }
    element->setAttribute(ComString(name).Get(), ComVariant(value).Get());
    return true;
}
