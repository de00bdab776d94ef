#include "ServicesTest.h"

namespace Option = OrvixPromptOption;

namespace
{

constexpr std::uint32_t LargestID = OrvixPromptID::None - 1;
constexpr std::uint32_t AllBits = 0xFFFFFFFF;
constexpr std::uint32_t HighestBit = 0x80000000;

using PromptActions = ServicesTest;
using PromptsFileLoad = ServicesTest;
using PromptsFileSave = ServicesTest;

} // namespace

TEST_F(PromptActions, AnUnknownPromptReadsAsZeroAndCannotBeSet)
{
    EXPECT_EQ(m_services->GetPromptAction(5), 0u);
    EXPECT_FALSE(m_services->SetPromptAction(5, Action::Yes));
    EXPECT_EQ(m_services->GetPromptAction(5), 0u);
}

TEST_F(PromptActions, RegisterAddsAnUnlockedRow)
{
    Initialize(0);
    EXPECT_TRUE(m_services->RegisterPrompt(5, L"Really?", Action::Yes, Option::OfferStopAsking, false));
    EXPECT_EQ(m_services->GetPromptAction(5), Action::Yes);
    EXPECT_TRUE(m_services->SetPromptAction(5, Action::YesToAll));
    EXPECT_EQ(m_services->GetPromptAction(5), Action::YesToAll);
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.text = "Really?",
                                           .id = "5",
                                           .options = InFile(Option::OfferStopAsking),
                                           .action = InFile(Action::YesToAll)}}));
}

TEST_F(PromptActions, RegisterOfAKnownPromptReplacesItsTextAlone)
{
    WritePrompts({{.text = "old",
                   .id = "5",
                   .locked = "true",
                   .options = InFile(Option::OnlyOK),
                   .action = InFile(Action::Yes)}});
    Initialize(0);
    EXPECT_TRUE(m_services->RegisterPrompt(5, L"new", Action::YesToAll, Option::InformationIcon, false));
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.text = "new",
                                           .id = "5",
                                           .locked = "true",
                                           .options = InFile(Option::OnlyOK),
                                           .action = InFile(Action::Yes)}}));
}

TEST_F(PromptActions, RegisterWithOverwriteReplacesOptionsAndActionAsWellEvenOfALockedRow)
{
    WritePrompts({{.text = "old",
                   .id = "5",
                   .locked = "true",
                   .options = InFile(Option::OnlyOK),
                   .action = InFile(Action::Yes)}});
    Initialize(0);
    EXPECT_TRUE(m_services->RegisterPrompt(5, L"new", Action::YesToAll, Option::InformationIcon, true));
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.text = "new",
                                           .id = "5",
                                           .locked = "true",
                                           .options = InFile(Option::InformationIcon),
                                           .action = InFile(Action::YesToAll)}}));
}

TEST_F(PromptActions, RegisterWithANullTextAddsNothingAndLeavesAnExistingText)
{
    WritePrompts({{.text = "old", .id = "5"}});
    Initialize(0);
    EXPECT_TRUE(m_services->RegisterPrompt(5, nullptr, Action::YesToAll, Option::InformationIcon, false));
    EXPECT_TRUE(m_services->RegisterPrompt(6, nullptr, Action::YesToAll, Option::InformationIcon, false));
    EXPECT_EQ(m_services->GetPromptAction(6), 0u);
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.text = "old", .id = "5"}}));
}

TEST_F(PromptActions, RegisterSavesNothing)
{
    Initialize(0);
    m_services->RegisterPrompt(5, L"text", Action::Yes, 0, false);
    EXPECT_FALSE(std::filesystem::exists(PromptsFile()));
}

TEST_F(PromptActions, ALockedRowCannotBeSet)
{
    WritePrompts({{.id = "5", .locked = "true", .action = InFile(Action::Yes)}});
    Initialize(0);
    EXPECT_FALSE(m_services->SetPromptAction(5, Action::No));
    EXPECT_EQ(m_services->GetPromptAction(5), Action::Yes);
}

