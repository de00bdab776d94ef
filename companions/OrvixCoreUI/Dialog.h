#pragma once

#include "Layout.h"
#include "Palette.h"

#include <windows.h>

#include <cstdint>
#include <optional>
#include <span>
#include <string>

/// A modal dialog from a template of this library, which can be resized and never gets smaller than its template. Where
/// it has a message (IDC_MESSAGE), it is as much higher as the message needs.
class Dialog
{
public:
    Dialog(const Dialog&) = delete;
    Dialog& operator=(const Dialog&) = delete;

    /// Shows the dialog until it is ended and returns its result; nothing when it cannot be shown or fails while it is
    /// open. `owner` may be null.
    std::optional<std::int32_t> Run(HWND owner);

protected:
    /// `name` is the one under which the user's size of the dialog is remembered; null: its size is not.
    Dialog(int templateId, const wchar_t* name, IOrvixCoreUIClientAccess* access)
        : m_templateId(templateId), m_name(name), m_palette(access)
    {
    }
    ~Dialog() = default;

    /// How the controls follow the dialog's size.
    virtual std::span<const Layout::Rule> Rules() const = 0;

    /// Fills the controls.
    virtual void OnInit() = 0;

    /// A control, or a key that stands for one, was used.
    virtual void OnCommand(int control, int notification) = 0;

    /// A control reports something; returns what the control is to get back.
    virtual LRESULT OnNotify(const NMHDR&) { return 0; }

    /// The user asks for a control's own menu, at a point of the screen or, by the keyboard, at (-1, -1); returns
    /// whether it has one.
    virtual bool OnContextMenu(HWND, POINT) { return false; }

    /// The controls have followed a new size.
    virtual void OnSize() {}

    /// Closes the dialog; `Run` returns `result`.
    void End(std::int32_t result);

    const Palette& Colors() const { return m_palette; }
    HWND Window() const { return m_window; }
    HWND Item(int control) const { return GetDlgItem(m_window, control); }
    void SetTitle(const wchar_t* text) const { SetWindowTextW(m_window, text); }
    void SetText(int control, const wchar_t* text) const { SetDlgItemTextW(m_window, control, text); }
    std::wstring GetText(int control) const;
    void SetChecked(int control, bool checked) const;
    bool IsChecked(int control) const { return IsDlgButtonChecked(m_window, control) == BST_CHECKED; }

    void Focus(int control) const { SendMessageW(m_window, WM_NEXTDLGCTL, reinterpret_cast<WPARAM>(Item(control)), 1); }

    /// Takes a control, and its access key, out of the dialog.
    void Hide(int control) const;

private:
    static INT_PTR CALLBACK Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept;
    INT_PTR Handle(UINT message, WPARAM wParam, LPARAM lParam);

    void OnOpen();
    void ColorCheckBoxes() const;

    /// Makes room for a message that needs more than the template has. Returns how much, in pixels.
    LONG ShowWholeMessage();
    RECT WorkArea() const;

    /// Gives the dialog a size in pixels, as far as the monitor allows, around the middle that it has.
    void Resize(LONG width, LONG height) const;
    void RememberSize() const;

    int m_templateId;
    const wchar_t* m_name;
    Palette m_palette;
    Layout m_layout;
    LONG m_roomForMessage = 0; // by which the window is higher, at 96 dots per inch
    HWND m_window = nullptr;
    std::optional<std::int32_t> m_result;
};
