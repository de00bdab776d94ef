#include "CoreUI.h"

#include "ExceptionBarrier.h"
#include "FileListDialog.h"
#include "OrvixDialogOption.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixPrompt.h"
#include "PromptDialog.h"
#include "PromptEditorDialog.h"

std::int32_t CoreUI::ShowPrompt(void* a, void* b, void* c, std::uint32_t options, bool* dontAskAgain)
{
    return WithBarrier(OrvixPromptAnswer::No, [&] {
        PromptDialog dialog(m_access, static_cast<const wchar_t*>(b), static_cast<const wchar_t*>(c), options);
        const std::int32_t answer = dialog.Run(static_cast<HWND>(a)).value_or(OrvixPromptAnswer::No);
        *dontAskAgain = dialog.DoNotAskAgain();
        return answer;
    });
}

std::int32_t CoreUI::ShowFileListDialog(void* a, OrvixFileListDialogParams* params)
{
    return WithBarrier(OrvixDialogResult::Cancelled, [&] {
        if (params == nullptr || params->GetOrvixFileList() == nullptr)
        {
            return OrvixDialogResult::Cancelled;
        }
        return FileListDialog(m_access, *params).Run(static_cast<HWND>(a)).value_or(OrvixDialogResult::Cancelled);
    });
}

std::int32_t CoreUI::EditPrompts(void* a, void*, OrvixPromptTable* prompts)
{
    return WithBarrier(OrvixPromptEditorResult::Unchanged, [&] {
        PromptEditorDialog dialog(m_access, *prompts);
        return dialog.Run(static_cast<HWND>(a)).value_or(OrvixPromptEditorResult::Unchanged);
    });
}

IOrvixCoreUI* GetIOrvixCoreUI()
{
    return new CoreUI;
}

void ReleaseIOrvixCoreUI(IOrvixCoreUI* coreUI)
{
    delete static_cast<CoreUI*>(coreUI);
}
