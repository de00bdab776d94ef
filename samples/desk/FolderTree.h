#pragma once

#include "Theme.h"

#include <commctrl.h>

#include <string>

/// The folders of a project in a tree control. A folder is read when it is opened for the first time. Hidden folders
/// and those with a leading dot are left out: providers have their own files there.
class FolderTree
{
public:
    /// Makes the control, empty.
    void Create(HWND parent, int id);
    HWND Window() const { return m_window; }

    /// Shows a project's folder, opened and selected; an empty text shows nothing.
    void ShowProject(const std::wstring& folder);

    /// The full path of the selected folder; empty when none is selected.
    std::wstring Selected() const;

    /// Opens or closes the selected folder.
    void Toggle() const;

    /// Handles TVN_ITEMEXPANDINGW.
    void OnExpanding(const NMTREEVIEWW& notification) const;

    void SetColors(const Theme& theme) const;

private:
    HTREEITEM Add(HTREEITEM parent, const std::wstring& name) const;
    std::wstring TextOf(HTREEITEM item) const;
    std::wstring PathOf(HTREEITEM item) const;

    HWND m_window = nullptr;
    std::wstring m_folder; // the full path of the root
};

/// Whether programs are expected not to show a file or folder: hidden ones and those with a leading dot.
bool IsHidden(const std::wstring& path);
