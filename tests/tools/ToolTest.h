#pragma once

#include "BuiltFile.h"
#include "Files.h"
#include "OrvixTool.h"
#include "TempFolder.h"

#include <windows.h>

#include <gtest/gtest.h>

#include <initializer_list>

/// orvix.exe in a project folder of its own, which goes with the test.
class ToolTest : public testing::Test
{
protected:
    using Arguments = std::vector<std::wstring>;

    // Exit codes.
    static constexpr unsigned long Success = 0;
    static constexpr unsigned long Failed = 1;
    static constexpr unsigned long BadUsage = 2;
    static constexpr unsigned long NotFound = 3;

    void SetUp() override { std::filesystem::create_directories(Project()); }

    void TearDown() override
    {
        // What a provider made read-only could not be deleted with its folder.
        for (const auto& entry : std::filesystem::recursive_directory_iterator(m_temp.Path()))
        {
            SetFileAttributesW(entry.path().c_str(), FILE_ATTRIBUTE_NORMAL);
        }
    }

    const std::filesystem::path& Scratch() const { return m_temp.Path(); }
    std::filesystem::path Project() const { return Scratch() / L"project"; }
    std::filesystem::path Config() const { return Scratch() / L"config"; }
    std::filesystem::path File(const std::wstring& name) const { return Project() / name; }

    void Write(const std::wstring& name, std::string_view text)
    {
        std::filesystem::create_directories(File(name).parent_path());
        WriteBytes(File(name), text);
    }

    /// From here on the tool is a copy of it, with these files from its folder beside it. Returns the folder.
    std::filesystem::path UseCopy(std::initializer_list<const wchar_t*> files)
    {
        const std::filesystem::path original = BuiltFile(L"orvix.exe");
        std::filesystem::path folder = Scratch() / L"bin";
        m_program = folder / original.filename();
        std::filesystem::create_directories(folder);
        std::filesystem::copy_file(original, m_program, std::filesystem::copy_options::overwrite_existing);
        for (const std::filesystem::path file : files)
        {
            std::filesystem::create_directories((folder / file).parent_path());
            std::filesystem::copy_file(original.parent_path() / file, folder / file,
                                       std::filesystem::copy_options::overwrite_existing);
        }
        return folder;
    }

    /// Runs the tool in the project folder with exactly these arguments.
    OrvixTool::Result RunExactly(const Arguments& arguments)
    {
        return OrvixTool::Run(m_program, Scratch(), Project(), arguments);
    }

    /// The same with a configuration folder of this test and a user, and with nobody to answer.
    OrvixTool::Result RunAs(const std::wstring& user, Arguments arguments)
    {
        arguments.insert(arguments.begin(), {L"--config", Config().wstring(), L"--user", user, L"--unattended"});
        return RunExactly(arguments);
    }

    OrvixTool::Result Run(Arguments arguments) { return RunAs(L"ada", std::move(arguments)); }

private:
    TempFolder m_temp;
    std::filesystem::path m_program = BuiltFile(L"orvix.exe");
};
