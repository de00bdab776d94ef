#pragma once

#include "Arguments.h"
#include "ClientAccess.h"
#include "Frame.h"
#include "Library.h"
#include "OperationListener.h"
#include "OutputPane.h"
#include "Project.h"
#include "Theme.h"

#include <windows.h>

#include <memory>

/// The window of the program, with at most one project. It turns commands into calls of the library.
class MainWindow
{
public:
    /// Makes the window and opens the project of the command line. Throws `Failure` when there is no window; when only
    /// the project cannot be opened, the window says so.
    explicit MainWindow(const Arguments& arguments);
    MainWindow(const MainWindow&) = delete;
    MainWindow& operator=(const MainWindow&) = delete;
    ~MainWindow() = default;

    /// Handles messages until the user closes the window. Returns the exit code of the program.
    int Run();

private:
    class Work;

    static LRESULT CALLBACK Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept;
    LRESULT Handle(UINT message, WPARAM wParam, LPARAM lParam);
    void OnCommand(int command);
    void RunCommand(int command);
    LRESULT OnNotify(NMHDR& notification);
    void OnContextMenu(POINT point) const;
    void OnResolution(const RECT& place);
    void OnClose();
    void OnDestroy();
    void OnEnterKey();

    void Open(const std::wstring& folder, std::uint32_t provider);
    void ChooseFolder();
    void OpenNewWindow() const;
    void Refresh();
    void RunFileCommand(const FileCommand& command);
    void ShowHistory();
    void ShowOptions();
    bool MayClose();
    void SetDark(bool dark);
    void EnableCommands();
    std::vector<const FileRow*> FilesThatAllow(unsigned long permission) const;

    /// Tells the user of a failure.
    void Report(const std::wstring& text);

    Arguments m_arguments;
    Theme m_theme;
    OutputPane m_output;
    ClientAccess m_access;
    OperationListener m_listener;
    Frame m_frame;
    std::unique_ptr<Library> m_library;
    std::unique_ptr<Project> m_project; // uses the library, so it ends first
    HWND m_window = nullptr;
    HWND m_focus = nullptr; // the control that had the focus when the window lost it
    bool m_deep = false;    // subfolders are shown, too
    bool m_busy = false;    // a command is at work: no other one begins, and the window stays
    bool m_closeAsked = false;
    UniqueWindow m_ownedWindow; // the last member: the window ends before what it uses
};
