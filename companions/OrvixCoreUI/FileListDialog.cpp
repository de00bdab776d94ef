#include "FileListDialog.h"

#include "FileStateText.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixOperation.h"
#include "Settings.h"
#include "Texts.h"
#include "UpperCase.h"
#include "resource.h"

#include <shellapi.h>

#include <algorithm>
#include <iterator>
#include <string_view>
#include <utility>

namespace
{

constexpr Layout::Rule FileListRules[] = {{IDC_MESSAGE, Layout::GrowX},
                                          {IDC_FILTER, Layout::GrowX},
                                          {IDC_LIST, Layout::GrowX | Layout::GrowY},
                                          {IDC_SELECT_ALL, Layout::MoveY},
                                          {IDC_SELECT_NONE, Layout::MoveY},
                                          {IDC_COUNT, Layout::GrowX | Layout::MoveY},
                                          {IDC_COMMENT_LABEL, Layout::MoveY},
                                          {IDC_COMMENT, Layout::GrowX | Layout::MoveY},
                                          {IDC_RECENT_LABEL, Layout::MoveY},
                                          {IDC_RECENT, Layout::GrowX | Layout::MoveY},
                                          {IDC_OPTION, Layout::MoveY},
                                          {IDC_REMEMBER, Layout::MoveY},
                                          {IDOK, Layout::MoveX | Layout::MoveY},
                                          {IDCANCEL, Layout::MoveX | Layout::MoveY}};

/// What the OK button says for an operation.
constexpr struct
{
    std::uint32_t operation; ///< of `OrvixOperation`
    UINT words;
} Actions[] = {{OrvixOperation::CheckIn, IDS_OK_CHECK_IN},
               {OrvixOperation::Add, IDS_OK_ADD},
               {OrvixOperation::GetLatest, IDS_OK_GET_LATEST},
               {OrvixOperation::CheckOut, IDS_OK_CHECK_OUT},
               {OrvixOperation::UndoCheckOut, IDS_OK_UNDO}};

/// A file's state, as a cell shows it. The disk is not asked: with many files on a network share that takes long.
std::wstring StateInWords(unsigned long flags)
{
    std::wstring words = FileStateText::InWords(flags, true);
    words.front() = UpperCase(words.substr(0, 1)).front();
    return words;
}

/// The length of the folder in a path with this last separator. A root keeps its separator.
std::size_t LengthOfFolder(std::wstring_view path, std::size_t separator)
{
    const bool isRoot = separator == 2 && path[1] == L':';
    return separator == std::wstring_view::npos ? 0 : separator + (isRoot ? 1 : 0);
}

/// Name, folder and state.
std::vector<std::wstring> CellsOf(OrvixFileEntry& entry)
{
    const std::wstring_view path = entry.GetFile();
    const std::size_t separator = path.find_last_of(L"\\/");
    const bool hasFolder = separator != std::wstring_view::npos;
    return {std::wstring(path.substr(hasFolder ? separator + 1 : 0)),
            std::wstring(path.substr(0, LengthOfFolder(path, separator))), StateInWords(entry.GetFlagsOut())};
}

} // namespace

FileListDialog::FileListDialog(IOrvixCoreUIClientAccess* access, OrvixFileListDialogParams& params)
    : Dialog(IDD_FILE_LIST, L"FileList", access), m_params(params)
{
    OrvixFileList& list = *params.GetOrvixFileList();
    for (unsigned int i = 0; i < list.NumActiveEntries(); ++i)
    {
        if (OrvixFileEntry* entry = list.GetActiveFileEntry(i))
        {
            m_entries.push_back(entry);
        }
    }
}

std::span<const Layout::Rule> FileListDialog::Rules() const
{
    return FileListRules;
}

void FileListDialog::OnInit()
{
    SetTitle(m_params.GetTitle());
    SetText(IDC_MESSAGE, m_params.GetMessageW());
    SendDlgItemMessageW(Window(), IDC_COMMENT, EM_SETLIMITTEXT, 0, 0); // no limit
    SetText(IDC_COMMENT, m_params.GetComment());
    FillList();
    if (TakesComment())
    {
        ShowRecentComments();
    }
    else
    {
        HideComment();
    }
    SetText(IDC_OPTION,
            Text(Has(OrvixDialogOption::OfferKeepCheckedOut) ? IDS_KEEP_CHECKED_OUT : IDS_GET_LATEST).c_str());
    InitBox(IDC_OPTION, OffersOption(), OrvixDialogOption::OptionChecked);
    InitBox(IDC_REMEMBER, Has(OrvixDialogOption::OfferRemember), OrvixDialogOption::RememberChecked);
}

bool FileListDialog::OnKey(WPARAM key)
{
    const bool isControl = GetKeyState(VK_CONTROL) < 0;
    if (isControl && key == L'F')
    {
        Focus(IDC_FILTER);
        return true;
    }
    if (isControl && key == VK_RETURN)
    {
        PostMessageW(Item(IDOK), BM_CLICK, 0, 0);
        return true;
    }
    return false;
}

