#include "CurrentFolder.h"
#include "Files.h"
#include "OrvixFileIO.h"
#include "TempFolder.h"
#include "UniqueHandle.h"

#include <gtest/gtest.h>
#include <objbase.h>

#include <string>
#include <string_view>
#include <thread>
#include <vector>

namespace
{

using Node = OrvixFileIO::Node;

class FileIO : public testing::Test
{
protected:
    /// Writes the file and opens it; the document is closed by the end of the test.
    void Open(std::string_view content)
    {
        WriteBytes(m_path, content);
        ASSERT_TRUE(m_file.OpenDocument(m_path.c_str()));
        m_open = true;
    }

    void Create()
    {
        ASSERT_TRUE(m_file.CreateDocument());
        m_open = true;
    }

    void TearDown() override
    {
        m_node.Reset();
        if (m_open)
        {
            EXPECT_TRUE(m_file.CloseDocument());
        }
    }

    /// Opens the file and makes `m_node` its root element, the last child of the document.
    void OpenRoot(std::string_view content)
    {
        Open(content);
        ASSERT_TRUE(m_file.GetChildNode(nullptr, m_file.NumChildNodes(m_file.GetDocumentRoot()->Get()) - 1, m_node));
    }

    /// Saves the document and gives the file without line ends, which are the XML service's choice.
    std::string Saved()
    {
        EXPECT_TRUE(m_file.SaveDocument(m_path.c_str()));
        std::string xml = ReadBytes(m_path);
        std::erase_if(xml, [](char c) { return c == '\r' || c == '\n'; });
        return xml;
    }

    TempFolder m_folder;
    std::filesystem::path m_path = m_folder.Path() / L"\u5009 file.xml";
    OrvixFileIO m_file;
    Node m_node;
    bool m_open = false;
    std::wstring m_text = L"before";
};

using OrvixFileIOOpenDocument = FileIO;
using OrvixFileIOCreateDocument = FileIO;
using OrvixFileIOSaveDocument = FileIO;
using OrvixFileIOCloseDocument = FileIO;
using OrvixFileIOGetDocumentRoot = FileIO;
using OrvixFileIOChildren = FileIO;
using OrvixFileIOGetNodeName = FileIO;
using OrvixFileIOGetNodeText = FileIO;
using OrvixFileIOFindChildText = FileIO;
using OrvixFileIOFindChildTexts = FileIO;
using OrvixFileIOAddElement = FileIO;
using OrvixFileIOAddTextElement = FileIO;
using OrvixFileIOAppendText = FileIO;
using OrvixFileIOSetAttribute = FileIO;

const std::string Declaration = R"(<?xml version="1.0" standalone="yes"?>)";

/// Whether COM is initialised on this thread.
bool HasApartment()
{
    APTTYPE type{};
    APTTYPEQUALIFIER qualifier{};
    return CoGetApartmentType(&type, &qualifier) == S_OK;
}

} // namespace

TEST_F(OrvixFileIOOpenDocument, HasNothingForAMissingFileAndStartsNoCom)
{
    std::thread([&] {
        EXPECT_TRUE(m_file.OpenDocument(m_path.c_str()));
        EXPECT_FALSE(HasApartment());
        EXPECT_EQ(m_file.GetContent(), OrvixFileIO::Content::Missing);
        EXPECT_EQ(m_file.GetDocumentRoot(), nullptr);
        EXPECT_FALSE(m_file.GetChildNode(nullptr, 0, m_node));
        EXPECT_FALSE(m_file.GetChildNode(nullptr, 1, m_node));
        std::wstring name;
        EXPECT_FALSE(m_file.GetRootElement(m_node, name));
        EXPECT_TRUE(m_file.CloseDocument());
    }).join();
}

