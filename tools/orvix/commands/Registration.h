#pragma once

#include <functional>
#include <optional>
#include <string>
#include <vector>

/// The registration of one MSSCCI library in the registry of this machine: a value in the list of installed libraries,
/// and a key of its own below Software\OrvixCore\MSSCCI. What other programs registered is never changed.
///
/// Names are compared without regard to letter case. Every operation throws `ToolError`: with `ExitCode::Failed` when
/// the registry refuses, most often because administrator rights are missing.
class Registration
{
public:
    /// Throws `ToolError` with `ExitCode::BadUsage` when this is not a valid name.
    explicit Registration(const std::wstring& name);

    /// Registers the library of this full path. Returns the path that it replaces, if any. Throws `ToolError` and
    /// leaves the registry as it was: with `ExitCode::BadUsage` when the path is too long, with `ExitCode::NotFound`
    /// when there is no such library, with `ExitCode::Failed` when the name belongs to another program.
    std::optional<std::wstring> Set(const std::wstring& library);

    /// The same for a library that `make` makes once nothing else speaks against the registration.
    std::optional<std::wstring> Set(const std::function<std::wstring()>& make);

    /// Throws `ToolError` with `ExitCode::NotFound` when a 64-bit host cannot use the library. None of the library's
    /// code runs.
    static void CheckLibrary(const std::wstring& path);

    /// Removes the registration. Throws `ToolError`: with `ExitCode::NotFound` when there is none, with
    /// `ExitCode::Failed` when it belongs to another program.
    void Remove();

private:
    /// A value of the list of installed libraries.
    struct Entry
    {
        std::wstring valueName;
        std::wstring keyPath; ///< of the provider's own key; empty when the value is not a text
    };

    /// What was registered under the own key.
    struct Previous
    {
        std::optional<std::wstring> name;
        std::optional<std::wstring> path;
    };

    static std::vector<Entry> ReadList();

    void Write(const std::wstring& library, bool isListed);

    /// Restores what was registered before a failed `Write`.
    void Restore(const Previous& previous, bool isListed);

    bool IsOwn(const Entry& entry) const;

    /// Throws `ToolError` when the name belongs to an entry of another program.
    void RefuseForeign(const std::vector<Entry>& list) const;

    std::wstring m_name;
    std::wstring m_keyPath;
};
