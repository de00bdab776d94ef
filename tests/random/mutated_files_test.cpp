// Files that were damaged at random. Each is read as far as it is XML or counts as broken, in bounded time. A save
// afterwards leaves a whole file, and keeps beside it what could not be read.

#include "FileBytes.h"
#include "Files.h"
#include "OrvixFileIO.h"
#include "OrvixMSSCC.h"
#include "OrvixProviderConfig.h"
#include "OrvixProviderConfigManager.h"
#include "PromptFile.h"
#include "RandomModel.h"
#include "SccRecorder.h"
#include "StoredAnswers.h"
#include "TempFolder.h"

#include <windows.h>

#include <algorithm>
#include <array>
#include <filesystem>

namespace
{

constexpr ULONGLONG LongestTime = 10000; // milliseconds for one file, on a busy machine as well

const std::string Prompts =
    R"(<?xml version="1.0" standalone="yes"?><OrvixPrompts version="1.0">)"
    "<Prompt><Text>Check the file out?</Text><ID>1</ID><Locked>false</Locked><ActionOpts>0</ActionOpts>"
    "<Action>2</Action></Prompt><Prompt><Text xml:space=\"preserve\"> \xE5\x80\x89&#13;\n</Text><ID>-2</ID>"
    "<Locked>true</Locked><ActionOpts>256</ActionOpts><Action>1</Action></Prompt></OrvixPrompts>";

const std::string Providers =
    "<?xml version=\"1.0\"?>\r\n<OrvixProviders>\r\n<Provider><Name>Depot</Name><Enabled>true</Enabled>"
    "<FixedProjectRoot>D:\\Songs</FixedProjectRoot><MSSCCProjectFile>settings.xml</MSSCCProjectFile>"
    "<Filters><Filter><Name>Takes</Name><Folder>D:\\Songs\\Takes</Folder><FileType>tmp</FileType></Filter>"
    "</Filters></Provider><!-- a note --><Provider><Name>Other</Name><Enabled>false</Enabled></Provider>"
    "</OrvixProviders>";

const std::string Settings = "<?xml version=\"1.0\" standalone=\"yes\"?><MSSCCProjectSettings><AuxPath>server</AuxPath>"
                             "<ProjectName>$/song</ProjectName></MSSCCProjectSettings>";

/// A few hundred bytes that keep a parser busy for hours when it follows them.
std::string NestedEntities()
{
    std::string type = "<!DOCTYPE a [<!ENTITY % p0 'xxxxxxxxxx'>";
    for (int i = 1; i < 10; ++i)
    {
        const std::string reference = "&#37;p" + std::to_string(i - 1) + ";";
        type += "<!ENTITY % p" + std::to_string(i) + " '";
        for (int j = 0; j < 4; ++j)
        {
            type += reference;
        }
        type += "'>";
    }
    return type + "%p9;]>";
}

const std::array<std::string, 40> Words = {
    "<",
    ">",
    "&",
    "\"",
    "=",
    "/",
    " ",
    std::string(1, '\0'),
    "\xC3",
    "\xED\xA0\x80",
    "\x01",
    "<!--",
    "-->",
    "<![CDATA[",
    "]]>",
    "<?x",
    "?>",
    "&#13;",
    "&#0;",
    "&#xD83D;",
    "&lt;",
    "&unknown;",
    "\xEF\xBB\xBF",
    "\xFF\xFE",
    "<?xml version=\"1.0\" encoding=\"UTF-16\"?>",
    "<?xml version=\"1.0\" encoding=\"windows-1252\"?>",
    "<?xml version=\"1.0\" encoding=\"UTF-7\"?>",
    "<?xml version=\"1.1\"?>",
    "<!DOCTYPE a>",
    "<!DOCTYPE a SYSTEM \"b.dtd\">",
    "<!DOCTYPE a [<!ENTITY e \"text\">]>",
    " xmlns=\"a\"",
    " xml:space=\"default\"",
    " xmlns:dt=\"urn:schemas-microsoft-com:datatypes\" dt:dt=\"bin.base64\"",
    "<Prompt>",
    "</Prompt>",
    "<Name></Name>",
    "99999999999999999999",
    std::string(5000, 'x'),
    NestedEntities(),
};

/// What may be between any two elements.
const std::array<std::string, 8> Pieces = {
    " ",
    "\r\n\t",
    "<!-- a note -->",
    "<?other instruction?>",
    "some text",
    "<Unknown><Deeper/></Unknown>",
    "<Name>a second one</Name>",
    "<Prompt><Text>a</Text><ID>3</ID><Locked/><ActionOpts>x</ActionOpts><Action>99999999999</Action></Prompt>",
};

class Mutator
{
public:
    explicit Mutator(RandomNumbers& random) : m_random(random) {}

