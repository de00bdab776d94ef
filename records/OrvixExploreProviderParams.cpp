#include "OrvixExploreProviderParams.h"

#include "RecordState.h"

#include <deque>

namespace
{

std::uint32_t WithBit(std::uint32_t flags, std::uint32_t bit, bool set)
{
    return set ? flags | bit : flags & ~bit;
}

} // namespace

struct OrvixExploreProviderParams::State
{
    struct Filter
    {
        std::wstring name;
        std::wstring extensions;
    };

    std::wstring title;
    std::deque<Filter> filters; // which never moves a text
};

OrvixExploreProviderParams::OrvixExploreProviderParams() = default;

OrvixExploreProviderParams::~OrvixExploreProviderParams()
{
    delete m_state;
}

const wchar_t* OrvixExploreProviderParams::GetTitle()
{
    return TextOf(m_state, &State::title);
}

void OrvixExploreProviderParams::SetTitle(const wchar_t* title)
{
    SetText(m_state, &State::title, title);
}

bool OrvixExploreProviderParams::GetMultipleSelections()
{
    return (m_flags & MultipleSelections) != 0;
}

void OrvixExploreProviderParams::SetMultipleSelections(bool allowed)
{
    m_flags = WithBit(m_flags, MultipleSelections, allowed);
}

bool OrvixExploreProviderParams::GetDownloadFiles()
{
    return (m_flags & DownloadFiles) != 0;
}

void OrvixExploreProviderParams::SetDownloadFiles(bool download)
{
    m_flags = WithBit(m_flags, DownloadFiles, download);
}

std::uint32_t OrvixExploreProviderParams::AddFilter(const wchar_t* name, const wchar_t* extensions)
{
    if (name == nullptr || extensions == nullptr)
    {
        return 0;
    }
    const bool added = Completes([&] { StateOf(m_state).filters.push_back({name, extensions}); });
    return added ? NumFilters() : 0;
}

std::uint32_t OrvixExploreProviderParams::NumFilters()
{
    return m_state != nullptr ? static_cast<std::uint32_t>(m_state->filters.size()) : 0;
}

const wchar_t* OrvixExploreProviderParams::GetFilterName(std::uint32_t index)
{
    return m_state != nullptr && index < m_state->filters.size() ? m_state->filters[index].name.c_str() : nullptr;
}

const wchar_t* OrvixExploreProviderParams::GetFilterExtensions(std::uint32_t index)
{
    return m_state != nullptr && index < m_state->filters.size() ? m_state->filters[index].extensions.c_str() : nullptr;
}