void FileListDialog::OnCommand(int control, int notification)
{
    switch (control)
    {
    case IDC_FILTER:
        if (notification == EN_CHANGE)
        {
            m_files.Filter(GetText(IDC_FILTER));
        }
        break;
    case IDC_SELECT_ALL:
    case IDC_SELECT_NONE:
        m_files.CheckShown(control == IDC_SELECT_ALL);
        break;
    case IDC_RECENT:
        // Only the open list counts: in the closed one, keys and the mouse wheel select items on the way to others. The
        // list opens with nothing selected, since some ways to close it confirm the selected item.
        if (notification == CBN_DROPDOWN)
        {
            SendDlgItemMessageW(Window(), IDC_RECENT, CB_SETCURSEL, static_cast<WPARAM>(-1), 0);
        }
        if (notification == CBN_SELENDOK && SendDlgItemMessageW(Window(), IDC_RECENT, CB_GETDROPPEDSTATE, 0, 0))
        {
            TakeRecentComment();
        }
        break;
    case IDOK:
        if (m_files.NumChecked() == 0) // keys may reach a disabled button
        {
            return;
        }
        StoreOptions();
        StoreChoice();
        End(OrvixDialogResult::Confirmed);
        return;
    case IDCANCEL:
        SetChecked(IDC_REMEMBER, false); // only a confirmation is remembered
        StoreOptions();
        End(OrvixDialogResult::Cancelled);
        return;
    default:
        return;
    }
    ShowCount();
}

void FileListDialog::OnMouseMove(int control)
{
    if (control == IDC_LIST)
    {
        m_files.OnMouseMove();
    }
}

LRESULT FileListDialog::OnNotify(const NMHDR& notification)
{
    const auto* const header = &notification;
    const LRESULT result = m_files.Handle(notification);
    if (notification.code == NM_DBLCLK)
    {
        if (const auto row = m_files.RowOf(*reinterpret_cast<const NMITEMACTIVATE*>(header)))
        {
            ShowProperties(*row);
        }
    }
    if (notification.code == LVN_KEYDOWN || notification.code == NM_CLICK || notification.code == NM_DBLCLK)
    {
        ShowCount();
    }
    return result;
}

bool FileListDialog::OnContextMenu(HWND control, POINT point)
{
    if (control != Item(IDC_LIST))
    {
        return false;
    }
    if (m_files.ShowMenu(point, Text(IDS_PROPERTIES)))
    {
        if (const auto row = m_files.Selected())
        {
            ShowProperties(*row);
        }
    }
    return true;
}

void FileListDialog::FillList()
{
    m_images = FileImages(GetDpiForWindow(Window()));
    m_files = TableView(Item(IDC_LIST), Colors(), SettingsName(), EntriesCanBeCleared());
    m_files.UseImages(m_images.List());
    m_files.AddColumn(Text(IDS_NAME), 28);
    m_files.AddColumn(Text(IDS_FOLDER), 34, TableView::Content::Path);
    m_files.AddColumn(Text(IDS_STATE), 38);
    for (OrvixFileEntry* entry : m_entries)
    {
        std::vector<std::wstring> cells = CellsOf(*entry);
        std::vector<int> images = {m_images.OfFile(cells[0]), cells[1].empty() ? -1 : m_images.OfFolder(),
                                   m_images.OfState(entry->GetFlagsOut())};
        m_files.AddRow(std::move(cells),
                       !EntriesCanBeCleared() || (entry->GetFlagsIn() & OrvixFileSelection::Selected) != 0,
                       std::move(images));
    }
    m_files.Open();
    if (!EntriesCanBeCleared())
    {
        Hide(IDC_SELECT_ALL);
        Hide(IDC_SELECT_NONE);
    }
    ShowCount();
}

void FileListDialog::ShowCount() const
{
    const bool all = m_files.NumShown() == m_files.NumRows();
    const auto count =
        FormatText(all ? IDS_COUNT : IDS_COUNT_SHOWN, {m_files.NumChecked(), m_files.NumRows(), m_files.NumShown()});
    if (count != GetText(IDC_COUNT))
    {
        SetText(IDC_COUNT, count.c_str());
    }
    const std::wstring action = Action();
    if (action != GetText(IDOK))
    {
        SetText(IDOK, action.c_str());
    }
    Enable(IDOK, m_files.NumChecked() > 0);
}

std::wstring FileListDialog::Action() const
{
    const std::size_t number = m_files.NumChecked();
    const std::wstring files = number == 1 ? Text(IDS_ONE_FILE) : FormatText(IDS_FILES, {number});
    const auto* const named = std::find_if(std::begin(Actions), std::end(Actions), [this](const auto& action) {
        return Has(OrvixDialogOption::ForOperation(action.operation));
    });
    return FormatText(named != std::end(Actions) ? named->words : IDS_OK_FILES,
                      {reinterpret_cast<DWORD_PTR>(files.c_str())});
}

