// An OrvixCoreUI.dll whose file-list dialog is answered by the environment variable ORVIX_TEST_ANSWER, which holds some
// of these words: "yes" confirms, "untick" unticks the first file, "keep" ticks the option, "remember" remembers.

#include "IOrvixCoreUI.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"

#include <windows.h>

#include <string>

namespace
{

class WrittenAnswerUI final : public IOrvixCoreUI
{
public:
    void SetClientAccess(IOrvixCoreUIClientAccess*) override {}
    std::int32_t ShowPrompt(void*, void*, void*, std::uint32_t, bool*) override { return 0; }
    std::int32_t EditPrompts(void*, void*, OrvixPromptTable*) override { return 0; }

    std::int32_t ShowFileListDialog(void*, OrvixFileListDialogParams* params) override
    {
        wchar_t buffer[100] = L"";
        GetEnvironmentVariableW(L"ORVIX_TEST_ANSWER", buffer, static_cast<DWORD>(std::size(buffer)));
        const std::wstring answer = buffer;
        const auto says = [&](const wchar_t* word) { return answer.find(word) != std::wstring::npos; };

        OrvixFileList* list = params->GetOrvixFileList();
        for (unsigned int i = 0; i < list->NumActiveEntries(); ++i)
        {
            OrvixFileEntry* entry = list->GetActiveFileEntry(i);
            const bool ticked = i > 0 || !says(L"untick");
            entry->SetFlagsOut(ticked ? entry->GetFlagsOut() | 0x2UL : entry->GetFlagsOut() & ~0x2UL);
        }
        params->SetOptions(params->GetOptions() | (says(L"keep") ? 0x10U : 0U) | (says(L"remember") ? 0x80U : 0U));
        return says(L"yes") ? 1 : 0;
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
