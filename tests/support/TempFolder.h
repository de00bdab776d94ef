#pragma once

#include <windows.h>

#include <atomic>
#include <filesystem>
#include <string>

/// A new, empty folder that is deleted with everything in it.
class TempFolder
{
public:
    TempFolder()
    {
        // The number of a process comes again: what an earlier one left behind is passed over.
        const std::filesystem::path root = std::filesystem::temp_directory_path();
        const std::wstring name = L"orvix-" + std::to_wstring(GetCurrentProcessId()) + L"-";
        do
        {
            m_path = root / (name + std::to_wstring(++Counter()));
        } while (!std::filesystem::create_directory(m_path));
    }
    TempFolder(const TempFolder&) = delete;
    TempFolder& operator=(const TempFolder&) = delete;
    ~TempFolder()
    {
        std::error_code ignored;
        std::filesystem::remove_all(m_path, ignored);
    }

    const std::filesystem::path& Path() const { return m_path; }

    /// The folder's path without a separator at its end.
    std::wstring Text() const { return m_path.wstring(); }

private:
    static std::atomic<int>& Counter()
    {
        static std::atomic<int> counter;
        return counter;
    }

    std::filesystem::path m_path;
};
