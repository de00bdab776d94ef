#include "StoredAnswers.h"

#include "PromptFile.h"
#include "PromptRows.h"

#include <utility>

bool StoredAnswers::Load(const wchar_t* path)
{
    m_table.RemoveAll();
    m_knownFile.clear(); // also when an exception leaves
    std::wstring file = path;
    OrvixFileIO::Content content = OrvixFileIO::Content::Missing;
    const bool loaded = ReadPromptFile(m_table, path, nullptr, &content);
    if (loaded || content == OrvixFileIO::Content::Missing)
    {
        m_knownFile = std::move(file);
    }
    return loaded;
}

bool StoredAnswers::Save(const wchar_t* path)
{
    std::wstring file = path;
    const auto previous = file == m_knownFile ? FileBytes::Previous::Replaced : FileBytes::Previous::Kept;
    const bool saved = WritePromptFile(m_table, path, previous);
    if (saved && m_table.NumPrompts() > 0)
    {
        m_knownFile = std::move(file);
    }
    return saved;
}

std::uint32_t StoredAnswers::GetAction(std::uint32_t promptID)
{
    const int row = PromptRows::First(m_table, static_cast<int>(promptID));
    return row == PromptRows::None ? 0 : m_table.GetPrompt(static_cast<unsigned int>(row));
}

bool StoredAnswers::IsLocked(std::uint32_t promptID)
{
    const int row = PromptRows::First(m_table, static_cast<int>(promptID));
    return row != PromptRows::None && m_table.GetLocked(static_cast<unsigned int>(row));
}

bool StoredAnswers::SetAction(std::uint32_t promptID, std::uint32_t action)
{
    const int row = PromptRows::Last(m_table, static_cast<int>(promptID));
    return row != PromptRows::None && !m_table.GetLocked(static_cast<unsigned int>(row)) &&
           m_table.SetPrompt(static_cast<unsigned int>(row), action);
}

void StoredAnswers::Register(std::uint32_t promptID, const wchar_t* text, std::uint32_t action,
                             std::uint32_t actionOpts, bool overwriteSettings)
{
    const int row = PromptRows::Last(m_table, static_cast<int>(promptID));
    if (row == PromptRows::None)
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