TEST_F(OrvixFileIOOpenDocument, HasNothingForAFolderAndForANullPath)
{
    for (const wchar_t* path : {m_folder.Path().c_str(), static_cast<const wchar_t*>(nullptr), L""})
    {
        OrvixFileIO file;
        EXPECT_TRUE(file.OpenDocument(path));
        EXPECT_FALSE(file.GetChildNode(nullptr, 0, m_node));
        file.CloseDocument();
    }
}

TEST_F(OrvixFileIOOpenDocument, TakesNoPartOfAPathForAnEscapeOfAUrl)
{
    for (const wchar_t* name : {L"a%20b", L"a b"})
    {
        std::filesystem::create_directories(m_folder.Path() / name);
    }
    WriteBytes(m_folder.Path() / L"a b" / L"f.xml", "<wrong/>");
    const std::wstring path = (m_folder.Path() / L"a%20b" / L"f.xml").wstring();
    WriteBytes(path, "<right/>");
    for (const std::wstring& spelling : {path, L"\\\\?\\" + path})
    {
        OrvixFileIO file;
        ASSERT_TRUE(file.OpenDocument(spelling.c_str()));
        const OpenedDocument opened(file);
        Node root;
        std::wstring name;
        EXPECT_TRUE(file.GetRootElement(root, name));
        EXPECT_EQ(name, L"right");
    }
}

TEST_F(OrvixFileIOOpenDocument, ReadsAFileThatAnotherProgramWrites)
{
    WriteBytes(m_path, "<a/>");
    const UniqueFile writer(CreateFileW(m_path.c_str(), GENERIC_READ | GENERIC_WRITE | DELETE,
                                        FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr, OPEN_EXISTING,
                                        0, nullptr));
    ASSERT_TRUE(writer);
    ASSERT_TRUE(m_file.OpenDocument(m_path.c_str()));
    m_open = true;
    EXPECT_EQ(m_file.GetContent(), OrvixFileIO::Content::Document);
}

TEST_F(OrvixFileIOOpenDocument, HasNothingForAFileThatAnotherProgramKeepsToItself)
{
    WriteBytes(m_path, "<a/>");
    const UniqueFile owner(CreateFileW(m_path.c_str(), GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr));
    ASSERT_TRUE(m_file.OpenDocument(m_path.c_str()));
    m_open = true;
    EXPECT_EQ(m_file.GetContent(), OrvixFileIO::Content::Unreadable);
    EXPECT_FALSE(m_file.GetChildNode(nullptr, 0, m_node));
}

TEST_F(OrvixFileIOOpenDocument, ReadsUpToTheLargestSizeAndNothingLarger)
{
    const std::string start = "<a>";
    const std::string end = "</a>";
    for (const std::size_t more : {std::size_t{0}, std::size_t{1}})
    {
        WriteBytes(m_path, start + std::string(OrvixFileIO::MaxFileSize - start.size() - end.size() + more, 'x') + end);
        OrvixFileIO file;
        ASSERT_TRUE(file.OpenDocument(m_path.c_str()));
        EXPECT_EQ(file.GetContent(), more == 0 ? OrvixFileIO::Content::Document : OrvixFileIO::Content::TooLarge);
        file.CloseDocument();
    }
}

TEST_F(OrvixFileIOOpenDocument, GivesAnEmptyDocumentForAMalformedFile)
{
    Open("<?xml version=\"1.0\"?><a><b>text</a>");
    EXPECT_EQ(m_file.NumChildNodes(m_file.GetDocumentRoot()->Get()), 0);
}

TEST_F(OrvixFileIOOpenDocument, ReadsAnyEncodingThatTheFileNames)
{
    OpenRoot("<?xml version=\"1.0\" encoding=\"ISO-8859-1\"?><a>\xE4</a>");
    EXPECT_TRUE(m_file.GetNodeText(m_node.Get(), m_text));
    EXPECT_EQ(m_text, L"\u00E4");
}

