#include "CoreUI.h"

#include "FileListDialog.h"
#include "OrvixFileListDialogParams.h"
#include "PromptDialog.h"
#include "PromptEditorDialog.h"

std::int32_t CoreUI::ShowPrompt(void* a, void* b, void* c, std::uint32_t options, bool* dontAskAgain)
{
    PromptDialog dialog(m_access, static_cast<const wchar_t*>(b), static_cast<const wchar_t*>(c), options);
    const std::int32_t answer = dialog.Run(static_cast<HWND>(a));
    *dontAskAgain = dialog.DoNotAskAgain();
    return answer;
}

std::int32_t CoreUI::ShowFileListDialog(void* a, OrvixFileListDialogParams* params)
{
    if (params == nullptr || params->GetOrvixFileList() == nullptr)
    {
        return 0;
    }
    return FileListDialog(m_access, *params).Run(static_cast<HWND>(a));
}

std::int32_t CoreUI::EditPrompts(void* a, void*, OrvixPromptTable* prompts)
{
    return PromptEditorDialog(m_access, *prompts).Run(static_cast<HWND>(a));
}

IOrvixCoreUI* GetIOrvixCoreUI()
{
    return new CoreUI;
}

void ReleaseIOrvixCoreUI(IOrvixCoreUI* coreUI)
{
    delete static_cast<CoreUI*>(coreUI);
}
