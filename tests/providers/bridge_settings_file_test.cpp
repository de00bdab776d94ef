// The project settings file in the project's folder.

#include "Bridge.h"
#include "CodePage.h"
#include "FileBytes.h"
#include "Files.h"

#include <cstring>
#include <filesystem>

using testing::ElementsAre;
using testing::HasSubstr;

namespace
{

constexpr UINT Western = 1252;

class SettingsFile : public Bridge
{
protected:
    SettingsFile() { m_bridge->SetProjectSettingsFile(L"settings.xml"); }

    std::filesystem::path Path() const { return m_folder.Path() / L"settings.xml"; }

    void Write(const std::string& xml) const { WriteBytes(Path(), xml); }

    /// The file without line ends, which the XML service chooses.
    std::string Content() const
    {
        std::string xml = ReadBytes(Path());
        std::erase_if(xml, [](char c) { return c == '\r' || c == '\n'; });
        return xml;
    }

    static std::string Shape(const std::string& auxPath, const std::string& projectName)
    {
        return "<?xml version=\"1.0\" standalone=\"yes\"?><MSSCCProjectSettings><AuxPath>" + auxPath +
               "</AuxPath><ProjectName>" + projectName + "</ProjectName></MSSCCProjectSettings>";
    }

    /// The library chooses these texts in SccGetProjPath.
    void Choose(const std::string& auxPath, const std::string& projectName)
    {
        m_recorder.getProjPath = [=](LPVOID, HWND, LPSTR, LPSTR name, LPSTR, LPSTR path, BOOL, LPBOOL) {
            std::strcpy(name, projectName.c_str());
            std::strcpy(path, auxPath.c_str());
            return SCC_OK;
        };
        EXPECT_EQ(m_bridge->GetProjPath(nullptr, nullptr, nullptr, nullptr, TRUE), SCC_OK);
        m_recorder.calls.clear();
    }

