// What the readers of the two XML files say of what they ignore.

#include "FileDiagnostics.h"
#include "Files.h"
#include "OrvixPromptTable.h"
#include "OrvixProviderConfigManager.h"
#include "PromptFile.h"
#include "TempFolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;

namespace
{

using Kind = FileDiagnostics::Kind;

class Diagnostics : public testing::Test
{
protected:
    void ReadPrompts(const std::string& xml)
    {
        WriteBytes(m_path, xml);
        m_found = {};
        OrvixPromptTable table;
        ReadPromptFile(table, m_path.c_str(), &m_found);
    }

    void ReadProviders(const std::string& xml)
    {
        WriteBytes(m_path, xml);
        m_found = {};
        m_manager.LoadConfig(m_path.c_str(), &m_found);
    }

    /// Kind and element of each remark.
    std::vector<std::pair<Kind, std::wstring>> Remarks() const
    {
        std::vector<std::pair<Kind, std::wstring>> remarks;
        for (const FileDiagnostics::Diagnostic& diagnostic : m_found.diagnostics)
        {
            remarks.emplace_back(diagnostic.kind, diagnostic.element);
        }
        return remarks;
    }

    TempFolder m_folder;
    std::wstring m_path = (m_folder.Path() / L"file.xml").wstring();
    FileDiagnostics m_found;
    OrvixProviderConfigManager m_manager;
};

} // namespace

TEST_F(Diagnostics, OfPromptsNameWhatIsMissingUnknownOrCut)
{
    const std::string whole = "<ID>1</ID><Locked>false</Locked><ActionOpts>0</ActionOpts><Action>1</Action>";
    ReadPrompts("<?xml version=\"1.0\"?><OrvixPrompts><Prompt><Text>a</Text>" + whole + "</Prompt></OrvixPrompts>");
    EXPECT_TRUE(m_found.hasRoot);
    EXPECT_EQ(m_found.root, L"OrvixPrompts");
    EXPECT_THAT(Remarks(), IsEmpty());
    ReadPrompts(
        "<?xml version=\"1.0\"?><OrvixPrompts><Prompt><Text>" + std::string(1025, 'x') + "</Text>" + whole +
        "<Extra/></Prompt>text<Prompt><Text>a</Text><ID>1</ID><Locked>perhaps</Locked><Action>1</Action></Prompt>"
        "</OrvixPrompts>");
    EXPECT_THAT(Remarks(), ElementsAre(Pair(Kind::TextCut, L"Text"), Pair(Kind::UnknownElement, L"Extra"),
                                       Pair(Kind::UnknownValue, L"Locked"), Pair(Kind::MissingElement, L"ActionOpts")));
    EXPECT_EQ(m_found.diagnostics.back().item, 2u);
}

TEST_F(Diagnostics, OfAPromptFileTellARootThatIsNotInItsPlace)
{
    ReadPrompts("<OrvixPrompts/>");
    EXPECT_FALSE(m_found.hasRoot);
    EXPECT_EQ(m_found.root, L"OrvixPrompts");
    EXPECT_EQ(m_found.content, OrvixFileIO::Content::Document);
}

TEST_F(Diagnostics, OfProvidersNameElementsWithoutEffect)
{
    ReadProviders("<OrvixProviders><a><Name>Depot</Name><Enabled>perhaps</Enabled><Other/><Filters><f><FileType>a"
                  "</FileType></f></Filters></a><b/></OrvixProviders>");
    EXPECT_TRUE(m_found.hasRoot);
    EXPECT_THAT(Remarks(), testing::Contains(Pair(Kind::UnknownElement, L"Other")));
    EXPECT_THAT(Remarks(), testing::Contains(Pair(Kind::UnknownValue, L"Enabled")));
    ASSERT_EQ(m_found.providers.size(), 1u);
    EXPECT_EQ(m_found.providers[0].name, L"Depot");
    EXPECT_EQ(m_manager.FindAllConfigs(L"depot").size(), 1u);
    EXPECT_THAT(m_manager.FindAllConfigs(L"other"), IsEmpty());
}
