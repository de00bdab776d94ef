#include "ServicesTest.h"

namespace
{

/// The path in a form in which its length has no limit.
std::filesystem::path Unlimited(const std::wstring& path)
{
    return L"\\\\?\\" + path;
}

/// A plug-in folder in which a short file name with non-ASCII letters makes a path of about 260 characters.
class PluginPathLength : public ServicesTest
{
protected:
    PluginPathLength() : m_folder(m_plugins.Text() + L"\\")
    {
        while (m_folder.size() < 220)
        {
            m_folder += std::wstring(std::min<std::size_t>(40, 221 - m_folder.size()), L'f') + L"\\";
        }
        std::filesystem::create_directories(m_folder);
        m_info.SetProviderPluginPath(m_folder.c_str());
    }

    // Here rather than in the destructor of the folder, which cannot delete such paths.
    void TearDown() override
    {
        std::error_code ignored;
        m_services.reset();
        std::filesystem::remove_all(Unlimited(m_plugins.Text()), ignored);
    }

    /// A path of exactly this many characters in the folder.
    std::wstring PathOf(std::size_t length, const std::wstring& end) const
    {
        const std::wstring start = m_folder + L"\u5009\u00E9 ";
        return start + std::wstring(length - start.size() - end.size(), L'n') + end;
    }

    void Add(const std::wstring& fake, const std::wstring& path) const
    {
        std::filesystem::copy_file(std::filesystem::path(ORVIX_FAKE_PLUGINS) / (fake + L".dll"), Unlimited(path));
    }

    std::wstring m_folder;
};

} // namespace

TEST_F(PluginPathLength, Of259CharactersFits)
{
    Add(L"good", PathOf(259, L".dll"));
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(ProviderNames(), Names{L"Fake Depot"});
}

TEST_F(PluginPathLength, Of260And261CharactersIsSkippedAndTheGoodOneIsStillFound)
{
    Add(L"good", PathOf(260, L".dll"));
    Add(L"twin", PathOf(261, L".dll"));
    EXPECT_FALSE(Initialize());
    EXPECT_EQ(FakeJournal::Read(), L"") << "loaded all the same";
    Add(L"other", PathOf(258, L".dll"));
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(ProviderNames(), Names{L"Other"});
}

TEST_F(PluginPathLength, OfTooManyCharactersIsNeverCutToTheNameOfAnotherFile)
{
    const std::wstring tooLong = PathOf(260, L".dll");
    Add(L"good", tooLong);
    Add(L"other", tooLong.substr(0, 259));
    EXPECT_FALSE(Initialize());
    EXPECT_EQ(FakeJournal::Read(), L"");
}

TEST_F(PluginPathLength, OfTheFolderAloneBeyondTheLimitFindsNothing)
{
    for (const std::size_t length : {254u, 255u, 256u, 300u, 5000u})
    {
        std::wstring folder = m_folder;
        while (folder.size() < length)
        {
            folder += L'x';
        }
        m_info.SetProviderPluginPath(folder.c_str());
        EXPECT_FALSE(Initialize()) << length;
    }
    EXPECT_EQ(m_services->GetProviderCount(), 0u);
}
