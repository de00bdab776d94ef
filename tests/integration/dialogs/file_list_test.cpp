#include "DialogsTest.h"
#include "FakeProvider.h"
#include "OrvixDialogOption.h"
#include "OrvixOperation.h"
#include "OrvixProviderOption.h"
#include "OrvixProviderResult.h"
#include "ReplacedImport.h"

#include <commctrl.h>
#include <windows.h>

#include <shellapi.h>

#include <algorithm>
#include <atomic>
#include <bit>
#include <utility>

namespace
{

constexpr const wchar_t* List = L"Files:";

/// Clicks the arrow of a drop-down list.
void ClickArrow(HWND box)
{
    RECT inside{};
    GetClientRect(box, &inside);
    const LPARAM arrow = MAKELPARAM(inside.right - 5, inside.bottom / 2);
    SendMessageW(box, WM_LBUTTONDOWN, MK_LBUTTON, arrow);
    SendMessageW(box, WM_LBUTTONUP, 0, arrow);
}

class FileListDialog : public DialogsTest
{
protected:
    static void Cancel(const DialogWindow& dialog) { dialog.Press(VK_ESCAPE); }

    /// Whether the dialog confirmed an entry.
    bool IsConfirmed(unsigned int index)
    {
        return (m_list.GetFileEntry(index)->GetFlagsOut() & OrvixFileSelection::Confirmed) != 0;
    }
};

TEST_F(FileListDialog, ShowsTitleMessageAndEachFileWithFolderAndState)
{
    namespace State = OrvixFileState;
    const std::pair<unsigned long, const wchar_t*> states[] = {
        {0, L"Unknown"},
        {State::NotControlled, L"Not controlled"},
        {State::Controlled, L"Checked in"},
        {State::Controlled | State::CheckedOut, L"Checked out"},
        {State::Controlled | State::CheckedOutByOther, L"Checked out by another user"},
        {State::Controlled | State::OutOfDate, L"Checked in, out of date"},
        {State::Controlled | State::Deleted, L"Checked in, deleted in the project"},
        {State::Controlled | State::Modified, L"Checked in, modified"},
        {State::Controlled | State::CheckedOut | State::CheckedOutByOther | State::OutOfDate | State::Deleted |
             State::Modified | OrvixFilePermission::CheckIn | OrvixFilePermission::ShowHistory,
         L"Checked out, also by another user, modified, out of date, deleted in the project"}};
    Texts words;
    for (const auto& [flags, text] : states)
    {
        AddFile(L"C:\\town\\bridge.model", flags);
        words.emplace_back(text);
    }
    AddFile(L"town/church.model", 0);
    AddFile(L"tower.model", 0);
    ShowFileList([&](const DialogWindow& dialog) {
        EXPECT_TRUE(dialog.Has(L"These files are opened."));
        const int last = static_cast<int>(words.size());
        Texts shown = dialog.Column(List, 2);
        shown.resize(words.size());
        EXPECT_EQ(shown, words);
        EXPECT_EQ(dialog.Cell(List, 0, 0), L"bridge.model");
        EXPECT_EQ(dialog.Cell(List, 0, 1), L"C:\\town");
        EXPECT_EQ(dialog.Cell(List, last, 0), L"church.model");
        EXPECT_EQ(dialog.Cell(List, last, 1), L"town");
        EXPECT_EQ(dialog.Cell(List, last + 1, 0), L"tower.model");
        EXPECT_EQ(dialog.Cell(List, last + 1, 1), L"");
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, IsHighEnoughForItsMessage)
{
    AddFile(L"a");
    struct Heights
    {
        LONG message;
        LONG list;
        LONG window;
    };
    const auto heightsWith = [this](const std::wstring& message) {
        Heights heights{};
        m_params.SetMessage(message.c_str());
        ShowFileList([&](const DialogWindow& dialog) {
            const bool scrolls = dialog.Has(L"Message:");
            const RECT place = dialog.Place(scrolls ? L"Message:" : message);
            EXPECT_EQ(dialog.Text(scrolls ? L"Message:" : message).substr(0, 1), L"1");
            const RECT list = dialog.Place(List);
            EXPECT_LE(place.bottom, dialog.Place(L"Filter:").top);
            RECT window{};
            GetWindowRect(dialog.Handle(), &window);
            RECT inside{};
            GetClientRect(dialog.Handle(), &inside);
            EXPECT_LT(dialog.Place(L"OK").bottom, inside.bottom);
            RECT work{};
            SystemParametersInfoW(SPI_GETWORKAREA, 0, &work, 0);
            EXPECT_LE(window.bottom, work.bottom);
            heights = {place.bottom - place.top, list.bottom - list.top, window.bottom - window.top};
            Cancel(dialog);
        });
        return heights;
    };
    const auto lines = [](int count) {
        std::wstring message = L"1";
        for (int i = 2; i <= count; ++i)
        {
            message += L"\n" + std::to_wstring(i);
        }
        return message;
    };
    const Heights one = heightsWith(lines(1));
    const Heights ten = heightsWith(lines(10));
    const Heights twenty = heightsWith(lines(20));
    EXPECT_NEAR(twenty.message, 2 * ten.message, 2);
    EXPECT_EQ(ten.list, one.list);
    EXPECT_EQ(twenty.list, one.list);
    EXPECT_EQ(heightsWith(lines(1)).window, one.window) << "the room for a message is not remembered";
    EXPECT_EQ(heightsWith(lines(500)).list, one.list) << "a message gets no more room than the monitor has";
}

TEST_F(FileListDialog, ScrollsAMessageForWhichTheMonitorHasNoRoom)
{
    AddFile(L"a");
    std::wstring message = L"first";
    for (int i = 0; i < 300; ++i)
    {
        message += L"\nline";
    }
    m_params.SetMessage((message + L"\nlast").c_str());
    ShowFileList([](const DialogWindow& dialog) {
        const HWND field = dialog.Control(L"Message:");
        EXPECT_EQ(dialog.Text(L"Message:").substr(0, 7), L"first\r\n");
        EXPECT_TRUE(dialog.Text(L"Message:").ends_with(L"line\r\nlast"));
        EXPECT_NE(GetWindowLongW(field, GWL_STYLE) & WS_VSCROLL, 0);
        EXPECT_EQ(dialog.Focused(), List);
        EXPECT_EQ(dialog.TabStops().front(), L"Message:");
        dialog.Focus(L"Message:");
        dialog.Press(VK_NEXT);
        EXPECT_GT(SendMessageW(field, EM_GETFIRSTVISIBLELINE, 0, 0), 10);
        RECT work{};
        SystemParametersInfoW(SPI_GETWORKAREA, 0, &work, 0);
        RECT window{};
        GetWindowRect(dialog.Handle(), &window);
        EXPECT_LE(window.bottom, work.bottom);
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, SaysWhatItsButtonDoesAndAsksForACommentWhereTheOperationTakesOne)
{
    AddFile(L"a");
    AddFile(L"b");
    struct Case
    {
        std::uint32_t operation;
        const wchar_t* two;
        const wchar_t* one;
        bool comment;
    };
    const Case cases[] = {
        {0, L"OK (2 files)", L"OK (1 file)", true},
        {OrvixOperation::CheckIn, L"Check in 2 files", L"Check in 1 file", true},
        {OrvixOperation::Add | OrvixOperation::Notify, L"Add 2 files", L"Add 1 file", true},
        {OrvixOperation::GetLatest, L"Get 2 files", L"Get 1 file", false},
        {OrvixOperation::CheckOut, L"Check out 2 files", L"Check out 1 file", true},
        {OrvixOperation::UndoCheckOut, L"Undo check-out of 2 files", L"Undo check-out of 1 file", false}};
    LONG heightWithComment = 0;
    for (const Case& expected : cases)
    {
        m_params.SetComment(L"before");
        const auto options =
            OrvixDialogOption::EntriesCanBeCleared | OrvixDialogOption::ForOperation(expected.operation);
        ShowFileList(options, [&](const DialogWindow& dialog) {
            EXPECT_EQ(dialog.Text(L"OK"), expected.two);
            dialog.ClickCheckBox(List, 1);
            EXPECT_EQ(dialog.Text(L"OK"), expected.one);
            EXPECT_EQ(dialog.Has(L"Comment:"), expected.comment);
            EXPECT_EQ(dialog.Has(L"Recent comments:"), expected.comment);
            const RECT list = dialog.Place(List);
            EXPECT_LT(list.bottom, dialog.Place(L"Check all").top);
            EXPECT_LT(dialog.Place(L"Check all").bottom, dialog.Place(L"OK").top);
            if (expected.comment)
            {
                heightWithComment = list.bottom - list.top;
                SetWindowTextW(dialog.Control(L"Comment:"), L"after");
            }
            else
            {
                EXPECT_GT(list.bottom - list.top, heightWithComment + 80);
            }
            dialog.Click(L"OK");
        });
        EXPECT_STREQ(m_params.GetComment(), expected.comment ? L"after" : L"before");
        EXPECT_EQ(m_params.GetOptions(), options);
    }
}

TEST_F(FileListDialog, FiltersAfterControlFAndConfirmsAfterControlEnter)
{
    AddFile(L"bridge");
    AddFile(L"church");
    m_params.SetComment(L"");
    EXPECT_EQ(ShowFileList([](const DialogWindow& dialog) {
                  dialog.Type(L"c");
                  EXPECT_EQ(dialog.NumRows(List), 2) << "text that is typed at once filters nothing";
                  dialog.PressControl('F');
                  EXPECT_EQ(dialog.Focused(), L"Filter:");
                  dialog.Type(L"chu");
                  EXPECT_EQ(dialog.NumRows(List), 1);
                  dialog.Focus(L"Comment:");
                  dialog.Type(L"done");
                  dialog.PressControl(VK_RETURN);
              }),
              OrvixDialogResult::Confirmed);
    EXPECT_STREQ(m_params.GetComment(), L"done");
}

/// Asks the dialog for the text of a cell, as the list does while it draws.
std::wstring DrawnText(const DialogWindow& dialog, int row, int column)
{
    const HWND list = dialog.Control(List);
    NMLVCUSTOMDRAW drawing{};
    drawing.nmcd.hdr = {list, static_cast<UINT_PTR>(GetDlgCtrlID(list)), static_cast<UINT>(NM_CUSTOMDRAW)};
    const auto notify = [&](void* notification) {
        SendMessageW(dialog.Handle(), WM_NOTIFY, drawing.nmcd.hdr.idFrom, std::bit_cast<LPARAM>(notification));
    };
    drawing.nmcd.dwDrawStage = CDDS_PREPAINT;
    notify(&drawing);
    NMLVDISPINFOW question{};
    question.hdr = drawing.nmcd.hdr;
    question.hdr.code = static_cast<UINT>(LVN_GETDISPINFOW);
    question.item.mask = LVIF_TEXT;
    question.item.iItem = row;
    question.item.iSubItem = column;
    notify(&question);
    drawing.nmcd.dwDrawStage = CDDS_POSTPAINT;
    notify(&drawing);
    return question.item.pszText;
}

TEST_F(FileListDialog, ShortensPathsInTheMiddleAndShowsThemWholeInAToolTip)
{
    const std::wstring folder = L"C:\\country\\with\\a\\long\\name\\and\\a\\town\\with\\a\\longer\\one\\models";
    AddFile((folder + L"\\bridge.model").c_str());
    AddFile(L"C:\\town\\church.model");
    ShowFileList([&](const DialogWindow& dialog) {
        const std::wstring drawn = DrawnText(dialog, 0, 1);
        EXPECT_LT(drawn.size(), folder.size());
        EXPECT_EQ(drawn.substr(0, 3), L"C:\\");
        EXPECT_NE(drawn.find(L"..."), std::wstring::npos);
        EXPECT_TRUE(drawn.ends_with(L"\\models")) << "the end of a path says more than its middle";
        EXPECT_EQ(DrawnText(dialog, 1, 1), L"C:\\town");
        EXPECT_EQ(dialog.Cell(List, 0, 1), folder) << "screen readers get the whole path";

        dialog.PointAt(List, 0, 1);
        EXPECT_EQ(dialog.ToolTip(), folder);
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, ShowsTheIconOfEachFileAndOfItsState)
{
    AddFile(L"a.txt", OrvixFileState::Controlled);
    AddFile(L"b.txt", OrvixFileState::Controlled | OrvixFileState::CheckedOut);
    AddFile(L"c.txt", OrvixFileState::Controlled);
    ShowFileList([](const DialogWindow& dialog) {
        const HWND list = dialog.Control(List);
        const auto image = [list](int row, int column) {
            LVITEMW item{};
            item.mask = LVIF_IMAGE;
            item.iItem = row;
            item.iSubItem = column;
            SendMessageW(list, LVM_GETITEMW, 0, reinterpret_cast<LPARAM>(&item));
            return item.iImage;
        };
        EXPECT_GE(image(0, 0), 0) << "an icon for the type of file";
        EXPECT_EQ(image(1, 0), image(0, 0));
        EXPECT_EQ(image(0, 1), I_IMAGENONE);
        EXPECT_GE(image(0, 2), 0) << "an icon for the state";
        EXPECT_NE(image(1, 2), image(0, 2));
        EXPECT_EQ(image(2, 2), image(0, 2));
        auto* const images = std::bit_cast<HIMAGELIST>(SendMessageW(list, LVM_GETIMAGELIST, LVSIL_SMALL, 0));
        EXPECT_GT(ImageList_GetImageCount(images), std::max(image(0, 0), image(1, 2)));
        Cancel(dialog);
    });
}

/// What the dialog asks of the system's shell: a verb, a blank and a file.
Texts& ShellRequests()
{
    static Texts requests;
    return requests;
}

BOOL WINAPI RecordShellRequest(SHELLEXECUTEINFOW* request)
{
    ShellRequests().push_back(std::wstring(request->lpVerb) + L' ' + request->lpFile);
    return TRUE;
}

TEST_F(FileListDialog, ShowsThePropertiesOfAFileAfterADoubleClickOrFromItsMenu)
{
    const ReplacedImport shell(L"OrvixCoreUI.dll", "ShellExecuteExW",
                               std::bit_cast<std::uintptr_t>(&RecordShellRequest));
    AddFile(L"C:\\town\\b");
    AddFile(L"C:\\town\\a");
    ShellRequests().clear();
    ShowFileList([](const DialogWindow& dialog) {
        dialog.ClickHeading(List, 0);
        dialog.DoubleClickRow(List, 1);
        EXPECT_EQ(ShellRequests(), (Texts{L"properties C:\\town\\b"}));
        dialog.SelectRow(List, 0);
        dialog.ChooseFromMenu(List, 4);
        EXPECT_EQ(ShellRequests().back(), L"properties C:\\town\\a");
        dialog.ClickCheckBox(List, 0);
        EXPECT_EQ(dialog.CheckedRows(List), (std::vector{false, true}));
        EXPECT_EQ(ShellRequests().size(), 2U);
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, RemembersTheWidthsOfItsColumnsAndItsOrder)
{
    AddFile(L"x\\b");
    AddFile(L"y\\a");
    const auto width = [](const DialogWindow& dialog, int column) {
        return SendMessageW(dialog.Control(List), LVM_GETCOLUMNWIDTH, static_cast<WPARAM>(column), 0);
    };
    LRESULT narrow = 0;
    ShowFileList([&](const DialogWindow& dialog) {
        narrow = width(dialog, 0) / 2;
        SendMessageW(dialog.Control(List), LVM_SETCOLUMNWIDTH, 1, width(dialog, 1) + narrow);
        SendMessageW(dialog.Control(List), LVM_SETCOLUMNWIDTH, 0, narrow);
        dialog.ClickHeading(List, 1);
        dialog.ClickHeading(List, 1);
        Cancel(dialog);
    });
    ShowFileList([&](const DialogWindow& dialog) {
        EXPECT_NEAR(static_cast<double>(width(dialog, 0)), static_cast<double>(narrow), 3);
        EXPECT_EQ(dialog.Column(List, 1), (Texts{L"y", L"x"}));
        dialog.ClickHeading(List, 1);
        EXPECT_EQ(dialog.Column(List, 1), (Texts{L"x", L"y"})) << "the next click reverses the order";
        Cancel(dialog);
    });
    // What no version has stored.
    const DWORD odd = 0xFFFFFFFF;
    for (const wchar_t* name : {L"FileListColumn1", L"FileListSortColumn"})
    {
        RegSetKeyValueW(HKEY_CURRENT_USER, L"Software\\OrvixCore\\Dialogs", name, REG_DWORD, &odd, sizeof odd);
    }
    ShowFileList([&](const DialogWindow& dialog) {
        EXPECT_NEAR(static_cast<double>(width(dialog, 0)), 2.0 * static_cast<double>(narrow), 4);
        EXPECT_EQ(dialog.Column(List, 1), (Texts{L"x", L"y"})) << "the order of the host";
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, KeepsItsHeightAfterAMessageForWhichTheMonitorHasNoRoom)
{
    AddFile(L"a");
    RECT work{};
    SystemParametersInfoW(SPI_GETWORKAREA, 0, &work, 0);
    const LONG high = (work.bottom - work.top) * 19 / 20;
    const auto heightWith = [&](const wchar_t* message, bool resize) {
        LONG height = 0;
        m_params.SetMessage(message);
        ShowFileList([&](const DialogWindow& dialog) {
            RECT place{};
            GetWindowRect(dialog.Handle(), &place);
            height = place.bottom - place.top;
            if (resize)
            {
                SetWindowPos(dialog.Handle(), nullptr, 0, 0, place.right - place.left, high, SWP_NOZORDER);
            }
            Cancel(dialog);
        });
        return height;
    };
    heightWith(L"short", true);
    EXPECT_NEAR(heightWith(L"short", false), high, 2);
    EXPECT_GT(heightWith(L"1\n2\n3\n4\n5\n6\n7\n8\n9\n10", false), high);
    EXPECT_NEAR(heightWith(L"short", false), high, 2);
}

TEST_F(FileListDialog, ConfirmsCheckedEntriesAndOnlyThem)
{
    OrvixFileEntry& leftChecked = AddFile(L"a", OrvixFileState::CheckedOut);
    OrvixFileEntry& cleared = AddFile(L"b", OrvixFileState::Controlled | OrvixFileState::CheckedOut);
    OrvixFileEntry& checked = AddFile(L"c", OrvixFileState::NotControlled, false);
    OrvixFileEntry& leftClear = AddFile(L"d", OrvixFileState::Controlled, false);
    EXPECT_EQ(ShowFileList([](const DialogWindow& dialog) {
                  EXPECT_TRUE(dialog.IsRowChecked(List, 0));
                  EXPECT_FALSE(dialog.IsRowChecked(List, 3));
                  dialog.ClickCheckBox(List, 1);
                  dialog.ClickCheckBox(List, 2);
                  dialog.Click(L"OK");
              }),
              OrvixDialogResult::Confirmed);
    EXPECT_EQ(leftChecked.GetFlagsOut(), OrvixFileSelection::Confirmed | OrvixFileState::CheckedOut);
    EXPECT_EQ(cleared.GetFlagsOut(), OrvixFileState::CheckedOut);
    EXPECT_EQ(checked.GetFlagsOut(), OrvixFileSelection::Confirmed | OrvixFileState::NotControlled);
    EXPECT_EQ(leftClear.GetFlagsOut(), 0U);
}

TEST_F(FileListDialog, IsCheckedAndClearedByTheSpaceBar)
{
    AddFile(L"a");
    AddFile(L"b");
    ShowFileList([](const DialogWindow& dialog) {
        dialog.Focus(List);
        dialog.SelectRow(List, 1);
        dialog.Press(VK_SPACE);
        EXPECT_TRUE(dialog.IsRowChecked(List, 0));
        EXPECT_FALSE(dialog.IsRowChecked(List, 1));
        dialog.Press(VK_SPACE);
        EXPECT_TRUE(dialog.IsRowChecked(List, 1));
        dialog.Press(VK_SPACE);
        dialog.Press(VK_RETURN);
    });
    EXPECT_TRUE(IsConfirmed(0));
    EXPECT_FALSE(IsConfirmed(1));
}

TEST_F(FileListDialog, IsOperatedByTabSpaceAndArrowsAlone)
{
    AddFile(L"a");
    AddFile(L"b");
    AddFile(L"c");
    ShowFileList([](const DialogWindow& dialog) {
        EXPECT_EQ(dialog.Focused(), List);
        dialog.Press(VK_SPACE);
        EXPECT_EQ(dialog.CheckedRows(List), (std::vector{false, true, true}));
        dialog.Press(VK_DOWN);
        dialog.Press(VK_SPACE);
        EXPECT_EQ(dialog.CheckedRows(List), (std::vector{false, false, true}));
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, ClearsTheRowWithTheFocusAndNotASelectedOneElsewhere)
{
    AddFile(L"a");
    AddFile(L"b");
    AddFile(L"c");
    ShowFileList([](const DialogWindow& dialog) {
        dialog.SelectRow(List, 0);
        dialog.FocusRow(List, 2);
        dialog.Press(VK_SPACE);
        EXPECT_EQ(dialog.CheckedRows(List), (std::vector{true, true, false}));
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, ClearsTheSelectedRowsTogether)
{
    AddFile(L"a", OrvixFileState::Controlled, false);
    AddFile(L"b");
    AddFile(L"c");
    ShowFileList([](const DialogWindow& dialog) {
        dialog.Focus(List);
        dialog.SelectEveryRow(List);
        dialog.FocusRow(List, 1);
        dialog.Press(VK_SPACE);
        EXPECT_EQ(dialog.CheckedRows(List), (std::vector{false, false, false})) << "as the row with the focus";
        Cancel(dialog);
    });
}

/// Records what screen readers are told of changed states in this process.
class StateChanges
{
public:
    struct Change
    {
        HWND window;
        LONG object;
        LONG child;
    };

    StateChanges()
        : m_hook(SetWinEventHook(EVENT_OBJECT_STATECHANGE, EVENT_OBJECT_STATECHANGE, GetModuleHandleW(nullptr), &Write,
                                 GetCurrentProcessId(), 0, WINEVENT_INCONTEXT))
    {
        Log().clear();
    }
    StateChanges(const StateChanges&) = delete;
    StateChanges& operator=(const StateChanges&) = delete;
    ~StateChanges() { UnhookWinEvent(m_hook); }

    /// The children of a window's client area whose changes were reported since the last call.
    static std::vector<LONG> Of(HWND window)
    {
        std::vector<LONG> children;
        for (const Change& change : std::exchange(Log(), {}))
        {
            if (change.window == window && change.object == OBJID_CLIENT)
            {
                children.push_back(change.child);
            }
        }
        return children;
    }

private:
    static std::vector<Change>& Log()
    {
        static std::vector<Change> log;
        return log;
    }
    static void CALLBACK Write(HWINEVENTHOOK, DWORD, HWND window, LONG object, LONG child, DWORD, DWORD)
    {
        Log().push_back({window, object, child});
    }

    HWINEVENTHOOK m_hook;
};

TEST_F(FileListDialog, TellsScreenReadersOfChangedCheckBoxes)
{
    AddFile(L"a");
    AddFile(L"b");
    AddFile(L"c");
    const StateChanges changes;
    ShowFileList([](const DialogWindow& dialog) {
        const HWND list = dialog.Control(List);
        StateChanges::Of(list);
        dialog.SelectRow(List, 1);
        dialog.Press(VK_SPACE);
        EXPECT_EQ(StateChanges::Of(list), (std::vector<LONG>{2}));
        dialog.ClickCheckBox(List, 2);
        EXPECT_EQ(StateChanges::Of(list), (std::vector<LONG>{3}));
        dialog.SelectEveryRow(List);
        StateChanges::Of(list);
        dialog.Press(VK_SPACE);
        EXPECT_EQ(StateChanges::Of(list), (std::vector<LONG>{CHILDID_SELF}));
        dialog.Click(L"Check none");
        EXPECT_EQ(StateChanges::Of(list), (std::vector<LONG>{CHILDID_SELF}));
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, KeepsTheFocusOnTheRowAfterSortingAndFiltering)
{
    AddFile(L"b");
    AddFile(L"a");
    AddFile(L"x");
    ShowFileList([](const DialogWindow& dialog) {
        dialog.ClickHeading(List, 0);
        EXPECT_EQ(dialog.Column(List, 0), (Texts{L"a", L"b", L"x"}));
        dialog.Focus(List);
        dialog.Press(VK_DOWN);
        dialog.Press(VK_SPACE);
        EXPECT_EQ(dialog.CheckedRows(List), (std::vector{true, true, false})) << "x is below b";
        SetWindowTextW(dialog.Control(L"Filter:"), L"x");
        dialog.Press(VK_SPACE);
        EXPECT_EQ(dialog.CheckedRows(List), (std::vector{true}));
        SetWindowTextW(dialog.Control(L"Filter:"), L"b");
        dialog.Press(VK_SPACE);
        EXPECT_EQ(dialog.CheckedRows(List), (std::vector{false})) << "the only row is reached without an arrow key";
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, ScrollsToTheRowWithTheFocusAfterSortingAndFiltering)
{
    for (int i = 999; i >= 100; --i)
    {
        AddFile(std::to_wstring(i).c_str());
    }
    ShowFileList([](const DialogWindow& dialog) {
        dialog.ClickHeading(List, 0);
        EXPECT_EQ(dialog.Cell(List, 899, 0), L"999");
        EXPECT_TRUE(dialog.IsRowInView(List, 899));
        SetWindowTextW(dialog.Control(L"Filter:"), L"9");
        EXPECT_TRUE(dialog.IsRowInView(List, dialog.NumRows(List) - 1));
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, ConfirmsEveryEntryWhereNoneCanBeCleared)
{
    OrvixFileEntry& entry = AddFile(L"a", OrvixFileState::CheckedOut, false);
    EXPECT_EQ(ShowFileList(0,
                           [](const DialogWindow& dialog) {
                               EXPECT_FALSE(dialog.Has(L"Check all"));
                               dialog.Press(VK_RETURN);
                           }),
              OrvixDialogResult::Confirmed);
    EXPECT_EQ(entry.GetFlagsOut(), OrvixFileSelection::Confirmed | OrvixFileState::CheckedOut);
}

TEST_F(FileListDialog, ChangesNoEntryAndNoCommentWhenItIsCancelled)
{
    OrvixFileEntry& entry = AddFile(L"a", OrvixFileState::CheckedOut);
    m_params.SetComment(L"before");
    EXPECT_EQ(ShowFileList([](const DialogWindow& dialog) {
                  dialog.Focus(L"Comment:");
                  dialog.Type(L"after");
                  dialog.Click(L"Cancel");
              }),
              OrvixDialogResult::Cancelled);
    EXPECT_EQ(entry.GetFlagsOut(), OrvixFileState::CheckedOut);
    EXPECT_STREQ(m_params.GetComment(), L"before");
}

TEST_F(FileListDialog, FiltersByNameFolderAndStateWhileTyping)
{
    AddFile(L"C:\\town\\bridge.model");
    AddFile(L"C:\\town\\Church.model", OrvixFileState::NotControlled);
    AddFile(L"C:\\church\\tower.model");
    ShowFileList([](const DialogWindow& dialog) {
        dialog.PressAlt(L'l');
        dialog.Type(L"c");
        EXPECT_EQ(dialog.NumRows(List), 3);
        dialog.Type(L"HUR");
        EXPECT_EQ(dialog.Column(List, 0), (Texts{L"Church.model", L"tower.model"}));
        dialog.Press(VK_HOME);
        dialog.Type(L"x");
        EXPECT_EQ(dialog.NumRows(List), 0);
        SetWindowTextW(dialog.Control(L"Filter:"), L"not con");
        EXPECT_EQ(dialog.Column(List, 0), (Texts{L"Church.model"}));
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, SelectsAllAndNoneOfWhatIsShownAndCounts)
{
    AddFile(L"bridge");
    AddFile(L"church");
    AddFile(L"tower", OrvixFileState::Controlled, false);
    ShowFileList([](const DialogWindow& dialog) {
        EXPECT_TRUE(dialog.Has(L"2 of 3 files checked"));
        dialog.PressAlt(L'n');
        EXPECT_TRUE(dialog.Has(L"0 of 3 files checked"));
        dialog.PressAlt(L'l');
        dialog.Type(L"chur");
        EXPECT_TRUE(dialog.Has(L"0 of 3 files checked, 1 shown"));
        dialog.PressAlt(L'a');
        EXPECT_TRUE(dialog.Has(L"1 of 3 files checked, 1 shown"));
        dialog.Click(L"OK");
    });
    EXPECT_EQ(m_list.GetFileEntry(0)->GetFlagsOut(), 0U);
    EXPECT_EQ(m_list.GetFileEntry(1)->GetFlagsOut(), OrvixFileSelection::Confirmed);
    EXPECT_EQ(m_list.GetFileEntry(2)->GetFlagsOut(), 0U);
}

TEST_F(FileListDialog, SortsByTheClickedColumnAndReversesTheOrder)
{
    AddFile(L"x\\b", OrvixFileState::Controlled, false);
    AddFile(L"z\\A");
    AddFile(L"y\\c", OrvixFileState::NotControlled);
    ShowFileList([](const DialogWindow& dialog) {
        EXPECT_EQ(dialog.Column(List, 0), (Texts{L"b", L"A", L"c"}));
        dialog.ClickHeading(List, 0);
        EXPECT_EQ(dialog.Column(List, 0), (Texts{L"A", L"b", L"c"}));
        EXPECT_TRUE(dialog.IsRowChecked(List, 0));
        EXPECT_FALSE(dialog.IsRowChecked(List, 1));
        dialog.ClickHeading(List, 0);
        EXPECT_EQ(dialog.Column(List, 0), (Texts{L"c", L"b", L"A"}));
        dialog.ClickHeading(List, 1);
        EXPECT_EQ(dialog.Column(List, 1), (Texts{L"x", L"y", L"z"}));
        dialog.ClickHeading(List, 2);
        EXPECT_EQ(dialog.Column(List, 2), (Texts{L"Checked in", L"Checked in", L"Not controlled"}));
        dialog.ClickCheckBox(List, 0);
        dialog.Click(L"OK");
    });
    EXPECT_TRUE(IsConfirmed(0)) << "b, the first of the files that are checked in";
    EXPECT_TRUE(IsConfirmed(1));
    EXPECT_TRUE(IsConfirmed(2));
}

TEST_F(FileListDialog, IsSortedByKeysThroughItsMenu)
{
    AddFile(L"x\\b");
    AddFile(L"y\\a");
    ShowFileList([](const DialogWindow& dialog) {
        dialog.ChooseFromMenu(List, 1);
        EXPECT_EQ(dialog.Column(List, 0), (Texts{L"a", L"b"}));
        dialog.ChooseFromMenu(List, 2);
        EXPECT_EQ(dialog.Column(List, 1), (Texts{L"x", L"y"}));
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, StoresTheCommentAndOffersItAgain)
{
    AddFile(L"a");
    for (const wchar_t* comment : {L"first", L"second", L"first"})
    {
        m_params.SetComment(L"");
        ShowFileList([comment](const DialogWindow& dialog) {
            dialog.PressAlt(L'm');
            dialog.Type(comment);
            dialog.Click(L"OK");
        });
        EXPECT_STREQ(m_params.GetComment(), comment);
    }
    ShowFileList([](const DialogWindow& dialog) {
        EXPECT_EQ(dialog.Items(L"Recent comments:"), (Texts{L"first", L"second"}));
        dialog.Choose(L"Recent comments:", L"second");
        EXPECT_EQ(dialog.Text(L"Comment:"), L"second");
        dialog.Click(L"OK");
    });
    EXPECT_STREQ(m_params.GetComment(), L"second");
}

TEST_F(FileListDialog, LeavesTheTypedCommentAloneUntilARecentOneIsChosenInTheOpenList)
{
    AddFile(L"a");
    m_params.SetComment(L"recent");
    ShowFileList([](const DialogWindow& dialog) { dialog.Click(L"OK"); });
    m_params.SetComment(L"");
    ShowFileList([](const DialogWindow& dialog) {
        constexpr const wchar_t* Recent = L"Recent comments:";
        const HWND comment = dialog.Control(L"Comment:");
        dialog.Focus(L"Comment:");
        dialog.Type(L"typed");
        dialog.Focus(Recent);
        dialog.Press(VK_END);
        dialog.Type(L"r");
        PostMessageW(dialog.Control(Recent), WM_MOUSEWHEEL, MAKEWPARAM(0, -WHEEL_DELTA), 0);
        dialog.Press(VK_UP);
        EXPECT_EQ(dialog.Text(L"Comment:"), L"typed") << "the list is not open";
        dialog.Press(VK_DOWN);
        EXPECT_TRUE(SendMessageW(dialog.Control(Recent), CB_GETDROPPEDSTATE, 0, 0));
        dialog.Press(VK_END);
        EXPECT_EQ(dialog.Text(L"Comment:"), L"typed") << "nothing is chosen yet";
        dialog.Press(VK_ESCAPE);
        EXPECT_EQ(dialog.Text(L"Comment:"), L"typed");
        dialog.Choose(Recent, L"recent");
        EXPECT_EQ(dialog.Text(L"Comment:"), L"recent");
        SendMessageW(comment, EM_UNDO, 0, 0);
        EXPECT_EQ(dialog.Text(L"Comment:"), L"typed");
        for (const bool open : {true, false})
        {
            ClickArrow(dialog.Control(Recent));
            EXPECT_EQ(SendMessageW(dialog.Control(Recent), CB_GETDROPPEDSTATE, 0, 0) != 0, open);
        }
        EXPECT_EQ(dialog.Text(L"Comment:"), L"typed") << "the list was closed by its arrow";
        dialog.Click(L"OK");
    });
    EXPECT_STREQ(m_params.GetComment(), L"typed");
}

TEST_F(FileListDialog, StoresARecentCommentOfAnyLength)
{
    AddFile(L"a");
    std::wstring longComment;
    while (longComment.size() < 40000)
    {
        longComment += std::wstring(80, L'x') + L"\r\n";
    }
    longComment += L"end";
    m_params.SetComment(longComment.c_str());
    ShowFileList([](const DialogWindow& dialog) { dialog.Click(L"OK"); });
    m_params.SetComment(L"");
    ShowFileList([](const DialogWindow& dialog) {
        dialog.Choose(L"Recent comments:", dialog.Items(L"Recent comments:").front());
        dialog.Click(L"OK");
    });
    EXPECT_TRUE(m_params.GetComment() == longComment);
}

TEST_F(FileListDialog, IgnoresRecentCommentsThatCannotBeRead)
{
    AddFile(L"a");
    constexpr const wchar_t* Key = L"Software\\OrvixCore\\Dialogs";
    const DWORD number = 7;
    RegSetKeyValueW(HKEY_CURRENT_USER, Key, L"RecentComments", REG_DWORD, &number, sizeof number);
    ShowFileList([](const DialogWindow& dialog) {
        EXPECT_FALSE(dialog.IsEnabled(L"Recent comments:"));
        Cancel(dialog);
    });
    // Without a terminator.
    RegSetKeyValueW(HKEY_CURRENT_USER, Key, L"RecentComments", REG_MULTI_SZ, L"abc", 6);
    ShowFileList([](const DialogWindow& dialog) {
        EXPECT_EQ(dialog.Items(L"Recent comments:"), (Texts{L"abc"}));
        Cancel(dialog);
    });
}

TEST_F(FileListDialog, OffersTheBoxesThatItsOptionsName)
{
    AddFile(L"a");
    constexpr const wchar_t* Keep = L"Keep checked out";
    constexpr const wchar_t* Latest = L"Get the latest version";
    constexpr const wchar_t* RememberBox = L"Remember my answer";
    struct Offer
    {
        std::uint32_t options;
        bool keep;
        bool latest;
        bool remember;
    };
    namespace Option = OrvixDialogOption;
    const Offer offers[] = {
        {Option::EntriesCanBeCleared, false, false, false},
        {Option::EntriesCanBeCleared | Option::OfferKeepCheckedOut, true, false, false},
        {Option::EntriesCanBeCleared | Option::OfferGetLatest, false, true, false},
        {Option::EntriesCanBeCleared | Option::OfferKeepCheckedOut | Option::OfferGetLatest, true, false, false},
        {Option::EntriesCanBeCleared | Option::OfferRemember, false, false, true},
        {Option::EntriesCanBeCleared | Option::RememberChecked | Option::OptionChecked, false, false, false}};
    for (const Offer& offer : offers)
    {
        ShowFileList(offer.options, [&](const DialogWindow& dialog) {
            EXPECT_EQ(dialog.Has(Keep), offer.keep);
            EXPECT_EQ(dialog.Has(Latest), offer.latest);
            EXPECT_EQ(dialog.Has(RememberBox), offer.remember);
            dialog.Click(L"OK");
        });
        EXPECT_EQ(m_params.GetOptions(), offer.options) << "no box was checked or cleared";
    }
}

TEST_F(FileListDialog, ReturnsTheStateOfItsBoxesWhateverTheAnswer)
{
    AddFile(L"a");
    constexpr std::uint32_t Offered = OrvixDialogOption::EntriesCanBeCleared | OrvixDialogOption::OfferKeepCheckedOut |
                                      OrvixDialogOption::OfferRemember;
    for (const wchar_t* button : {L"OK", L"Cancel"})
    {
        ShowFileList(Offered | OrvixDialogOption::OptionChecked, [button](const DialogWindow& dialog) {
            EXPECT_TRUE(dialog.IsChecked(L"Keep checked out"));
            EXPECT_FALSE(dialog.IsChecked(L"Remember my answer"));
            dialog.PressAlt(L'k');
            dialog.PressAlt(L'r');
            dialog.Click(button);
        });
        const bool confirmed = std::wcscmp(button, L"OK") == 0; // a cancel is never remembered
        EXPECT_EQ(m_params.GetOptions(), Offered | (confirmed ? OrvixDialogOption::RememberChecked : 0));
    }
}

TEST_F(FileListDialog, ConfirmsNothingWhenNoFileIsChecked)
{
    AddFile(L"C:\\a");
    AddFile(L"b");
    EXPECT_EQ(ShowFileList([](const DialogWindow& dialog) {
                  EXPECT_EQ(dialog.Column(List, 1), (Texts{L"C:\\", L""}));
                  EXPECT_TRUE(dialog.IsEnabled(L"OK"));
                  dialog.PressAlt(L'n');
                  EXPECT_FALSE(dialog.IsEnabled(L"OK"));
                  Cancel(dialog);
              }),
              OrvixDialogResult::Cancelled);
}

TEST_F(FileListDialog, CutsBlankLinesAtTheEndOfTheComment)
{
    AddFile(L"a");
    ShowFileList([](const DialogWindow& dialog) {
        dialog.Focus(L"Comment:");
        dialog.Type(L"one\r\rtwo\r \r\r");
        dialog.Click(L"OK");
    });
    EXPECT_STREQ(m_params.GetComment(), L"one\r\n\r\ntwo");
}

/// Records the files and the arguments of a check-in.
class CheckInProvider final : public FakeProvider
{
public:
    CheckInProvider() : FakeProvider(L"CheckIn") {}

    Texts files;
    std::wstring comment;
    unsigned long options = 0;

    int CheckIn(OrvixFileList* list, const wchar_t* text, unsigned long how) override
    {
        for (unsigned int i = 0; i < list->NumActiveEntries(); ++i)
        {
            files.emplace_back(list->GetActiveFileEntry(i)->GetFile());
        }
        comment = text;
        options = how;
        return OrvixProviderResult::Success;
    }
};

TEST_F(FileListDialog, DecidesWhatAnOperationWorksOn)
{
    AddFile(L"a");
    AddFile(L"b");
    AddFile(L"c");
    constexpr std::uint32_t DialogPrompt = 100;
    constexpr std::uint32_t OptionPrompt = 200;
    m_services->RegisterPrompt(DialogPrompt, L"Check in?", OrvixPromptAction::Ask, 0, true);
    m_services->RegisterPrompt(OptionPrompt, L"Keep checked out?", OrvixPromptAction::Ask, 0, true);
    m_params.SetDialogPromptID(DialogPrompt);
    m_params.SetOptionPromptID(OptionPrompt);
    m_params.SetOptions(OrvixDialogOption::OfferKeepCheckedOut | OrvixDialogOption::OfferRemember);

    CheckInProvider provider;
    std::int32_t result = 0;
    {
        const User user(Title, [](const DialogWindow& dialog) {
            dialog.ClickCheckBox(List, 1);
            dialog.PressAlt(L'm');
            dialog.Type(L"done");
            dialog.PressAlt(L'k');
            dialog.PressAlt(L'r');
            dialog.Click(L"OK");
        });
        result = m_services->RunFileListOperation(nullptr, &m_params, false, &provider, OrvixOperation::CheckIn,
                                                  OrvixFileState::Controlled);
    }
    EXPECT_EQ(result, OrvixOperationResult::Done);
    EXPECT_EQ(provider.files, (Texts{L"a", L"c"}));
    EXPECT_EQ(provider.comment, L"done");
    EXPECT_EQ(provider.options, OrvixProviderOption::KeepCheckedOut);
    EXPECT_EQ(m_services->GetPromptAction(DialogPrompt), OrvixPromptAction::Yes);
    EXPECT_EQ(m_services->GetPromptAction(OptionPrompt), OrvixPromptAction::OptionChecked);
}

/// Counts the changes of a row's state after which the list has something to draw. When many rows change, that is to
/// be so only after the last change: otherwise the list is drawn again for each row.
class DrawnChanges
{
public:
    explicit DrawnChanges(HWND list)
        : m_list(list), m_procedure(std::bit_cast<WNDPROC>(GetWindowLongPtrW(list, GWLP_WNDPROC)))
    {
        UpdateWindow(list);
        s_current = this;
        Install(&Watch);
    }
    DrawnChanges(const DrawnChanges&) = delete;
    DrawnChanges& operator=(const DrawnChanges&) = delete;
    ~DrawnChanges()
    {
        Install(m_procedure);
        SendMessageW(m_list, WM_NULL, 0, 0); // afterwards the window's thread is not in Watch
    }

    int Number() const { return m_number; }

private:
    static LRESULT CALLBACK Watch(HWND window, UINT message, WPARAM wParam, LPARAM lParam)
    {
        const LRESULT result = CallWindowProcW(s_current->m_procedure, window, message, wParam, lParam);
        if (message == LVM_SETITEMSTATE && GetUpdateRect(window, nullptr, FALSE))
        {
            ++s_current->m_number;
        }
        return result;
    }
    void Install(WNDPROC procedure) const
    {
        SetWindowLongPtrW(m_list, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(procedure));
    }

    inline static DrawnChanges* s_current = nullptr;
    HWND m_list;
    WNDPROC m_procedure;
    std::atomic<int> m_number = 0;
};

TEST_F(FileListDialog, IsDrawnOnceWhenManySelectedRowsAreSortedOrFiltered)
{
    for (int i = 0; i < 1000; ++i)
    {
        AddFile(std::to_wstring(i).c_str());
    }
    ShowFileList([](const DialogWindow& dialog) {
        constexpr int AHandful = 5;
        dialog.SelectEveryRow(List);
        {
            const DrawnChanges drawn(dialog.Control(List));
            dialog.ClickHeading(List, 0);
            EXPECT_LE(drawn.Number(), AHandful) << "to sort";
        }
        {
            const DrawnChanges drawn(dialog.Control(List));
            SetWindowTextW(dialog.Control(L"Filter:"), L"1");
            EXPECT_LE(drawn.Number(), AHandful) << "to filter";
        }
        Cancel(dialog);
    });
}

class LongFileList : public FileListDialog
{
protected:
    static constexpr int Count = 50000;

    LongFileList()
    {
        for (int i = 0; i < Count; ++i)
        {
            AddFile((L"C:\\town\\file" + std::to_wstring(i)).c_str());
        }
    }

    static int NumSelected(const DialogWindow& dialog)
    {
        return static_cast<int>(SendMessageW(dialog.Control(List), LVM_GETSELECTEDCOUNT, 0, 0));
    }
};

TEST_F(LongFileList, IsVirtual)
{
    ShowFileList([](const DialogWindow& dialog) {
        EXPECT_EQ(dialog.NumRows(List), Count);
        EXPECT_NE(GetWindowLongW(dialog.Control(List), GWL_STYLE) & LVS_OWNERDATA, 0);
        Cancel(dialog);
    });
}

TEST_F(LongFileList, ConfirmsWhatIsCheckedAmongFilteredAndSortedRows)
{
    ShowFileList([](const DialogWindow& dialog) {
        dialog.Click(L"Check none");
        dialog.Focus(L"Filter:");
        dialog.Type(L"49999");
        EXPECT_EQ(dialog.Column(List, 0), (Texts{L"file49999"}));
        dialog.Click(L"Check all");
        dialog.ClickHeading(List, 0);
        dialog.Click(L"OK");
    });
    EXPECT_TRUE(IsConfirmed(Count - 1));
    EXPECT_FALSE(IsConfirmed(0));
}

TEST_F(LongFileList, KeepsEveryRowSelectedWhenItIsSortedAndFiltered)
{
    ShowFileList([](const DialogWindow& dialog) {
        dialog.SelectEveryRow(List);
        dialog.ClickHeading(List, 0);
        EXPECT_EQ(NumSelected(dialog), Count);
        SetWindowTextW(dialog.Control(L"Filter:"), L"file");
        EXPECT_EQ(NumSelected(dialog), Count);
        dialog.Focus(List);
        dialog.Press(VK_SPACE);
        EXPECT_FALSE(dialog.IsRowChecked(List, 0));
        EXPECT_FALSE(dialog.IsRowChecked(List, Count - 1));
        SetWindowTextW(dialog.Control(L"Filter:"), L"49999");
        EXPECT_EQ(NumSelected(dialog), 1);
        Cancel(dialog);
    });
}

TEST_F(LongFileList, KeepsMostRowsSelectedWhenItIsSorted)
{
    ShowFileList([](const DialogWindow& dialog) {
        constexpr int Step = 100;
        dialog.SelectEveryRow(List);
        for (int row = 0; row < Count; row += Step)
        {
            dialog.UnselectRow(List, row);
        }
        dialog.ClickHeading(List, 0);
        EXPECT_EQ(NumSelected(dialog), Count - Count / Step);
        std::vector<bool> selected;
        for (WPARAM place = 0; place < 7; ++place)
        {
            selected.push_back(SendMessageW(dialog.Control(List), LVM_GETITEMSTATE, place, LVIS_SELECTED) != 0);
        }
        EXPECT_EQ(selected, (std::vector{false, true, true, false, false, false, true}))
            << "file0, file1, file10, file100, file1000, file10000, file10001";
        Cancel(dialog);
    });
}

} // namespace
