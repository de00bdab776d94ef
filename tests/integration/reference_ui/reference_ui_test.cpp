#include "BuiltFile.h"
#include "IOrvixCoreUI.h"
#include "OrvixDialogOption.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixPrompt.h"
#include "OrvixPromptTable.h"
#include "UniqueHandle.h"

#include <gtest/gtest.h>
#include <windows.h>

#include <bit>

namespace
{

/// A handle that no window has. A dialog with this owner cannot be shown, with or without a display.
void* NoWindow()
{
    return std::bit_cast<void*>(std::uintptr_t{0x7FFFFFF0});
}

/// The reference library of the build. This program has the scripted one loaded as well.
class ReferenceUI : public testing::Test
{
protected:
    void SetUp() override
    {
        ASSERT_TRUE(m_module);
        ASSERT_EQ(GetProcAddress(m_module.Get(), "GetCoreUIScript"), nullptr) << "the scripted one";
        m_coreUI = Function<decltype(&GetIOrvixCoreUI)>("GetIOrvixCoreUI")();
        ASSERT_NE(m_coreUI, nullptr);
        m_coreUI->SetClientAccess(nullptr);
    }
    void TearDown() override
    {
        if (m_coreUI != nullptr)
        {
            Function<decltype(&ReleaseIOrvixCoreUI)>("ReleaseIOrvixCoreUI")(m_coreUI);
        }
    }

    template <typename Pointer>
    Pointer Function(const char* name) const
    {
        return reinterpret_cast<Pointer>(reinterpret_cast<void*>(GetProcAddress(m_module.Get(), name)));
    }

    UniqueModule m_module{LoadLibraryW(BuiltFile(L"OrvixCoreUI.dll").c_str())};
    IOrvixCoreUI* m_coreUI = nullptr;
};

TEST_F(ReferenceUI, AnswersNoWhereThePromptCannotBeShown)
{
    bool dontAskAgain = false;
    EXPECT_EQ(m_coreUI->ShowPrompt(NoWindow(), nullptr, nullptr, OrvixPromptOption::OfferStopAsking, &dontAskAgain),
              OrvixPromptAnswer::No);
    EXPECT_FALSE(dontAskAgain);
}

TEST_F(ReferenceUI, CancelsWhereTheFileListCannotBeShown)
{
    OrvixFileList list;
    OrvixFileEntry* entry = list.CreateEntry(L"a", nullptr, OrvixFileSelection::Selected, 0);
    entry->SetFlagsOut(OrvixFileState::Controlled);
    list.AddActiveEntry(entry);
    OrvixFileListDialogParams params;
    params.SetOrvixFileList(&list);
    constexpr std::uint32_t Options = OrvixDialogOption::EntriesCanBeCleared | OrvixDialogOption::OfferKeepCheckedOut |
                                      OrvixDialogOption::OptionChecked | OrvixDialogOption::OfferRemember |
                                      OrvixDialogOption::RememberChecked;
    params.SetOptions(Options);
    params.SetComment(L"comment");
    EXPECT_EQ(m_coreUI->ShowFileListDialog(NoWindow(), &params), OrvixDialogResult::Cancelled);
    EXPECT_EQ(entry->GetFlagsOut(), OrvixFileState::Controlled);
    EXPECT_EQ(params.GetOptions(), Options);
    EXPECT_STREQ(params.GetComment(), L"comment");
}

TEST_F(ReferenceUI, CancelsWhereThereIsNoFileListToShow)
{
    OrvixFileListDialogParams params;
    EXPECT_EQ(m_coreUI->ShowFileListDialog(nullptr, &params), OrvixDialogResult::Cancelled);
    EXPECT_EQ(m_coreUI->ShowFileListDialog(nullptr, nullptr), OrvixDialogResult::Cancelled);
}

TEST_F(ReferenceUI, ChangesNothingWhereTheEditorCannotBeShown)
{
    OrvixPromptTable prompts;
    prompts.AddPrompt(1, L"text", 0, OrvixPromptAction::Yes, false);
    EXPECT_EQ(m_coreUI->EditPrompts(NoWindow(), nullptr, &prompts), OrvixPromptEditorResult::Unchanged);
    EXPECT_EQ(prompts.GetPrompt(0), OrvixPromptAction::Yes);
}

} // namespace
