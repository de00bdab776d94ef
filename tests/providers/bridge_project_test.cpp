// Opening and closing a project.

#include "Bridge.h"

#include <cstring>

using testing::ElementsAre;
using testing::IsEmpty;

namespace
{

using BridgeOpenProject = Bridge;
using BridgeCloseProject = Bridge;
using BridgeGetProjPath = Bridge;

LONG TextOutput(LPCSTR, LONG)
{
    return 0;
}

TEST_F(BridgeOpenProject, PassesTheHostsArguments)
{
    Start();
    const std::string folder = Project();
    const std::string text = "a comment";
    m_recorder.openProject = [&](LPVOID, HWND, LPSTR, LPCSTR, LPCSTR localPath, LPSTR, LPCSTR comment,
                                 LPTEXTOUTPROC output, LONG flags) {
        EXPECT_STREQ(localPath, folder.c_str());
        EXPECT_EQ(comment, text.c_str());
        EXPECT_EQ(output, &TextOutput);
        EXPECT_EQ(flags, SCC_OP_CREATEIFNEW);
        return SCC_OK;
    };
    EXPECT_EQ(m_bridge->OpenProject(folder.c_str(), text.c_str(), &TextOutput), SCC_OK);
    EXPECT_TRUE(m_bridge->IsProjectOpen());
    EXPECT_EQ(Calls().size(), 1u);
}

TEST_F(BridgeOpenProject, PassesNull)
{
    Start();
    m_bridge->SetProjectSettingsFile(L"settings.xml");
    EXPECT_EQ(m_bridge->OpenProject(nullptr, nullptr, nullptr), SCC_OK);
    EXPECT_TRUE(m_bridge->IsProjectOpen());
    EXPECT_THAT(Calls(), ElementsAre("SccOpenProject(0x77, 0x1234, \"\", \"\", null, \"\", null, 0x1)"));
}

TEST_F(BridgeOpenProject, KeepsTheUserAndTheAuxiliaryPathOfTheLibrary)
{
    Start();
    m_recorder.openProject = [](LPVOID, HWND, LPSTR user, LPCSTR, LPCSTR, LPSTR auxPath, LPCSTR, LPTEXTOUTPROC, LONG) {
        std::strcpy(user, "ada");
        std::strcpy(auxPath, "server");
        return SCC_OK;
    };
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_EQ(m_bridge->CloseProject(), SCC_OK);
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "", ""), "SccCloseProject(0x77)", OpenCall("ada", "", "server")));
}

TEST_F(BridgeOpenProject, ThatFailsKeepsNoText)
{
    Start();
    m_recorder.openProject = [](LPVOID, HWND, LPSTR user, LPCSTR, LPCSTR, LPSTR auxPath, LPCSTR, LPTEXTOUTPROC, LONG) {
        std::strcpy(user, "ada");
        std::strcpy(auxPath, "server");
        return SCC_E_UNKNOWNPROJECT;
    };
    for (int attempt = 0; attempt < 2; ++attempt)
    {
        EXPECT_EQ(Open(), SCC_E_UNKNOWNPROJECT);
        EXPECT_FALSE(m_bridge->IsProjectOpen());
        EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "", "")));
    }
}

TEST_F(BridgeOpenProject, WithAPositiveResultHasNotOpenedIt)
{
    Start();
    m_recorder.results["SccOpenProject"] = SCC_I_OPERATIONCANCELED;
    EXPECT_EQ(Open(), SCC_I_OPERATIONCANCELED);
    EXPECT_FALSE(m_bridge->IsProjectOpen());
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "", "")));
}

TEST_F(BridgeOpenProject, ClosesTheOpenOneFirstWhateverTheResult)
{
    StartAndOpen();
    m_recorder.results["SccCloseProject"] = SCC_E_NONSPECIFICERROR;
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre("SccCloseProject(0x77)", OpenCall("", "", "")));
    m_recorder.results["SccOpenProject"] = SCC_E_UNKNOWNPROJECT;
    EXPECT_EQ(Open(), SCC_E_UNKNOWNPROJECT);
    EXPECT_FALSE(m_bridge->IsProjectOpen());
}