TEST_F(PromptActions, ReadingTakesTheFirstRowOfAnIDAndWritingTheLast)
{
    WritePrompts({{.text = "a", .id = "5", .action = InFile(Action::Ask)},
                  {.text = "b", .id = "5", .action = InFile(Action::Yes)}});
    Initialize(0);
    EXPECT_EQ(m_services->GetPromptAction(5), Action::Ask);
    EXPECT_TRUE(m_services->SetPromptAction(5, Action::YesToAll));
    EXPECT_EQ(m_services->GetPromptAction(5), Action::Ask);
    EXPECT_TRUE(m_services->RegisterPrompt(5, L"c", Action::NoToAll, Option::WarningIcon, true));
    EXPECT_EQ(m_services->GetPromptAction(5), Action::Ask);
    m_services->Shutdown();
    EXPECT_EQ(
        SavedPrompts(),
        PromptsXml(
            {{.text = "a", .id = "5", .action = InFile(Action::Ask)},
             {.text = "c", .id = "5", .options = InFile(Option::WarningIcon), .action = InFile(Action::NoToAll)}}));
}

TEST_F(PromptActions, TheLockOfTheLastRowOfAnIDDecidesWhetherItIsWritten)
{
    WritePrompts({{.id = "5", .locked = "true", .action = InFile(Action::Ask)},
                  {.id = "5", .action = InFile(Action::Yes)},
                  {.id = "6", .action = InFile(Action::Ask)},
                  {.id = "6", .locked = "true", .action = InFile(Action::Yes)}});
    Initialize(0);
    EXPECT_TRUE(m_services->SetPromptAction(5, Action::YesToAll));
    EXPECT_FALSE(m_services->SetPromptAction(6, Action::YesToAll));
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.id = "5", .locked = "true", .action = InFile(Action::Ask)},
                                          {.id = "5", .action = InFile(Action::YesToAll)},
                                          {.id = "6", .action = InFile(Action::Ask)},
                                          {.id = "6", .locked = "true", .action = InFile(Action::Yes)}}));
}

TEST_F(PromptActions, IDsAndActionsUseAll32Bits)
{
    EXPECT_TRUE(m_services->RegisterPrompt(LargestID, L"text", AllBits, 0, false));
    EXPECT_EQ(m_services->GetPromptAction(LargestID), AllBits);
}

TEST_F(PromptsFileLoad, TakesTheRootByPositionWhateverItsName)
{
    WriteBytes(PromptsFile(), "<?xml version=\"1.0\"?><Another><Row><Action>2</Action><Locked>false</Locked>"
                              "<ID>5</ID><ActionOpts>0</ActionOpts><Text>t</Text></Row></Another>");
    Initialize(0);
    EXPECT_EQ(m_services->GetPromptAction(5), Action::Yes);
}

TEST_F(PromptsFileLoad, TakesACommentInThePlaceOfTheRootForTheRoot)
{
    std::string xml = PromptsXml({{.id = "5", .action = InFile(Action::Yes)}});
    xml.insert(xml.find("<OrvixPrompts"), "<!--comment-->");
    WriteBytes(PromptsFile(), xml);
    Initialize(0);
    EXPECT_EQ(m_services->GetPromptAction(5), 0u);
}

TEST_F(PromptsFileLoad, FindsNoRootInAFileWithoutDeclaration)
{
    WriteBytes(PromptsFile(), "<OrvixPrompts><Prompt><Text>t</Text><ID>5</ID><Locked>false</Locked>"
                              "<ActionOpts>0</ActionOpts><Action>2</Action></Prompt></OrvixPrompts>");
    Initialize(0);
    EXPECT_EQ(m_services->GetPromptAction(5), 0u);
}

TEST_F(PromptsFileLoad, SkipsARowInWhichOneOfTheFiveElementsIsMissing)
{
    const std::string whole =
        PromptsXml({{.id = "5", .action = InFile(Action::Yes)}, {.id = "6", .action = InFile(Action::No)}});
    for (const std::string name : {"Text", "ID", "Locked", "ActionOpts", "Action"})
    {
        SCOPED_TRACE(name);
        // The element has a name that differs in letter case alone.
        std::string xml = whole;
        xml.replace(xml.find("<" + name + ">"), name.size() + 2, "<x" + name.substr(1) + ">");
        xml.replace(xml.find("</" + name + ">"), name.size() + 3, "</x" + name.substr(1) + ">");
        WriteBytes(PromptsFile(), xml);
        Initialize(0);
        EXPECT_EQ(m_services->GetPromptAction(5), 0u);
        EXPECT_EQ(m_services->GetPromptAction(6), Action::No) << "the row after it was lost";
    }
}

TEST_F(PromptsFileLoad, MatchesElementNamesWithTheirLetterCase)
{
    std::string xml = PromptsXml({{.id = "5", .action = InFile(Action::Yes)}});
    xml.replace(xml.find("<ID>"), 4, "<Id>");
    xml.replace(xml.find("</ID>"), 5, "</Id>");
    WriteBytes(PromptsFile(), xml);
    Initialize(0);
    EXPECT_EQ(m_services->GetPromptAction(5), 0u);
}

