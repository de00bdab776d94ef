#include "AllocationSweep.h"
#include "ServicesTest.h"

namespace
{

/// Too long to be inside a string object.
const wchar_t* const LongText = L"A question that is long enough to need memory of its own";
const std::string LongTextInFile = "A question that is long enough to need memory of its own";

using OutOfMemory = ServicesTest;

/// Two answered prompts in the file.
std::vector<StoredPrompt> TwoPrompts()
{
    return {{.text = LongTextInFile, .id = "1", .action = InFile(Action::Yes)},
            {.text = LongTextInFile, .id = "2", .action = InFile(Action::No)}};
}

} // namespace

TEST_F(OutOfMemory, GetServicesGivesNull)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        const OrvixServicesPointer services = round.Attempt([] { return MakeOrvixServices(); });
        EXPECT_EQ(services == nullptr, round.Failed());
        EXPECT_NE(MakeOrvixServices(), nullptr);
    });
    EXPECT_GE(failures, 2);
}

TEST_F(OutOfMemory, RegisterOfANewPromptAddsTheWholeRowOrNone)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        const OrvixServicesPointer services = MakeOrvixServices();
        EXPECT_TRUE(round.Attempt([&] { return services->RegisterPrompt(1, LongText, Action::Yes, 0, false); }));
        EXPECT_EQ(services->GetPromptAction(1), round.Failed() ? 0u : Action::Yes);
        EXPECT_EQ(services->SetPromptAction(1, Action::YesToAll), !round.Failed());
        EXPECT_TRUE(services->RegisterPrompt(2, LongText, Action::No, 0, false));
        EXPECT_EQ(services->GetPromptAction(2), Action::No);
    });
    EXPECT_GE(failures, 10);
}

TEST_F(OutOfMemory, RegisterOfAKnownPromptKeepsTheRow)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        const OrvixServicesPointer services = MakeOrvixServices();
        services->RegisterPrompt(1, L"", Action::Yes, 0, false);
        EXPECT_TRUE(round.Attempt([&] { return services->RegisterPrompt(1, LongText, Action::No, 0, false); }));
        EXPECT_EQ(services->GetPromptAction(1), Action::Yes);
        EXPECT_TRUE(services->RegisterPrompt(1, LongText, Action::No, 0, true));
        EXPECT_EQ(services->GetPromptAction(1), Action::No);
    });
    EXPECT_GE(failures, 2);
}

TEST_F(OutOfMemory, InitializeAndShutdownLoseNoStoredAnswer)
{
    WritePrompts(TwoPrompts());
    const std::filesystem::path good = AddPlugin(L"good");
    const long failures = SweepAllocations([&](AllocationRound& round) {
        OrvixServicesPointer services = MakeOrvixServices();
        const bool found = round.Attempt([&] { return services->Initialize(&m_info, OrvixProviderSource::Plugins); });
        EXPECT_EQ(found, services->GetProviderCount() == 1);
        EXPECT_TRUE(found || round.Failed());
        services->Shutdown();
        EXPECT_EQ(SavedPrompts(), PromptsXml(TwoPrompts()));
        EXPECT_FALSE(IsLoaded(good));

        EXPECT_TRUE(services->Initialize(&m_info, OrvixProviderSource::Plugins));
        EXPECT_EQ(services->GetProviderCount(), 1u);
        EXPECT_EQ(services->GetPromptAction(2), Action::No);
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
    after[0].action = InFile(Action::YesToAll);
    SweepAllocations([&](AllocationRound& round) {
        WritePrompts(TwoPrompts());
        OrvixServicesPointer services = MakeOrvixServices();
        round.Attempt([&] { services->Initialize(&m_info, OrvixProviderSource::Plugins); });
        const bool read = services->SetPromptAction(1, Action::YesToAll);
        services.reset();
        EXPECT_EQ(SavedPrompts(), PromptsXml(read ? after : TwoPrompts()));
    });
}

TEST_F(OutOfMemory, ShutdownReleasesEverythingAndWritesTheWholeFileOrNothing)
{
    const std::filesystem::path good = AddPlugin(L"good");
    std::vector<StoredPrompt> after = TwoPrompts();
    after[0].action = InFile(Action::YesToAll);
    const long failures = SweepAllocations([&](AllocationRound& round) {
        WritePrompts(TwoPrompts());
        const OrvixServicesPointer services = MakeOrvixServices();
        ASSERT_TRUE(services->Initialize(&m_info, OrvixProviderSource::Plugins));
        services->SetPromptAction(1, Action::YesToAll);
        round.Attempt([&] { services->Shutdown(); });
        EXPECT_EQ(services->GetProviderCount(), 0u);
        EXPECT_FALSE(IsLoaded(good));
        EXPECT_TRUE(SavedPrompts() == PromptsXml(after) ||
                    (round.Failed() && SavedPrompts() == PromptsXml(TwoPrompts())))
            << SavedPrompts();
        EXPECT_EQ(services->GetPromptAction(1), Action::YesToAll);
        services->Shutdown();
        EXPECT_EQ(SavedPrompts(), PromptsXml(after));
    });
    EXPECT_GE(failures, 2);
}

TEST_F(OutOfMemory, ReleaseWritesTheWholeFileOrNothing)
{
    const std::filesystem::path good = AddPlugin(L"good");
    std::vector<StoredPrompt> after = TwoPrompts();
    after[0].action = InFile(Action::YesToAll);
    SweepAllocations([&](AllocationRound& round) {
        WritePrompts(TwoPrompts());
        OrvixServicesPointer services = MakeOrvixServices();
        ASSERT_TRUE(services->Initialize(&m_info, OrvixProviderSource::Plugins));
        services->SetPromptAction(1, Action::YesToAll);
        round.Attempt([&] { services.reset(); });
        EXPECT_FALSE(IsLoaded(good));
        EXPECT_TRUE(SavedPrompts() == PromptsXml(after) ||
                    (round.Failed() && SavedPrompts() == PromptsXml(TwoPrompts())))
            << SavedPrompts();
    });
}

// Provider configurations live until the process ends, so that memory which stays allocated is no leak here. The rounds
// are therefore counted without the sweep, which looks at the heaps.
TEST_F(OutOfMemory, InitializeWithProviderSettingsThrowsNothingAndCanBeRepeated)
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
            OrvixServicesPointer services = MakeOrvixServices();
            AllocationRound round(heap, n, forGood);
            round.Attempt([&] { services->Initialize(&m_info, OrvixProviderSource::Plugins); });
            failed = round.Failed();
            services->Shutdown();
            ASSERT_EQ(SavedPrompts(), PromptsXml(TwoPrompts()));

            services = MakeOrvixServices();
            ASSERT_TRUE(services->Initialize(&m_info, OrvixProviderSource::Plugins));
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
                   m_services->GetProviderAltExecutable(0) && m_services->GetPromptAction(2) == Action::No &&
                   m_services->SetPromptAction(2, Action::No);
        }));
    });
    EXPECT_EQ(failures, 0);
}