TEST_F(BridgeOpenProject, ThatIsRefusedForItsTextsLetsTheUserChooseAndTriesTheOldTextsAgain)
{
    Start();
    int attempts = 0;
    std::vector<const char*> buffers;
    m_recorder.openProject = [&](LPVOID, HWND, LPSTR user, LPCSTR projectName, LPCSTR, LPSTR auxPath, LPCSTR,
                                 LPTEXTOUTPROC, LONG) {
        buffers.insert(buffers.end(), {user, projectName, auxPath});
        if (++attempts == 2)
        {
            return SCC_OK;
        }
        std::strcpy(user, "first");
        std::strcpy(auxPath, "try");
        return SCC_E_PROJSYNTAXERR;
    };
    m_recorder.getProjPath = [](LPVOID, HWND, LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath, BOOL,
                                LPBOOL) {
        std::strcpy(user, "ada");
        std::strcpy(projectName, "$/song");
        std::strcpy(localPath, "C:\\song");
        std::strcpy(auxPath, "server");
        return SCC_OK;
    };
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_TRUE(m_bridge->IsProjectOpen());
    EXPECT_THAT(Calls(),
                ElementsAre(OpenCall("", "", ""), GetProjPathCall("", "", "", ""), OpenCall("first", "", "try")));
    ASSERT_EQ(buffers.size(), 6u);
    EXPECT_TRUE(std::equal(buffers.begin(), buffers.begin() + 3, buffers.begin() + 3));

    // User and auxiliary path are those of the successful attempt, the other texts are the chosen ones.
    m_recorder.getProjPath = nullptr;
    EXPECT_EQ(m_bridge->GetProjPath(nullptr, nullptr, nullptr, nullptr, TRUE), SCC_OK);
    EXPECT_THAT(Calls(), ElementsAre(GetProjPathCall("first", "$/song", "C:\\song", "try")));
}

TEST_F(BridgeOpenProject, ReturnsTheRefusalToChooseAProject)
{
    Start();
    m_recorder.results["SccOpenProject"] = SCC_E_PROJSYNTAXERR;
    for (const SCCRTN refusal : {SCC_I_OPERATIONCANCELED, SCC_E_NONSPECIFICERROR})
    {
        m_recorder.results["SccGetProjPath"] = refusal;
        EXPECT_EQ(Open(), refusal);
        EXPECT_FALSE(m_bridge->IsProjectOpen());
        EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "", ""), GetProjPathCall("", "", "", "")));
    }
}

TEST_F(BridgeOpenProject, TriesTwiceAtMost)
{
    Start();
    m_recorder.results["SccOpenProject"] = SCC_E_PROJSYNTAXERR;
    EXPECT_EQ(Open(), SCC_E_PROJSYNTAXERR);
    EXPECT_FALSE(m_bridge->IsProjectOpen());
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "", ""), GetProjPathCall("", "", "", ""), OpenCall("", "", "")));
}

TEST_F(BridgeOpenProject, FailsWhenTheLibraryCannotChooseAProject)
{
    NewBridge(L"recording_without_SccGetProjPath");
    Start();
    m_recorder.results["SccOpenProject"] = SCC_E_PROJSYNTAXERR;
    EXPECT_EQ(Open(), SCC_E_INITIALIZEFAILED);
    EXPECT_THAT(Calls(), ElementsAre(OpenCall("", "", "")));
}

TEST_F(BridgeCloseProject, WithoutOneOpenFailsAndLoadsNothing)
{
    EXPECT_EQ(m_bridge->CloseProject(), SCC_E_PROJNOTOPEN);
    EXPECT_THAT(AllCalls(), IsEmpty());
    Start();
    EXPECT_EQ(m_bridge->CloseProject(), SCC_E_PROJNOTOPEN);
    EXPECT_THAT(AllCalls(), IsEmpty());
}

