// What an archive keeps when the process of its library is killed in the middle of an operation.

#include "ArchiveLibrary.h"
#include "ArchiveProject.h"
#include "LibraryProcesses.h"
#include "SccLibrary.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <array>
#include <set>
#include <string>
#include <thread>
#include <vector>

namespace
{

constexpr int Rounds = 12;

std::vector<std::string> printed;

LONG Print(LPCSTR text, LONG)
{
    printed.emplace_back(text);
    return SCC_MSG_RTN_OK;
}

std::string Narrow(const std::wstring& text)
{
    return std::filesystem::path(text).string();
}

/// A session of the library with one file of a project.
class Session
{
public:
    Session(const SccLibrary& library, const ArchiveProject& project, const std::string& file)
        : m_library(library), m_folder(Narrow(project.Text())), m_file(file)
    {
        std::array<char, SCC_NAME_SIZE> name = {};
        std::array<char, SCC_AUXLABEL_SIZE> label = {};
        LONG unused = 0;
        m_library.initialize(&m_context, nullptr, "host", name.data(), &unused, label.data(), &unused, &unused);
        if (Open() == SCC_E_PROJSYNTAXERR)
        {
            BOOL isNew = TRUE;
            m_library.getProjPath(m_context, nullptr, m_user.data(), m_name.data(), m_path.data(), m_auxPath.data(),
                                  TRUE, &isNew);
            Open();
        }
    }
    Session(const Session&) = delete;
    Session& operator=(const Session&) = delete;
    ~Session() { m_library.uninitialize(m_context); }

    SCCRTN Add()
    {
        LONG options = 0;
        return m_library.add(m_context, nullptr, 1, &m_names, "added", &options, nullptr);
    }
    SCCRTN Checkout() { return m_library.checkout(m_context, nullptr, 1, &m_names, "", 0, nullptr); }
    SCCRTN Checkin(const std::string& comment)
    {
        return m_library.checkin(m_context, nullptr, 1, &m_names, comment.c_str(), 0, nullptr);
    }
    SCCRTN Get() { return m_library.get(m_context, nullptr, 1, &m_names, 0, nullptr); }
    SCCRTN History() { return m_library.history(m_context, nullptr, 1, &m_names, 0, nullptr); }
    LONG Status()
    {
        LONG status = SCC_STATUS_INVALID;
        EXPECT_EQ(m_library.queryInfo(m_context, 1, &m_names, &status), SCC_OK);
        return status;
    }

private:
    SCCRTN Open()
    {
        return m_library.openProject(m_context, nullptr, m_user.data(), m_name.data(), m_folder.c_str(),
                                     m_auxPath.data(), "", Print, SCC_OP_CREATEIFNEW);
    }

    const SccLibrary& m_library;
    std::string m_folder;
    const std::string& m_file;
    LPCSTR m_names = m_file.c_str();
    LPVOID m_context = nullptr;
    std::array<char, SCC_USER_SIZE> m_user = {"anna"};
    std::array<char, SCC_PRJPATH_SIZE> m_name = {};
    std::array<char, MAX_PATH> m_path = {};
    std::array<char, SCC_PRJPATH_SIZE> m_auxPath = {};
};

void KillAfter(DWORD milliseconds)
{
    Sleep(milliseconds);
    for (const DWORD id : LibraryProcesses())
    {
        const UniqueKernelHandle process(OpenProcess(PROCESS_TERMINATE, FALSE, id));
        TerminateProcess(process.Get(), 9);
    }
}

} // namespace

TEST(KilledArchive, OpensAgainAndHasEveryVersion)
{
    const SccLibrary library(ArchiveLibrary());
    const ArchiveProject project;
    const std::string file = Narrow(project.Write(L"a.txt", "first"));
    ASSERT_EQ(Session(library, project, file).Add(), SCC_OK);
    DWORD whole = 0; // milliseconds that one round takes when nobody kills it
    {
        Session session(library, project, file);
        const ULONGLONG start = GetTickCount64();
        ASSERT_EQ(session.Checkout(), SCC_OK);
        project.Overwrite(project.Path(L"a.txt"), "measured");
        ASSERT_EQ(session.Checkin("measured"), SCC_OK);
        whole = static_cast<DWORD>(GetTickCount64() - start);
    }
    std::set<int> finished; // the rounds whose check-in was done before the end
    for (int round = 1; round <= Rounds; ++round)
    {
        const std::string number = std::to_string(round);
        {
            Session session(library, project, file);
            std::thread killer(KillAfter, whole * static_cast<DWORD>(round) / Rounds);
            session.Checkout();
            project.Overwrite(project.Path(L"a.txt"), "killed " + number);
            if (session.Checkin("killed " + number) == SCC_OK)
            {
                finished.insert(round);
            }
            killer.join();
            EXPECT_EQ(session.Get(), SCC_E_NONSPECIFICERROR);
        }
        Session session(library, project, file);
        const LONG status = session.Status();
        ASSERT_TRUE(status & SCC_STATUS_CONTROLLED) << round;
        if ((status & SCC_STATUS_CHECKEDOUT) == 0)
        {
            ASSERT_EQ(session.Checkout(), SCC_OK) << round;
        }
        project.Overwrite(project.Path(L"a.txt"), "kept " + number);
        ASSERT_EQ(session.Checkin("kept " + number), SCC_OK) << round;
    }

    Session session(library, project, file);
    SetReadOnly(project.Path(L"a.txt"), false);
    ASSERT_TRUE(std::filesystem::remove(project.Path(L"a.txt")));
    EXPECT_EQ(session.Get(), SCC_OK);
    EXPECT_EQ(project.Read(L"a.txt"), "kept " + std::to_string(Rounds));
    printed.clear();
    EXPECT_EQ(session.History(), SCC_OK);
    for (int round = 1; round <= Rounds; ++round)
    {
        EXPECT_THAT(printed, testing::Contains(testing::EndsWith("  kept " + std::to_string(round))));
    }
    for (const int round : finished)
    {
        EXPECT_THAT(printed, testing::Contains(testing::EndsWith("  killed " + std::to_string(round))));
    }
    EXPECT_THAT(printed.back(), testing::EndsWith("  added"));
}
