#include "DialogWindow.h"
#include "Display.h"
#include "FileLists.h"
#include "Measure.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixServicesPointer.h"
#include "PrivateUserKey.h"

#include <windows.h>

#include <commctrl.h>

#include <algorithm>
#include <bit>
#include <cstdio>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace
{

constexpr wchar_t Filter[] = L"99";

/// Handles the thread's messages until there is none, those to draw included.
void Settle(HWND dialog)
{
    MSG message{};
    while (PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE))
    {
        if (!IsDialogMessageW(dialog, &message))
        {
            DispatchMessageW(&message);
        }
    }
}

/// A window with a procedure of its own.
class HostWindow
{
public:
    explicit HostWindow(WNDPROC procedure)
        : m_window(CreateWindowExW(0, L"Static", nullptr, WS_OVERLAPPEDWINDOW, 0, 0, 700, 500, nullptr, nullptr,
                                   nullptr, nullptr))
    {
        SetWindowLongPtrW(m_window, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(procedure));
    }
    HostWindow(const HostWindow&) = delete;
    HostWindow& operator=(const HostWindow&) = delete;
    ~HostWindow() { DestroyWindow(m_window); }

    HWND Handle() const { return m_window; }

private:
    HWND m_window;
};

/// Sorts, filters and closes the dialog of which its owner is told that it is open and drawn.
LRESULT CALLBACK UseDialog(HWND window, UINT message, WPARAM wParam, LPARAM lParam)
{
    if (message == WM_ENTERIDLE)
    {
        const DialogWindow dialog(std::bit_cast<HWND>(lParam), &Settle);
        dialog.ClickHeading(L"Files:", 0);
        SetWindowTextW(dialog.Control(L"Filter:"), Filter);
        Settle(dialog.Handle());
        PostMessageW(dialog.Handle(), WM_COMMAND, IDCANCEL, 0);
        return 0;
    }
    return DefWindowProcW(window, message, wParam, lParam);
}

/// A virtual list view over the entries' own paths, with one copy of each for comparisons without regard to letter
/// case.
class ListByHand
{
public:
    explicit ListByHand(OrvixFileList& files) : m_host(&Procedure)
    {
        const INITCOMMONCONTROLSEX classes{sizeof classes, ICC_LISTVIEW_CLASSES};
        InitCommonControlsEx(&classes);
        SetWindowLongPtrW(m_host.Handle(), GWLP_USERDATA, reinterpret_cast<LONG_PTR>(this));
        m_list = CreateWindowExW(0, WC_LISTVIEWW, nullptr, WS_CHILD | WS_VISIBLE | LVS_REPORT | LVS_OWNERDATA, 0, 0,
                                 680, 460, m_host.Handle(), nullptr, nullptr, nullptr);
        for (WPARAM i = 0; const wchar_t* heading : {L"Name", L"Folder", L"State"})
        {
            LVCOLUMNW column{};
            column.mask = LVCF_TEXT | LVCF_WIDTH;
            column.cx = 200;
            column.pszText = const_cast<wchar_t*>(heading);
            SendMessageW(m_list, LVM_INSERTCOLUMNW, i++, reinterpret_cast<LPARAM>(&column));
        }
        for (unsigned int i = 0; i < files.NumActiveEntries(); ++i)
        {
            const std::wstring_view path = files.GetActiveFileEntry(i)->GetFile();
            Row row{path, path.rfind(L'\\') + 1, std::wstring(path)};
            CharLowerBuffW(row.folded.data(), static_cast<DWORD>(row.folded.size()));
            m_shown.push_back(m_rows.size());
            m_rows.push_back(std::move(row));
        }
        SendMessageW(m_list, LVM_SETITEMCOUNT, m_shown.size(), 0);
        ShowWindow(m_host.Handle(), SW_SHOW);
        Settle(m_host.Handle());
    }

    void Sort()
    {
        const auto nameOf = [this](std::size_t row) {
            return std::wstring_view(m_rows[row].folded).substr(m_rows[row].name);
        };
        std::stable_sort(m_shown.begin(), m_shown.end(),
                         [&](std::size_t left, std::size_t right) { return nameOf(left) < nameOf(right); });
        InvalidateRect(m_list, nullptr, TRUE);
        Settle(m_host.Handle());
    }

    void Filter(std::wstring_view text)
    {
        std::erase_if(m_shown, [&](std::size_t row) {
            return m_rows[row].folded.find(text) == std::wstring::npos && State.find(text) == std::wstring_view::npos;
        });
        SendMessageW(m_list, LVM_SETITEMCOUNT, m_shown.size(), 0);
        Settle(m_host.Handle());
    }

private:
    struct Row
    {
        std::wstring_view path;
        std::size_t name; // where it begins
        std::wstring folded;
    };
    static constexpr std::wstring_view State = L"unknown";

    static LRESULT CALLBACK Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam)
    {
        if (message == WM_NOTIFY && std::bit_cast<const NMHDR*>(lParam)->code == LVN_GETDISPINFOW)
        {
            const auto* list = std::bit_cast<const ListByHand*>(GetWindowLongPtrW(window, GWLP_USERDATA));
            list->GiveItem(std::bit_cast<NMLVDISPINFOW*>(lParam)->item);
            return 0;
        }
        return DefWindowProcW(window, message, wParam, lParam);
    }

    void GiveItem(LVITEMW& item) const
    {
        if ((item.mask & LVIF_TEXT) == 0)
        {
            return;
        }
        const Row& row = m_rows[m_shown[static_cast<std::size_t>(item.iItem)]];
        const std::wstring_view cells[] = {row.path.substr(row.name), row.path.substr(0, row.name - 1), State};
        const std::wstring_view cell = cells[item.iSubItem];
        lstrcpynW(item.pszText, cell.data(), std::min(item.cchTextMax, static_cast<int>(cell.size()) + 1));
    }

    HostWindow m_host;
    HWND m_list = nullptr;
    std::vector<Row> m_rows;
    std::vector<std::size_t> m_shown;
};

} // namespace

void BenchDialogs(MeasureTable& table)
{
    if (!HasDisplay())
    {
        std::printf("ShowFileListDialog is left out: no display to show dialogs on\n");
        return;
    }
    const PrivateUserKey userKey;
    const OrvixServicesPointer services = MakeOrvixServices();
    const HostWindow owner(&UseDialog);
    OrvixFileListDialogParams params;
    const auto show = [&] { services->ShowFileListDialog(owner.Handle(), &params); };

    constexpr unsigned int Many = 50000;
    const auto files = MakeActiveList(Many);
    params.SetOrvixFileList(files.get());
    table.Print(Compare("ShowFileListDialog, 50,000 files: open, sort, filter, close", 5.0, show, [&] {
        ListByHand list(*files);
        list.Sort();
        list.Filter(Filter);
    }));

    const auto timeOf = [&](unsigned int count) {
        const auto list = MakeActiveList(count);
        params.SetOrvixFileList(list.get());
        return BestTime(show);
    };
    constexpr unsigned int Few = 5000;
    const double empty = timeOf(0);
    table.Print({"the same, time per file over that of no file: 50,000 against 5,000", (timeOf(Many) - empty) / Many,
                 (timeOf(Few) - empty) / Few, 2.0});
}
