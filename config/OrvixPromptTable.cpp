#include "OrvixPromptTable.h"

#include "AssignText.h"

OrvixPromptTable::OrvixPromptTable() = default;
OrvixPromptTable::~OrvixPromptTable() = default;

int OrvixPromptTable::AddPrompt(int id, const wchar_t* text, unsigned long options, unsigned long prompt, bool locked)
{
    if (text == nullptr)
    {
        return -1;
    }
    const std::size_t count = m_ids.size();
    const bool added = WithBarrier(false, [&] {
        m_ids.push_back(id);
        m_texts.emplace_back(text);
        m_options.push_back(options);
        m_prompts.push_back(prompt);
        m_locked.push_back(locked);
        return true;
    });
    if (!added)
    {
        // Shrinking does not allocate; the arrays keep equal lengths.
        m_ids.resize(count);
        m_texts.resize(count);
        m_options.resize(count);
        m_prompts.resize(count);
        return -1;
    }
    return NumPrompts();
}

int OrvixPromptTable::NumPrompts()
{
    return static_cast<int>(m_ids.size());
}

void OrvixPromptTable::RemoveAll()
{
    m_ids.clear();
    m_texts.clear();
    m_options.clear();
    m_prompts.clear();
    m_locked.clear();
}

int OrvixPromptTable::GetPromptID(unsigned int index)
{
    return index < m_ids.size() ? m_ids[index] : -1;
}

bool OrvixPromptTable::SetPromptID(unsigned int index, int id)
{
    if (index >= m_ids.size())
    {
        return false;
    }
    m_ids[index] = id;
    return true;
}

const wchar_t* OrvixPromptTable::GetPromptText(unsigned int index)
{
    return index < m_texts.size() ? m_texts[index].c_str() : nullptr;
}

bool OrvixPromptTable::SetPromptText(unsigned int index, const wchar_t* text)
{
    return index < m_texts.size() && AssignText(m_texts[index], text);
}

unsigned long OrvixPromptTable::GetPromptOptions(unsigned int index)
{
    return index < m_options.size() ? m_options[index] : 0;
}

bool OrvixPromptTable::SetPromptOptions(unsigned int index, unsigned long options)
{
    if (index >= m_options.size())
    {
        return false;
    }
    m_options[index] = options;
    return true;
}

unsigned long OrvixPromptTable::GetPrompt(unsigned int index)
{
    return index < m_prompts.size() ? m_prompts[index] : 0;
}

bool OrvixPromptTable::SetPrompt(unsigned int index, unsigned long prompt)
{
    if (index >= m_prompts.size())
    {
        return false;
    }
    m_prompts[index] = prompt;
    return true;
}

bool OrvixPromptTable::GetLocked(unsigned int index)
{
    return index < m_locked.size() && m_locked[index];
}

bool OrvixPromptTable::SetLocked(unsigned int index, bool locked)
{
    if (index >= m_locked.size())
    {
        return false;
    }
    m_locked[index] = locked;
    return true;
}