TEST_F(OrvixFileIOOpenDocument, TakesANameRelativeToTheCurrentFolder)
{
    const CurrentFolder current(m_folder.Path());
    WriteBytes(m_folder.Path() / L"relative.xml", "<a/>");
    ASSERT_TRUE(m_file.OpenDocument(L"relative.xml"));
    m_open = true;
    EXPECT_EQ(m_file.NumChildNodes(m_file.GetDocumentRoot()->Get()), 1);
}

TEST_F(OrvixFileIOOpenDocument, HasNothingForAFileThatDeclaresEntities)
{
    for (const char* content : {"<a>&e;</a>", "<a/>"})
    {
        OrvixFileIO file;
        WriteBytes(m_path, std::string(R"(<?xml version="1.0"?><!DOCTYPE a [<!ENTITY e "text">]>)") + content);
        ASSERT_TRUE(file.OpenDocument(m_path.c_str()));
        EXPECT_EQ(file.GetContent(), OrvixFileIO::Content::UsesEntities) << content;
        EXPECT_FALSE(file.GetChildNode(nullptr, 0, m_node));
        file.CloseDocument();
    }
}

TEST_F(OrvixFileIOOpenDocument, ReadsAFileWithADocumentTypeThatDeclaresNoEntities)
{
    for (const char* type :
         {"<!DOCTYPE a>", R"(<!DOCTYPE a [<!ELEMENT a ANY><!-- <!ENTITY -->]>)", R"(<!DOCTYPE a SYSTEM "other.dtd">)"})
    {
        OrvixFileIO file;
        WriteBytes(m_path, std::string("<?xml version=\"1.0\"?>") + type + "<a>text &amp; &#65;</a>");
        ASSERT_TRUE(file.OpenDocument(m_path.c_str()));
        EXPECT_EQ(file.NumChildNodes(file.GetDocumentRoot()->Get()), 3) << type;
        file.CloseDocument();
    }
}

TEST_F(OrvixFileIOCreateDocument, StartsWithADeclarationAlone)
{
    Create();
    ASSERT_TRUE(m_file.GetChildNode(nullptr, 0, m_node));
    EXPECT_EQ(Saved(), Declaration);
}

TEST_F(OrvixFileIOCreateDocument, PutsTheDeclarationBeforeTheRoot)
{
    Create();
    EXPECT_TRUE(m_file.AddElement(nullptr, L"root", m_node, false));
    EXPECT_EQ(Saved(), Declaration + "<root/>");
}

TEST_F(OrvixFileIOSaveDocument, GivesFalseWithoutADocument)
{
    EXPECT_FALSE(m_file.SaveDocument(m_path.c_str()));
    EXPECT_FALSE(std::filesystem::exists(m_path));
}

TEST_F(OrvixFileIOSaveDocument, GivesFalseAfterTheDocumentWasClosed)
{
    ASSERT_TRUE(m_file.CreateDocument());
    EXPECT_TRUE(m_file.CloseDocument());
    EXPECT_FALSE(m_file.SaveDocument(m_path.c_str()));
}

TEST_F(OrvixFileIOSaveDocument, GivesFalseForAPathThatCannotBeWritten)
{
    Create();
    EXPECT_FALSE(m_file.SaveDocument((m_folder.Path() / L"missing" / L"file.xml").c_str()));
}

TEST_F(OrvixFileIOGetDocumentRoot, IsNullBeforeOpeningAndForACreatedDocument)
{
    EXPECT_EQ(m_file.GetDocumentRoot(), nullptr);
    Create();
    EXPECT_EQ(m_file.GetDocumentRoot(), nullptr);
}

TEST_F(OrvixFileIOGetDocumentRoot, IsTheDocumentNodeOfAnOpenedFile)
{
    Open("<?xml version=\"1.0\"?><!--c--><a/>");
    ASSERT_NE(m_file.GetDocumentRoot(), nullptr);
    EXPECT_EQ(m_file.NumChildNodes(m_file.GetDocumentRoot()->Get()), 3);
}

