#pragma once

#include "OrvixFileEntry.h"
#include "OrvixFileList.h"

#include <memory>
#include <string>

inline std::wstring FileName(unsigned int index)
{
    return L"C:\\project\\folder " + std::to_wstring(index / 100) + L"\\file " + std::to_wstring(index) + L".txt";
}

/// A list of `count` files, all active.
inline std::unique_ptr<OrvixFileList> MakeActiveList(unsigned int count)
{
    std::unique_ptr<OrvixFileList> list(new OrvixFileList);
    for (unsigned int i = 0; i < count; ++i)
    {
        list->CreateEntry(FileName(i).c_str(), nullptr, 1, 0);
    }
    list->BuildActiveList(1, false);
    return list;
}