    std::string Mutate(std::string bytes)
    {
        if (m_random.OneIn(12))
        {
            bytes = Utf16(bytes);
        }
        const bool gently = m_random.OneIn(2);
        for (unsigned int count = m_random.Below(4) + 1; count > 0; --count)
        {
            gently ? ChangeGently(bytes) : Change(bytes);
        }
        return bytes;
    }

private:
    /// In two bytes each, with a mark.
    static std::string Utf16(const std::string& bytes)
    {
        std::string wide = "\xFF\xFE";
        for (const char c : bytes)
        {
            wide += {c, '\0'};
        }
        return wide;
    }

    std::size_t Place(const std::string& bytes) { return m_random.Below(static_cast<unsigned int>(bytes.size()) + 1); }

    /// Mostly leaves a document.
    void ChangeGently(std::string& bytes)
    {
        const std::size_t gap = bytes.find("><", Place(bytes));
        if (gap != std::string::npos)
        {
            bytes.insert(gap + 1, m_random.From(Pieces));
        }
        else if (!bytes.empty())
        {
            char& character = bytes[Place(bytes) % bytes.size()];
            character = character >= '0' && character <= '9' ? '7' : character;
        }
    }

    void Change(std::string& bytes)
    {
        const std::size_t place = Place(bytes);
        const std::size_t length = m_random.OneIn(4) ? m_random.Below(200) : m_random.Below(8) + 1;
        switch (m_random.Below(8))
        {
        case 0:
            bytes.resize(place);
            break;
        case 1:
            bytes.erase(place, length);
            break;
        case 2:
            bytes.insert(place, bytes.substr(Place(bytes), length));
            break;
        case 3:
            bytes.replace(place, length, m_random.From(Words));
            break;
        case 4:
            if (place < bytes.size())
            {
                bytes[place] = static_cast<char>(m_random.Below(256));
            }
            break;
        case 5:
            if (place < bytes.size())
            {
                bytes[place] = static_cast<char>(bytes[place] ^ (1 << m_random.Below(8)));
            }
            break;
        default:
            bytes.insert(place, m_random.From(Words));
        }
    }

    RandomNumbers& m_random;
};

/// A folder with the file of each turn, and what the turns found. A turn is given whether the file is as it was.
class MutatedFiles : public testing::Test
{
protected:
    /// `turn` gives true when the file was read. `share` is in tenths of all files.
    template <typename Turn>
    void Run(const std::string& whole, unsigned int share, Turn turn)
    {
        const unsigned int count = NumberByHand(L"ORVIX_MUTATIONS", 2000) * share / 10;
        RandomNumbers random(Seed());
        Mutator mutator(random);
        unsigned int read = 0;
        for (unsigned int i = 0; i < count; ++i)
        {
            SCOPED_TRACE("seed " + std::to_string(Seed()) + ", file " + std::to_string(i));
            m_bytes = i == 0 ? whole : mutator.Mutate(whole);
            std::filesystem::remove(m_kept);
            WriteBytes(m_path, m_bytes);
            const ULONGLONG start = GetTickCount64();
            const bool isRead = turn(m_bytes == whole);
            ASSERT_LT(GetTickCount64() - start, LongestTime);
            ASSERT_FALSE(HasFailure()) << m_bytes;
            read += isRead ? 1 : 0;
        }
        RecordProperty("files", static_cast<int>(count));
        RecordProperty("read", static_cast<int>(read));
        // Both kinds occur, so that both ways are tried.
        EXPECT_GT(read, count / 20);
        EXPECT_GT(count - read, count / 20);
    }

    void ExpectKept(bool kept)
    {
        EXPECT_EQ(std::filesystem::exists(m_kept), kept);
        if (kept)
        {
            EXPECT_EQ(ReadBytes(m_kept), m_bytes);
        }
        EXPECT_FALSE(std::filesystem::exists(m_path.wstring() + L".new"));
    }