    /// Opens a project with "old" as auxiliary path and "name" as project name beside this file. The texts that the
    /// library gets then show what was read.
    void ExpectRead(const std::string& xml, const std::string& auxPath, const std::string& projectName)
    {
        SCOPED_TRACE(xml.substr(0, 200));
        NewBridge(L"recording_full");
        m_bridge->SetProjectSettingsFile(L"settings.xml");
        Start();
        Choose("old", "name");
        Write(xml);
        EXPECT_EQ(Open(), SCC_OK);
        EXPECT_THAT(Calls(), ElementsAre(OpenCall("", projectName, auxPath)));
    }
};

using SettingsFileReading = SettingsFile;
using SettingsFileWriting = SettingsFile;

TEST_F(SettingsFileReading, GivesBothTexts)
{
    ExpectRead(Shape("server", "$/song"), "server", "$/song");
    ExpectRead(Shape("", ""), "", "");
    ExpectRead("<MSSCCProjectSettings><ProjectName>b</ProjectName><AuxPath>a</AuxPath></MSSCCProjectSettings>", "a",
               "b");
    ExpectRead("<MSSCCProjectSettings><AuxPath>a &amp; b</AuxPath></MSSCCProjectSettings>", "a & b", "name");
    ExpectRead("<MSSCCProjectSettings><ProjectName>b</ProjectName></MSSCCProjectSettings>", "old", "b");
}

TEST_F(SettingsFileReading, IgnoresLetterCase)
{
    ExpectRead("<mssccPROJECTsettings><AUXPATH>a</AUXPATH><projectname>b</projectname></mssccPROJECTsettings>", "a",
               "b");
}

TEST_F(SettingsFileReading, TakesTheLastOfSeveral)
{
    ExpectRead("<MSSCCProjectSettings><AuxPath>long one</AuxPath><ProjectName>c</ProjectName><auxpath>b</auxpath>"
               "<ProjectName>d</ProjectName></MSSCCProjectSettings>",
               "b", "d");
}

TEST_F(SettingsFileReading, IgnoresEverythingElse)
{
    ExpectRead("<?xml version=\"1.0\"?><!-- c --><?other pi?><MSSCCProjectSettings><!-- c --><Path>x</Path>text"
               "<AuxPathName>y</AuxPathName><AuxPath>a</AuxPath><Deeper><ProjectName>z</ProjectName></Deeper>"
               "</MSSCCProjectSettings>",
               "a", "name");
}

TEST_F(SettingsFileReading, FindsARootAfterOtherNodes)
{
    ExpectRead("<?xml version=\"1.0\"?><!-- first --><!-- second --><MSSCCProjectSettings><AuxPath>a</AuxPath>"
               "</MSSCCProjectSettings><!-- last -->",
               "a", "name");
}

TEST_F(SettingsFileReading, FindsTheRootAfterADocumentTypeThatNothingRefersTo)
{
    for (const char* type :
         {"<!DOCTYPE MSSCCProjectSettings>", "<!DOCTYPE a [<!ELEMENT a ANY>]>", R"(<!DOCTYPE a SYSTEM "b.dtd">)"})
    {
        SCOPED_TRACE(type);
        ExpectRead(type + Shape("server", "$/song").substr(Shape("", "").find("<MSS")), "server", "$/song");
    }
}

TEST_F(SettingsFileReading, CutsATextAt260Characters)
{
    ExpectRead(Shape("", std::string(261, 'p')), "", std::string(260, 'p'));
    ExpectRead(Shape("", std::string(100000, 'p')), "", std::string(260, 'p'));
    NewBridge(L"recording_full");
    m_bridge->SetProjectSettingsFile(L"settings.xml");
    Write(Shape(std::string(300, 'a'), ""));
    Start();
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_EQ(Content(), Shape(std::string(260, 'a'), ""));
}

TEST_F(SettingsFileReading, OfAFileThatCannotBeUsedChangesNothing)
{
    const std::string settings = "<MSSCCProjectSettings><AuxPath>a</AuxPath></MSSCCProjectSettings>";
    const std::string entity = "<!DOCTYPE MSSCCProjectSettings [<!ENTITY e \"a\">]>";
    const std::vector<std::string> files = {"",
                                            "no XML",
                                            "<MSSCCProjectSettings><AuxPath>a</AuxPath>",
                                            "<MSSCCProjectSettings><AuxPath>a</Aux>",
                                            "<Other><AuxPath>a</AuxPath></Other>",
                                            "<AuxPath>a</AuxPath>",
                                            "<MSSCCProjectSettings/>",
                                            "<Other>" + settings + "</Other>",
                                            entity +
                                                "<MSSCCProjectSettings><AuxPath>&e;</AuxPath></MSSCCProjectSettings>"};
    for (const std::string& xml : files)
    {
        ExpectRead(xml, "old", "name");
    }
}

TEST_F(SettingsFileReading, OfAMissingFileChangesNothing)
{
    Start();
    Choose("old", "name");
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "name", "old")));
}

TEST_F(SettingsFileReading, CountsEvenWhenTheProjectDoesNotOpen)
{
    Write(Shape("server", "$/song"));
    Start();
    m_recorder.results["SccOpenProject"] = SCC_E_UNKNOWNPROJECT;
    EXPECT_EQ(Open(), SCC_E_UNKNOWNPROJECT);
    m_bridge->SetProjectSettingsFile({});
    EXPECT_EQ(Open(), SCC_E_UNKNOWNPROJECT);
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "$/song", "server"), OpenCall("", "$/song", "server")));
}

TEST_F(SettingsFileReading, DoesNotHappenForALibraryThatCannotOpenProjects)
{
    NewBridge(L"recording_without_SccOpenProject");
    m_bridge->SetProjectSettingsFile(L"settings.xml");
    Write(Shape("server", "$/song"));
    Start();
    EXPECT_EQ(Open(), SCC_E_INITIALIZEFAILED);
    EXPECT_EQ(m_bridge->GetProjPath(nullptr, nullptr, nullptr, nullptr, TRUE), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(GetProjPathCall("", "", "", "")));
}

