#pragma once

#include "UniqueHandle.h"

#include <windows.h>

#include <commctrl.h>

#include <map>
#include <string>

/// How an image list is destroyed.
struct ImageListPolicy
{
    using Handle = HIMAGELIST;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle images) noexcept { ImageList_Destroy(images); }
};

/// Small pictures for a list of files: the icon of each type of file, and one for each state under source control.
class FileImages
{
public:
    FileImages() = default;

    /// Pictures for a monitor with this resolution in dots per inch.
    explicit FileImages(UINT dpi);

    /// The pictures, which this object owns.
    HIMAGELIST List() const { return m_images.Get(); }

    /// The number of the picture for a file, which its extension decides: the disk is not asked. -1 when the system
    /// has none.
    int OfFile(const std::wstring& name);

    /// The number of the picture for a folder. -1 when the system has none.
    int OfFolder();

    /// The number of the picture for a state, bits of `OrvixFileState`.
    int OfState(unsigned long state) const;

private:
    /// Adds the system's icon for a name and attributes (FILE_ATTRIBUTE_*), and returns its number.
    int AddIcon(const std::wstring& name, DWORD attributes);

    UniqueHandle<ImageListPolicy> m_images;
    int m_firstState = 0;
    std::map<std::wstring, int> m_byExtension; // numbers of pictures
};
