#include "IOrvixCoreUI.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixPromptTable.h"

#include <gtest/gtest.h>
#include <windows.h>

#include <bit>

namespace
{

/// A handle that no window has: a dialog that belongs to it cannot be shown, with or without a display.
void* NoWindow()
{
    return std::bit_cast<void*>(std::uintptr_t{0x7FFFFFF0});
}

/// The reference library of the build, beside the scripted one that this program has loaded.
class ReferenceUI : public testing::Test
{
protected:
    void SetUp() override
    {
        m_module = LoadLibraryW(ORVIX_REFERENCE_UI);
        ASSERT_NE(m_module, nullptr);
        ASSERT_EQ(GetProcAddress(m_module, "GetCoreUIScript"), nullptr) << "the scripted one";
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
        if (m_module != nullptr)
        {
            FreeLibrary(m_module);
        }
    }

    template <typename Pointer>
    Pointer Function(const char* name) const
    {
        return reinterpret_cast<Pointer>(reinterpret_cast<void*>(GetProcAddress(m_module, name)));
    }

    HMODULE m_module = nullptr;
    IOrvixCoreUI* m_coreUI = nullptr;
};

TEST_F(ReferenceUI, AnswersNoWhereThePromptCannotBeShown)
{
    bool dontAskAgain = false;
    EXPECT_EQ(m_coreUI->ShowPrompt(NoWindow(), nullptr, nullptr, 0x100, &dontAskAgain), 0);
    EXPECT_FALSE(dontAskAgain);
}

TEST_F(ReferenceUI, CancelsWhereTheFileListCannotBeShown)
{
    OrvixFileList list;
    OrvixFileEntry* entry = list.CreateEntry(L"a", nullptr, 1, 0);
    entry->SetFlagsOut(0x2);
    list.AddActiveEntry(entry);
    OrvixFileListDialogParams params;
    params.SetOrvixFileList(&list);
    params.SetOptions(0xD5);
    params.SetComment(L"comment");
    EXPECT_EQ(m_coreUI->ShowFileListDialog(NoWindow(), &params), 0);
    EXPECT_EQ(entry->GetFlagsOut(), 0x2U);
    EXPECT_EQ(params.GetOptions(), 0xD5U);
    EXPECT_STREQ(params.GetComment(), L"comment");
}

TEST_F(ReferenceUI, CancelsWhereThereIsNoFileListToShow)
{
    OrvixFileListDialogParams params;
    EXPECT_EQ(m_coreUI->ShowFileListDialog(nullptr, &params), 0);
    EXPECT_EQ(m_coreUI->ShowFileListDialog(nullptr, nullptr), 0);
}

TEST_F(ReferenceUI, ChangesNothingWhereTheEditorCannotBeShown)
{
    OrvixPromptTable prompts;
    prompts.AddPrompt(1, L"text", 0, 0x2, false);
    EXPECT_EQ(m_coreUI->EditPrompts(NoWindow(), nullptr, &prompts), 0);
    EXPECT_EQ(prompts.GetPrompt(0), 0x2U);
}

} // namespace
