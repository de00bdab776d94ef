#pragma once

#include "IOrvixCoreUI.h"

#include <functional>
#include <vector>

/// What the scripted OrvixCoreUI.dll answers, and what the library asked of it. Link the test program with
/// ScriptedCoreUI. The process has one script.
struct CoreUIScript
{
    struct Prompt
    {
        void* a;
        void* b;
        void* c;
        std::uint32_t options;
        bool* dontAskAgain;
    };
    struct FileList
    {
        void* a;
        OrvixFileListDialogParams* params;
    };
    struct Editor
    {
        void* a;
        void* b;
        OrvixPromptTable* prompts;
    };

    /// The dialogs. One that is not set answers no, cancelled or unchanged. They may throw.
    std::function<std::int32_t(const Prompt&)> onPrompt;
    std::function<std::int32_t(const FileList&)> onFileList;
    std::function<std::int32_t(const Editor&)> onEditor;

    /// Every dialog that the library asked for, with its arguments.
    std::vector<Prompt> prompts;
    std::vector<FileList> fileLists;
    std::vector<Editor> editors;

    /// The interfaces that were obtained, their client accesses, and the interfaces that were released.
    std::vector<IOrvixCoreUI*> obtained;
    std::vector<IOrvixCoreUIClientAccess*> accesses;
    std::vector<IOrvixCoreUI*> released;
};

extern "C" ORVIXCOREUI_API CoreUIScript& GetCoreUIScript();