TEST_F(PromptsFileLoad, TakesTheFirstOfSeveralElementsOfAName)
{
    std::string xml = PromptsXml({{.id = "5", .action = InFile(Action::Yes)}});
    xml.insert(xml.find("</Prompt>"), "<Action>4</Action>");
    WriteBytes(PromptsFile(), xml);
    Initialize(0);
    EXPECT_EQ(m_services->GetPromptAction(5), Action::Yes);
}

TEST_F(PromptsFileLoad, ReadsLockedAsFalseForTheTextFalseInAnyLetterCaseOnly)
{
    WritePrompts({{.id = "1", .locked = "false"},
                  {.id = "2", .locked = "FALSE"},
                  {.id = "3", .locked = "no"},
                  {.id = "4", .locked = ""},
                  {.id = "5", .locked = "true"},
                  {.id = "6", .locked = "0"}});
    Initialize(0);
    EXPECT_TRUE(m_services->SetPromptAction(1, Action::No));
    EXPECT_TRUE(m_services->SetPromptAction(2, Action::No));
    EXPECT_FALSE(m_services->SetPromptAction(3, Action::No));
    EXPECT_FALSE(m_services->SetPromptAction(4, Action::No));
    EXPECT_FALSE(m_services->SetPromptAction(5, Action::No));
    EXPECT_FALSE(m_services->SetPromptAction(6, Action::No));
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.id = "1", .action = InFile(Action::No)},
                                          {.id = "2", .action = InFile(Action::No)},
                                          {.id = "3", .locked = "true"},
                                          {.id = "4", .locked = "true"},
                                          {.id = "5", .locked = "true"},
                                          {.id = "6", .locked = "true"}}));
}

TEST_F(PromptsFileLoad, ReadsWhatIsNoNumberAsZero)
{
    WritePrompts({{.id = "abc", .options = "x", .action = InFile(Action::Yes)}, {.id = "12abc", .action = " 7"}});
    Initialize(0);
    EXPECT_EQ(m_services->GetPromptAction(0), Action::Yes);
    EXPECT_EQ(m_services->GetPromptAction(12), 7);
}

TEST_F(PromptsFileLoad, CutsATextToItsFirst1024Characters)
{
    const std::string start = "start ";
    WritePrompts({{.text = start + std::string(1500 - start.size(), 'x')},
                  {.text = std::string(1024, 'y'), .id = "2"},
                  {.text = std::string(1025, 'z'), .id = "3"}});
    Initialize(0);
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.text = start + std::string(1024 - start.size(), 'x')},
                                          {.text = std::string(1024, 'y'), .id = "2"},
                                          {.text = std::string(1024, 'z'), .id = "3"}}));
}

TEST_F(PromptsFileLoad, ACutThroughAPairOfSurrogatesLeavesAReadableFile)
{
    const std::string pair = "\xF0\x9F\x98\x80";
    WritePrompts({{.text = std::string(1023, 'x') + pair + "tail", .action = InFile(Action::Yes)}});
    Initialize(0);
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(),
              PromptsXml({{.text = std::string(1023, 'x') + "\xEF\xBF\xBD", .action = InFile(Action::Yes)}}));
}

TEST_F(PromptsFileLoad, KeepsDuplicatesInOrder)
{
    const std::vector<StoredPrompt> prompts = {{.text = "a", .id = "5", .action = InFile(Action::Ask)},
                                               {.text = "b", .id = "5"},
                                               {.text = "a", .id = "5", .action = InFile(Action::Ask)}};
    WritePrompts(prompts);
    Initialize(0);
    m_services->SetPromptAction(5, Action::Ask);
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml(prompts));
}

TEST_F(PromptsFileLoad, SurvivesElementsWhoseTypedValueIsNoText)
{
    std::string xml =
        PromptsXml({{.id = "5", .action = InFile(Action::Yes)}, {.id = "6", .action = InFile(Action::No)}});
    xml.insert(xml.find("<Prompt>") + 7, " xmlns:dt=\"urn:schemas-microsoft-com:datatypes\"");
    xml.insert(xml.find("<ID>") + 3, " dt:dt=\"int\"");
    WriteBytes(PromptsFile(), xml);
    Initialize(0);
    EXPECT_EQ(m_services->GetPromptAction(5), 0u);
    EXPECT_EQ(m_services->GetPromptAction(6), Action::No);
}