TEST_F(SettingsFileReading, ClosesTheFile)
{
    Write(Shape("server", "$/song"));
    StartAndOpen();
    EXPECT_TRUE(std::filesystem::remove(Path()));
}

TEST_F(SettingsFileWriting, GivesADeclarationAndBothTextsInOrder)
{
    Start();
    Choose("the server", "$/song & <dance>");
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_EQ(Content(), Shape("the server", "$/song &amp; &lt;dance&gt;"));
}

TEST_F(SettingsFileWriting, OfEmptyTextsKeepsTheElements)
{
    StartAndOpen();
    EXPECT_EQ(Content(), Shape("", ""));
}

TEST_F(SettingsFileWriting, KeepsTheTextsOfTheLibraryForTheNextRun)
{
    Start();
    m_recorder.openProject = [](LPVOID, HWND, LPSTR, LPCSTR, LPCSTR, LPSTR auxPath, LPCSTR, LPTEXTOUTPROC, LONG) {
        std::strcpy(auxPath, "given");
        return SCC_OK;
    };
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_EQ(Content(), Shape("given", ""));
    NewBridge(L"recording_full");
    m_bridge->SetProjectSettingsFile(L"settings.xml");
    m_recorder.openProject = nullptr;
    Start();
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "", "given")));
}

TEST_F(SettingsFileWriting, ReplacesAnEarlierFileCompletely)
{
    Write("<MSSCCProjectSettings><AuxPath>a</AuxPath><Other>lost</Other></MSSCCProjectSettings>");
    StartAndOpen();
    EXPECT_EQ(Content(), Shape("a", ""));
    Write("no XML at all, and longer than what is written instead: " + std::string(1000, ' '));
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_EQ(Content(), Shape("a", ""));
}

TEST_F(SettingsFileWriting, HappensWithTheSecondAttemptToOpen)
{
    Start();
    m_recorder.getProjPath = [](LPVOID, HWND, LPSTR, LPSTR projectName, LPSTR, LPSTR auxPath, BOOL, LPBOOL) {
        std::strcpy(projectName, "$/song");
        std::strcpy(auxPath, "server");
        return SCC_OK;
    };
    bool first = true;
    m_recorder.openProject = [&](LPVOID, HWND, LPSTR, LPCSTR, LPCSTR, LPSTR, LPCSTR, LPTEXTOUTPROC, LONG) {
        return std::exchange(first, false) ? SCC_E_PROJSYNTAXERR : SCC_OK;
    };
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_EQ(Content(), Shape("", "$/song")); // the auxiliary path is that of the attempt
}

TEST_F(SettingsFileWriting, OfTextThatXmlCannotCarryStaysReadable)
{
    Start();
    Choose("a\x01"
           "b",
           "$/song");
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_EQ(Content(), Shape("a\xef\xbf\xbd"
                               "b",
                               "$/song"));
    NewBridge(L"recording_full");
    m_bridge->SetProjectSettingsFile(L"settings.xml");
    Start();
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "$/song", "a?b")));
}

TEST_F(SettingsFileWriting, DoesNotFollowAFailedOpening)
{
    Start();
    for (const SCCRTN result : {SCC_E_UNKNOWNPROJECT, SCC_I_OPERATIONCANCELED, SCC_E_PROJSYNTAXERR})
    {
        m_recorder.results["SccOpenProject"] = result;
        EXPECT_EQ(Open(), result);
    }
    m_recorder.throwing = {"SccOpenProject"};
    EXPECT_EQ(Open(), SCC_E_INITIALIZEFAILED);
    EXPECT_TRUE(std::filesystem::is_empty(m_folder.Path()));
}

