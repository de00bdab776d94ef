#pragma once

#include <string>

/// What the command line asks for.
struct Arguments
{
    std::wstring project;    ///< full path of the folder to open; empty for none
    std::wstring provider;   ///< name; empty for the one that was used last
    std::wstring plugins;    ///< folder of the plug-ins; ends in a backslash
    std::wstring config;     ///< folder of the settings files; exists, and does not end in a backslash
    bool unattended = false; ///< nobody answers: no dialog is shown, stored answers count
};

/// Reads `desk [--unattended] [--provider NAME] [--plugins FOLDER] [--config FOLDER] [PROJECT-FOLDER]`. Without the
/// options the plug-ins are beside the program in "plugins", and the settings in %APPDATA%\OrvixDesk, which is made.
/// Throws `Failure` for anything else and when the folder of the settings cannot be made.
Arguments ReadArguments(int count, const wchar_t* const* arguments);
