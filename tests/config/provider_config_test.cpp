#include "OrvixProviderConfig.h"
#include "ProviderFilters.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

namespace
{

ProviderFilters* ExcludeType(const wchar_t* name, const wchar_t* type)
{
    static std::vector<std::unique_ptr<ProviderFilters>> filters;
    filters.push_back(std::make_unique<ProviderFilters>());
    filters.back()->m_name = name;
    filters.back()->m_fileTypes.push_back(type);
    return filters.back().get();
}

} // namespace

TEST(OrvixProviderConfig, StartsEnabledAndOtherwiseEmpty)
{
    const OrvixProviderConfig config;
    EXPECT_EQ(config.m_name, L"");
    EXPECT_TRUE(config.m_enabled);
    EXPECT_EQ(config.m_fixedProjectRoot, L"");
    EXPECT_EQ(config.m_altProviderExecutable, L"");
    EXPECT_EQ(config.m_msSccProjectFile, L"");
    EXPECT_EQ(config.m_msSccDllSearchPath, L"");
    EXPECT_EQ(config.m_msSccDllFullPath, L"");
    EXPECT_TRUE(config.m_filters.empty());
}

TEST(OrvixProviderConfigIsFileExcluded, IsFalseWithoutFiltersAndLeavesTheNameAlone)
{
    const OrvixProviderConfig config;
    std::wstring name = L"before";
    EXPECT_FALSE(config.IsFileExcluded(L"a.tmp", &name));
    EXPECT_EQ(name, L"before");
}

TEST(OrvixProviderConfigIsFileExcluded, GivesTheNameOfTheFirstFilterThatExcludes)
{
    OrvixProviderConfig config;
    config.m_filters = {ExcludeType(L"objects", L"OBJ"), ExcludeType(L"First of two", L"TMP"),
                        ExcludeType(L"second", L"TMP")};
    std::wstring name = L"before";
    EXPECT_TRUE(config.IsFileExcluded(L"a.tmp", &name));
    EXPECT_EQ(name, L"First of two");
    name = L"before";
    EXPECT_FALSE(config.IsFileExcluded(L"a.txt", &name));
    EXPECT_EQ(name, L"before");
}

TEST(OrvixProviderConfigIsFileExcluded, GivesTheVerdictWithoutAPlaceForTheName)
{
    OrvixProviderConfig config;
    config.m_filters = {ExcludeType(L"temporary", L"TMP")};
    EXPECT_TRUE(config.IsFileExcluded(L"a.tmp", nullptr));
    EXPECT_FALSE(config.IsFileExcluded(L"a.txt", nullptr));
}

TEST(OrvixProviderConfigIsFileExcluded, GivesTheSameWhenFiltersAreThereSeveralTimes)
{
    ProviderFilters* objects = ExcludeType(L"objects", L"OBJ");
    ProviderFilters* first = ExcludeType(L"first of two", L"TMP");
    ProviderFilters* second = ExcludeType(L"second", L"TMP");
    OrvixProviderConfig config;
    config.m_filters = {objects, objects, objects, first, first, objects, second, second, first};
    std::wstring name = L"before";
    EXPECT_FALSE(config.IsFileExcluded(L"a.txt", &name));
    EXPECT_EQ(name, L"before");
    EXPECT_TRUE(config.IsFileExcluded(L"a.tmp", &name));
    EXPECT_EQ(name, L"first of two");
    EXPECT_EQ(config.FindExclusion(L"a.tmp").filter, first);
    EXPECT_TRUE(config.IsFileExcluded(L"a.obj", &name));
    EXPECT_EQ(name, L"objects");
}

TEST(OrvixProviderConfigIsFileExcluded, IsFalseForANullPath)
{
    OrvixProviderConfig config;
    config.m_filters = {ExcludeType(L"temporary", L"TMP")};
    std::wstring name = L"before";
    EXPECT_FALSE(config.IsFileExcluded(nullptr, &name));
    EXPECT_EQ(name, L"before");
}

TEST(OrvixProviderConfigFindExclusion, GivesTheFirstFilterThatExcludesAndWhy)
{
    OrvixProviderConfig config;
    config.m_filters = {ExcludeType(L"objects", L"OBJ"), ExcludeType(L"first of two", L"TMP"),
                        ExcludeType(L"second", L"TMP")};
    const FileExclusion exclusion = config.FindExclusion(L"a.tmp");
    EXPECT_EQ(exclusion.filter, config.m_filters[1]);
    EXPECT_EQ(exclusion.reason, Exclusion::ByType);
}

TEST(OrvixProviderConfigFindExclusion, GivesNothingForAFileThatIsNotExcludedAndForANullPath)
{
    OrvixProviderConfig config;
    config.m_filters = {ExcludeType(L"temporary", L"TMP")};
    for (const wchar_t* path : {L"a.txt", static_cast<const wchar_t*>(nullptr)})
    {
        const FileExclusion exclusion = config.FindExclusion(path);
        EXPECT_EQ(exclusion.filter, nullptr);
        EXPECT_EQ(exclusion.reason, Exclusion::None);
    }
}