TEST_F(SettingsFileWriting, AndReadingDoNotHappenWithoutAName)
{
    m_bridge->SetProjectSettingsFile({});
    Write(Shape("server", "$/song"));
    Start();
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "", "")));
    EXPECT_EQ(Content(), Shape("server", "$/song"));
    std::filesystem::remove(Path());
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_TRUE(std::filesystem::is_empty(m_folder.Path()));
}

TEST_F(SettingsFileWriting, ThatFailsIsSilent)
{
    Start();
    Choose("server", "$/song");
    EXPECT_EQ(m_bridge->OpenProject((Project() + "\\missing").c_str(), "", nullptr), SCC_OK);
    EXPECT_TRUE(m_bridge->IsProjectOpen());
    EXPECT_TRUE(std::filesystem::is_empty(m_folder.Path()));

    Write(Shape("kept", ""));
    ASSERT_TRUE(SetFileAttributesW(Path().c_str(), FILE_ATTRIBUTE_READONLY));
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_TRUE(m_bridge->IsProjectOpen());
    EXPECT_EQ(Content(), Shape("kept", ""));
    SetFileAttributesW(Path().c_str(), FILE_ATTRIBUTE_NORMAL);
    std::filesystem::remove(Path());

    std::filesystem::create_directory(Path());
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_TRUE(std::filesystem::is_empty(Path()));
}

TEST_F(SettingsFileWriting, WorksForAFolderThatEndsWithABackslash)
{
    Start();
    EXPECT_EQ(m_bridge->OpenProject((Project() + "\\").c_str(), "comment", nullptr), SCC_OK);
    EXPECT_EQ(Content(), Shape("", ""));
    Write(Shape("server", ""));
    EXPECT_EQ(m_bridge->OpenProject((Project() + "\\").c_str(), "comment", nullptr), SCC_OK);
    EXPECT_THAT(Calls().back(), HasSubstr("\"server\""));
}

TEST_F(SettingsFileWriting, GoesToAFolderWithANonAsciiName)
{
    const CodePage western(Western);
    const std::filesystem::path folder = m_folder.Path() / L"r\u00e9sum\u00e9";
    std::filesystem::create_directory(folder);
    Start();
    EXPECT_EQ(m_bridge->OpenProject((Project() + "\\r\xe9sum\xe9").c_str(), "", nullptr), SCC_OK);
    EXPECT_TRUE(std::filesystem::exists(folder / L"settings.xml"));
}

} // namespace

TEST_F(SettingsFile, ThatCannotBeReadIsKeptBeforeItIsReplaced)
{
    const std::filesystem::path kept = FileBytes::KeptName(Path().wstring());
    for (const std::string xml : {"<MSSCCProjectSettings><AuxPath>a</Aux", "<Other/>"})
    {
        Write(xml);
        Start();
        Choose("path", "project");
        EXPECT_EQ(Open(), SCC_OK);
        EXPECT_EQ(Content(), Shape("path", "project"));
        EXPECT_EQ(ReadBytes(kept), xml);
        std::filesystem::remove(kept);
        NewBridge(L"recording_full");
        m_bridge->SetProjectSettingsFile(L"settings.xml");
    }
    Start();
    Choose("path", "project");
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_FALSE(std::filesystem::exists(kept)) << "it was read";
}

TEST_F(SettingsFile, OfANameThatIsNotBareIsNotUsed)
{
    for (const wchar_t* name : {L"..\\settings.xml", L"sub\\settings.xml", L"settings.xml:stream", L"NUL", L".."})
    {
        NewBridge(L"recording_full");
        m_bridge->SetProjectSettingsFile(name);
        Start();
        Choose("path", "project");
        EXPECT_EQ(Open(), SCC_OK);
        EXPECT_TRUE(std::filesystem::is_empty(m_folder.Path()));
        EXPECT_FALSE(std::filesystem::exists(m_folder.Path().parent_path() / L"settings.xml"));
    }
}
