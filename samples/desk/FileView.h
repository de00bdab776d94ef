#pragma once

#include "FileState.h"
#include "Theme.h"

#include <commctrl.h>

#include <string>
#include <vector>

/// The files of a folder with their states. The list control asks for the texts that it draws (LVS_OWNERDATA), so it is
/// fast with any number of files.
class FileView
{
public:
    /// Makes the control, empty.
    void Create(HWND parent, int id);
    HWND Window() const { return m_window; }

    /// Shows other files. Those that were selected before and are still there stay selected.
    void Show(std::vector<FileRow> rows);
    const std::vector<FileRow>& Rows() const { return m_rows; }

    /// The selected files; all files when none is selected. Files that a filter excludes are left out.
    std::vector<const FileRow*> Chosen() const;

    /// Handles LVN_GETDISPINFOW.
    void FillItem(LVITEMW& item) const;

    /// A point of the screen at the file with the focus, for a menu.
    POINT FocusedPoint() const;

    /// Divides the width among the columns.
    void FitColumns() const;
    void SetColors(const Theme& theme) const;

private:
    std::vector<const FileRow*> Selected() const;

    HWND m_window = nullptr;
    std::vector<FileRow> m_rows;
};
