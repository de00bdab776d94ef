#pragma once

#include "OrvixMSSCC.h"
#include "SccRecorder.h"
#include "TempFolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <utility>
#include <vector>

/// A bridge to a recording library. When it is started, the library gives 0x77 as its context and `m_capabilities`.
class Bridge : public testing::Test
{
protected:
    Bridge()
    {
        m_recorder = {};
        m_recorder.initialize = [this](LPVOID* context, HWND, LPCSTR, LPSTR, LPLONG capabilities, LPSTR, LPLONG,
                                       LPLONG) {
            *context = reinterpret_cast<LPVOID>(0x77);
            *capabilities = m_capabilities;
            return m_recorder.results["SccInitialize"];
        };
        NewBridge(L"recording_full");
    }

    void TearDown() override
    {
        m_bridge.reset();
        m_recorder = {};
    }

    static std::wstring LibraryPath(const std::wstring& library)
    {
        return std::wstring(ORVIX_RECORDING_MSSCCI) + L"\\" + library + L".dll";
    }

    /// Replaces the bridge by a new one.
    void NewBridge(const std::wstring& library, const wchar_t* searchFolder = nullptr)
    {
        m_bridge = std::make_unique<OrvixMSSCC>();
        m_bridge->SetProvider(LibraryPath(library).c_str(), searchFolder, L"Depot", false);
        m_bridge->SetParentWindow(reinterpret_cast<HWND>(0x1234));
        m_recorder.calls.clear();
    }

    /// Starts the library and forgets the calls.
    void Start()
    {
        ASSERT_EQ(m_bridge->Initialize("host"), SCC_OK);
        m_recorder.calls.clear();
    }

    SCCRTN Open() { return m_bridge->OpenProject(Project().c_str(), "comment", nullptr); }

    /// Starts the library, opens the project and forgets the calls.
    void StartAndOpen()
    {
        Start();
        ASSERT_EQ(Open(), SCC_OK);
        m_recorder.calls.clear();
    }

    /// The project's folder as the host names it.
    std::string Project() const { return m_folder.Path().string(); }

    /// The call of SccOpenProject for the project.
    std::string OpenCall(const std::string& user, const std::string& projectName, const std::string& auxPath) const
    {
        return "SccOpenProject(0x77, 0x1234, \"" + user + "\", \"" + projectName + "\", \"" + Project() + "\", \"" +
               auxPath + "\", \"comment\", 0x1)";
    }

    static std::string GetProjPathCall(const std::string& user, const std::string& projectName,
                                       const std::string& localPath, const std::string& auxPath)
    {
        return "SccGetProjPath(0x77, 0x1234, \"" + user + "\", \"" + projectName + "\", \"" + localPath + "\", \"" +
               auxPath + "\", 0x1, 0x1)";
    }

    /// The calls since the last time, without loading and freeing.
    std::vector<std::string> Calls() { return m_recorder.Take(); }

    /// The calls since the last time, with loading and freeing.
    std::vector<std::string> AllCalls() { return std::exchange(m_recorder.calls, {}); }

    SccRecorder& m_recorder = *TheSccRecorder();
    LONG m_capabilities = 0;
    TempFolder m_folder;
    std::unique_ptr<OrvixMSSCC> m_bridge;
};
