#pragma once

#include "IsolationSettings.h"

#include <chrono>
#include <filesystem>
#include <string>

/// The folder of an isolated MSSCCI library, below the machine's program data: a copy of the proxy that hosts load, the
/// program of the library's process, and the file that names the library. Everybody may read it; administrators may
/// change it.
class IsolatedFolder
{
public:
    /// Of the registration with this name.
    explicit IsolatedFolder(const std::wstring& name);

    /// Makes the folder for a library of 32 or 64 bits, or replaces its files. `patience` as in `IsolationSettings`.
    /// Returns the path of the proxy. Throws `ToolError` with `ExitCode::Failed` when that is not possible.
    std::wstring Make(const std::wstring& library, int bits, std::chrono::seconds patience) const;

    bool Exists() const;

    /// What the folder says about its library; without a folder, its `library` is empty.
    IsolationSettings Settings() const;

    /// Removes the folder, if there is one. Throws `ToolError` with `ExitCode::Failed` when a file is in use.
    void Remove() const;

private:
    std::wstring m_name;
    std::filesystem::path m_path;
};
