#pragma once

#include <string>

/// A new, empty folder below the user's temporary folder. At the end it is deleted with everything in it.
class ValidationScratch
{
public:
    /// Throws `ToolError` when the folder cannot be made.
    ValidationScratch();
    ValidationScratch(const ValidationScratch&) = delete;
    ValidationScratch& operator=(const ValidationScratch&) = delete;
    ~ValidationScratch();

    /// The full path.
    const std::wstring& Path() const { return m_path; }

    /// Deletes a folder with everything in it, read-only files included, as far as the system allows. A link is
    /// deleted, never its target.
    static void RemoveTree(const std::wstring& folder);

private:
    std::wstring m_path;
};
