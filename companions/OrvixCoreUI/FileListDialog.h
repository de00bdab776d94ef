#pragma once

#include "Dialog.h"
#include "FileImages.h"
#include "OrvixDialogOption.h"
#include "TableView.h"
#include "resource.h"

#include <string>
#include <vector>

class OrvixFileEntry;
class OrvixFileListDialogParams;

/// Shows the active entries of a file list and lets the user confirm them. The result is an `OrvixDialogResult`.
class FileListDialog final : public Dialog
{
public:
    /// `params` has a file list; both outlive the dialog.
    FileListDialog(IOrvixCoreUIClientAccess* access, OrvixFileListDialogParams& params);

private:
    std::span<const Layout::Rule> Rules() const override;
    void OnInit() override;
    int FirstFocus() const override { return IDC_LIST; }

    /// Ctrl+F goes to the filter, and Ctrl+Enter confirms.
    bool OnKey(WPARAM key) override;
    void OnCommand(int control, int notification) override;
    LRESULT OnNotify(const NMHDR& notification) override;
    bool OnContextMenu(HWND control, POINT point) override;
    void OnMouseMove(int control) override;
    void OnSize() override { m_files.FitColumns(); }
    void OnClose() override { m_files.Close(); }

    void FillList();
    void ShowCount() const;

    /// What OK does, and on how many files.
    std::wstring Action() const;

    /// Whether the operation has a comment. An operation that is not named has.
    bool TakesComment() const;
    void HideComment() const;
    RECT PlaceOf(int control) const;

    /// Shows the system's properties of a file.
    void ShowProperties(std::size_t row) const;
    void ShowRecentComments();
    void TakeRecentComment() const;
    void InitBox(int control, bool offered, std::uint32_t checkedBit) const;
    void StoreBox(int control, bool offered, std::uint32_t checkedBit) const;
    void StoreOptions() const;
    void StoreChoice() const;
    void StoreComment() const;
    /// Whether the record has one of these bits of `OrvixDialogOption`.
    bool Has(std::uint32_t options) const;
    bool EntriesCanBeCleared() const { return Has(OrvixDialogOption::EntriesCanBeCleared); }
    bool OffersOption() const
    {
        return Has(OrvixDialogOption::OfferKeepCheckedOut | OrvixDialogOption::OfferGetLatest);
    }

    OrvixFileListDialogParams& m_params;
    std::vector<OrvixFileEntry*> m_entries;
    std::vector<std::wstring> m_recentComments;
    FileImages m_images;
    TableView m_files;
};
