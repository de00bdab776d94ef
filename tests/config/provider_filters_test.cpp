#include "ImportHook.h"
#include "ProviderFilters.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <initializer_list>
#include <string>

namespace
{

/// A filter as it is after loading: folders and types in upper case.
struct Filter : ProviderFilters
{
    Filter(bool exclude, std::initializer_list<std::wstring> folders, std::initializer_list<std::wstring> types)
    {
        m_exclude = exclude;
        m_folders = folders;
        m_fileTypes = types;
    }
};

int g_allocations = 0;
void* (*g_malloc)(std::size_t) = nullptr;

void* CountingMalloc(std::size_t size)
{
    ++g_allocations;
    return g_malloc(size);
}

constexpr bool Exclude = true;
constexpr bool Include = false;

} // namespace

TEST(ProviderFilters, StartsAsAnExcludeFilterWithoutNameFoldersAndTypes)
{
    const ProviderFilters filter;
    EXPECT_EQ(filter.m_name, L"");
    EXPECT_TRUE(filter.m_exclude);
    EXPECT_TRUE(filter.m_folders.empty());
    EXPECT_TRUE(filter.m_fileTypes.empty());
}

TEST(ProviderFiltersExcludes, IsFalseForANullPath)
{
    EXPECT_FALSE(Filter(Exclude, {L""}, {L"TMP"}).Excludes(nullptr));
    EXPECT_FALSE(Filter(Include, {L"C:\\PROJ"}, {L"TMP"}).Excludes(nullptr));
}

TEST(ProviderFiltersExcludes, IsFalseForAFilterWithoutFoldersAndTypes)
{
    EXPECT_FALSE(Filter(Exclude, {}, {}).Excludes(L"C:\\X\\A.TMP"));
    EXPECT_FALSE(Filter(Include, {}, {}).Excludes(L"C:\\X\\A.TMP"));
}

TEST(ProviderFiltersExcludes, ExcludeFilterNamesFilesByTypeInAnyLetterCase)
{
    const Filter filter(Exclude, {}, {L"TMP"});
    EXPECT_TRUE(filter.Excludes(L"C:\\X\\A.TMP"));
    EXPECT_TRUE(filter.Excludes(L"c:\\x\\a.tmp"));
    EXPECT_TRUE(filter.Excludes(L"a.Tmp"));
    EXPECT_FALSE(filter.Excludes(L"C:\\X\\A.TXT"));
    EXPECT_FALSE(filter.Excludes(L"C:\\X\\README"));
    EXPECT_FALSE(filter.Excludes(L"C:\\X\\A.TMP1"));
    EXPECT_FALSE(filter.Excludes(L"C:\\X\\A.TM"));
    EXPECT_FALSE(filter.Excludes(L""));
}

TEST(ProviderFiltersExcludes, ExcludeFilterNamesFilesByFolderOrByType)
{
    const Filter filter(Exclude, {L"C:\\OUT\\"}, {L"TMP"});
    EXPECT_TRUE(filter.Excludes(L"c:\\out\\a.txt"));
    EXPECT_TRUE(filter.Excludes(L"c:\\out\\readme"));
    EXPECT_TRUE(filter.Excludes(L"d:\\else\\a.tmp"));
    EXPECT_FALSE(filter.Excludes(L"d:\\else\\a.txt"));
}

TEST(ProviderFiltersExcludes, IncludeFilterExcludesOutsideItsFoldersAndOtherTypes)
{
    const Filter filter(Include, {L"C:\\PROJ"}, {L"CFG"});
    EXPECT_TRUE(filter.Excludes(L"D:\\Other\\a.cfg"));
    EXPECT_TRUE(filter.Excludes(L"C:\\PROJ\\a.txt"));
    EXPECT_FALSE(filter.Excludes(L"C:\\proj\\a.CFG"));
    EXPECT_FALSE(filter.Excludes(L"C:\\proj\\readme"));
}

TEST(ProviderFiltersExcludes, IncludeFilterWithoutTypesLetsEveryFileOfItsFoldersIn)
{
    const Filter filter(Include, {L"C:\\PROJ"}, {});
    EXPECT_FALSE(filter.Excludes(L"C:\\proj\\a.txt"));
    EXPECT_FALSE(filter.Excludes(L"C:\\proj\\sub\\readme"));
    EXPECT_TRUE(filter.Excludes(L"D:\\proj\\a.txt"));
    EXPECT_TRUE(filter.Excludes(L""));
}

TEST(ProviderFiltersExcludes, IncludeFilterWithoutFoldersGoesByTypeAlone)
{
    const Filter filter(Include, {}, {L"CFG", L"TXT"});
    EXPECT_FALSE(filter.Excludes(L"D:\\a.cfg"));
    EXPECT_FALSE(filter.Excludes(L"D:\\a.txt"));
    EXPECT_TRUE(filter.Excludes(L"D:\\a.bin"));
    EXPECT_FALSE(filter.Excludes(L"D:\\readme"));
}

