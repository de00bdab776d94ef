#include "OperationTest.h"

#include <climits>
#include <stdexcept>

namespace
{

class ShowFileListDialog : public OperationTest
{
};

TEST_F(ShowFileListDialog, PassesItsArgumentsToTheDialogAndReturnsAnyResult)
{
    for (const std::int32_t result : {DialogResult::Cancelled, DialogResult::Confirmed, 2, -1, INT_MAX, INT_MIN})
    {
        m_dialogResult = result;
        EXPECT_EQ(m_services->ShowFileListDialog(Token(5), &m_params), result);
        EXPECT_EQ(m_script.fileLists.back().a, Token(5));
        EXPECT_EQ(m_script.fileLists.back().params, &m_params);
    }
}

TEST_F(ShowFileListDialog, IsNothingButTheDialog)
{
    AddFile(L"a");
    AddFile(L"b");
    UsePrompts();
    AddPrompt(DialogPrompt, Action::Yes);
    m_host.unattended = true;
    m_cleared = {"b"};
    m_params.SetOptions(DialogOption::RememberChecked);
    EXPECT_EQ(m_services->ShowFileListDialog(nullptr, &m_params), DialogResult::Confirmed);
    EXPECT_EQ(m_log, (Lines{"Dialog [a b] RememberChecked"}));
    EXPECT_EQ(ActiveNames(&m_list), "[a b]");
    EXPECT_EQ(m_params.GetOptions(), DialogOption::RememberChecked);
    EXPECT_EQ(m_list.GetFileEntry(0)->GetFlagsIn(), 0U);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), Action::Yes);
}

TEST_F(ShowFileListDialog, IsCancelledWhenTheDialogThrows)
{
    m_script.onFileList = [](const CoreUIScript::FileList&) -> std::int32_t { throw std::runtime_error("dialog"); };
    EXPECT_EQ(m_services->ShowFileListDialog(nullptr, &m_params), DialogResult::Cancelled);
}

} // namespace
