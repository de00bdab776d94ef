#pragma once

#include "FileBytes.h"

#include <windows.h>

#include <msxml.h>
#include <wrl/client.h>

#include <span>
#include <string>
#include <string_view>

/// Reads or writes one XML file through the MSXML document object model.
///
/// Used on one thread, for one file: `OpenDocument` or `CreateDocument`, then the node operations, then
/// `CloseDocument` (see `OpenedDocument`). COM is initialised on the thread where there is something to parse or to
/// write; `CloseDocument` is the only place that uninitialises it, so it is called after a success only, and no node
/// may be held across it. A failed start leaves COM as it is.
///
/// MSXML never sees the file's path, which it would take for a URL in reading: bytes go to and from it.
///
/// A node argument may not be null, except a parent: null means the document node. Operations report failure by
/// false. When memory for a string runs out, `_com_error` is thrown.
class OrvixFileIO
{
public:
    using Node = Microsoft::WRL::ComPtr<IXMLDOMNode>;

    OrvixFileIO();
    OrvixFileIO(const OrvixFileIO&) = delete;
    OrvixFileIO& operator=(const OrvixFileIO&) = delete;

    /// Releases what is still held; leaves COM initialised when `CloseDocument` was not called.
    virtual ~OrvixFileIO();

    /// Starts a new document that holds an XML declaration (version 1.0, standalone) and nothing else.
    bool CreateDocument();

    /// In bytes. Larger files are not read: MSXML needs a minute for one text of 50 MB, and real files are a thousand
    /// times smaller.
    static constexpr std::size_t MaxFileSize = 16 * 1024 * 1024;

    /// What `OpenDocument` found.
    enum class Content
    {
        Missing,
        Unreadable, ///< kept from us by the system or another program; also when MSXML cannot be started
        TooLarge,   ///< more than `MaxFileSize`
        Malformed,
        UsesEntities, ///< or declares some, or has an encoding in which this cannot be told
        Document
    };

    /// Loads a file. A file that is missing, unreadable, too large or not well-formed, and one that declares or uses
    /// entities of its own, gives an empty document and true: the reader notices it by not finding its root element.
    /// The declarations are found before MSXML sees them, since a few hundred bytes of them can keep it busy for
    /// hours. False when COM or MSXML cannot be started.
    bool OpenDocument(const wchar_t* path);

    /// What the last `OpenDocument` found.
    Content GetContent() const { return m_content; }

    /// Saves to `path` in one step, see `FileBytes::Replace`; false without a document and when MSXML or the system
    /// reports a failure.
    bool SaveDocument(const wchar_t* path, FileBytes::Previous previous = FileBytes::Previous::Replaced);

    /// Releases the document and uninitialises COM once if it was initialised; always true.
    bool CloseDocument();

    /// The document node of a document that was read; null otherwise. Owned by this object.
    Node* GetDocumentRoot();

    /// The root element, whatever is around it, and its name; false when there is none.
    bool GetRootElement(Node& root, std::wstring& name);

    /// Number of child nodes; 0 when they cannot be read.
    long NumChildNodes(IXMLDOMNode* node);

    /// The child at `index`; false when it is out of range. Linear in the index: to walk all children use
    /// `GetFirstChild` and `GetNextSibling`.
    bool GetChildNode(IXMLDOMNode* parent, long index, Node& child);

    /// The first child; false when there is none.
    bool GetFirstChild(IXMLDOMNode* parent, Node& child);

    /// Steps from `node` to its next sibling; false, with a null node, after the last one.
    bool GetNextSibling(Node& node);

    /// Name of an element; false for every other kind of node.
    bool GetNodeName(IXMLDOMNode* node, std::wstring& name);

    /// Text value of a node; false when it has none that is a string.
    bool GetNodeText(IXMLDOMNode* node, std::wstring& text);

    /// Text of the first child with this name (compared exactly) whose text can be read.
    bool FindChildText(IXMLDOMNode* node, const wchar_t* name, std::wstring& text);

    /// `FindChildText` for several names in one walk: `texts[i]` receives the text for `names[i]`. True when
    /// all were found. At most 32 names.
    bool FindChildTexts(IXMLDOMNode* node, std::span<const std::wstring_view> names, std::span<std::wstring> texts);

    /// Adds an element under a parent, before its first child or after its last one; always true.
    bool AddElement(IXMLDOMNode* parent, const wchar_t* name, Node& element, bool insertFirst);

    /// Adds an element whose only child is a text node.
    bool AddTextElement(IXMLDOMNode* parent, const wchar_t* name, const wchar_t* text);

    /// Appends a text to an element; false when the node is no element. Characters that XML cannot carry become
    /// U+FFFD, since one of them would make the whole saved file unreadable. For a text that begins or ends with white
    /// space, or contains a carriage return, the element gets `xml:space="preserve"`, and the carriage return is
    /// written as a character reference: a parser would drop the one and change the other.
    bool AppendText(IXMLDOMNode* node, const wchar_t* text);

    /// Sets an attribute; false when the node is no element.
    bool SetAttribute(IXMLDOMNode* node, const wchar_t* name, const wchar_t* value);

private:
    bool MakeDocument();
    void Parse(std::string_view bytes);
    void AppendTextNode(IXMLDOMElement& element, const std::wstring& text);
    IXMLDOMNode* ParentOrDocument(IXMLDOMNode* parent) const
    {
        return parent != nullptr ? parent : m_documentNode.Get();
    }

    Microsoft::WRL::ComPtr<IXMLDOMDocument> m_document;
    Node m_documentNode;
    Node m_rootNode;
    Content m_content = Content::Missing;
    bool m_usesCom = false;
};

/// Closes a document at the end of a scope, also when an exception leaves it. Declared before any node.
class OpenedDocument
{
public:
    explicit OpenedDocument(OrvixFileIO& file) : m_file(file) {}
    OpenedDocument(const OpenedDocument&) = delete;
    OpenedDocument& operator=(const OpenedDocument&) = delete;
    ~OpenedDocument() { m_file.CloseDocument(); }

private:
    OrvixFileIO& m_file;
};
