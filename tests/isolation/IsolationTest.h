#pragma once

#include "Defect.h"
#include "IsolatedCopy.h"
#include "LibraryProcesses.h"
#include "SccLibrary.h"

#include <gtest/gtest.h>

#include <array>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

/// A test that uses the misbehaving library, directly or in a process of its own.
class IsolationTest : public testing::Test
{
public:
    /// What a host loads to use the misbehaving library isolated, with a patience that a busy machine does not reach.
    static std::filesystem::path Proxy()
    {
        static const IsolatedCopy isolated(ORVIX_MISBEHAVING_SCC, std::chrono::seconds(60));
        return isolated.Proxy();
    }

    /// The same with a patience of two seconds.
    static std::filesystem::path ImpatientProxy()
    {
        static const IsolatedCopy isolated(ORVIX_MISBEHAVING_SCC, std::chrono::seconds(2));
        return isolated.Proxy();
    }

    static LONG Output(LPCSTR text, LONG kind)
    {
        const std::lock_guard lock(s_mutex);
        s_lines.push_back((kind == SCC_MSG_ERROR ? "error: " : "") + std::string(text != nullptr ? text : "(null)"));
        return SCC_MSG_RTN_OK;
    }

protected:
    void SetUp() override
    {
        Misbehave(L"");
        Lines();
    }
    void TearDown() override { Misbehave(L""); }

    /// How libraries misbehave that are started from now on.
    static void Misbehave(const std::wstring& how) { SetEnvironmentVariableW(Defect::Variable, how.c_str()); }

    /// What libraries have printed since the last time.
    static std::vector<std::string> Lines()
    {
        const std::lock_guard lock(s_mutex);
        return std::exchange(s_lines, {});
    }

    static std::string Text()
    {
        std::string text;
        for (const std::string& line : Lines())
        {
            text += line + '\n';
        }
        return text;
    }

    /// A context of the library, which ends with this object.
    class Session
    {
    public:
        explicit Session(const SccLibrary& library, HWND window = nullptr) : m_library(library), m_window(window)
        {
            result = library.initialize(&context, m_window, "host", name.data(), &capabilities, label.data(),
                                        &checkoutLength, &commentLength);
        }
        Session(const Session&) = delete;
        Session& operator=(const Session&) = delete;
        ~Session()
        {
            if (context != nullptr)
            {
                Uninitialize();
            }
        }

        SCCRTN Open(LPTEXTOUTPROC output = Output)
        {
            return m_library.openProject(context, m_window, user.data(), project.data(), folder.data(), auxPath.data(),
                                         "comment", output, SCC_OP_CREATEIFNEW);
        }
        SCCRTN Get(LPCMDOPTS block = nullptr)
        {
            LPCSTR file = "C:\\project\\a.txt";
            return m_library.get(context, m_window, 1, &file, 0, block);
        }
        SCCRTN Uninitialize() { return m_library.uninitialize(std::exchange(context, nullptr)); }

        LPVOID context = nullptr;
        SCCRTN result;

        // Larger than the interface demands, as those of OrvixCore are.
        std::array<char, 512> name{"Depot"};
        std::array<char, 512> label{"Aux"};
        std::array<char, 512> user{"Ben"};
        std::array<char, 512> project{"project"};
        std::array<char, 512> folder{"C:\\project"}; // a library writes to it
        std::array<char, 512> auxPath{"path"};
        LONG capabilities = 0;
        LONG checkoutLength = 0;
        LONG commentLength = 0;

    private:
        const SccLibrary& m_library;
        HWND m_window;
    };

    /// The number of running processes of isolated libraries that this process started.
    static std::size_t Processes() { return LibraryProcesses().size(); }

private:
    static inline std::mutex s_mutex;
    static inline std::vector<std::string> s_lines;
};
