#pragma once

#include "Layout.h"
#include "Palette.h"

#include <windows.h>

#include <cstdint>
#include <optional>
#include <span>
#include <string>

/// A modal dialog from a template of this library. It can be resized, but not below the size of its template. When its
/// message (IDC_MESSAGE) needs more room than the template has, the dialog is higher. A message for which the monitor
/// is too small becomes a field that scrolls.
class Dialog
{
public:
    Dialog(const Dialog&) = delete;
    Dialog& operator=(const Dialog&) = delete;

    /// Shows the dialog until it is ended and returns its result; nothing when it cannot be shown or fails while it is
    /// open. `owner` may be null.
    std::optional<std::int32_t> Run(HWND owner);

protected:
    /// `name` is the name under which the size of the dialog is remembered; null when it is not. The name outlives the
    /// dialog, and so does `access`, which may be null.
    Dialog(int templateId, const wchar_t* name, IOrvixCoreUIClientAccess* access)
        : m_templateId(templateId), m_name(name), m_palette(access)
    {
    }
    ~Dialog() = default;

    /// How the controls follow the size of the dialog. Valid as long as the dialog.
    virtual std::span<const Layout::Rule> Rules() const = 0;

    /// Fills the controls.
    virtual void OnInit() = 0;

    /// The control that has the keyboard's focus first; 0 for the first one of the tab order.
    virtual int FirstFocus() const { return 0; }

    /// A key was pressed while a control of the dialog had the focus, before the control sees it. Returns whether the
    /// dialog has used the key.
    virtual bool OnKey(WPARAM) { return false; }

    /// A control was used, or the key that does the same.
    virtual void OnCommand(int control, int notification) = 0;

    /// A control sends a notification; the result is returned to the control.
    virtual LRESULT OnNotify(const NMHDR&) { return 0; }

    /// The user asks for the context menu of a control, at a point of the screen; by keyboard the point is (-1, -1).
    /// Returns whether the control has a menu.
    virtual bool OnContextMenu(HWND, POINT) { return false; }

    /// The mouse has moved over a control.
    virtual void OnMouseMove(int) {}

    /// The dialog has a new size, and the controls have followed it.
    virtual void OnSize() {}

    /// The dialog is about to be destroyed.
    virtual void OnClose() {}

    /// Closes the dialog; `Run` returns `result`.
    void End(std::int32_t result);

    /// The name under which settings of this dialog are remembered; null when they are not.
    const wchar_t* SettingsName() const { return m_name; }

    const Palette& Colors() const { return m_palette; }
    HWND Window() const { return m_window; }
    HWND Item(int control) const { return GetDlgItem(m_window, control); }
    void SetTitle(const wchar_t* text) const { SetWindowTextW(m_window, text); }
    void SetText(int control, const wchar_t* text) const { SetDlgItemTextW(m_window, control, text); }
    std::wstring GetText(int control) const;
    void SetChecked(int control, bool checked) const;
    bool IsChecked(int control) const { return IsDlgButtonChecked(m_window, control) == BST_CHECKED; }

    /// Moves the keyboard's focus to a control.
    void Focus(int control) const { SendMessageW(m_window, WM_NEXTDLGCTL, reinterpret_cast<WPARAM>(Item(control)), 1); }

    /// Enables or disables a control.
    void Enable(int control, bool enabled) const { EnableWindow(Item(control), enabled ? TRUE : FALSE); }

    /// Hides a control and disables it, so that its access key has no effect.
    void Hide(int control) const;

private:
    static INT_PTR CALLBACK Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept;
    INT_PTR Handle(UINT message, WPARAM wParam, LPARAM lParam);

    static LRESULT CALLBACK ControlProcedure(HWND control, UINT message, WPARAM wParam, LPARAM lParam, UINT_PTR id,
                                             DWORD_PTR dialog) noexcept;

    void OnOpen();
    LRESULT HandleNotification(const NMHDR& notification);
    void WatchControls();

    /// Removes the theme where it would draw in the system's colours instead of the host's.
    void ColorControls() const;

    /// By how many pixels the message needs more room than it has; `most` is how many it gets.
    struct Room
    {
        LONG needed;
        LONG most;
    };
    Room RoomForMessage() const;

    /// Replaces the label of the message by a field that scrolls, and names the field for screen readers.
    void MakeMessageScroll() const;
    RECT WorkArea() const;

    /// Gives the dialog a size in pixels and keeps its centre, as far as the monitor allows.
    void Resize(LONG width, LONG height) const;
    void RememberSize() const;

    int m_templateId;
    const wchar_t* m_name;
    Palette m_palette;
    Layout m_layout;
    LONG m_roomForMessage = 0; // how much higher the window is for its message, at 96 dots per inch
    bool m_usedKey = false;    // its character is still to come
    HWND m_window = nullptr;
    std::optional<std::int32_t> m_result;
};
