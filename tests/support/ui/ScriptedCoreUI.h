#pragma once

#include "IOrvixCoreUI.h"

#include <functional>
#include <vector>

/// What the scripted OrvixCoreUI.dll answers, and what the library asked of it. Link the test program with
/// ScriptedCoreUI; the script is one for the whole process.
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

    /// The dialogs; one that is not set is cancelled. They may throw.
    std::function<std::int32_t(const Prompt&)> onPrompt;
    std::function<std::int32_t(const FileList&)> onFileList;
    std::function<std::int32_t(const Editor&)> onEditor;

    /// Every dialog that was asked for, with the arguments as they came.
    std::vector<Prompt> prompts;
    std::vector<FileList> fileLists;
    std::vector<Editor> editors;

    /// The interface as it was handed out, given a client access, and handed back.
    std::vector<IOrvixCoreUI*> obtained;
    std::vector<IOrvixCoreUIClientAccess*> accesses;
    std::vector<IOrvixCoreUI*> released;
};

extern "C" ORVIXCOREUI_API CoreUIScript& GetCoreUIScript();
