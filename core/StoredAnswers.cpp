#include "StoredAnswers.h"

namespace
{

constexpr int NoRow = -1;

bool HasID(OrvixPromptTable& table, int row, std::uint32_t promptID)
{
    return static_cast<std::uint32_t>(table.GetPromptID(static_cast<unsigned int>(row))) == promptID;
}

} // namespace

std::uint32_t StoredAnswers::GetAction(std::uint32_t promptID)
{
    const int row = FirstRow(promptID);
    return row == NoRow ? 0 : m_table.GetPrompt(static_cast<unsigned int>(row));
}

bool StoredAnswers::IsLocked(std::uint32_t promptID)
{
    const int row = FirstRow(promptID);
    return row != NoRow && m_table.GetLocked(static_cast<unsigned int>(row));
}

bool StoredAnswers::SetAction(std::uint32_t promptID, std::uint32_t action)
{
    const int row = LastRow(promptID);
    return row != NoRow && !m_table.GetLocked(static_cast<unsigned int>(row)) &&
           m_table.SetPrompt(static_cast<unsigned int>(row), action);
}

void StoredAnswers::Register(std::uint32_t promptID, const wchar_t* text, std::uint32_t action,
                             std::uint32_t actionOpts, bool overwriteSettings)
{
    const int row = LastRow(promptID);
    if (row == NoRow)
    {
        m_table.AddPrompt(static_cast<int>(promptID), text, actionOpts, action, false);
        return;
    }
    const auto index = static_cast<unsigned int>(row);
    m_table.SetPromptText(index, text);
    if (overwriteSettings)
    {
        m_table.SetPromptOptions(index, actionOpts);
        m_table.SetPrompt(index, action);
    }
}

int StoredAnswers::FirstRow(std::uint32_t promptID)
{
    for (int row = 0; row < m_table.NumPrompts(); ++row)
    {
        if (HasID(m_table, row, promptID))
        {
            return row;
        }
    }
    return NoRow;
}

int StoredAnswers::LastRow(std::uint32_t promptID)
{
    for (int row = m_table.NumPrompts() - 1; row >= 0; --row)
    {
        if (HasID(m_table, row, promptID))
        {
            return row;
        }
    }
    return NoRow;
}
