#include "ServicesTest.h"

#include <psapi.h>

#include <functional>
#include <ostream>

namespace
{

std::string Repeated(std::string_view text, std::size_t count)
{
    std::string result;
    result.reserve(text.size() * count);
    for (; count > 0; --count)
    {
        result += text;
    }
    return result;
}

std::string Utf16(std::u16string_view text)
{
    return "\xFF\xFE" + std::string(reinterpret_cast<const char*>(text.data()), text.size() * sizeof(char16_t));
}

/// Entities that name each other, each ten times the one before.
std::string NestedEntities()
{
    std::string dtd = "<!DOCTYPE a [<!ENTITY e0 \"lol\">";
    for (int i = 1; i < 12; ++i)
    {
        dtd += "<!ENTITY e" + std::to_string(i) + " \"" + Repeated("&e" + std::to_string(i - 1) + ";", 10) + "\">";
    }
    return dtd + "]>";
}

/// Parameter entities that name each other, which a parser expands although no text refers to them.
std::string NestedParameterEntities()
{
    std::string dtd = "<!DOCTYPE a [<!ENTITY % e0 \"<!-- -->\">";
    for (int i = 1; i <= 10; ++i)
    {
        dtd +=
            "<!ENTITY % e" + std::to_string(i) + " \"" + Repeated("&#37;e" + std::to_string(i - 1) + ";", 10) + "\">";
    }
    return dtd + "%e10;]>";
}

/// One long entity, to be used often.
std::string LongEntity()
{
    return "<!DOCTYPE a [<!ENTITY e \"" + std::string(1000000, 'x') + "\">]>";
}

const std::string Declaration = "<?xml version=\"1.0\"?>";

/// Bytes that are no XML document, or one that uses entities of its own. Both files then count as missing.
struct Unreadable
{
    const char* name;
    std::function<std::string()> bytes;
};

void PrintTo(const Unreadable& file, std::ostream* stream)
{
    *stream << file.name;
}

class UnreadableFile : public ServicesTest, public testing::WithParamInterface<Unreadable>
{
};

/// Well-formed files that try to exhaust the reader.
class HostileFile : public ServicesTest
{
protected:
    void TearDown() override
    {
        PROCESS_MEMORY_COUNTERS memory{};
        memory.cb = sizeof memory;
        GetProcessMemoryInfo(GetCurrentProcess(), &memory, sizeof memory);
        RecordProperty("peak_megabytes", static_cast<int>(memory.PeakWorkingSetSize >> 20));
        EXPECT_LT(memory.PeakWorkingSetSize, std::size_t{512} << 20);
    }
};

} // namespace

TEST_P(UnreadableFile, OfPromptsIsAnEmptyTableAndStaysAsItIs)
{
    const std::string bytes = GetParam().bytes();
    WritePrompts({{.id = "1", .action = InFile(Action::Yes)}});
    Initialize(0);
    ASSERT_EQ(m_services->GetPromptAction(1), Action::Yes);
    WriteBytes(PromptsFile(), bytes);
    EXPECT_FALSE(Initialize(0));
    EXPECT_EQ(m_services->GetPromptAction(1), 0u);
    m_services->Shutdown();
    EXPECT_EQ(ReadBytes(PromptsFile()), bytes);
}

TEST_P(UnreadableFile, OfProvidersLeavesEveryProviderEnabledAndUnfiltered)
{
    AddPlugin(L"good");
    WriteBytes(m_config.Path() / L"OrvixProviders.xml", GetParam().bytes());
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(ProviderNames(), Names{L"Fake Depot"});
    EXPECT_EQ(m_services->GetProviderFixedProjectRoot(0), nullptr);
}

