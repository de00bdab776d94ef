#pragma once

#include "BuiltFile.h"
#include "IsolationSettings.h"
#include "TempFolder.h"

#include <filesystem>

/// A folder with the files that isolate a library, as `orvix register --isolated` makes it.
class IsolatedCopy
{
public:
    explicit IsolatedCopy(const std::filesystem::path& library,
                          std::chrono::seconds patience = IsolationSettings().patience, int bits = 64)
    {
        const std::filesystem::path program = bits == 32 ? L"scc_host32.exe" : L"scc_host64.exe";
        for (const std::filesystem::path& file : {std::filesystem::path(L"scc_proxy.dll"), program})
        {
            std::filesystem::copy_file(BuiltFile(file), m_folder.Path() / file);
        }
        IsolationSettings settings;
        settings.name = L"Isolated";
        settings.library = library;
        settings.patience = patience;
        settings.bits = bits;
        settings.Write(m_folder.Path());
    }

    const std::filesystem::path& Folder() const { return m_folder.Path(); }

    /// The library that a host loads.
    std::filesystem::path Proxy() const { return m_folder.Path() / L"scc_proxy.dll"; }

private:
    TempFolder m_folder;
};
