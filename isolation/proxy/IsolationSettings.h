#pragma once

#include <chrono>
#include <filesystem>
#include <string>

/// What the file scc_proxy.ini beside the proxy says about the library to isolate.
struct IsolationSettings
{
    /// Reads the file in `folder`. What is missing there has its default; without a file, `library` is empty.
    static IsolationSettings Read(const std::filesystem::path& folder);

    /// Writes the file in `folder`. False when that fails.
    bool Write(const std::filesystem::path& folder) const;

    static constexpr wchar_t FileName[] = L"scc_proxy.ini";

    std::wstring name;             ///< of the provider, for messages
    std::filesystem::path library; ///< full path
    std::filesystem::path program; ///< full path of the program for the library's process
    int bits = 64;                 ///< of the library: 32 or 64

    /// A call without a window of the library and without a sign of life is ended after that.
    std::chrono::seconds patience{300};
};
