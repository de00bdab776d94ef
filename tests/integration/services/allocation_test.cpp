#include "AllocationSweep.h"
#include "ServicesTest.h"

namespace
{

/// Too long for the place that a short text has within a string object.
const wchar_t* const LongText = L"A question that is long enough to need memory of its own";
const std::string LongTextInFile = "A question that is long enough to need memory of its own";

using OutOfMemory = ServicesTest;

/// Two answered prompts in the file.
std::vector<StoredPrompt> TwoPrompts()
{
    return {{.text = LongTextInFile, .id = "1", .action = "2"}, {.text = LongTextInFile, .id = "2", .action = "4"}};
}

} // namespace

TEST_F(OutOfMemory, GetServicesGivesNull)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        const ServicesPointer services(round.Attempt([] { return GetIOrvixServices(); }));
        EXPECT_EQ(services == nullptr, round.Failed());
        EXPECT_NE(ServicesPointer(GetIOrvixServices()), nullptr);
    });
    EXPECT_GE(failures, 2);
}

TEST_F(OutOfMemory, RegisterOfANewPromptAddsTheWholeRowOrNone)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        const ServicesPointer services(GetIOrvixServices());
        EXPECT_TRUE(round.Attempt([&] { return services->RegisterPrompt(1, LongText, 2, 0, false); }));
        EXPECT_EQ(services->GetPromptAction(1), round.Failed() ? 0u : 2u);
        EXPECT_EQ(services->SetPromptAction(1, 8), !round.Failed());
        EXPECT_TRUE(services->RegisterPrompt(2, LongText, 4, 0, false));
        EXPECT_EQ(services->GetPromptAction(2), 4u);
    });
    EXPECT_GE(failures, 10);
}

TEST_F(OutOfMemory, RegisterOfAKnownPromptKeepsTheRow)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        const ServicesPointer services(GetIOrvixServices());
        services->RegisterPrompt(1, L"", 2, 0, false);
        EXPECT_TRUE(round.Attempt([&] { return services->RegisterPrompt(1, LongText, 4, 0, false); }));
        EXPECT_EQ(services->GetPromptAction(1), 2u);
        EXPECT_TRUE(services->RegisterPrompt(1, LongText, 4, 0, true));
        EXPECT_EQ(services->GetPromptAction(1), 4u);
    });
    EXPECT_GE(failures, 2);
}

TEST_F(OutOfMemory, InitializeAndShutdownNeverCostAStoredAnswer)
{
    WritePrompts(TwoPrompts());
    const std::filesystem::path good = AddPlugin(L"good");
    const long failures = SweepAllocations([&](AllocationRound& round) {
        ServicesPointer services(GetIOrvixServices());
        const bool found = round.Attempt([&] { return services->Initialize(&m_info, Plugins); });
        EXPECT_EQ(found, services->GetProviderCount() == 1);
        EXPECT_TRUE(found || round.Failed());
        services->Shutdown();
        EXPECT_EQ(SavedPrompts(), PromptsXml(TwoPrompts()));
        EXPECT_FALSE(IsLoaded(good));

        EXPECT_TRUE(services->Initialize(&m_info, Plugins));
        EXPECT_EQ(services->GetProviderCount(), 1u);
        EXPECT_EQ(services->GetPromptAction(2), 4u);
        services.reset();
        EXPECT_EQ(SavedPrompts(), PromptsXml(TwoPrompts()));
    });
    EXPECT_GE(failures, 20);
}

TEST_F(OutOfMemory, WhatInitializeCouldReadIsSavedAtTheEnd)
{
    AddPlugin(L"good");
    AddPlugin(L"other");
    std::vector<StoredPrompt> after = TwoPrompts();
    after[0].action = "8";
    SweepAllocations([&](AllocationRound& round) {
        WritePrompts(TwoPrompts());
        ServicesPointer services(GetIOrvixServices());
        round.Attempt([&] { services->Initialize(&m_info, Plugins); });
        const bool read = services->SetPromptAction(1, 8);
        services.reset();
        EXPECT_EQ(SavedPrompts(), PromptsXml(read ? after : TwoPrompts()));
    });
}

TEST_F(OutOfMemory, ShutdownReleasesEverythingAndWritesTheWholeFileOrNothing)
{
    const std::filesystem::path good = AddPlugin(L"good");
    std::vector<StoredPrompt> after = TwoPrompts();
    after[0].action = "8";
    const long failures = SweepAllocations([&](AllocationRound& round) {
        WritePrompts(TwoPrompts());
        const ServicesPointer services(GetIOrvixServices());
        ASSERT_TRUE(services->Initialize(&m_info, Plugins));
        services->SetPromptAction(1, 8);
        round.Attempt([&] { services->Shutdown(); });
        EXPECT_EQ(services->GetProviderCount(), 0u);
        EXPECT_FALSE(IsLoaded(good));
        EXPECT_TRUE(SavedPrompts() == PromptsXml(after) ||
                    (round.Failed() && SavedPrompts() == PromptsXml(TwoPrompts())))
            << SavedPrompts();
        EXPECT_EQ(services->GetPromptAction(1), 8u);
        services->Shutdown();
        EXPECT_EQ(SavedPrompts(), PromptsXml(after));
    });
    EXPECT_GE(failures, 2);
}

