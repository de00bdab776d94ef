#pragma once

#include "FileCommand.h"
#include "FileState.h"
#include "IOrvixProvider.h"
#include "Library.h"
#include "Progress.h"

#include <string>
#include <vector>

/// A folder that is open as a project of one provider. At the end the project is closed.
///
/// One provider object has one open project, and a plug-in may have one provider object for the whole process. So the
/// program has one project, and another window of it is another process.
class Project
{
public:
    /// Opens the folder, or the administrator's fixed root in its place. `library` outlives this object. Throws
    /// `Failure`.
    Project(Library& library, std::uint32_t provider, const std::wstring& folder);
    Project(const Project&) = delete;
    Project& operator=(const Project&) = delete;
    ~Project();

    const std::wstring& Folder() const { return m_folder; }
    std::uint32_t ProviderIndex() const { return m_index; }
    std::wstring ProviderName() const { return m_library.Services().GetProviderName(m_index); }

    /// The files of a folder with their states, by name; with `deep` also those of the folders below. When the user
    /// stops the work or the provider fails, states are missing.
    std::vector<FileRow> Files(const std::wstring& folder, bool deep, Progress& progress) const;

    /// Runs an operation on those of the files that fit. Returns whether it was done, and not cancelled. What became of
    /// each file the provider does not say: ask for `Files` again.
    bool Run(const FileCommand& command, const std::vector<const FileRow*>& files, HWND owner) const;

    /// Shows the history. True when a file on the disk has changed. Throws `Failure` when the provider cannot show it.
    bool ShowHistory(const std::vector<const FileRow*>& files) const;

    /// Shows the properties of the first file. Throws `Failure` when the provider cannot show them.
    void ShowProperties(const std::vector<const FileRow*>& files) const;

private:
    void QueryStates(std::vector<FileRow>& rows, Progress& progress) const;

    Library& m_library;
    std::uint32_t m_index;
    IOrvixProvider* m_provider; // owned by the plug-in or by the services object
    std::wstring m_folder;
};