TEST_F(BridgeCloseProject, HasClosedItWhateverTheResult)
{
    StartAndOpen();
    m_recorder.results["SccCloseProject"] = SCC_E_NONSPECIFICERROR;
    EXPECT_EQ(m_bridge->CloseProject(), SCC_E_NONSPECIFICERROR);
    EXPECT_FALSE(m_bridge->IsProjectOpen());
    EXPECT_EQ(m_bridge->CloseProject(), SCC_E_PROJNOTOPEN);
    EXPECT_TRUE(m_bridge->IsInitialized());
    EXPECT_THAT(Calls(), ElementsAre("SccCloseProject(0x77)"));
}

TEST_F(BridgeCloseProject, HasClosedItWhenTheLibraryThrows)
{
    StartAndOpen();
    m_recorder.throwing = {"SccCloseProject"};
    EXPECT_EQ(m_bridge->CloseProject(), SCC_E_INITIALIZEFAILED);
    EXPECT_FALSE(m_bridge->IsProjectOpen());
}

TEST_F(BridgeGetProjPath, LetsTheLibraryMakeANewProjectAndWritesToNoTextOfTheHost)
{
    Start();
    for (const BOOL allow : {TRUE, FALSE})
    {
        m_recorder.getProjPath = [&](LPVOID, HWND, LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath,
                                     BOOL allowChangePath, LPBOOL isNew) {
            EXPECT_EQ(allowChangePath, allow);
            EXPECT_EQ(*isNew, TRUE);
            *isNew = FALSE;
            for (LPSTR text : {user, projectName, localPath, auxPath})
            {
                std::strcpy(text, "new");
            }
            return SCC_OK;
        };
        char user[] = "a";
        char projectName[] = "b";
        char localPath[] = "c";
        char auxPath[] = "d";
        EXPECT_EQ(m_bridge->GetProjPath(user, projectName, localPath, auxPath, allow), SCC_OK);
        EXPECT_STREQ(user, "a");
        EXPECT_STREQ(projectName, "b");
        EXPECT_STREQ(localPath, "c");
        EXPECT_STREQ(auxPath, "d");
    }
}

TEST_F(BridgeGetProjPath, KeepsWhatWasChosen)
{
    Start();
    m_recorder.getProjPath = [](LPVOID, HWND, LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath, BOOL,
                                LPBOOL) {
        std::strcpy(user, "ada");
        std::strcpy(projectName, "$/song");
        std::strcpy(localPath, "C:\\song");
        std::strcpy(auxPath, "server");
        return SCC_OK;
    };
    EXPECT_EQ(m_bridge->GetProjPath(nullptr, nullptr, nullptr, nullptr, TRUE), SCC_OK);
    EXPECT_EQ(m_bridge->GetProjPath(nullptr, nullptr, nullptr, nullptr, TRUE), SCC_OK);
    EXPECT_EQ(Open(), SCC_OK);
    EXPECT_THAT(Calls(),
                ElementsAre(GetProjPathCall("", "", "", ""), GetProjPathCall("ada", "$/song", "C:\\song", "server"),
                            OpenCall("ada", "$/song", "server")));
}

TEST_F(BridgeGetProjPath, ThatFailsKeepsNothing)
{
    Start();
    m_recorder.getProjPath = [](LPVOID, HWND, LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath, BOOL,
                                LPBOOL) {
        for (LPSTR text : {user, projectName, localPath, auxPath})
        {
            std::strcpy(text, "new");
        }
        return SCC_I_OPERATIONCANCELED;
    };
    EXPECT_EQ(m_bridge->GetProjPath(nullptr, nullptr, nullptr, nullptr, TRUE), SCC_I_OPERATIONCANCELED);
    EXPECT_EQ(m_bridge->GetProjPath(nullptr, nullptr, nullptr, nullptr, TRUE), SCC_I_OPERATIONCANCELED);
    EXPECT_THAT(Calls(), ElementsAre(GetProjPathCall("", "", "", ""), GetProjPathCall("", "", "", "")));
}

} // namespace