TEST(ProviderFiltersExcludes, TriesEveryFolderAndEveryType)
{
    const Filter filter(Exclude, {L"C:\\A\\", L"C:\\B\\"}, {L"OBJ", L"PCH"});
    EXPECT_TRUE(filter.Excludes(L"C:\\A\\x.c"));
    EXPECT_TRUE(filter.Excludes(L"C:\\B\\x.c"));
    EXPECT_TRUE(filter.Excludes(L"C:\\C\\x.obj"));
    EXPECT_TRUE(filter.Excludes(L"C:\\C\\x.pch"));
    EXPECT_FALSE(filter.Excludes(L"C:\\C\\x.c"));
    const Filter include(Include, {L"C:\\A\\", L"C:\\B\\"}, {});
    EXPECT_FALSE(include.Excludes(L"C:\\B\\x.c"));
}

TEST(ProviderFiltersExcludes, FolderMustStandAtTheStartOfThePath)
{
    const Filter filter(Exclude, {L"PROJ\\"}, {});
    EXPECT_TRUE(filter.Excludes(L"proj\\a.txt"));
    EXPECT_FALSE(filter.Excludes(L"C:\\proj\\a.txt"));
    EXPECT_TRUE(filter.Excludes(L"proj\\proj\\a.txt"));
}

TEST(ProviderFiltersExcludes, FolderIsAPrefixOfCharactersNotOfPathParts)
{
    const Filter filter(Exclude, {L"C:\\SONG"}, {});
    EXPECT_TRUE(filter.Excludes(L"C:\\Song\\x.txt"));
    EXPECT_TRUE(filter.Excludes(L"C:\\SONGBOOK\\X.txt"));
    EXPECT_TRUE(filter.Excludes(L"C:\\SONG"));
    EXPECT_FALSE(filter.Excludes(L"C:/SONG/x.txt"));
    EXPECT_FALSE(filter.Excludes(L"C:\\SON"));
}

TEST(ProviderFiltersExcludes, AnEmptyFolderEntryCoversEveryPath)
{
    EXPECT_TRUE(Filter(Exclude, {L""}, {}).Excludes(L"C:\\x"));
    EXPECT_TRUE(Filter(Exclude, {L""}, {}).Excludes(L""));
    EXPECT_FALSE(Filter(Include, {L""}, {}).Excludes(L"C:\\x"));
}

TEST(ProviderFiltersExcludes, ExtensionIsWhatFollowsTheLastDotOfTheWholePath)
{
    const Filter exclude(Exclude, {}, {L"B", L"GZ", L"B\\README"});
    EXPECT_FALSE(Filter(Exclude, {}, {L"B", L"README"}).Excludes(L"C:\\A.B\\README"));
    EXPECT_TRUE(Filter(Include, {}, {L"B", L"README"}).Excludes(L"C:\\A.B\\README"));
    EXPECT_TRUE(exclude.Excludes(L"C:\\A.B\\README"));
    EXPECT_TRUE(exclude.Excludes(L"C:\\x.tar.gz"));
    EXPECT_FALSE(Filter(Exclude, {}, {L"TAR", L"TAR.GZ"}).Excludes(L"C:\\x.tar.gz"));
}

TEST(ProviderFiltersExcludes, AFinalDotIsAnEmptyExtension)
{
    EXPECT_FALSE(Filter(Exclude, {}, {L"TXT"}).Excludes(L"C:\\a."));
    EXPECT_TRUE(Filter(Exclude, {}, {L""}).Excludes(L"C:\\a."));
    EXPECT_TRUE(Filter(Include, {}, {L"TXT"}).Excludes(L"C:\\a."));
}

TEST(ProviderFiltersExcludes, UppercasesTheLettersAToZOnly)
{
    const Filter filter(Exclude, {L"C:\\\u00C4"}, {});
    EXPECT_TRUE(filter.Excludes(L"c:\\\u00C4\\x"));
    EXPECT_FALSE(filter.Excludes(L"c:\\\u00E4\\x"));
    // Neither a letter of another script nor one half of a pair is taken for its low byte.
    const Filter wide(Exclude, {L"\u0461\U0001F461"}, {});
    EXPECT_TRUE(wide.Excludes(L"\u0461\U0001F461.txt"));
    EXPECT_FALSE(wide.Excludes(L"\u0441\U0001F461.txt"));
}

TEST(ProviderFiltersExcludes, TakesVeryLongPaths)
{
    const std::wstring path = L"c:\\" + std::wstring(100000, L'x') + L".tmp";
    EXPECT_TRUE(Filter(Exclude, {}, {L"TMP"}).Excludes(path.c_str()));
    EXPECT_FALSE(Filter(Exclude, {}, {L"TXT"}).Excludes(path.c_str()));
}