bool FileListDialog::TakesComment() const
{
    constexpr std::uint32_t WithComment =
        OrvixDialogOption::ForOperation(OrvixOperation::CheckIn | OrvixOperation::Add | OrvixOperation::CheckOut);
    return Has(WithComment) || !Has(OrvixDialogOption::OperationMask);
}

RECT FileListDialog::PlaceOf(int control) const
{
    RECT place{};
    GetWindowRect(Item(control), &place);
    MapWindowPoints(nullptr, Window(), reinterpret_cast<POINT*>(&place), 2);
    return place;
}

/// The list takes the room of the comment.
void FileListDialog::HideComment() const
{
    const LONG room = PlaceOf(IDC_OPTION).top - PlaceOf(IDC_COMMENT_LABEL).top;
    for (const int control : {IDC_COMMENT_LABEL, IDC_COMMENT, IDC_RECENT_LABEL, IDC_RECENT})
    {
        Hide(control);
    }
    const RECT list = PlaceOf(IDC_LIST);
    SetWindowPos(Item(IDC_LIST), nullptr, 0, 0, list.right - list.left, list.bottom - list.top + room,
                 SWP_NOMOVE | SWP_NOZORDER);
    for (const int control : {IDC_SELECT_ALL, IDC_SELECT_NONE, IDC_COUNT})
    {
        const RECT place = PlaceOf(control);
        SetWindowPos(Item(control), nullptr, place.left, place.top + room, 0, 0, SWP_NOSIZE | SWP_NOZORDER);
    }
}

void FileListDialog::ShowProperties(std::size_t row) const
{
    SHELLEXECUTEINFOW request{};
    request.cbSize = sizeof request;
    request.fMask = SEE_MASK_INVOKEIDLIST | SEE_MASK_FLAG_NO_UI;
    request.hwnd = Window();
    request.lpVerb = L"properties";
    request.lpFile = m_entries[row]->GetFile();
    request.nShow = SW_SHOWNORMAL;
    if (ShellExecuteExW(&request) == FALSE)
    {
        MessageBeep(MB_ICONWARNING); // the file is not on the disk
    }
}

void FileListDialog::ShowRecentComments()
{
    m_recentComments = Settings::RecentComments();
    for (const std::wstring& comment : m_recentComments)
    {
        SendDlgItemMessageW(Window(), IDC_RECENT, CB_ADDSTRING, 0, reinterpret_cast<LPARAM>(OneLine(comment).c_str()));
    }
    SendDlgItemMessageW(Window(), IDC_RECENT, CB_SETEXTENDEDUI, TRUE, 0); // the Down key opens the list
    EnableWindow(Item(IDC_RECENT), !m_recentComments.empty() ? TRUE : FALSE);
}

void FileListDialog::TakeRecentComment() const
{
    const LRESULT chosen = SendDlgItemMessageW(Window(), IDC_RECENT, CB_GETCURSEL, 0, 0);
    if (chosen < 0)
    {
        return;
    }
    const std::wstring& comment = m_recentComments[static_cast<std::size_t>(chosen)];
    // EM_REPLACESEL lets Ctrl+Z restore the previous comment.
    SendDlgItemMessageW(Window(), IDC_COMMENT, EM_SETSEL, 0, -1);
    SendDlgItemMessageW(Window(), IDC_COMMENT, EM_REPLACESEL, TRUE, reinterpret_cast<LPARAM>(comment.c_str()));
}

void FileListDialog::InitBox(int control, bool offered, std::uint32_t checkedBit) const
{
    if (offered)
    {
        SetChecked(control, Has(checkedBit));
    }
    else
    {
        Hide(control);
    }
}

void FileListDialog::StoreBox(int control, bool offered, std::uint32_t checkedBit) const
{
    if (!offered)
    {
        return;
    }
    const std::uint32_t options = m_params.GetOptions();
    m_params.SetOptions(IsChecked(control) ? options | checkedBit : options & ~checkedBit);
}

void FileListDialog::StoreOptions() const
{
    StoreBox(IDC_OPTION, OffersOption(), OrvixDialogOption::OptionChecked);
    StoreBox(IDC_REMEMBER, Has(OrvixDialogOption::OfferRemember), OrvixDialogOption::RememberChecked);
}

void FileListDialog::StoreChoice() const
{
    if (TakesComment())
    {
        StoreComment();
    }
    for (std::size_t row = 0; OrvixFileEntry * entry : m_entries)
    {
        const unsigned long flags = entry->GetFlagsOut();
        entry->SetFlagsOut(m_files.IsChecked(row) ? flags | OrvixFileSelection::Confirmed
                                                  : flags & ~OrvixFileSelection::Confirmed);
        ++row;
    }
}

void FileListDialog::StoreComment() const
{
    std::wstring comment = GetText(IDC_COMMENT);
    comment.erase(comment.find_last_not_of(L" \t\r\n") + 1);
    m_params.SetComment(comment.c_str());
    Settings::AddRecentComment(comment);
}

bool FileListDialog::Has(std::uint32_t options) const
{
    return (m_params.GetOptions() & options) != 0;
}
