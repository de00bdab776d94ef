// Texts that are cut, and libraries that write as much as the interface lets them.

#include "Bridge.h"
#include "CodePage.h"
#include "Files.h"

#include <algorithm>
#include <cstring>
#include <functional>

using testing::ElementsAre;
using testing::HasSubstr;

namespace
{

constexpr UINT ShiftJis = 932;

/// A character of two bytes in code page 932, and in UTF-8.
constexpr const char* KanaBytes = "\x83\x5c";
constexpr const char* KanaUtf8 = "\xe3\x82\xbd";

std::string Repeat(const std::string& text, int times)
{
    std::string repeated;
    for (int n = 0; n < times; ++n)
    {
        repeated += text;
    }
    return repeated;
}

class BridgeTexts : public Bridge
{
protected:
    BridgeTexts() { m_bridge->SetProjectSettingsFile(L"settings.xml"); }

    void WriteSettings(const std::string& auxPath, const std::string& projectName) const
    {
        WriteBytes(m_folder.Path() / L"settings.xml", "<MSSCCProjectSettings><AuxPath>" + auxPath +
                                                          "</AuxPath><ProjectName>" + projectName +
                                                          "</ProjectName></MSSCCProjectSettings>");
    }

    std::string Settings() const { return ReadBytes(m_folder.Path() / L"settings.xml"); }

    /// From now on the library does this with each text that it may write in SccOpenProject.
    void WriteInOpenProject(const std::function<void(char* text)>& write)
    {
        m_recorder.openProject = [write](LPVOID, HWND, LPSTR user, LPCSTR, LPCSTR, LPSTR auxPath, LPCSTR, LPTEXTOUTPROC,
                                         LONG) {
            write(user);
            write(auxPath);
            return SCC_OK;
        };
    }

    /// The same for SccGetProjPath.
    void WriteInGetProjPath(const std::function<void(char* text)>& write)
    {
        m_recorder.getProjPath = [write](LPVOID, HWND, LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath,
                                         BOOL, LPBOOL) {
            for (char* text : {user, projectName, localPath, auxPath})
            {
                write(text);
            }
            return SCC_OK;
        };
    }

    SCCRTN Choose() { return m_bridge->GetProjPath(nullptr, nullptr, nullptr, nullptr, TRUE); }

    /// The call of SccGetProjPath when the user chooses a project.
    std::string Choice()
    {
        m_recorder.getProjPath = nullptr;
        m_recorder.calls.clear();
        EXPECT_EQ(Choose(), SCC_OK);
        return Calls().at(0);
    }
};

using BridgeWildLibrary = BridgeTexts;

TEST_F(BridgeTexts, PassTheFirst31BytesOfTheAuxiliaryPathAndTheWholeProjectName)
{
    WriteSettings(std::string(32, 'a'), std::string(260, 'p'));
    Start();
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", std::string(260, 'p'), std::string(31, 'a'))));
    EXPECT_EQ(Choice(), GetProjPathCall("", std::string(260, 'p'), "", std::string(31, 'a')));
}

TEST_F(BridgeTexts, KeepTheRestOfACutAuxiliaryPathThatComesBackUnchanged)
{
    const std::string path = std::string(31, 'a') + " and the rest";
    WriteSettings(path, "song");
    Start();
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Settings(), HasSubstr("<AuxPath>" + path + "</AuxPath>"));
}

TEST_F(BridgeTexts, DropTheRestOfACutAuxiliaryPathThatComesBackShorter)
{
    WriteSettings(std::string(31, 'a') + " and the rest", "song");
    Start();
    WriteInOpenProject([](char* text) { std::strcpy(text, "new"); });
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Settings(), HasSubstr("<AuxPath>new</AuxPath>"));
}

TEST_F(BridgeTexts, LeaveNothingOfALongerOne)
{
    WriteSettings(std::string(50, 'a'), "song");
    Start();
    EXPECT_EQ(Open(), SCC_OK);
    WriteSettings("short", "song");
    WriteInOpenProject([](char* text) { std::strcpy(text, std::string(31, 'o').c_str()); });
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Settings(), HasSubstr("<AuxPath>" + std::string(31, 'o') + "</AuxPath>"));
}

TEST_F(BridgeTexts, AreReadUpToTheirOwnLimits)
{
    Start();
    WriteInGetProjPath([](char* text) { std::strcpy(text, std::string(300, 'x').c_str()); });
    EXPECT_EQ(Choose(), SCC_OK);
    EXPECT_EQ(Choice(), GetProjPathCall(std::string(31, 'x'), std::string(260, 'x'), std::string(259, 'x'),
                                        std::string(31, 'x')));
    m_bridge->SetProjectSettingsFile({});
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(OpenCall(std::string(31, 'x'), std::string(260, 'x'), std::string(31, 'x'))));
}