TEST_F(OrvixFileIOChildren, AreCountedWithTextAndComments)
{
    OpenRoot("<a>text<b/><!--c--><d/></a>");
    EXPECT_EQ(m_file.NumChildNodes(m_node.Get()), 4);
}

TEST_F(OrvixFileIOChildren, AreFoundByIndexWithinTheCountOnly)
{
    OpenRoot("<a><b/><c/></a>");
    Node child;
    EXPECT_FALSE(m_file.GetChildNode(m_node.Get(), -1, child));
    EXPECT_FALSE(m_file.GetChildNode(m_node.Get(), 2, child));
    EXPECT_FALSE(m_file.GetChildNode(m_node.Get(), 0x7FFFFFFF, child));
    EXPECT_TRUE(m_file.GetChildNode(m_node.Get(), 1, child));
    EXPECT_TRUE(m_file.GetNodeName(child.Get(), m_text));
    EXPECT_EQ(m_text, L"c");
    EXPECT_TRUE(m_file.GetChildNode(m_node.Get(), 0, child));
    EXPECT_TRUE(m_file.GetNodeName(child.Get(), m_text));
    EXPECT_EQ(m_text, L"b");
}

TEST_F(OrvixFileIOChildren, OfANullParentAreTheDocuments)
{
    Open("<?xml version=\"1.0\"?><a/>");
    EXPECT_TRUE(m_file.GetChildNode(nullptr, 0, m_node));
    EXPECT_FALSE(m_file.GetNodeName(m_node.Get(), m_text)) << "the declaration is no element";
    EXPECT_TRUE(m_file.GetChildNode(nullptr, 1, m_node));
    EXPECT_TRUE(m_file.GetNodeName(m_node.Get(), m_text));
    EXPECT_EQ(m_text, L"a");
    EXPECT_FALSE(m_file.GetChildNode(nullptr, 2, m_node));
}

TEST_F(OrvixFileIOChildren, AreNoneWithoutADocument)
{
    EXPECT_FALSE(m_file.GetChildNode(nullptr, 0, m_node));
    EXPECT_FALSE(m_file.GetFirstChild(nullptr, m_node));
}

TEST_F(OrvixFileIOChildren, AreWalkedFromTheFirstToTheLast)
{
    OpenRoot("<a><b/>text<c/><!--d--><e/></a>");
    std::vector<std::wstring> names;
    Node child;
    for (bool more = m_file.GetFirstChild(m_node.Get(), child); more; more = m_file.GetNextSibling(child))
    {
        if (m_file.GetNodeName(child.Get(), m_text))
        {
            names.push_back(m_text);
        }
    }
    EXPECT_EQ(child, nullptr);
    EXPECT_EQ(names, (std::vector<std::wstring>{L"b", L"c", L"e"}));
}

TEST_F(OrvixFileIOChildren, OfAnEmptyElementAreNone)
{
    OpenRoot("<a/>");
    Node child;
    EXPECT_EQ(m_file.NumChildNodes(m_node.Get()), 0);
    EXPECT_FALSE(m_file.GetFirstChild(m_node.Get(), child));
}

TEST_F(OrvixFileIOGetNodeName, IsThatOfElementsAlone)
{
    OpenRoot("<a:b xmlns:a=\"urn:x\">text<!--c--><![CDATA[d]]><?e f?></a:b>");
    EXPECT_TRUE(m_file.GetNodeName(m_node.Get(), m_text));
    EXPECT_EQ(m_text, L"a:b");
    for (long i = 0; i < 4; ++i)
    {
        Node child;
        std::wstring name = L"before";
        ASSERT_TRUE(m_file.GetChildNode(m_node.Get(), i, child));
        EXPECT_FALSE(m_file.GetNodeName(child.Get(), name)) << i;
        EXPECT_EQ(name, L"before");
    }
}

