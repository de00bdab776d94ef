#pragma once

#include "OrvixFileEntry.h"
#include "OrvixFileList.h"

#include <memory>
#include <string>

inline std::wstring FileName(unsigned int index)
{
    return L"C:\\project\\folder " + std::to_wstring(index / 100) + L"\\file " + std::to_wstring(index) + L".txt";
}

/// The bit of the entries that `MakeTree` makes.
inline constexpr unsigned long SelectedInTree = 0x4;

/// Every eleventh entry is a root; the ten after it are its children. All are selected.
inline std::unique_ptr<OrvixFileList> MakeTree(unsigned int count)
{
    std::unique_ptr<OrvixFileList> list(new OrvixFileList);
    OrvixFileEntry* root = nullptr;
    for (unsigned int i = 0; i < count; ++i)
    {
        OrvixFileEntry* entry = list->CreateEntry(FileName(i).c_str(), i % 11 ? root : nullptr, SelectedInTree, 0);
        if (i % 11 == 0)
        {
            root = entry;
        }
    }
    return list;
}

/// A list of `count` files, all active.
inline std::unique_ptr<OrvixFileList> MakeActiveList(unsigned int count)
{
    std::unique_ptr<OrvixFileList> list(new OrvixFileList);
    constexpr unsigned long Everything = 0x2; // a bit of the host
    for (unsigned int i = 0; i < count; ++i)
    {
        list->CreateEntry(FileName(i).c_str(), nullptr, Everything, 0);
    }
    list->BuildActiveList(Everything, false);
    return list;
}
