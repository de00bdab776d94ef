#include "OrvixPrompt.h"
#include "OrvixPromptTable.h"
#include "PromptFile.h"
#include "TempFolder.h"

#include <gtest/gtest.h>

#include <string>

TEST(PromptFileWrite, IsFalseWhenTheFileCannotBeSaved)
{
    const TempFolder folder;
    OrvixPromptTable table;
    ASSERT_EQ(table.AddPrompt(1, L"a", 0, OrvixPromptAction::Yes, false), 1);
    EXPECT_FALSE(WritePromptFile(table, (folder.Text() + L"\\nowhere\\OrvixPrompts.xml").c_str()));
    EXPECT_TRUE(WritePromptFile(table, (folder.Text() + L"\\OrvixPrompts.xml").c_str()));
}
