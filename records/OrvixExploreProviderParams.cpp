#include "OrvixExploreProviderParams.h"

#include "AssignText.h"

namespace
{

constexpr std::uint32_t MultipleSelections = 0x1;
constexpr std::uint32_t DownloadFiles = 0x2;

std::uint32_t WithBit(std::uint32_t flags, std::uint32_t bit, bool set)
{
    return set ? flags | bit : flags & ~bit;
}

} // namespace

OrvixExploreProviderParams::OrvixExploreProviderParams() = default;
OrvixExploreProviderParams::~OrvixExploreProviderParams() = default;

const wchar_t* OrvixExploreProviderParams::GetTitle()
{
    return m_title.c_str();
}

void OrvixExploreProviderParams::SetTitle(const wchar_t* title)
{
    AssignText(m_title, title);
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
    const std::size_t count = m_filterNames.size();
    const bool added = WithBarrier(false, [&] {
        std::wstring copy(extensions); // may be a name of this record, which moves
        m_filterNames.emplace_back(name);
        m_filterExtensions.push_back(std::move(copy));
        return true;
    });
    if (!added)
    {
        m_filterNames.resize(count); // shrinking does not allocate
        return 0;
    }
    return NumFilters();
}

std::uint32_t OrvixExploreProviderParams::NumFilters()
{
    return static_cast<std::uint32_t>(m_filterNames.size());
}

const wchar_t* OrvixExploreProviderParams::GetFilterName(std::uint32_t index)
{
    return index < m_filterNames.size() ? m_filterNames[index].c_str() : nullptr;
}

const wchar_t* OrvixExploreProviderParams::GetFilterExtensions(std::uint32_t index)
{
    return index < m_filterExtensions.size() ? m_filterExtensions[index].c_str() : nullptr;
}