TEST(ProviderFiltersExcludes, TakesPathsThatJustFitOrDoNotFitItsBuffer)
{
    for (std::size_t size = 250; size < 270; ++size)
    {
        const std::wstring path = L"c:\\" + std::wstring(size - 7, L'x') + L".tmp";
        ASSERT_EQ(path.size(), size);
        EXPECT_TRUE(Filter(Exclude, {}, {L"TMP"}).Excludes(path.c_str())) << size;
        EXPECT_FALSE(Filter(Exclude, {}, {L"TM"}).Excludes(path.c_str())) << size;
        EXPECT_TRUE(Filter(Exclude, {L"C:\\XX"}, {}).Excludes(path.c_str())) << size;
        EXPECT_TRUE(Filter(Exclude, {L"C:\\" + std::wstring(size - 7, L'X') + L".TMP"}, {}).Excludes(path.c_str()))
            << size;
    }
}

TEST(ProviderFiltersExcludes, ComparesTheWholeFolderThatAgreesInItsFirstAndLastCharacters)
{
    EXPECT_FALSE(Filter(Exclude, {L"C:\\ABC\\"}, {}).Excludes(L"c:\\axc\\file"));
    EXPECT_FALSE(Filter(Exclude, {L"D:\\ABC\\"}, {}).Excludes(L"c:\\abc\\file"));
    EXPECT_FALSE(Filter(Exclude, {L"C:\\ABC\\"}, {}).Excludes(L"c:\\abcd\\file"));
    EXPECT_TRUE(Filter(Exclude, {L"C"}, {}).Excludes(L"c:\\file"));
    EXPECT_FALSE(Filter(Exclude, {L"D"}, {}).Excludes(L"c:\\file"));
}

TEST(ProviderFiltersExcludes, ComparesTypesThatBeginWithNonAsciiOrEndDifferently)
{
    EXPECT_TRUE(Filter(Exclude, {}, {L"\u00C4BC"}).Excludes(L"a.\u00C4bc"));
    EXPECT_FALSE(Filter(Exclude, {}, {L"\u00C4BC"}).Excludes(L"a.\u00C4bd"));
    EXPECT_FALSE(Filter(Exclude, {}, {L"A\u00C4C"}).Excludes(L"a.b\u00C4c"));
    EXPECT_FALSE(Filter(Exclude, {}, {L"TMP"}).Excludes(L"a.tmq"));
    EXPECT_FALSE(Filter(Exclude, {}, {L"TMP"}).Excludes(L"a.xmp"));
}

TEST(ProviderFiltersExcludes, AllocatesNothingForAPathOfUsualLength)
{
    const Filter filter(Exclude, {L"C:\\OUT\\"}, {L"TMP"});
    const std::wstring usual = L"c:\\project\\" + std::wstring(200, L'x') + L".txt";
    const std::wstring longer = L"c:\\project\\" + std::wstring(300, L'x') + L".txt";
    const ImportHook hook(GetModuleHandleW(nullptr), "malloc", reinterpret_cast<void*>(&CountingMalloc));
    ASSERT_TRUE(hook.IsActive());
    g_malloc = hook.Original<void*(std::size_t)>();
    g_allocations = 0;
    EXPECT_FALSE(filter.Excludes(usual.c_str()));
    EXPECT_EQ(g_allocations, 0);
    EXPECT_FALSE(filter.Excludes(longer.c_str()));
    EXPECT_GT(g_allocations, 0);
}

TEST(ProviderFiltersJudge, TellsTheFolderFromTheType)
{
    const Filter exclude(Exclude, {L"C:\\OUT\\"}, {L"TMP"});
    EXPECT_EQ(exclude.Judge(FilteredPath(L"c:\\out\\a.txt")), Exclusion::ByFolder);
    EXPECT_EQ(exclude.Judge(FilteredPath(L"c:\\out\\a.tmp")), Exclusion::ByFolder);
    EXPECT_EQ(exclude.Judge(FilteredPath(L"d:\\a.tmp")), Exclusion::ByType);
    EXPECT_EQ(exclude.Judge(FilteredPath(L"d:\\a.txt")), Exclusion::None);
    const Filter include(Include, {L"C:\\PROJ\\"}, {L"CFG"});
    EXPECT_EQ(include.Judge(FilteredPath(L"d:\\a.cfg")), Exclusion::ByFolder);
    EXPECT_EQ(include.Judge(FilteredPath(L"c:\\proj\\a.txt")), Exclusion::ByType);
    EXPECT_EQ(include.Judge(FilteredPath(L"c:\\proj\\a.cfg")), Exclusion::None);
}