TEST_F(OrvixFileIOGetNodeText, JoinsTextCdataAndEntitiesOfAllDescendants)
{
    OpenRoot("<a>one<b> two<c> three</c></b><!--no--> <![CDATA[<4>]]>&amp;&#x5009;</a>");
    EXPECT_TRUE(m_file.GetNodeText(m_node.Get(), m_text));
    EXPECT_EQ(m_text, L"one two three <4>&\u5009");
}

TEST_F(OrvixFileIOGetNodeText, TakesTextsAroundTheSizeOfAStackBufferAndFarBeyond)
{
    for (const std::size_t size : {1u, 126u, 127u, 128u, 129u, 1000u, 1000000u})
    {
        OrvixFileIO file;
        WriteBytes(m_path, "<a>" + std::string(size - 1, 'x') + "y</a>");
        ASSERT_TRUE(file.OpenDocument(m_path.c_str()));
        {
            Node root;
            ASSERT_TRUE(file.GetChildNode(nullptr, 0, root));
            EXPECT_TRUE(file.GetNodeText(root.Get(), m_text));
            EXPECT_EQ(m_text, std::wstring(size - 1, L'x') + L"y");
        }
        file.CloseDocument();
    }
}

TEST_F(OrvixFileIOGetNodeText, IsFalseForATypedValueThatIsNoText)
{
    OpenRoot("<a xmlns:dt=\"urn:schemas-microsoft-com:datatypes\"><b dt:dt=\"int\">42</b><b dt:dt=\"boolean\">1</b>"
             "<b dt:dt=\"r8\">1.5</b><b dt:dt=\"bin.hex\">4142</b><b dt:dt=\"dateTime\">2001-02-03T04:05:06</b>"
             "<b dt:dt=\"string\">text</b></a>");
    Node child;
    for (long i = 0; i < 5; ++i)
    {
        ASSERT_TRUE(m_file.GetChildNode(m_node.Get(), i, child));
        EXPECT_FALSE(m_file.GetNodeText(child.Get(), m_text)) << i;
        EXPECT_EQ(m_text, L"before");
    }
    ASSERT_TRUE(m_file.GetChildNode(m_node.Get(), 5, child));
    EXPECT_TRUE(m_file.GetNodeText(child.Get(), m_text));
    EXPECT_EQ(m_text, L"text");
}

TEST_F(OrvixFileIOFindChildText, ComparesNamesWithTheirLetterCase)
{
    OpenRoot("<a><Text>upper</Text></a>");
    EXPECT_FALSE(m_file.FindChildText(m_node.Get(), L"text", m_text));
    EXPECT_FALSE(m_file.FindChildText(m_node.Get(), L"Tex", m_text));
    EXPECT_FALSE(m_file.FindChildText(m_node.Get(), L"Texts", m_text));
    EXPECT_EQ(m_text, L"before");
    EXPECT_TRUE(m_file.FindChildText(m_node.Get(), L"Text", m_text));
    EXPECT_EQ(m_text, L"upper");
}

TEST_F(OrvixFileIOFindChildText, IsFalseWithoutChildren)
{
    OpenRoot("<a/>");
    EXPECT_FALSE(m_file.FindChildText(m_node.Get(), L"Text", m_text));
}

TEST_F(OrvixFileIOFindChildText, LooksAtChildrenNotAtTheirChildren)
{
    OpenRoot("<a><b><Text>deep</Text></b></a>");
    EXPECT_FALSE(m_file.FindChildText(m_node.Get(), L"Text", m_text));
}

TEST_F(OrvixFileIOFindChildText, TakesTheFirstNamesakeThatCanBeRead)
{
    OpenRoot(R"(<a xmlns:dt="urn:schemas-microsoft-com:datatypes"><T dt:dt="int">1</T><T>two</T><T>three</T></a>)");
    EXPECT_TRUE(m_file.FindChildText(m_node.Get(), L"T", m_text));
    EXPECT_EQ(m_text, L"two");
}

