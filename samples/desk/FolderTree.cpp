#include "FolderTree.h"

#include "Icons.h"

#include <algorithm>
#include <bit>
#include <filesystem>
#include <vector>

namespace fs = std::filesystem;

namespace
{

std::vector<std::wstring> SubfoldersOf(const std::wstring& folder)
{
    std::vector<std::wstring> names;
    std::error_code error;
    for (fs::directory_iterator item(folder, error), end; !error && item != end; item.increment(error))
    {
        if (item->is_directory(error) && !IsHidden(item->path().wstring()))
        {
            names.push_back(item->path().filename().wstring());
        }
    }
    std::sort(names.begin(), names.end(), [](const auto& left, const auto& right) {
        return CompareStringOrdinal(left.c_str(), -1, right.c_str(), -1, TRUE) == CSTR_LESS_THAN;
    });
    return names;
}

} // namespace

bool IsHidden(const std::wstring& path)
{
    const DWORD attributes = GetFileAttributesW(path.c_str());
    constexpr DWORD FolderLink = FILE_ATTRIBUTE_DIRECTORY | FILE_ATTRIBUTE_REPARSE_POINT;
    return fs::path(path).filename().wstring().starts_with(L'.') ||
           (attributes != INVALID_FILE_ATTRIBUTES &&
            ((attributes & FILE_ATTRIBUTE_HIDDEN) != 0 || (attributes & FolderLink) == FolderLink));
}

void FolderTree::Create(HWND parent, int id)
{
    m_window = CreateWindowExW(WS_EX_CLIENTEDGE, WC_TREEVIEWW, L"",
                               WS_CHILD | WS_VISIBLE | WS_TABSTOP | TVS_HASBUTTONS | TVS_HASLINES | TVS_LINESATROOT |
                                   TVS_SHOWSELALWAYS,
                               0, 0, 0, 0, parent, std::bit_cast<HMENU>(INT_PTR{id}), nullptr, nullptr);
}

void FolderTree::ShowProject(const std::wstring& folder)
{
    m_folder = folder;
    TreeView_DeleteAllItems(m_window);
    if (folder.empty())
    {
        return;
    }
    const std::wstring name = fs::path(folder).filename().wstring();
    const HTREEITEM root = Add(TVI_ROOT, name.empty() ? folder : name);
    TreeView_Expand(m_window, root, TVE_EXPAND);
    TreeView_SelectItem(m_window, root);
}

std::wstring FolderTree::Selected() const
{
    const HTREEITEM item = TreeView_GetSelection(m_window);
    return item != nullptr ? PathOf(item) : L"";
}

void FolderTree::Toggle() const
{
    TreeView_Expand(m_window, TreeView_GetSelection(m_window), TVE_TOGGLE);
}

void FolderTree::OnExpanding(const NMTREEVIEWW& notification) const
{
    const HTREEITEM item = notification.itemNew.hItem;
    if (notification.action != TVE_EXPAND || TreeView_GetChild(m_window, item) != nullptr)
    {
        return;
    }
    const auto names = SubfoldersOf(PathOf(item));
    for (const std::wstring& name : names)
    {
        Add(item, name);
    }
    if (names.empty())
    {
        TVITEMW state{};
        state.mask = TVIF_HANDLE | TVIF_CHILDREN;
        state.hItem = item;
        TreeView_SetItem(m_window, &state); // without a button
    }
}

void FolderTree::SetColors(const Theme& theme) const
{
    TreeView_SetBkColor(m_window, theme.Color(COLOR_WINDOW));
    TreeView_SetTextColor(m_window, theme.Color(COLOR_WINDOWTEXT));
}

HTREEITEM FolderTree::Add(HTREEITEM parent, const std::wstring& name) const
{
    std::wstring text = name; // the structure wants a text that can be written to
    TVINSERTSTRUCTW insert{};
    insert.hParent = parent;
    insert.hInsertAfter = TVI_LAST;
    insert.item.mask = TVIF_TEXT | TVIF_IMAGE | TVIF_SELECTEDIMAGE | TVIF_CHILDREN;
    insert.item.pszText = text.data();
    insert.item.iImage = static_cast<int>(Icon::Folder);
    insert.item.iSelectedImage = static_cast<int>(Icon::Folder);
    insert.item.cChildren = 1; // perhaps; known when the folder is opened
    return TreeView_InsertItem(m_window, &insert);
}

std::wstring FolderTree::TextOf(HTREEITEM item) const
{
    wchar_t text[MAX_PATH] = {};
    TVITEMW wanted{};
    wanted.mask = TVIF_HANDLE | TVIF_TEXT;
    wanted.hItem = item;
    wanted.pszText = text;
    wanted.cchTextMax = MAX_PATH;
    TreeView_GetItem(m_window, &wanted);
    return wanted.pszText;
}

std::wstring FolderTree::PathOf(HTREEITEM item) const
{
    const HTREEITEM parent = TreeView_GetParent(m_window, item);
    return parent == nullptr ? m_folder : (fs::path(PathOf(parent)) / TextOf(item)).wstring();
}