TEST_F(BridgeTexts, AreWrittenToTheSettingsFileAsFarAsTheyWereRead)
{
    m_recorder.initialize = [](LPVOID*, HWND, LPCSTR, LPSTR, LPLONG, LPSTR label, LPLONG, LPLONG) {
        std::strcpy(label, std::string(40, 'l').c_str());
        return SCC_OK;
    };
    Start();
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Settings(), HasSubstr("<AuxPath>" + std::string(31, 'l') + "</AuxPath>"));

    WriteInOpenProject([](char* text) { std::strcpy(text, std::string(40, 'o').c_str()); });
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Settings(), HasSubstr("<AuxPath>" + std::string(31, 'o') + "</AuxPath>"));

    EXPECT_EQ(m_bridge->Uninitialize(), SCC_OK);
    m_recorder.initialize = nullptr;
    Start();
    std::filesystem::remove(m_folder.Path() / L"settings.xml");
    WriteInGetProjPath([](char* text) { std::strcpy(text, std::string(300, 'x').c_str()); });
    EXPECT_EQ(Choose(), SCC_OK);
    m_recorder.openProject = nullptr;
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Settings(), HasSubstr("<AuxPath>" + std::string(31, 'x') + "</AuxPath>"));
    EXPECT_THAT(Settings(), HasSubstr("<ProjectName>" + std::string(260, 'x') + "</ProjectName>"));
}

TEST_F(BridgeTexts, ArePassedAsAnsiAndReadAsWide)
{
    const CodePage shiftJis(ShiftJis);
    WriteSettings(KanaUtf8, Repeat(KanaUtf8, 2));
    Start();
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", Repeat(KanaBytes, 2), KanaBytes)));
    EXPECT_THAT(Settings(), HasSubstr(std::string("<AuxPath>") + KanaUtf8 + "</AuxPath>"));

    WriteInOpenProject([](char* text) { std::strcpy(text, Repeat(KanaBytes, 3).c_str()); });
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Settings(), HasSubstr("<AuxPath>" + Repeat(KanaUtf8, 3) + "</AuxPath>"));
}

TEST_F(BridgeTexts, AreCutBetweenCharactersOfTwoBytes)
{
    const CodePage shiftJis(ShiftJis);
    WriteSettings(Repeat(KanaUtf8, 20), "x" + Repeat(KanaUtf8, 259));
    Start();
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "x" + Repeat(KanaBytes, 259), Repeat(KanaBytes, 15))));
    EXPECT_EQ(Choice(), GetProjPathCall("", "x" + Repeat(KanaBytes, 149), "", Repeat(KanaBytes, 15)));

    m_bridge->SetProjectSettingsFile({});
    const auto choose = [this] {
        WriteInGetProjPath([](char* text) { std::strcpy(text, Repeat(KanaBytes, 150).c_str()); });
        EXPECT_EQ(Choose(), SCC_OK);
    };
    choose();
    EXPECT_EQ(Choice(), GetProjPathCall(Repeat(KanaBytes, 15), Repeat(KanaBytes, 150), Repeat(KanaBytes, 129),
                                        Repeat(KanaBytes, 15)));
    choose();
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_EQ(Calls().back(), OpenCall(Repeat(KanaBytes, 15), Repeat(KanaBytes, 150), Repeat(KanaBytes, 15)));
}

TEST_F(BridgeWildLibrary, MayPadEveryTextWithZeros)
{
    Start();
    for (const std::size_t size : {260u, 301u})
    {
        const auto clear = [size](char* text) { std::strncpy(text, "ada", size); };
        WriteInOpenProject(clear);
        EXPECT_EQ(Open(), SCC_OK);
        WriteInGetProjPath(clear);
        EXPECT_EQ(Choose(), SCC_OK);
        EXPECT_EQ(Choice(), GetProjPathCall("ada", "ada", "ada", "ada"));
        WriteInGetProjPath([size](char* text) { std::memset(text, 0, size); });
        EXPECT_EQ(Choose(), SCC_OK);
        EXPECT_EQ(Choice(), GetProjPathCall("", "", "", ""));
    }
}