TEST_F(OrvixFileIOFindChildTexts, FindsAllInAnyOrderAndTheFirstOfEach)
{
    OpenRoot("<a>text<C>3</C><A>1</A><!--x--><B>2</B><A>other</A></a>");
    const std::wstring_view names[] = {L"A", L"B", L"C"};
    std::wstring texts[3];
    EXPECT_TRUE(m_file.FindChildTexts(m_node.Get(), names, texts));
    EXPECT_EQ(texts[0], L"1");
    EXPECT_EQ(texts[1], L"2");
    EXPECT_EQ(texts[2], L"3");
}

TEST_F(OrvixFileIOFindChildTexts, IsFalseWhenOneIsMissing)
{
    OpenRoot("<a><A>1</A><C>3</C></a>");
    const std::wstring_view names[] = {L"A", L"B", L"C"};
    std::wstring texts[3];
    EXPECT_FALSE(m_file.FindChildTexts(m_node.Get(), names, texts));
}

TEST_F(OrvixFileIOAddElement, AppendsBehindTheLastChildOrInsertsBeforeTheFirst)
{
    Create();
    Node child;
    EXPECT_TRUE(m_file.AddElement(nullptr, L"root", m_node, false));
    EXPECT_TRUE(m_file.AddElement(m_node.Get(), L"b", child, false));
    EXPECT_TRUE(m_file.AddElement(m_node.Get(), L"c", child, false));
    EXPECT_TRUE(m_file.AddElement(child.Get(), L"d", child, false));
    EXPECT_TRUE(m_file.AddElement(m_node.Get(), L"a", child, true));
    ASSERT_TRUE(m_file.GetNodeName(child.Get(), m_text));
    EXPECT_EQ(m_text, L"a");
    EXPECT_EQ(Saved(), Declaration + "<root><a/><b/><c><d/></c></root>");
}

TEST_F(OrvixFileIOAddElement, InsertsIntoAnElementWithoutChildren)
{
    Create();
    Node child;
    EXPECT_TRUE(m_file.AddElement(nullptr, L"root", m_node, false));
    EXPECT_TRUE(m_file.AddElement(m_node.Get(), L"a", child, true));
    EXPECT_EQ(Saved(), Declaration + "<root><a/></root>");
}

TEST_F(OrvixFileIOAddElement, IsTrueEvenWhenTheElementCannotBeMade)
{
    Create();
    EXPECT_TRUE(m_file.AddElement(nullptr, L"", m_node, false));
    EXPECT_EQ(m_node, nullptr);
    EXPECT_EQ(Saved(), Declaration);
}

TEST_F(OrvixFileIOAddTextElement, MakesAnElementWhoseOnlyChildIsOneText)
{
    Create();
    ASSERT_TRUE(m_file.AddElement(nullptr, L"root", m_node, false));
    EXPECT_TRUE(m_file.AddTextElement(m_node.Get(), L"a", L"<1> & \"2\""));
    EXPECT_TRUE(m_file.AddTextElement(m_node.Get(), L"b", L""));
    Node child;
    ASSERT_TRUE(m_file.GetChildNode(m_node.Get(), 0, child));
    EXPECT_EQ(m_file.NumChildNodes(child.Get()), 1);
    const std::string saved = Saved();
    EXPECT_TRUE(saved == Declaration + "<root><a>&lt;1&gt; &amp; \"2\"</a><b/></root>" ||
                saved == Declaration + "<root><a>&lt;1&gt; &amp; \"2\"</a><b></b></root>")
        << saved;
}

TEST_F(OrvixFileIOAddTextElement, UnderANullParentMakesTheRoot)
{
    Create();
    EXPECT_TRUE(m_file.AddTextElement(nullptr, L"root", L"text"));
    EXPECT_EQ(Saved(), Declaration + "<root>text</root>");
}

TEST_F(OrvixFileIOAddTextElement, IsFalseWhenTheElementCannotBeMade)
{
    Create();
    EXPECT_FALSE(m_file.AddTextElement(nullptr, L"", L"text"));
    EXPECT_EQ(Saved(), Declaration);
}

