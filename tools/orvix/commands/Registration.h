#pragma once

#include <optional>
#include <string>
#include <vector>

/// The registration of one MSSCCI library in the registry of this machine: a value in the list of installed libraries,
/// and a key of its own below Software\OrvixCore\MSSCCI. What other programs have registered is never changed.
///
/// Names are compared without regard to case. Every operation throws `ToolError`: with `ExitCode::Failed` when the
/// registry refuses, for want of administrator rights above all.
class Registration
{
public:
    /// Throws `ToolError` with `ExitCode::BadUsage` when nothing can have this name.
    explicit Registration(const std::wstring& name);

    /// Registers the library of this full path and returns the path that it replaces, if any. When it fails, what was
    /// registered is as before. Throws `ToolError`: `ExitCode::NoProject` when there is no such library,
    /// `ExitCode::Failed` when the name belongs to another program.
    std::optional<std::wstring> Set(const std::wstring& library);

    /// Takes the registration out. Throws `ToolError`: `ExitCode::NoProject` when there is none,
    /// `ExitCode::Failed` when it belongs to another program.
    void Remove();

private:
    /// A value of the list.
    struct Entry
    {
        std::wstring valueName;
        std::wstring keyPath; ///< of the provider's own key; empty when it is no text
    };

    static std::vector<Entry> ReadList();

    bool IsOwn(const Entry& entry) const;

    /// Throws `ToolError` when the name belongs to an entry of another program.
    void RefuseForeign(const std::vector<Entry>& list) const;

    std::wstring m_name;
    std::wstring m_keyPath;
};
