#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixProviderBase.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <vector>

using testing::Each;

namespace
{

/// What a provider on the base class has to say itself, and nothing more.
class SmallestProvider final : public OrvixProviderBase
{
public:
    const wchar_t* GetName() override { return L"Smallest"; }
    bool IsInitialized() override { return false; }
    bool IsProjectOpen() override { return false; }
    int Initialize(OrvixClientInfo*) override { return OrvixProviderResult::Success; }
    int Uninitialize() override { return OrvixProviderResult::Success; }
    int OpenProject(const wchar_t*, const wchar_t*) override { return OrvixProviderResult::Success; }
    int CloseProject() override { return OrvixProviderResult::Success; }
    int QueryStatus(OrvixFileList*, unsigned long) override { return OrvixProviderResult::Success; }
};

/// The provider as a host sees it.
class ProviderBase : public testing::Test
{
protected:
    IOrvixProvider& Provider() { return m_provider; }

    std::vector<int> FileOperations()
    {
        return {Provider().CheckIn(&m_list, L"", 0), Provider().CheckOut(&m_list, L"", 0),
                Provider().UndoCheckOut(&m_list, 0), Provider().GetLatest(&m_list, 0),
                Provider().Add(&m_list, L"", 0),     Provider().ShowHistory(&m_list),
                Provider().ShowProperties(&m_list)};
    }

    OrvixFileList m_list;

private:
    SmallestProvider m_provider;
};

} // namespace

TEST_F(ProviderBase, OffersNoOperationOnFiles)
{
    m_list.CreateEntry(L"C:\\a", nullptr, OrvixFileSelection::Selected, 0);
    m_list.BuildActiveList(OrvixFileSelection::Selected, false);
    EXPECT_THAT(FileOperations(), Each(OrvixProviderResult::NotOffered));
}

TEST_F(ProviderBase, FailsInEveryFileOperationForAListWithoutActiveEntries)
{
    m_list.CreateEntry(L"C:\\a", nullptr, OrvixFileSelection::Selected, 0);
    EXPECT_THAT(FileOperations(), Each(OrvixProviderResult::Failure));
}

TEST_F(ProviderBase, OffersNoDialogOfItsOwnAndNoProgram)
{
    EXPECT_EQ(Provider().ShowOptions(), OrvixProviderResult::NotOffered);
    EXPECT_EQ(Provider().RunProviderClient(), OrvixProviderResult::NotOffered);
}

TEST_F(ProviderBase, AnswersTheReservedOperationsAsTheContractAsks)
{
    EXPECT_EQ(Provider().ReservedA(), OrvixProviderResult::Success);
    EXPECT_EQ(Provider().ReservedB(), OrvixProviderResult::Success);
    EXPECT_EQ(Provider().ReservedC(), OrvixProviderResult::NotOffered);
    EXPECT_EQ(Provider().ReservedE(), OrvixProviderResult::NotOffered);
    EXPECT_EQ(Provider().ReservedF(), OrvixProviderResult::NotOffered);
    EXPECT_EQ(Provider().ReservedG(), OrvixProviderResult::NotOffered);
    EXPECT_EQ(Provider().ReservedH(), OrvixProviderResult::NotOffered);
    EXPECT_TRUE(Provider().ReservedI());
}

TEST_F(ProviderBase, StoresZeroThroughBothPointersOfReservedD)
{
    unsigned long first = 7;
    unsigned long second = 8;
    EXPECT_EQ(Provider().ReservedD(nullptr, &first, &second), OrvixProviderResult::NotOffered);
    EXPECT_EQ(first, 0U);
    EXPECT_EQ(second, 0U);
}