TEST_F(BridgeWildLibrary, MayFillEveryTextWithoutATerminator)
{
    Start();
    for (const std::size_t size : {32u, 260u, 301u})
    {
        const auto fill = [size](char* text) { std::fill_n(text, size, 'x'); };
        WriteInOpenProject(fill);
        EXPECT_EQ(Open(), SCC_OK);
        EXPECT_TRUE(m_bridge->IsProjectOpen());
        EXPECT_THAT(Settings(), HasSubstr("<AuxPath>" + std::string(31, 'x') + "</AuxPath>"));
        WriteInGetProjPath(fill);
        EXPECT_EQ(Choose(), SCC_OK);
        EXPECT_EQ(Choice(), GetProjPathCall(std::string(31, 'x'), std::string(std::min<std::size_t>(size, 260), 'x'),
                                            std::string(std::min<std::size_t>(size, 259), 'x'), std::string(31, 'x')));
        WriteInGetProjPath([](char* text) { *text = '\0'; });
        EXPECT_EQ(Choose(), SCC_OK);
    }
}

TEST_F(BridgeWildLibrary, MayFillTheTextsOfItsStart)
{
    for (const std::size_t size : {32u, 260u, 301u})
    {
        NewBridge(L"recording_full");
        m_bridge->SetProjectSettingsFile(L"settings.xml");
        std::filesystem::remove(m_folder.Path() / L"settings.xml");
        m_recorder.initialize = [size](LPVOID*, HWND, LPCSTR, LPSTR sccName, LPLONG, LPSTR label, LPLONG, LPLONG) {
            std::fill_n(sccName, size, 'x');
            std::fill_n(label, size, 'y');
            return SCC_OK;
        };
        Start();
        EXPECT_STREQ(m_bridge->GetProviderName(), L"Depot");
        EXPECT_EQ(Open(), SCC_OK);
        EXPECT_THAT(Settings(), HasSubstr("<AuxPath>" + std::string(31, 'y') + "</AuxPath>"));
        EXPECT_EQ(m_bridge->Uninitialize(), SCC_OK);
        Calls();
        EXPECT_EQ(m_bridge->Initialize("host"), SCC_OK);
        EXPECT_THAT(Calls(),
                    ElementsAre("SccInitialize(0x0, 0x1234, \"host\", \"" + std::string(31, 'x') + "\", \"\")"));
    }
}

TEST_F(BridgeWildLibrary, MayWriteIntoTheProjectNameOfOpenProjectWithoutEffect)
{
    Start();
    m_recorder.openProject = [](LPVOID, HWND, LPSTR, LPCSTR projectName, LPCSTR, LPSTR, LPCSTR, LPTEXTOUTPROC, LONG) {
        std::fill_n(const_cast<char*>(projectName), 301, 'x');
        return SCC_OK;
    };
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_EQ(Choice(), GetProjPathCall("", "", "", ""));
    EXPECT_THAT(Settings(), HasSubstr("<ProjectName></ProjectName>"));
}

TEST_F(BridgeWildLibrary, MayFillTheLocalPathOfOpenProjectUpToItsMaximum)
{
    m_recorder.openProject = [](LPVOID, HWND, LPSTR, LPCSTR, LPCSTR localPath, LPSTR, LPCSTR, LPTEXTOUTPROC, LONG) {
        std::memset(const_cast<char*>(localPath), 'x', MAX_PATH);
        return SCC_OK;
    };
    const std::string folder = "C:\\p";
    EXPECT_EQ(m_bridge->OpenProject(folder.c_str(), "", nullptr), SCC_OK);
    EXPECT_EQ(folder, "C:\\p");
}

TEST_F(BridgeWildLibrary, GetsTheProjectNameThatItWroteInTheSecondAttempt)
{
    Start();
    int attempts = 0;
    m_recorder.openProject = [&attempts](LPVOID, HWND, LPSTR, LPCSTR projectName, LPCSTR, LPSTR, LPCSTR, LPTEXTOUTPROC,
                                         LONG) {
        if (++attempts == 2)
        {
            return SCC_OK;
        }
        std::fill_n(const_cast<char*>(projectName), 301, 'x');
        return SCC_E_PROJSYNTAXERR;
    };
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "", ""), GetProjPathCall("", "", "", ""),
                                     OpenCall("", std::string(301, 'x'), "")));
}

TEST_F(BridgeWildLibrary, MayWriteBytesThatAreNoTextInTheCodePage)
{
    const CodePage shiftJis(ShiftJis);
    Start();
    WriteInOpenProject([](char* text) { std::fill_n(text, 301, '\x83'); }); // halves of characters
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_TRUE(m_bridge->IsProjectOpen());
}

} // namespace
