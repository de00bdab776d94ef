#include "OrvixPrompt.h"
#include "PromptFile.h"
#include "PromptRows.h"
#include "RandomModel.h"
#include "StoredAnswers.h"
#include "TempFolder.h"

#include <array>
#include <climits>
#include <optional>
#include <vector>

namespace
{

constexpr unsigned int MostRows = 60;

// Few, so that they repeat.
constexpr std::array<int, 8> Ids = {0, 1, 2, 3, 1000, -1, INT_MAX, INT_MIN};

constexpr std::array<unsigned long, 6> Actions = {
    0, OrvixPromptAction::Ask, OrvixPromptAction::Yes, OrvixPromptAction::No, OrvixPromptAction::YesToAll, 0xFFFFFFFF};

/// What an XML file has to carry.
const std::array<std::wstring, 10> Texts = {L"",
                                            L"Check the file out?",
                                            L" a blank around it ",
                                            L"a\r\nb\nc\rd",
                                            L"\t\n",
                                            L"<a b=\"c\">&amp;</a>]]>",
                                            L"\u5009\u00E9",
                                            L"\xD83D\xDE00",
                                            std::wstring(300, L'x'),
                                            L"&#13;"};

struct Row
{
    int id = 0;
    std::wstring text;
    unsigned long options = 0;
    unsigned long action = 0;
    bool locked = false;
};

class PromptTableModel : public RandomModel
{
public:
    explicit PromptTableModel(RandomNumbers& random) : RandomModel(random) {}

    void Step()
    {
        switch (m_random.Below(10))
        {
        case 0:
        case 1:
            Add();
            break;
        case 2:
            Register();
            break;
        case 3:
            Answer();
            break;
        case 4:
            if (m_random.OneIn(40) || m_rows.size() > MostRows)
            {
                Table().RemoveAll();
                m_rows.clear();
            }
            break;
        case 5:
            if (m_random.OneIn(100))
            {
                Save();
            }
            break;
        case 6:
            if (m_random.OneIn(100))
            {
                Load();
            }
            break;
        default:
            Set();
        }
        CompareTable();
        CompareAnswers(m_random.From(Ids));
    }

private:
    OrvixPromptTable& Table() { return m_answers.Table(); }

    Row NewRow()
    {
        return {m_random.From(Ids), m_random.From(Texts), m_random.From(Actions), m_random.From(Actions),
                m_random.OneIn(3)};
    }

    int First(int id) const
    {
        for (std::size_t i = 0; i < m_rows.size(); ++i)
        {
            if (m_rows[i].id == id)
            {
                return static_cast<int>(i);
            }
        }
        return PromptRows::None;
    }

    int Last(int id) const
    {
        for (std::size_t i = m_rows.size(); i > 0; --i)
        {
            if (m_rows[i - 1].id == id)
            {
                return static_cast<int>(i - 1);
            }
        }
        return PromptRows::None;
    }

    void Add()
    {
        const Row row = NewRow();
        if (m_random.OneIn(10))
        {
            Expect(Table().AddPrompt(row.id, nullptr, row.options, row.action, row.locked) == -1, "a row without text");
            return;
        }
        m_rows.push_back(row);
        Expect(Table().AddPrompt(row.id, row.text.c_str(), row.options, row.action, row.locked) ==
                   static_cast<int>(m_rows.size()),
               "AddPrompt");
    }

    void Register()
    {
        Row row = NewRow();
        row.locked = false;
        const bool overwrites = m_random.OneIn(2);
        const int last = Last(row.id);
        m_answers.Register(static_cast<std::uint32_t>(row.id), row.text.c_str(), row.action, row.options, overwrites);
        if (last == PromptRows::None)
        {
            m_rows.push_back(row);
            return;
        }
        Row& old = m_rows[static_cast<std::size_t>(last)];
        old.text = row.text;
        if (overwrites)
        {
            old.options = row.options;
            old.action = row.action;
        }
    }

