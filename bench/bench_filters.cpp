#include "Measure.h"
#include "OrvixProviderConfig.h"
#include "ProviderFilters.h"
#include "UpperCase.h"

#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace
{

constexpr int FilterCount = 50;

/// A configuration as the file's reader leaves it, with 50 filters.
struct Filters
{
    std::vector<std::unique_ptr<ProviderFilters>> owned;
    OrvixProviderConfig config;
};

/// `fill` gives filter `i` its folders and types.
template <typename Fill>
Filters MakeFilters(const Fill& fill)
{
    Filters filters;
    for (int i = 0; i < FilterCount; ++i)
    {
        filters.owned.push_back(std::make_unique<ProviderFilters>());
        ProviderFilters& filter = *filters.owned.back();
        filter.m_name = L"Filter";
        fill(filter, i);
        // Once for the name and once for each of the further elements.
        const std::size_t count = 1 + filter.m_folders.size() + filter.m_fileTypes.size();
        filters.config.m_filters.insert(filters.config.m_filters.end(), count, &filter);
    }
    return filters;
}

std::vector<std::wstring> MakePaths(int count)
{
    std::vector<std::wstring> paths;
    paths.reserve(static_cast<std::size_t>(count));
    for (int i = 0; i < count; ++i)
    {
        paths.push_back(L"c:\\project\\scenes\\level " + std::to_wstring(i / 100) + L"\\object " + std::to_wstring(i) +
                        L".mesh");
    }
    return paths;
}

/// One upper-cased copy of the path, and one comparison for each folder and type.
bool JudgeByHand(const std::wstring& path, const Filters& filters)
{
    const std::wstring upper = UpperCase(path);
    const std::wstring_view type = std::wstring_view(upper).substr(upper.rfind(L'.') + 1);
    bool excluded = false;
    for (const auto& filter : filters.owned)
    {
        for (const std::wstring& folder : filter->m_folders)
        {
            excluded |= upper.starts_with(folder);
        }
        for (const std::wstring& entry : filter->m_fileTypes)
        {
            excluded |= type == entry;
        }
    }
    return excluded;
}

Measure JudgeAll(const std::string& name, const Filters& filters, const std::vector<std::wstring>& paths)
{
    return Compare(
        "IsFileExcluded, 50 filters " + name + ", " + std::to_string(paths.size()) + " paths", 1.3,
        [&] {
            for (const std::wstring& path : paths)
            {
                Keep(filters.config.IsFileExcluded(path.c_str(), nullptr));
            }
        },
        [&] {
            for (const std::wstring& path : paths)
            {
                Keep(JudgeByHand(path, filters));
            }
        });
}

std::wstring OtherDrive(int i)
{
    return std::wstring(1, static_cast<wchar_t>(L'D' + i % 20)) + L":\\";
}

} // namespace

void BenchFilters(MeasureTable& table)
{
    const Filters near = MakeFilters([](ProviderFilters& filter, int i) {
        filter.m_folders = {L"C:\\PROJECT\\EXCLUDED " + std::to_wstring(i) + L"\\", L"D:\\CACHE\\"};
        filter.m_fileTypes = {L"TMP" + std::to_wstring(i), L"BAK"};
    });
    const Filters far = MakeFilters([](ProviderFilters& filter, int i) {
        filter.m_folders = {OtherDrive(i) + L"PROJECT\\EXCLUDED " + std::to_wstring(i) + L"\\",
                            OtherDrive(i + 7) + L"CACHE\\"};
    });
    const Filters types = MakeFilters([](ProviderFilters& filter, int i) {
        filter.m_fileTypes = {L"TMP" + std::to_wstring(i), L"BAK"};
    });
    const std::vector<std::wstring> paths = MakePaths(100000);
    table.Print(JudgeAll("near the paths", near, paths));
    table.Print(JudgeAll("on other drives", far, paths));
    table.Print(JudgeAll("by type", types, paths));
    table.Print(JudgeAll("on other drives", far, MakePaths(1000)));
    table.Print(JudgeAll("by type", types, MakePaths(1000)));
}
