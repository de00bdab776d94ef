#include "Arguments.h"

#include "Failure.h"

#include <windows.h>

#include <filesystem>
#include <string_view>

namespace fs = std::filesystem;

namespace
{

constexpr const wchar_t* Usage =
    L"desk [--unattended] [--provider NAME] [--plugins FOLDER] [--config FOLDER] [PROJECT-FOLDER]";

/// A full path with backslashes, without one at its end.
fs::path FullPath(const fs::path& path)
{
    const fs::path full = fs::absolute(path).lexically_normal().make_preferred();
    return full.has_filename() ? full : full.parent_path();
}

fs::path DefaultPlugins()
{
    wchar_t program[MAX_PATH] = {};
    GetModuleFileNameW(nullptr, program, MAX_PATH);
    return fs::path(program).replace_filename(L"plugins");
}

fs::path DefaultConfig()
{
    const wchar_t* applicationData = _wgetenv(L"APPDATA");
    if (applicationData == nullptr)
    {
        throw Failure{L"%APPDATA% is not set; name a folder with --config"};
    }
    return fs::path(applicationData) / L"OrvixDesk";
}

} // namespace

Arguments ReadArguments(int count, const wchar_t* const* arguments)
{
    Arguments result;
    fs::path plugins;
    fs::path config;
    for (int i = 1; i < count; ++i)
    {
        const std::wstring_view argument = arguments[i];
        const auto value = [&] {
            if (++i == count)
            {
                throw Failure{std::wstring(argument) + L" needs a value:\n\n" + Usage};
            }
            return arguments[i];
        };
        if (argument == L"--unattended")
        {
            result.unattended = true;
        }
        else if (argument == L"--provider")
        {
            result.provider = value();
        }
        else if (argument == L"--plugins")
        {
            plugins = value();
        }
        else if (argument == L"--config")
        {
            config = value();
        }
        else if (argument.empty() || argument.starts_with(L'-') || !result.project.empty())
        {
            throw Failure{L"Not understood: " + std::wstring(argument) + L"\n\n" + Usage};
        }
        else
        {
            result.project = FullPath(argument).wstring();
        }
    }
    result.plugins = FullPath(plugins.empty() ? DefaultPlugins() : plugins).wstring() + L'\\';
    const fs::path configFolder = FullPath(config.empty() ? DefaultConfig() : config);
    std::error_code ignored;
    fs::create_directories(configFolder, ignored);
    if (!fs::is_directory(configFolder, ignored))
    {
        throw Failure{L"The folder of the settings cannot be made: " + configFolder.wstring()};
    }
    result.config = configFolder.wstring();
    return result;
}