TEST_F(OrvixFileIOAppendText, AddsToElementsOnly)
{
    Create();
    ASSERT_TRUE(m_file.AddTextElement(nullptr, L"root", L"a"));
    ASSERT_TRUE(m_file.GetChildNode(nullptr, 1, m_node));
    EXPECT_TRUE(m_file.AppendText(m_node.Get(), L"b"));
    ASSERT_TRUE(m_file.GetChildNode(m_node.Get(), 0, m_node));
    EXPECT_FALSE(m_file.AppendText(m_node.Get(), L"c"));
    EXPECT_FALSE(m_file.AppendText(nullptr, L"c"));
    EXPECT_EQ(Saved(), Declaration + "<root>ab</root>");
}

TEST_F(OrvixFileIOAppendText, SavesCharactersThatXmlCannotCarryAsTheReplacementCharacter)
{
    std::wstring text;
    for (wchar_t c = 1; c < 0x20; ++c)
    {
        text += c;
    }
    text += L"\xD800";       // the first half of a pair alone
    text += L"-\xDC00-";     // the second half alone
    text += L"\xDC00\xD800"; // both halves in the wrong order
    text += L"\xD83D\xDE00"; // a pair
    text += L"\xD800\xD83D\xDE00\xDE00";
    text += L"\xFFFD\xFFFE\xFFFF\x7F\x85\xD7FF\xE000";
    std::wstring expected(31, 0xFFFD);
    expected[L'\t' - 1] = L'\t';
    expected[L'\n' - 1] = L'\n';
    expected[L'\r' - 1] = L'\n'; // as every XML reader takes a line end
    expected += L"\xFFFD-\xFFFD-\xFFFD\xFFFD\xD83D\xDE00\xFFFD\xD83D\xDE00\xFFFD\xFFFD\xFFFD\xFFFD\x7F\x85\xD7FF\xE000";

    Create();
    ASSERT_TRUE(m_file.AddTextElement(nullptr, L"root", text.c_str()));
    ASSERT_TRUE(m_file.SaveDocument(m_path.c_str()));

    OrvixFileIO reader;
    ASSERT_TRUE(reader.OpenDocument(m_path.c_str()));
    {
        Node root;
        ASSERT_TRUE(reader.GetChildNode(nullptr, 1, root)) << "the saved file cannot be read";
        ASSERT_TRUE(reader.GetNodeText(root.Get(), m_text));
    }
    reader.CloseDocument();
    // A carriage return may come back as it was or as the line end that it is.
    m_text[L'\r' - 1] = L'\n';
    EXPECT_EQ(m_text, expected);
}

TEST_F(OrvixFileIOAppendText, KeepsWhiteSpaceAndCarriageReturnsInASaveAndLoad)
{
    const std::wstring texts[] = {L"a\rb",        L"a\r\nb", L" out er ", L"\r\nx\n",   L"\t",     L"",
                                  L"a\nb inside", L"\r",     L"\r\r",     L"a\r \r\nb", L"a & <b>"};
    Create();
    ASSERT_TRUE(m_file.AddElement(nullptr, L"root", m_node, false));
    for (const std::wstring& text : texts)
    {
        EXPECT_TRUE(m_file.AddTextElement(m_node.Get(), L"t", text.c_str()));
    }
    ASSERT_TRUE(m_file.SaveDocument(m_path.c_str()));

    OrvixFileIO reader;
    ASSERT_TRUE(reader.OpenDocument(m_path.c_str()));
    const OpenedDocument opened(reader);
    Node root;
    Node child;
    std::wstring name;
    ASSERT_TRUE(reader.GetRootElement(root, name));
    bool more = reader.GetFirstChild(root.Get(), child);
    for (const std::wstring& text : texts)
    {
        ASSERT_TRUE(more);
        std::wstring read = L"nothing";
        EXPECT_TRUE(reader.GetNodeText(child.Get(), read));
        EXPECT_EQ(read, text);
        more = reader.GetNextSibling(child);
    }
}