TEST_F(PromptsFileSave, WritesTheWholeTableInOrder)
{
    constexpr std::uint32_t anyAction = Action::Yes | Action::NoToAll;
    constexpr std::uint32_t anyOptions = OrvixPromptOption::OfferStopAsking;
    Initialize(0);
    m_services->RegisterPrompt(7, L"\u00C4 & <b> \"q\" \U0001F600", anyAction, anyOptions, false);
    m_services->RegisterPrompt(LargestID, L"second", HighestBit, AllBits, false);
    m_services->Shutdown();
    EXPECT_EQ(
        SavedPrompts(),
        PromptsXml(
            {{.text = "\xC3\x84 &amp; &lt;b&gt; \"q\" \xF0\x9F\x98\x80", .id = "7", .options = "256", .action = "18"},
             {.text = "second", .id = "-2", .options = "-1", .action = "-2147483648"}}));
}

TEST_F(PromptsFileSave, ReadsItsOwnFileBackBitByBit)
{
    Initialize(0);
    m_services->RegisterPrompt(LargestID, L"text", HighestBit | Action::Ask, AllBits, false);
    m_services->Shutdown();
    const std::string saved = ReadBytes(PromptsFile());

    m_services = MakeOrvixServices();
    Initialize(0);
    EXPECT_EQ(m_services->GetPromptAction(LargestID), HighestBit | Action::Ask);
    m_services->Shutdown();
    EXPECT_EQ(ReadBytes(PromptsFile()), saved);
}

TEST_F(PromptsFileSave, AnEmptyTableLeavesTheFileAlone)
{
    const std::string content = "<?xml version=\"1.0\"?><OrvixPrompts><nothing/></OrvixPrompts>";
    WriteBytes(PromptsFile(), content);
    Initialize(0);
    m_services->Shutdown();
    EXPECT_EQ(ReadBytes(PromptsFile()), content);
}

TEST_F(PromptsFileSave, AnEmptyTableMakesNoFile)
{
    Initialize(0);
    m_services.reset();
    EXPECT_FALSE(std::filesystem::exists(PromptsFile()));
}

TEST_F(PromptsFileSave, AnEmptyTextIsARowLikeAnyOther)
{
    Initialize(0);
    m_services->RegisterPrompt(1, L"", Action::Yes, 0, false);
    m_services->RegisterPrompt(2, L"text", Action::No, 0, false);
    m_services->Shutdown();
    m_services = MakeOrvixServices();
    Initialize(0);
    EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes);
    EXPECT_EQ(m_services->GetPromptAction(2), Action::No);
}

TEST_F(PromptsFileSave, TextThatXmlCannotCarryLosesNoStoredAnswer)
{
    const std::wstring badTexts[] = {
        L"\x01",
        L"a\x0B\x0C\x1F z",
        std::wstring(L"\xD800"),
        std::wstring(L"x\xDC00y"),
        std::wstring(L"\xDC00\xD800"),
        L"\xFFFE\xFFFF",
        std::wstring(L"tail\xDBFF"),
    };
    constexpr std::uint32_t firstAction = 100; // each prompt has its own
    Initialize(0);
    std::uint32_t id = 0;
    for (const std::wstring& text : badTexts)
    {
        ++id;
        m_services->RegisterPrompt(id, text.c_str(), firstAction + id, 0, false);
    }
    m_services->Shutdown();

    m_services = MakeOrvixServices();
    Initialize(0);
    for (; id != 0; --id)
    {
        EXPECT_EQ(m_services->GetPromptAction(id), firstAction + id);
    }
}

TEST_F(PromptsFileSave, ReplacesTextThatXmlCannotCarry)
{
    Initialize(0);
    m_services->RegisterPrompt(1, L"a\x01z\xD800z\xFFFE", 0, 0, false);
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.text = "a\xEF\xBF\xBDz\xEF\xBF\xBDz\xEF\xBF\xBD"}}));
}

TEST_F(PromptsFileSave, AFileThatCannotBeWrittenIsNoError)
{
    std::filesystem::create_directory(PromptsFile());
    Initialize(0);
    m_services->RegisterPrompt(5, L"text", Action::Yes, 0, false);
    m_services->Shutdown();
    EXPECT_EQ(m_services->GetPromptAction(5), Action::Yes);
    EXPECT_TRUE(std::filesystem::is_directory(PromptsFile()));
}