TEST_F(OutOfMemory, TheReleaseWritesTheWholeFileOrNothing)
{
    const std::filesystem::path good = AddPlugin(L"good");
    std::vector<StoredPrompt> after = TwoPrompts();
    after[0].action = "8";
    SweepAllocations([&](AllocationRound& round) {
        WritePrompts(TwoPrompts());
        ServicesPointer services(GetIOrvixServices());
        ASSERT_TRUE(services->Initialize(&m_info, Plugins));
        services->SetPromptAction(1, 8);
        round.Attempt([&] { services.reset(); });
        EXPECT_FALSE(IsLoaded(good));
        EXPECT_TRUE(SavedPrompts() == PromptsXml(after) ||
                    (round.Failed() && SavedPrompts() == PromptsXml(TwoPrompts())))
            << SavedPrompts();
    });
}

// Provider configurations live until the process ends, so what their loading keeps is no leak: the rounds are
// counted here without the sweep's look at the heaps.
TEST_F(OutOfMemory, InitializeWithProviderSettingsLetsNothingOutAndCanBeRepeated)
{
    WritePrompts(TwoPrompts());
    AddPlugin(L"good");
    WriteProviders("<a><Name>Fake Depot</Name><FixedProjectRoot>" + LongTextInFile +
                   "</FixedProjectRoot><Filters><f><Name>" + LongTextInFile +
                   "</Name><Folder>C:\\A folder that is long enough\\</Folder><FileType>tmp</FileType></f>"
                   "</Filters></a>");
    LibraryHeap heap;
    for (const bool forGood : {false, true})
    {
        long n = 1;
        for (bool failed = true; failed; ++n)
        {
            SCOPED_TRACE(n);
            ServicesPointer services(GetIOrvixServices());
            AllocationRound round(heap, n, forGood);
            round.Attempt([&] { services->Initialize(&m_info, Plugins); });
            failed = round.Failed();
            services->Shutdown();
            ASSERT_EQ(SavedPrompts(), PromptsXml(TwoPrompts()));

            services.reset(GetIOrvixServices());
            ASSERT_TRUE(services->Initialize(&m_info, Plugins));
            ASSERT_STREQ(services->GetProviderFixedProjectRoot(0), LongText);
            ASSERT_TRUE(services->IsFileExcludedByProvider(0, L"a.tmp", nullptr));
        }
        EXPECT_GT(n, 30);
    }
}

TEST_F(OutOfMemory, AFilterThatCannotBeAskedExcludesNothing)
{
    AddPlugin(L"good");
    WriteProviders("<a><Name>Depot</Name><Filters><f><Name>" + LongTextInFile +
                   "</Name><FileType>tmp</FileType></f></Filters></a>");
    ASSERT_TRUE(Initialize());
    const long failures = SweepAllocations([&](AllocationRound& round) {
        std::wstring name;
        const bool excluded = round.Attempt(
            [&] { return m_services->IsFileExcludedByProvider(0, L"C:\\a folder\\and another\\a file.tmp", &name); });
        EXPECT_EQ(excluded, !round.Failed());
        EXPECT_EQ(name, round.Failed() ? L"" : LongText);
        EXPECT_TRUE(m_services->IsFileExcludedByProvider(0, L"a.tmp", nullptr));
    });
    EXPECT_GE(failures, 2);
}

TEST_F(OutOfMemory, LookUpsNeedNoMemory)
{
    AddPlugin(L"good");
    WriteProviders("<a><Name>Depot</Name><FixedProjectRoot>root</FixedProjectRoot></a>");
    WritePrompts(TwoPrompts());
    ASSERT_TRUE(Initialize());
    const long failures = SweepAllocations([&](AllocationRound& round) {
        EXPECT_TRUE(round.Attempt([&] {
            return m_services->GetProviderCount() == 1 && m_services->GetProvider(0) &&
                   m_services->GetProviderName(0) == std::wstring_view(L"Fake Depot") &&
                   m_services->GetProviderFixedProjectRoot(0) == std::wstring_view(L"root") &&
                   m_services->GetProviderAltExecutable(0) && m_services->GetPromptAction(2) == 4 &&
                   m_services->SetPromptAction(2, 4);
        }));
    });
    EXPECT_EQ(failures, 0);
}