    TempFolder m_folder;
    std::filesystem::path m_path = m_folder.Path() / L"file.xml";
    std::filesystem::path m_kept = FileBytes::KeptName(m_path.wstring());
    std::string m_bytes;
};

void ExpectSameRows(OrvixPromptTable& actual, OrvixPromptTable& expected)
{
    ASSERT_EQ(actual.NumPrompts(), expected.NumPrompts());
    for (unsigned int i = 0; i < static_cast<unsigned int>(actual.NumPrompts()); ++i)
    {
        EXPECT_EQ(actual.GetPromptID(i), expected.GetPromptID(i));
        EXPECT_STREQ(actual.GetPromptText(i), expected.GetPromptText(i));
        EXPECT_EQ(actual.GetPromptOptions(i), expected.GetPromptOptions(i));
        EXPECT_EQ(actual.GetPrompt(i), expected.GetPrompt(i));
        EXPECT_EQ(actual.GetLocked(i), expected.GetLocked(i));
    }
}

/// Whether the element after the XML declaration is the root, where the library looks for it.
bool HasRootInItsPlace(const std::filesystem::path& path)
{
    OrvixFileIO file;
    if (!file.OpenDocument(path.c_str()))
    {
        return false;
    }
    const OpenedDocument opened(file);
    OrvixFileIO::Node root;
    std::wstring name;
    return file.GetChildNode(nullptr, 1, root) && file.GetNodeName(root.Get(), name);
}

/// Name of the root element of a file; empty when the file cannot be read.
std::wstring RootOf(const std::filesystem::path& path)
{
    OrvixFileIO file;
    if (!file.OpenDocument(path.c_str()))
    {
        return {};
    }
    const OpenedDocument opened(file);
    OrvixFileIO::Node root;
    std::wstring name;
    return file.GetRootElement(root, name) ? name : std::wstring();
}

} // namespace

TEST_F(MutatedFiles, OfPromptsAreReadOrKeptAndTheNextSaveIsWhole)
{
    Run(Prompts, 2, [this](bool isWhole) {
        StoredAnswers answers;
        const bool loaded = answers.Load(m_path.c_str());
        EXPECT_EQ(loaded, HasRootInItsPlace(m_path));
        EXPECT_TRUE(loaded || answers.Table().NumPrompts() == 0);
        if (isWhole)
        {
            EXPECT_EQ(answers.GetAction(1), 2u);
            EXPECT_TRUE(answers.IsLocked(static_cast<std::uint32_t>(-2)));
        }
        EXPECT_EQ(ReadBytes(m_path), m_bytes);
        answers.Register(77, L"a new one", 4, 0, true);
        EXPECT_TRUE(answers.Save(m_path.c_str()));
        ExpectKept(!loaded);

        StoredAnswers again;
        EXPECT_TRUE(again.Load(m_path.c_str()));
        ExpectSameRows(again.Table(), answers.Table());
        EXPECT_EQ(again.GetAction(77), 4u);
        return loaded;
    });
}

TEST_F(MutatedFiles, OfProvidersAreReadOrIgnoredAndStayAsTheyAre)
{
    Run(Providers, 7, [this](bool isWhole) {
        OrvixProviderConfigManager manager;
        const bool loaded = manager.LoadConfig(m_path.c_str());
        const OrvixProviderConfig* config = manager.FindConfig(L"Depot");
        EXPECT_TRUE(loaded || config == nullptr);
        const bool excluded = config != nullptr && config->IsFileExcluded(L"D:\\Songs\\Takes\\a.wav", nullptr);
        if (isWhole)
        {
            EXPECT_TRUE(excluded);
            const OrvixProviderConfig* other = manager.FindConfig(L"Other");
            EXPECT_TRUE(other != nullptr && !other->m_enabled);
        }
        EXPECT_EQ(ReadBytes(m_path), m_bytes);
        ExpectKept(false);
        return loaded;
    });
}

TEST_F(MutatedFiles, OfProjectSettingsAreReadOrKeptAndTheNextSaveIsWhole)
{
    SccRecorder& recorder = *TheSccRecorder();
    recorder = {};
    std::string projectName;
    recorder.openProject = [&](LPVOID, HWND, LPSTR, LPCSTR project, LPCSTR, LPSTR, LPCSTR, LPTEXTOUTPROC, LONG) {
        projectName = project;
        return SCC_OK;
    };
    OrvixMSSCC bridge;
    bridge.SetProvider(ORVIX_RECORDING_MSSCCI L"\\recording_full.dll", nullptr, L"Depot", false);
    bridge.SetProjectSettingsFile(m_path.filename().wstring());
    ASSERT_EQ(bridge.Initialize("host"), SCC_OK);
    const std::string folder = m_folder.Path().string();
    Run(Settings, 1, [&](bool isWhole) {
        const bool isReadable = _wcsicmp(RootOf(m_path).c_str(), L"MSSCCProjectSettings") == 0;
        EXPECT_EQ(bridge.OpenProject(folder.c_str(), "", nullptr), SCC_OK);
        recorder.calls.clear();
        if (isWhole)
        {
            EXPECT_EQ(projectName, "$/song");
        }
        EXPECT_EQ(RootOf(m_path), L"MSSCCProjectSettings");
        ExpectKept(!isReadable);
        return isReadable;
    });
    recorder = {};
}