INSTANTIATE_TEST_SUITE_P(
    Bytes, UnreadableFile,
    testing::Values(
        Unreadable{"Empty", [] { return std::string(); }},
        Unreadable{"BlanksOnly", [] { return std::string(" \r\n\t "); }},
        Unreadable{"ByteOrderMarkOnly", [] { return std::string("\xEF\xBB\xBF"); }},
        Unreadable{"Truncated",
                   [] {
                       const std::string whole = PromptsXml({{.id = "1", .action = InFile(Action::Yes)}});
                       return whole.substr(0, whole.size() - 3);
                   }},
        Unreadable{"TruncatedProviders",
                   [] { return Declaration + "<OrvixProviders><a><Name>Depot</Name><Enabled>false</Enabled></a>"; }},
        Unreadable{"Binary", [] { return ReadBytes(std::filesystem::path(ORVIX_FAKE_PLUGINS) / L"good.dll"); }},
        Unreadable{"NulBytes", [] { return std::string(4096, '\0'); }},
        Unreadable{"NulInText",
                   [] { return Declaration + "<OrvixProviders>a" + std::string(1, '\0') + "</OrvixProviders>"; }},
        Unreadable{"InvalidUtf8", [] { return Declaration + "<OrvixProviders>\xC3\x28\xFF</OrvixProviders>"; }},
        Unreadable{"OddUtf16", [] { return Utf16(u"<?xml version=\"1.0\"?><a>text</a") + "x"; }},
        Unreadable{"ControlCharacter", [] { return Declaration + "<OrvixProviders>\x01</OrvixProviders>"; }},
        Unreadable{"TwoRoots", [] { return Declaration + "<OrvixProviders/><OrvixProviders/>"; }},
        Unreadable{"UnknownEntity", [] { return Declaration + "<OrvixProviders>&nothing;</OrvixProviders>"; }},
        Unreadable{"OpenElements", [] { return Declaration + Repeated("<n>", 100000); }},
        Unreadable{"EntitiesOfEntities",
                   [] {
                       return Declaration + NestedEntities() + "<OrvixProviders><a><Name>&e11;</Name></a>" +
                              "</OrvixProviders>";
                   }},
        Unreadable{"ParameterEntitiesOfEntities",
                   [] {
                       return Declaration + NestedParameterEntities() +
                              "<OrvixProviders><a><Name>Depot</Name><Enabled>false</Enabled></a></OrvixProviders>";
                   }},
        Unreadable{"DocumentTypeOfPrompts",
                   [] {
                       std::string xml = PromptsXml({{.id = "1", .action = InFile(Action::Yes)}});
                       return xml.insert(xml.find("<OrvixPrompts"), "<!DOCTYPE OrvixPrompts>");
                   }},
        Unreadable{"EntityOfAnotherFile",
                   [] {
                       return Declaration +
                              "<!DOCTYPE a [<!ENTITY e SYSTEM \"OrvixPrompts.xml\">]><OrvixProviders><a>" +
                              "<Name>Depot</Name><FixedProjectRoot>&e;</FixedProjectRoot></a></OrvixProviders>";
                   }},
        Unreadable{"EntityOfItself",
                   [] {
                       return Declaration + "<!DOCTYPE a [<!ENTITY e \"&e;\">]><OrvixProviders><a><Name>&e;</Name>" +
                              "</a></OrvixProviders>";
                   }}),
    [](const testing::TestParamInfo<Unreadable>& test) { return std::string(test.param.name); });

TEST_F(HostileFile, InUtf16IsReadLikeAnyOther)
{
    AddPlugin(L"good");
    WriteBytes(PromptsFile(), Utf16(u"<?xml version=\"1.0\" encoding=\"UTF-16\"?><r><p><Text>\u5009</Text><ID>1</ID>"
                                    u"<Locked>false</Locked><ActionOpts>0</ActionOpts><Action>2</Action></p></r>"));
    WriteBytes(m_config.Path() / L"OrvixProviders.xml",
               Utf16(u"<?xml version=\"1.0\" encoding=\"UTF-16\"?><OrvixProviders><a><Name>Depot</Name>"
                     u"<FixedProjectRoot>\u5009</FixedProjectRoot></a></OrvixProviders>"));
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes);
    EXPECT_STREQ(m_services->GetProviderFixedProjectRoot(0), L"\u5009");
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.text = "\xE5\x80\x89", .action = InFile(Action::Yes)}}));
}

TEST_F(HostileFile, WithADocumentTypeThatNothingRefersToStillDisablesAProvider)
{
    AddPlugin(L"good");
    for (const char* type : {"<!DOCTYPE a>", "<!DOCTYPE a [<!ELEMENT a ANY>]>", R"(<!DOCTYPE a SYSTEM "b.dtd">)"})
    {
        SCOPED_TRACE(type);
        WriteBytes(m_config.Path() / L"OrvixProviders.xml",
                   Declaration + type +
                       "<OrvixProviders><a><Name>Depot</Name><Enabled>false</Enabled></a></OrvixProviders>");
        Initialize();
        EXPECT_EQ(m_services->GetProviderCount(), 0u);
    }
}