TEST_F(OrvixFileIOSetAttribute, SetsAndReplacesOnElements)
{
    Create();
    ASSERT_TRUE(m_file.AddElement(nullptr, L"root", m_node, false));
    EXPECT_TRUE(m_file.SetAttribute(m_node.Get(), L"version", L"0.9"));
    EXPECT_TRUE(m_file.SetAttribute(m_node.Get(), L"version", L"1.0 & <more>"));
    EXPECT_EQ(Saved(), Declaration + "<root version=\"1.0 &amp; &lt;more&gt;\"/>");
}

TEST_F(OrvixFileIOSetAttribute, IsFalseForWhatIsNoElement)
{
    Create();
    ASSERT_TRUE(m_file.GetChildNode(nullptr, 0, m_node));
    EXPECT_FALSE(m_file.SetAttribute(m_node.Get(), L"version", L"1.0"));
}

TEST_F(OrvixFileIOSetAttribute, IsTrueWhateverTheDocumentSaysToIt)
{
    Create();
    ASSERT_TRUE(m_file.AddElement(nullptr, L"root", m_node, false));
    EXPECT_TRUE(m_file.SetAttribute(m_node.Get(), L"no name", L"1"));
}

TEST_F(OrvixFileIOCloseDocument, LeavesAThreadWithoutComAsItWas)
{
    WriteBytes(m_path, "<a><b/></a>");
    std::thread([&] {
        OrvixFileIO reader;
        EXPECT_TRUE(reader.OpenDocument(m_path.c_str()));
        EXPECT_TRUE(HasApartment());
        EXPECT_TRUE(reader.CloseDocument());
        EXPECT_FALSE(HasApartment());
        EXPECT_EQ(reader.GetDocumentRoot(), nullptr) << "a pointer outlived COM";

        OrvixFileIO writer;
        EXPECT_TRUE(writer.CreateDocument());
        EXPECT_TRUE(writer.SaveDocument(m_path.c_str()));
        EXPECT_TRUE(writer.CloseDocument());
        EXPECT_FALSE(HasApartment());
    }).join();
}

TEST_F(OrvixFileIOCloseDocument, IsWhatLeavesCom)
{
    WriteBytes(m_path, "<a/>");
    std::thread([&] {
        {
            OrvixFileIO file;
            EXPECT_TRUE(file.OpenDocument(m_path.c_str()));
        }
        EXPECT_TRUE(HasApartment());
        CoUninitialize();
        EXPECT_FALSE(HasApartment());
    }).join();
}

TEST_F(OrvixFileIOOpenDocument, FailsOnAThreadOfTheMultithreadedApartmentAndLeavesItThere)
{
    WriteBytes(m_path, "<a/>");
    std::thread([&] {
        ASSERT_EQ(CoInitializeEx(nullptr, COINIT_MULTITHREADED), S_OK);
        {
            OrvixFileIO file;
            EXPECT_FALSE(file.OpenDocument(m_path.c_str()));
            EXPECT_FALSE(file.CreateDocument());
            EXPECT_EQ(file.GetDocumentRoot(), nullptr);
            EXPECT_FALSE(file.SaveDocument(m_path.c_str()));
        }
        CoUninitialize();
        EXPECT_FALSE(HasApartment());
    }).join();
    EXPECT_EQ(ReadBytes(m_path), "<a/>");
}

TEST(OpenedDocument, ClosesAtTheEndOfItsScopeAlsoWhenAnExceptionLeavesIt)
{
    std::thread([] {
        OrvixFileIO file;
        try
        {
            ASSERT_TRUE(file.CreateDocument());
            const OpenedDocument opened(file);
            throw 1;
        }
        catch (int)
        {
        }
        EXPECT_FALSE(HasApartment());
    }).join();
}
