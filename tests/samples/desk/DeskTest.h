#pragma once

#include "ArchiveProject.h"
#include "Arguments.h"
#include "MainWindow.h"
#include "PrivateUserKey.h"
#include "TempFolder.h"
#include "User.h"
#include "resource.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

using Texts = std::vector<std::wstring>;

/// The main window, with a user at it.
class Desk
{
public:
    static constexpr const wchar_t* Files = L"Files"; ///< the name of the list

    explicit Desk(const DialogWindow& window) : m_window(window) {}

    const DialogWindow& Window() const { return m_window; }

    /// Chooses a command of the menu, with nothing to answer.
    void Command(int id) const;

    /// Chooses a command and handles the dialog that it shows, by title.
    void Command(int id, const wchar_t* title, const std::function<void(const DialogWindow&)>& handle) const;

    /// Chooses a command and confirms the dialog that it shows, by title.
    void Confirm(int id, const wchar_t* title) const;

    bool IsEnabled(int id) const;
    bool IsChecked(int id) const;
    Texts Names() const { return m_window.Column(Files, 0); }
    Texts States() const { return m_window.Column(Files, 1); }
    std::wstring Output() const { return m_window.Text(L"Output"); }
    std::wstring Status(int part = 0) const;

    /// Waits for a window of the program.
    DialogWindow Await(const wchar_t* title) const;

    void Close() const;

private:
    DialogWindow m_window;
};

/// Confirms a dialog.
void Confirm(const DialogWindow& dialog);

/// The program on this thread, with the archive as the provider and a project of three files. Each test has an empty
/// registry for what the program remembers. Skipped without a display.
class DeskTest : public testing::Test
{
protected:
    DeskTest();
    ~DeskTest() override;
    void SetUp() override;

    /// Runs the program with a project, and a user who handles the window. The user ends with a closed window.
    void Run(const std::function<void(const Desk&)>& handle);
    void Run(const std::wstring& title, const std::function<void(const Desk&)>& handle);

    PrivateUserKey m_userKey;
    TempFolder m_config;
    TempFolder m_plugins; ///< has the archive alone
    ArchiveProject m_project;
    Arguments m_arguments;
};
