#include "Settings.h"

#include <algorithm>

namespace
{

constexpr const wchar_t* Key = L"Software\\OrvixCore\\Dialogs";
constexpr const wchar_t* Recent = L"RecentComments";

std::optional<LONG> Number(const std::wstring& name)
{
    DWORD number = 0;
    DWORD size = sizeof number;
    if (RegGetValueW(HKEY_CURRENT_USER, Key, name.c_str(), RRF_RT_REG_DWORD, nullptr, &number, &size) != ERROR_SUCCESS)
    {
        return std::nullopt;
    }
    return static_cast<LONG>(number);
}

void StoreNumber(const std::wstring& name, LONG number)
{
    RegSetKeyValueW(HKEY_CURRENT_USER, Key, name.c_str(), REG_DWORD, &number, sizeof number);
}

} // namespace

std::optional<SIZE> Settings::WindowSize(const std::wstring& dialog)
{
    const auto width = Number(dialog + L"Width");
    const auto height = Number(dialog + L"Height");
    if (!width || !height)
    {
        return std::nullopt;
    }
    return SIZE{*width, *height};
}

void Settings::StoreWindowSize(const std::wstring& dialog, SIZE size)
{
    StoreNumber(dialog + L"Width", size.cx);
    StoreNumber(dialog + L"Height", size.cy);
}

Settings::ListView Settings::StoredListView(const std::wstring& dialog, std::size_t columns)
{
    ListView view;
    for (std::size_t column = 1; column <= columns; ++column)
    {
        if (const auto share = Number(dialog + L"Column" + std::to_wstring(column)))
        {
            view.shares.push_back(static_cast<int>(*share));
        }
    }
    if (view.shares.size() != columns)
    {
        view.shares.clear();
    }
    view.sortColumn = static_cast<int>(Number(dialog + L"SortColumn").value_or(0));
    view.descending = Number(dialog + L"SortDescending").value_or(0) == 1;
    return view;
}

void Settings::StoreListView(const std::wstring& dialog, const ListView& view)
{
    for (std::size_t column = 0; column < view.shares.size(); ++column)
    {
        StoreNumber(dialog + L"Column" + std::to_wstring(column + 1), view.shares[column]);
    }
    StoreNumber(dialog + L"SortColumn", view.sortColumn);
    StoreNumber(dialog + L"SortDescending", view.descending ? 1 : 0);
}

std::vector<std::wstring> Settings::RecentComments()
{
    DWORD size = 0;
    if (RegGetValueW(HKEY_CURRENT_USER, Key, Recent, RRF_RT_REG_MULTI_SZ, nullptr, nullptr, &size) != ERROR_SUCCESS)
    {
        return {};
    }
    std::wstring block(size / sizeof(wchar_t), L'\0');
    if (RegGetValueW(HKEY_CURRENT_USER, Key, Recent, RRF_RT_REG_MULTI_SZ, nullptr, block.data(), &size) !=
        ERROR_SUCCESS)
    {
        return {};
    }
    std::vector<std::wstring> comments;
    for (const wchar_t* text = block.c_str(); *text && comments.size() < MaxRecentComments;)
    {
        comments.emplace_back(text);
        text += comments.back().size() + 1;
    }
    return comments;
}

void Settings::AddRecentComment(const std::wstring& comment)
{
    if (comment.empty())
    {
        return;
    }
    std::vector<std::wstring> comments = RecentComments();
    std::erase(comments, comment);
    comments.insert(comments.begin(), comment);
    comments.resize(std::min(comments.size(), MaxRecentComments));
    std::wstring block;
    for (const std::wstring& text : comments)
    {
        block += text + L'\0';
    }
    block += L'\0';
    RegSetKeyValueW(HKEY_CURRENT_USER, Key, Recent, REG_MULTI_SZ, block.data(),
                    static_cast<DWORD>(block.size() * sizeof(wchar_t)));
}
