#pragma once

#include "FileView.h"
#include "FolderTree.h"
#include "Icons.h"
#include "OutputPane.h"

#include <string>

/// What the main window shows: toolbar, folders, files, output, status bar. It places the controls and gives them font,
/// icons and colours.
class Frame
{
public:
    /// Makes the controls in a window.
    void Create(HWND window, OutputPane& output);

    FolderTree& Folders() { return m_folders; }
    FileView& Files() { return m_files; }
    const FileView& Files() const { return m_files; }
    HWND ProgressBar() const { return m_progressBar; }

    /// Places the controls for the size of the window.
    void Layout();

    /// Takes font and icons for the resolution of the window's monitor.
    void UseResolution();

    /// Gives the controls the colours of a theme, which outlives this object.
    void UseTheme(const Theme& theme);

    /// Handles WM_ERASEBKGND.
    void Erase(HDC context) const;

    /// Handles WM_CTLCOLORSTATIC, which labels and the output send. Returns the brush of the background.
    HBRUSH Paint(HDC context, HWND control) const;

    /// Handles NM_CUSTOMDRAW, to give the toolbar the colours of the theme.
    LRESULT PaintToolbar(NMHDR& notification) const;

    void SetStatus(const std::wstring& text) const;
    void SetProvider(const std::wstring& text) const;
    void EnableButton(int command, bool enabled) const;

private:
    void CreateToolbar();
    HWND CreateLabel(const wchar_t* text) const;
    int Pixels(int at96Dpi) const;

    DrawingSession m_drawing;
    HWND m_window = nullptr;
    HWND m_toolbar = nullptr;
    HWND m_status = nullptr;
    HWND m_progressBar = nullptr;
    HWND m_output = nullptr;
    HWND m_foldersLabel = nullptr;
    HWND m_filesLabel = nullptr;
    HWND m_outputLabel = nullptr;
    FolderTree m_folders;
    FileView m_files;
    UniqueFont m_font;
    UniqueImageList m_icons;
    UniqueBrush m_faceBrush;
    UniqueBrush m_windowBrush;
    const Theme* m_theme = nullptr;
};
