#include "OrvixPromptTable.h"

#include "FlatMap.h"
#include "PromptRows.h"
#include "RecordState.h"

#include <deque>
#include <string>
#include <utility>
#include <vector>

/// Arrays of equal length, entry i of each belonging to row i. The texts are in a deque, which never moves one: a
/// text's address holds until the text is set or removed.
struct OrvixPromptTable::State
{
    /// The first and the last row of an ID.
    struct Rows
    {
        int first = PromptRows::None;
        int last = PromptRows::None;
    };

    /// Without memory for an index the search is linear.
    Rows Find(int id)
    {
        if (!indexed)
        {
            index.Clear();
            indexed = Completes([this] { AddToIndex(0); });
        }
        if (indexed)
        {
            const Rows* rows = index.Find(id);
            return rows != nullptr ? *rows : Rows{};
        }
        Rows rows;
        for (int row = 0; row < static_cast<int>(ids.size()); ++row)
        {
            if (ids[static_cast<std::size_t>(row)] == id)
            {
                rows = {rows.first == PromptRows::None ? row : rows.first, row};
            }
        }
        return rows;
    }

    /// Adds the rows from `first` on. Throws std::bad_alloc.
    void AddToIndex(std::size_t first)
    {
        index.Reserve(ids.size());
        for (std::size_t i = first; i < ids.size(); ++i)
        {
            const int row = static_cast<int>(i);
            index.Add(ids[i], {row, row}).first.last = row;
        }
    }

    std::vector<int> ids;
    std::deque<std::wstring> texts;
    std::vector<unsigned long> options;
    std::vector<unsigned long> prompts;
    std::vector<bool> locked;

    FlatMap<int, Rows> index;
    bool indexed = true; ///< the index holds all rows
};

namespace
{

template <typename State>
bool HasRow(const State* state, unsigned int index)
{
    return state != nullptr && index < state->ids.size();
}

} // namespace

OrvixPromptTable::OrvixPromptTable() = default;

OrvixPromptTable::~OrvixPromptTable()
{
    delete m_state;
}

int OrvixPromptTable::AddPrompt(int id, const wchar_t* text, unsigned long options, unsigned long prompt, bool locked)
{
    if (text == nullptr)
    {
        return -1;
    }
    const std::size_t count = m_state != nullptr ? m_state->ids.size() : 0;
    const bool added = Completes([&] {
        State& state = StateOf(m_state);
        if (state.indexed)
        {
            state.index.Reserve(count + 1);
        }
        state.ids.push_back(id);
        state.texts.emplace_back(text);
        state.options.push_back(options);
        state.prompts.push_back(prompt);
        state.locked.push_back(locked);
    });
    if (!added)
    {
        if (m_state != nullptr)
        {
            // Shrinking does not allocate; the arrays keep equal lengths.
            m_state->ids.resize(count);
            m_state->texts.resize(count);
            m_state->options.resize(count);
            m_state->prompts.resize(count);
        }
        return -1;
    }
    if (m_state->indexed)
    {
        m_state->AddToIndex(count);
    }
    return NumPrompts();
}

int OrvixPromptTable::NumPrompts()
{
    return m_state != nullptr ? static_cast<int>(m_state->ids.size()) : 0;
}

void OrvixPromptTable::RemoveAll()
{
    delete std::exchange(m_state, nullptr);
}

int OrvixPromptTable::GetPromptID(unsigned int index)
{
    return HasRow(m_state, index) ? m_state->ids[index] : -1;
}

bool OrvixPromptTable::SetPromptID(unsigned int index, int id)
{
    if (!HasRow(m_state, index))
    {
        return false;
    }
    m_state->ids[index] = id;
    m_state->indexed = false;
    return true;
}

const wchar_t* OrvixPromptTable::GetPromptText(unsigned int index)
{
    return HasRow(m_state, index) ? m_state->texts[index].c_str() : nullptr;
}

bool OrvixPromptTable::SetPromptText(unsigned int index, const wchar_t* text)
{
    return HasRow(m_state, index) && text != nullptr && Completes([&] { m_state->texts[index] = text; });
}

unsigned long OrvixPromptTable::GetPromptOptions(unsigned int index)
{
    return HasRow(m_state, index) ? m_state->options[index] : 0;
}

bool OrvixPromptTable::SetPromptOptions(unsigned int index, unsigned long options)
{
    if (!HasRow(m_state, index))
    {
        return false;
    }
    m_state->options[index] = options;
    return true;
}

unsigned long OrvixPromptTable::GetPrompt(unsigned int index)
{
    return HasRow(m_state, index) ? m_state->prompts[index] : 0;
}

bool OrvixPromptTable::SetPrompt(unsigned int index, unsigned long prompt)
{
    if (!HasRow(m_state, index))
    {
        return false;
    }
    m_state->prompts[index] = prompt;
    return true;
}

bool OrvixPromptTable::GetLocked(unsigned int index)
{
    return HasRow(m_state, index) && m_state->locked[index];
}

bool OrvixPromptTable::SetLocked(unsigned int index, bool locked)
{
    if (!HasRow(m_state, index))
    {
        return false;
    }
    m_state->locked[index] = locked;
    return true;
}

int PromptRows::First(const OrvixPromptTable& table, int id)
{
    return table.m_state != nullptr ? table.m_state->Find(id).first : None;
}

int PromptRows::Last(const OrvixPromptTable& table, int id)
{
    return table.m_state != nullptr ? table.m_state->Find(id).last : None;
}
