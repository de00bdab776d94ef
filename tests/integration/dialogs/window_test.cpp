#include "DialogsTest.h"
#include "OrvixDialogOption.h"
#include "OrvixPrompt.h"

#include <commctrl.h>
#include <uxtheme.h>
#include <windows.h>

#include <algorithm>
#include <bit>

namespace
{

/// What the dialogs have in common, mostly tested on the file list, which has the most controls.
class DialogWindows : public DialogsTest
{
protected:
    static constexpr std::uint32_t AllAnswers =
        OrvixPromptOption::OfferYesToAll | OrvixPromptOption::OfferNoToAll | OrvixPromptOption::OfferStopAsking;
    static constexpr std::uint32_t Everything = OrvixDialogOption::EntriesCanBeCleared |
                                                OrvixDialogOption::OfferKeepCheckedOut |
                                                OrvixDialogOption::OfferRemember;

    DialogWindows() { AddFile(L"C:\\town\\bridge.model"); }

    static RECT WindowPlace(const DialogWindow& dialog)
    {
        RECT place{};
        GetWindowRect(dialog.Handle(), &place);
        return place;
    }
    static SIZE SizeOf(const RECT& place) { return {place.right - place.left, place.bottom - place.top}; }
    static void Enlarge(const DialogWindow& dialog, int x, int y)
    {
        const SIZE size = SizeOf(WindowPlace(dialog));
        SetWindowPos(dialog.Handle(), nullptr, 0, 0, size.cx + x, size.cy + y, SWP_NOMOVE | SWP_NOZORDER);
    }
};

TEST_F(DialogWindows, NameEveryControlForScreenReaders)
{
    const auto expectNames = [](const DialogWindow& dialog) {
        for (const auto& name : dialog.TabStops())
        {
            EXPECT_NE(name, L"");
        }
        dialog.Press(VK_ESCAPE);
    };
    ShowPrompt(AllAnswers, expectNames);
    ShowFileList(Everything, expectNames);
    ShowEditor(expectNames);
}

TEST_F(DialogWindows, LetTabReachEveryControl)
{
    ShowFileList(Everything, [](const DialogWindow& dialog) {
        const Texts stops = dialog.TabStops();
        EXPECT_EQ(stops, (Texts{L"Filter:", L"Files:", L"Check all", L"Check none", L"Comment:", L"Keep checked out",
                                L"Remember my answer", L"OK", L"Cancel"}));
        EXPECT_EQ(dialog.Focused(), L"Files:");
        dialog.Focus(stops.front());
        Texts walked;
        for (std::size_t i = 0; i < stops.size(); ++i)
        {
            walked.push_back(dialog.Focused());
            dialog.Press(VK_TAB);
        }
        EXPECT_EQ(walked, stops);
        EXPECT_EQ(dialog.Focused(), stops.front());
        dialog.Press(VK_ESCAPE);
    });
}

TEST_F(DialogWindows, OfTheStoredAnswersLetTabReachTheWholeText)
{
    m_services->RegisterPrompt(1, L"Open?", OrvixPromptAction::Yes, 0, true);
    ShowEditor([](const DialogWindow& dialog) {
        const Texts stops = dialog.TabStops();
        EXPECT_EQ(stops,
                  (Texts{L"Search:", L"Prompts:", L"Whole text:", L"Answer:", L"Reset to ask", L"OK", L"Cancel"}));
        for (const auto& stop : stops)
        {
            EXPECT_EQ(dialog.Focused(), stop);
            dialog.Press(VK_TAB);
        }
        dialog.Press(VK_ESCAPE);
    });
}

TEST_F(DialogWindows, GiveEveryControlAnAccessKeyOfItsOwn)
{
    const auto expectKeys = [](const DialogWindow& dialog) {
        std::wstring keys;
        for (HWND control = GetWindow(dialog.Handle(), GW_CHILD); control != nullptr;
             control = GetWindow(control, GW_HWNDNEXT))
        {
            wchar_t text[256] = {};
            GetWindowTextW(control, text, 256);
            const wchar_t* mark = wcschr(text, L'&');
            if (IsWindowVisible(control) && mark != nullptr)
            {
                keys += static_cast<wchar_t>(towlower(mark[1]));
            }
        }
        EXPECT_NE(keys, L"");
        std::sort(keys.begin(), keys.end());
        EXPECT_EQ(std::adjacent_find(keys.begin(), keys.end()), keys.end()) << "twice";
        dialog.Press(VK_ESCAPE);
    };
    ShowPrompt(AllAnswers, expectKeys);
    ShowFileList(Everything, expectKeys);
    ShowFileList(OrvixDialogOption::EntriesCanBeCleared | OrvixDialogOption::OfferGetLatest |
                     OrvixDialogOption::OfferRemember,
                 expectKeys);
    ShowEditor(expectKeys);
}

TEST_F(DialogWindows, LetTheirControlsFollowTheSize)
{
    ShowFileList(Everything, [](const DialogWindow& dialog) {
        const RECT list = dialog.Place(L"Files:");
        const RECT ok = dialog.Place(L"OK");
        const RECT comment = dialog.Place(L"Comment:");
        const RECT all = dialog.Place(L"Check all");
        Enlarge(dialog, 100, 60);
        EXPECT_EQ(dialog.Place(L"Files:").right, list.right + 100);
        EXPECT_EQ(dialog.Place(L"Files:").bottom, list.bottom + 60);
        EXPECT_EQ(dialog.Place(L"Files:").top, list.top);
        EXPECT_EQ(dialog.Place(L"OK").left, ok.left + 100);
        EXPECT_EQ(dialog.Place(L"OK").top, ok.top + 60);
        EXPECT_EQ(SizeOf(dialog.Place(L"OK")).cx, SizeOf(ok).cx);
        EXPECT_EQ(dialog.Place(L"Comment:").right, comment.right + 100);
        EXPECT_EQ(dialog.Place(L"Comment:").top, comment.top + 60);
        EXPECT_EQ(dialog.Place(L"Check all").left, all.left);
        EXPECT_EQ(dialog.Place(L"Check all").top, all.top + 60);
        dialog.Press(VK_ESCAPE);
    });
}

TEST_F(DialogWindows, NeverGetSmallerThanTheirControlsNeed)
{
    ShowFileList(Everything, [](const DialogWindow& dialog) {
        const SIZE size = SizeOf(WindowPlace(dialog));
        Enlarge(dialog, -200, -200);
        EXPECT_EQ(SizeOf(WindowPlace(dialog)).cx, size.cx);
        EXPECT_EQ(SizeOf(WindowPlace(dialog)).cy, size.cy);
        dialog.Press(VK_ESCAPE);
    });
}

TEST_F(DialogWindows, RememberTheirSize)
{
    SIZE enlarged{};
    ShowFileList(Everything, [&](const DialogWindow& dialog) {
        Enlarge(dialog, 120, 80);
        enlarged = SizeOf(WindowPlace(dialog));
        dialog.Press(VK_ESCAPE);
    });
    ShowFileList(Everything, [&](const DialogWindow& dialog) {
        EXPECT_EQ(SizeOf(WindowPlace(dialog)).cx, enlarged.cx);
        EXPECT_EQ(SizeOf(WindowPlace(dialog)).cy, enlarged.cy);
        RECT inside{};
        GetClientRect(dialog.Handle(), &inside);
        EXPECT_LT(dialog.Place(L"OK").right, inside.right);
        EXPECT_GT(dialog.Place(L"OK").bottom, inside.bottom - 40);
        dialog.Press(VK_ESCAPE);
    });
}

TEST_F(DialogWindows, StayOnTheScreenWhateverSizeIsRemembered)
{
    RECT work{};
    SystemParametersInfoW(SPI_GETWORKAREA, 0, &work, 0);
    for (const DWORD size : {0U, 1U, 1000000U, 0xFFFFFFFFU, 0x7FFFFFFFU})
    {
        for (const wchar_t* name : {L"FileListWidth", L"FileListHeight"})
        {
            RegSetKeyValueW(HKEY_CURRENT_USER, L"Software\\OrvixCore\\Dialogs", name, REG_DWORD, &size, sizeof size);
        }
        ShowFileList(Everything, [&](const DialogWindow& dialog) {
            const RECT place = WindowPlace(dialog);
            EXPECT_GE(place.left, work.left);
            EXPECT_GE(place.top, work.top);
            EXPECT_LE(place.right, work.right);
            EXPECT_LE(place.bottom, work.bottom);
            EXPECT_GT(SizeOf(dialog.Place(L"Files:")).cy, 20);
            dialog.Press(VK_ESCAPE);
        });
    }
}

TEST_F(DialogWindows, IgnoreASizeOfAnotherType)
{
    SIZE usual{};
    const auto measure = [&usual](const DialogWindow& dialog) {
        usual = SizeOf(WindowPlace(dialog));
        dialog.Press(VK_ESCAPE);
    };
    ShowFileList(Everything, measure);
    const SIZE before = usual;
    constexpr wchar_t AsManyBytes[] = L"\x7FF"; // as many bytes as a number
    for (const wchar_t* name : {L"FileListWidth", L"FileListHeight"})
    {
        RegSetKeyValueW(HKEY_CURRENT_USER, L"Software\\OrvixCore\\Dialogs", name, REG_SZ, AsManyBytes,
                        sizeof AsManyBytes);
    }
    ShowFileList(Everything, measure);
    EXPECT_EQ(usual.cx, before.cx);
    EXPECT_EQ(usual.cy, before.cy);
}

TEST_F(DialogWindows, AreDrawnForEachMonitorWhateverTheHostIs)
{
    const DPI_AWARENESS_CONTEXT before = SetThreadDpiAwarenessContext(DPI_AWARENESS_CONTEXT_UNAWARE);
    ShowFileList(Everything, [](const DialogWindow& dialog) {
        EXPECT_EQ(GetAwarenessFromDpiAwarenessContext(GetWindowDpiAwarenessContext(dialog.Handle())),
                  DPI_AWARENESS_PER_MONITOR_AWARE);
        dialog.Press(VK_ESCAPE);
    });
    EXPECT_EQ(GetAwarenessFromDpiAwarenessContext(GetThreadDpiAwarenessContext()), DPI_AWARENESS_UNAWARE);
    SetThreadDpiAwarenessContext(before);
}

TEST_F(DialogWindows, FollowTheResolutionOfTheMonitor)
{
    ShowFileList(Everything, [](const DialogWindow& dialog) {
        const auto letterHeight = [&] {
            LOGFONTW letters{};
            GetObjectW(std::bit_cast<HFONT>(SendMessageW(dialog.Control(L"OK"), WM_GETFONT, 0, 0)), sizeof letters,
                       &letters);
            return letters.lfHeight;
        };
        const auto distanceFromCorner = [&] {
            RECT inside{};
            GetClientRect(dialog.Handle(), &inside);
            const RECT ok = dialog.Place(L"OK");
            return SIZE{inside.right - ok.left, inside.bottom - ok.top};
        };
        const LONG height = letterHeight();
        const SIZE distance = distanceFromCorner();
        const RECT list = dialog.Place(L"Files:");
        const SIZE size = SizeOf(WindowPlace(dialog));
        const RECT place = {0, 0, size.cx * 3 / 2, size.cy * 3 / 2};
        SendMessageW(dialog.Handle(), WM_DPICHANGED, MAKEWPARAM(144, 144), reinterpret_cast<LPARAM>(&place));
        EXPECT_EQ(SizeOf(WindowPlace(dialog)).cx, SizeOf(place).cx);
        EXPECT_NEAR(letterHeight(), height * 3 / 2.0, 1);
        EXPECT_NEAR(distanceFromCorner().cx, distance.cx * 3 / 2.0, 2);
        EXPECT_NEAR(distanceFromCorner().cy, distance.cy * 3 / 2.0, 2);
        EXPECT_NEAR(dialog.Place(L"Files:").top, list.top * 3 / 2.0, 2);
        dialog.Press(VK_ESCAPE);
    });
}

TEST_F(DialogWindows, UseTheCommonControlsOfVersionSix)
{
    ShowFileList(Everything, [](const DialogWindow& dialog) {
        // Only version 6 knows these messages.
        SIZE size{};
        EXPECT_TRUE(SendMessageW(dialog.Control(L"OK"), BCM_GETIDEALSIZE, 0, reinterpret_cast<LPARAM>(&size)));
        EXPECT_TRUE(
            SendMessageW(dialog.Control(L"Filter:"), EM_SETCUEBANNER, FALSE, reinterpret_cast<LPARAM>(L"name")));
        dialog.Press(VK_ESCAPE);
    });
}

TEST_F(DialogWindows, DrawCheckBoxesWithoutAThemeThatHidesTheHostsColours)
{
    if (!IsThemeActive())
    {
        GTEST_SKIP() << "no theme is active";
    }
    bool themed = false;
    const auto look = [&themed](const DialogWindow& dialog) {
        themed = GetWindowTheme(dialog.Control(L"Keep checked out")) != nullptr;
        dialog.Press(VK_ESCAPE);
    };
    ShowFileList(Everything, look);
    EXPECT_TRUE(themed);
    m_host.colors = {{COLOR_BTNTEXT, 0x000000F0}};
    ShowFileList(Everything, look);
    EXPECT_FALSE(themed);
}

TEST_F(DialogWindows, HaveTheHostsColours)
{
    m_host.colors = {{COLOR_BTNFACE, 0x00102030}, {COLOR_BTNTEXT, 0x00405060}, {COLOR_WINDOW, 0x00708090}};
    ShowFileList(Everything, [](const DialogWindow& dialog) {
        const HDC context = GetDC(dialog.Handle());
        auto* const brush = std::bit_cast<HBRUSH>(SendMessageW(
            dialog.Handle(), WM_CTLCOLORDLG, std::bit_cast<WPARAM>(context), std::bit_cast<LPARAM>(dialog.Handle())));
        LOGBRUSH paint{};
        GetObjectW(brush, sizeof paint, &paint);
        EXPECT_EQ(paint.lbColor, 0x00102030U);
        EXPECT_EQ(GetTextColor(context), 0x00405060U);
        ReleaseDC(dialog.Handle(), context);
        EXPECT_EQ(SendMessageW(dialog.Control(L"Files:"), LVM_GETBKCOLOR, 0, 0), 0x00708090);
        dialog.Press(VK_ESCAPE);
    });
}

/// How many pixels of an area of a window have a colour.
int NumPixels(HWND window, const RECT& area, COLORREF color)
{
    RedrawWindow(window, nullptr, nullptr, RDW_INVALIDATE | RDW_UPDATENOW);
    const HDC context = GetDC(window);
    int number = 0;
    for (int y = area.top; y < area.bottom; ++y)
    {
        for (int x = area.left; x < area.right; ++x)
        {
            number += GetPixel(context, x, y) == color ? 1 : 0;
        }
    }
    ReleaseDC(window, context);
    return number;
}

TEST_F(DialogWindows, DrawButtonsHeadingsAndSelectedRowsInTheHostsColours)
{
    constexpr COLORREF Face = 0x00302010;
    constexpr COLORREF Selected = 0x00604020;
    m_host.colors = {{COLOR_BTNFACE, Face},          {COLOR_BTNTEXT, 0x00F0F0F0}, {COLOR_WINDOW, 0x00201008},
                     {COLOR_WINDOWTEXT, 0x00F0F0F0}, {COLOR_HIGHLIGHT, Selected}, {COLOR_HIGHLIGHTTEXT, 0x0000FFFF},
                     {COLOR_GRAYTEXT, 0x00808080}};
    ShowFileList(Everything, [&](const DialogWindow& dialog) {
        const auto inside = [](HWND window) {
            RECT area{};
            GetClientRect(window, &area);
            return area;
        };
        const auto mostOf = [](const RECT& area) { return (area.right - area.left) * (area.bottom - area.top) / 2; };
        const HWND button = dialog.Control(L"Check all");
        EXPECT_GT(NumPixels(button, inside(button), Face), mostOf(inside(button)));

        const HWND list = dialog.Control(L"Files:");
        auto* const headings = std::bit_cast<HWND>(SendMessageW(list, LVM_GETHEADER, 0, 0));
        EXPECT_GT(NumPixels(headings, inside(headings), Face), mostOf(inside(headings)));

        RECT row{};
        row.left = LVIR_LABEL;
        SendMessageW(list, LVM_GETITEMRECT, 0, reinterpret_cast<LPARAM>(&row));
        EXPECT_GT(NumPixels(list, row, Selected), mostOf(row)) << "the first row is selected";
        dialog.Press(VK_ESCAPE);
    });
}

} // namespace
