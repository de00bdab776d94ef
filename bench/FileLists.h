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
    constexpr unsigned long Everything = 0x2; // a bit of the host
    for (unsigned int i = 0; i < count; ++i)
    {
        list->CreateEntry(FileName(i).c_str(), nullptr, Everything, 0);
    }
    list->BuildActiveList(Everything, false);
    return list;
}
