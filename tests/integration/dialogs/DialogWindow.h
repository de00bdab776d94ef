#pragma once

#include <windows.h>

#include <string>
#include <vector>

/// A dialog of this process, operated as a user does, by keyboard and mouse messages. The name of a control is what a
/// screen reader says: the text of a button, the label before any other control, without the mark of the access key.
/// Only the button that confirms is always called OK; its text says on what.
/// Throws std::runtime_error when there is no such control.
class DialogWindow
{
public:
    /// `settle` returns when the dialog has handled every message that was posted before.
    DialogWindow(HWND window, void (*settle)(HWND)) : m_window(window), m_settle(settle) {}

    HWND Handle() const { return m_window; }
    bool IsOpen() const { return IsWindow(m_window) != FALSE; }

    /// Waits until the dialog has handled every message that was posted before.
    void Settle() const { m_settle(m_window); }

    /// A window inside this one, such as the page of a property sheet.
    DialogWindow Child(HWND window) const { return {window, m_settle}; }

    /// Presses a key. Keys go to the control with the focus.
    void Press(WORD key) const;
    void Type(const std::wstring& text) const;
    void PressAlt(wchar_t accessKey) const;
    /// Presses a key while the Ctrl key is down.
    void PressControl(WORD key) const;
    /// Opens the drop-down list with the focus.
    void PressAltDown() const;
    std::wstring Focused() const;
    void Focus(const std::wstring& name) const;

    /// Clicks a button.
    void Click(const std::wstring& name) const;

    /// Clicks the close button of the title bar.
    void Close() const;

    /// A visible control, by name.
    HWND Control(const std::wstring& name) const;
    bool Has(const std::wstring& name) const;
    bool IsEnabled(const std::wstring& name) const { return IsWindowEnabled(Control(name)) != FALSE; }
    bool IsChecked(const std::wstring& name) const;

    /// The visible buttons except check boxes, from left to right.
    std::vector<std::wstring> Buttons() const;

    /// The visible controls that take the focus, in tab order; one without a name is "".
    std::vector<std::wstring> TabStops() const;

    std::wstring Text(const std::wstring& name) const;

    /// Opens a drop-down list by keyboard and chooses an item.
    void Choose(const std::wstring& name, const std::wstring& item) const;
    std::vector<std::wstring> Items(const std::wstring& name) const;
    std::wstring Chosen(const std::wstring& name) const;

    /// The rectangle of a control, relative to the inside of the dialog.
    RECT Place(const std::wstring& name) const;

    /// The rows of a list, in the order in which they are shown.
    int NumRows(const std::wstring& list) const;
    std::wstring Cell(const std::wstring& list, int row, int column) const;
    std::vector<std::wstring> Column(const std::wstring& list, int column) const;
    bool IsRowChecked(const std::wstring& list, int row) const;
    bool IsRowInView(const std::wstring& list, int row) const;
    /// For each row, whether it is checked.
    std::vector<bool> CheckedRows(const std::wstring& list) const;
    void SelectRow(const std::wstring& list, int row) const;
    void SelectEveryRow(const std::wstring& list) const;
    void UnselectRow(const std::wstring& list, int row) const;
    /// Moves the focus to a row without selecting it, as Ctrl and an arrow key do.
    void FocusRow(const std::wstring& list, int row) const;
    void ClickHeading(const std::wstring& list, int column) const;
    /// Opens the context menu of a control by keyboard and chooses an item; the first is 1.
    void ChooseFromMenu(const std::wstring& name, int item) const;
    void ClickCheckBox(const std::wstring& list, int row) const;
    void DoubleClickRow(const std::wstring& list, int row) const;
    /// Moves the mouse over a cell.
    void PointAt(const std::wstring& list, int row, int column) const;
    /// The text of the tool tip that is shown; empty when none appears within a second or two.
    std::wstring ToolTip() const;

private:
    HWND FocusWindow() const;
    void SetRowState(const std::wstring& list, int row, UINT states, bool set) const;
    void Post(HWND control, UINT message, WPARAM wParam, LPARAM lParam) const;
    void ClickAt(HWND control, LONG x, LONG y) const;

    HWND m_window;
    void (*m_settle)(HWND);
};