    void Answer()
    {
        const int id = m_random.From(Ids);
        const unsigned long action = m_random.From(Actions);
        const int last = Last(id);
        const bool isStored = last != PromptRows::None && !m_rows[static_cast<std::size_t>(last)].locked;
        Expect(m_answers.SetAction(static_cast<std::uint32_t>(id), action) == isStored, "an answer that is stored");
        if (isStored)
        {
            m_rows[static_cast<std::size_t>(last)].action = action;
        }
    }

    /// Sets one value of a row, which may be out of range.
    void Set()
    {
        const unsigned int index = m_random.Below(static_cast<unsigned int>(m_rows.size()) + 2);
        const Row row = NewRow();
        Row outOfRange;
        const bool isThere = index < m_rows.size();
        Row& old = isThere ? m_rows[index] : outOfRange;
        bool isSet = false;
        switch (m_random.Below(6))
        {
        case 0:
            old.id = row.id;
            isSet = Table().SetPromptID(index, row.id);
            break;
        case 1:
            old.text = row.text;
            isSet = Table().SetPromptText(index, row.text.c_str());
            break;
        case 2:
            old.options = row.options;
            isSet = Table().SetPromptOptions(index, row.options);
            break;
        case 3:
            old.action = row.action;
            isSet = Table().SetPrompt(index, row.action);
            break;
        case 4:
            old.locked = row.locked;
            isSet = Table().SetLocked(index, row.locked);
            break;
        default:
            Expect(!Table().SetPromptText(index, nullptr), "SetPromptText of null");
            isSet = isThere;
        }
        Expect(isSet == isThere, "a value that is set");
    }

    /// An empty table is not written: the old file stays.
    void Save()
    {
        Expect(m_answers.Save(m_path.c_str()), "Save");
        if (!m_rows.empty())
        {
            m_file = m_rows;
        }
    }

    void Load()
    {
        Expect(m_answers.Load(m_path.c_str()) == m_file.has_value(), "Load");
        m_rows = m_file.value_or(std::vector<Row>());
    }

    void CompareTable()
    {
        const auto count = static_cast<unsigned int>(m_rows.size());
        Expect(Table().NumPrompts() == static_cast<int>(count), "NumPrompts");
        for (unsigned int i = 0; i < count; ++i)
        {
            const Row& row = m_rows[i];
            Expect(Table().GetPromptID(i) == row.id, "GetPromptID");
            Expect(Table().GetPromptText(i) == row.text, "GetPromptText");
            Expect(Table().GetPromptOptions(i) == row.options, "GetPromptOptions");
            Expect(Table().GetPrompt(i) == row.action, "GetPrompt");
            Expect(Table().GetLocked(i) == row.locked, "GetLocked");
        }
        Expect(Table().GetPromptID(count) == -1 && Table().GetPromptText(count) == nullptr &&
                   Table().GetPromptOptions(count) == 0 && Table().GetPrompt(count) == 0 && !Table().GetLocked(count),
               "a row out of range");
    }

    void CompareAnswers(int id)
    {
        const int first = First(id);
        const Row row = first == PromptRows::None ? Row{} : m_rows[static_cast<std::size_t>(first)];
        const auto promptID = static_cast<std::uint32_t>(id);
        Expect(PromptRows::First(Table(), id) == first, "the first row of an ID");
        Expect(PromptRows::Last(Table(), id) == Last(id), "the last row of an ID");
        Expect(m_answers.GetAction(promptID) == row.action, "GetAction");
        Expect(m_answers.IsLocked(promptID) == row.locked, "IsLocked");
    }

    TempFolder m_folder;
    std::wstring m_path = (m_folder.Path() / PromptFileName).wstring();
    StoredAnswers m_answers;
    std::vector<Row> m_rows;                ///< the model
    std::optional<std::vector<Row>> m_file; ///< what is in the file; none while there is no file
};

} // namespace

TEST(RandomSteps, OfPromptsKeepTheTableLikeItsModel)
{
    RunModel<PromptTableModel>();
}
