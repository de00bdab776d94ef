#pragma once

#include "Palette.h"

#include <windows.h>

#include <cstdint>
#include <string>

/// A modal dialog from a template of this library.
class Dialog
{
public:
    Dialog(const Dialog&) = delete;
    Dialog& operator=(const Dialog&) = delete;

    /// Shows the dialog until it is ended and returns its result. A dialog that cannot be shown, or fails
    /// while it is, is cancelled: 0.
    std::int32_t Run(HWND owner);

protected:
    Dialog(int templateId, IOrvixCoreUIClientAccess* access) : m_templateId(templateId), m_palette(access) {}
    ~Dialog() = default;

    /// Fills the controls.
    virtual void OnInit() = 0;

    /// A control, or a key that stands for one, was used.
    virtual void OnCommand(int control, int notification) = 0;

    /// The selection of a list changed.
    virtual void OnListSelection() {}

    void End(std::int32_t result) const { EndDialog(m_window, result); }

    const Palette& Colors() const { return m_palette; }
    HWND Item(int control) const { return GetDlgItem(m_window, control); }
    void SetTitle(const wchar_t* text) const { SetWindowTextW(m_window, text); }
    void SetText(int control, const wchar_t* text) const { SetDlgItemTextW(m_window, control, text); }
    std::wstring GetText(int control) const;
    void SetTicked(int control, bool ticked) const;
    bool IsTicked(int control) const { return IsDlgButtonChecked(m_window, control) == BST_CHECKED; }

    /// Takes a control, and its access key, out of the dialog.
    void Hide(int control) const;

private:
    static INT_PTR CALLBACK Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept;
    INT_PTR Handle(UINT message, WPARAM wParam, LPARAM lParam);

    int m_templateId;
    Palette m_palette;
    HWND m_window = nullptr;
};
