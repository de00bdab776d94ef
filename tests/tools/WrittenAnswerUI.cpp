// An OrvixCoreUI.dll whose file-list dialog is answered by the environment variable ORVIX_TEST_ANSWER. It holds some of
// these words: "yes" confirms, "clear" clears the first file, "keep" checks the option, "remember" stores the answers,
// and "slowly" takes a while to answer.

#include "IOrvixCoreUI.h"
#include "OrvixDialogOption.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixPrompt.h"

#include <windows.h>

#include <string>

namespace
{

class WrittenAnswerUI final : public IOrvixCoreUI
{
public:
    void SetClientAccess(IOrvixCoreUIClientAccess*) override {}
    std::int32_t ShowPrompt(void*, void*, void*, std::uint32_t, bool*) override { return OrvixPromptAnswer::No; }
    std::int32_t EditPrompts(void*, void*, OrvixPromptTable*) override { return OrvixPromptEditorResult::Unchanged; }

    std::int32_t ShowFileListDialog(void*, OrvixFileListDialogParams* params) override
    {
        wchar_t buffer[100] = L"";
        GetEnvironmentVariableW(L"ORVIX_TEST_ANSWER", buffer, static_cast<DWORD>(std::size(buffer)));
        const std::wstring answer = buffer;
        const auto says = [&](const wchar_t* word) { return answer.find(word) != std::wstring::npos; };

        Sleep(says(L"slowly") ? 12'000 : 0);
        OrvixFileList* list = params->GetOrvixFileList();
        for (unsigned int i = 0; i < list->NumActiveEntries(); ++i)
        {
            OrvixFileEntry* entry = list->GetActiveFileEntry(i);
            const bool isChecked = i > 0 || !says(L"clear");
            entry->SetFlagsOut(isChecked ? entry->GetFlagsOut() | OrvixFileSelection::Confirmed
                                         : entry->GetFlagsOut() & ~OrvixFileSelection::Confirmed);
        }
        params->SetOptions(params->GetOptions() | (says(L"keep") ? OrvixDialogOption::OptionChecked : 0U) |
                           (says(L"remember") ? OrvixDialogOption::RememberChecked : 0U));
        return says(L"yes") ? OrvixDialogResult::Confirmed : OrvixDialogResult::Cancelled;
    }
};

WrittenAnswerUI ui;

} // namespace

IOrvixCoreUI* GetIOrvixCoreUI()
{
    return &ui;
}

void ReleaseIOrvixCoreUI(IOrvixCoreUI*)
{
}