TEST_F(HostileFile, WithTenMegabytesOfTextKeepsTheOtherRows)
{
    AddPlugin(L"good");
    const std::string text(10 << 20, 'x');
    WritePrompts({{.text = text, .id = "1", .action = InFile(Action::Yes)}, {.id = "2", .action = InFile(Action::No)}});
    WriteProviders("<a><Name>Depot</Name><FixedProjectRoot>" + text + "</FixedProjectRoot></a>");
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes);
    EXPECT_EQ(m_services->GetPromptAction(2), Action::No);
    EXPECT_EQ(std::wcslen(m_services->GetProviderFixedProjectRoot(0)), text.size());
    m_services->Shutdown();
    EXPECT_EQ(SavedPrompts(), PromptsXml({{.text = std::string(1024, 'x'), .id = "1", .action = InFile(Action::Yes)},
                                          {.id = "2", .action = InFile(Action::No)}}));
}

TEST_F(HostileFile, WithAVeryLongProviderNameMatchesNothing)
{
    AddPlugin(L"good");
    WriteProviders("<a><Name>" + std::string(1 << 20, 'x') + "</Name><Enabled>false</Enabled></a>");
    EXPECT_TRUE(Initialize());
}

TEST_F(HostileFile, WithAHugeAttributeIsRead)
{
    std::string xml = PromptsXml({{.id = "1", .action = InFile(Action::Yes)}});
    xml.replace(xml.find("1.0\"", xml.find("<OrvixPrompts")), 3, std::string(5 << 20, 'x'));
    WriteBytes(PromptsFile(), xml);
    Initialize(0);
    EXPECT_EQ(m_services->GetPromptAction(1), Action::Yes);
}

TEST_F(HostileFile, WithManyRowsIsReadWhole)
{
    std::vector<StoredPrompt> prompts(20000);
    for (std::size_t i = 0; i < prompts.size(); ++i)
    {
        prompts[i].id = std::to_string(i);
    }
    prompts.back().action = InFile(Action::Yes);
    WritePrompts(prompts);
    Initialize(0);
    EXPECT_EQ(m_services->GetPromptAction(19999), Action::Yes);
}

TEST_F(HostileFile, NestedTooDeepDoesNoHarm)
{
    AddPlugin(L"good");
    const std::string deep = Repeated("<n>", 100000) + Repeated("</n>", 100000);
    WriteBytes(PromptsFile(), Declaration + deep);
    WriteBytes(m_config.Path() / L"OrvixProviders.xml", Declaration + "<OrvixProviders>" + deep + "</OrvixProviders>");
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(ProviderNames(), Names{L"Fake Depot"});
    EXPECT_EQ(m_services->GetProviderFixedProjectRoot(0), nullptr);
    EXPECT_EQ(m_services->GetPromptAction(0), 0u);
    m_services->Shutdown();
    EXPECT_EQ(ReadBytes(PromptsFile()), Declaration + deep);
}

TEST_F(HostileFile, WithALongEntityUsedOftenTakesBoundedTimeAndMemory)
{
    AddPlugin(L"good");
    const std::string references = Repeated("&e;", 1000);
    // Without a declaration the root comes second, after the document type: there the reader looks for it.
    const std::string prompts = LongEntity() + "<p><Prompt><Text>" + references +
                                "</Text><ID>1</ID><Locked>false</Locked><ActionOpts>0</ActionOpts><Action>2</Action>"
                                "</Prompt></p>";
    WriteBytes(PromptsFile(), prompts);
    WriteBytes(m_config.Path() / L"OrvixProviders.xml", Declaration + LongEntity() +
                                                            "<OrvixProviders><a><Name>Depot</Name><FixedProjectRoot>" +
                                                            references + "</FixedProjectRoot></a></OrvixProviders>");
    EXPECT_TRUE(Initialize());
    EXPECT_EQ(m_services->GetProviderFixedProjectRoot(0), nullptr);
    EXPECT_EQ(m_services->GetPromptAction(1), 0u);
    m_services->Shutdown();
    EXPECT_EQ(ReadBytes(PromptsFile()), prompts);
}
