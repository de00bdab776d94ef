#pragma once

#include "Dialog.h"
#include "TableView.h"

#include <string>
#include <vector>

class OrvixFileEntry;
class OrvixFileListDialogParams;

/// Shows the active entries of a file list and lets the user confirm them: 1 confirmed, 0 cancelled.
class FileListDialog final : public Dialog
{
public:
    /// Bits of the record's options.
    static constexpr std::uint32_t OfferTicks = 0x1;
    static constexpr std::uint32_t OptionKeepsCheckedOut = 0x4;
    static constexpr std::uint32_t OptionGetsLatest = 0x8;
    static constexpr std::uint32_t OptionTicked = 0x10;
    static constexpr std::uint32_t OfferRemember = 0x40;
    static constexpr std::uint32_t RememberTicked = 0x80;

    /// `params` has a file list; both outlive the dialog.
    FileListDialog(IOrvixCoreUIClientAccess* access, OrvixFileListDialogParams& params);

private:
    std::span<const Layout::Rule> Rules() const override;
    void OnInit() override;
    void OnCommand(int control, int notification) override;
    LRESULT OnNotify(const NMHDR& notification) override;
    bool OnContextMenu(HWND control, POINT point) override;
    void OnSize() override { m_files.FitColumns(); }

    void FillList();
    void ShowCount() const;
    void ShowRecentComments();
    void TakeRecentComment() const;
    void InitBox(int control, bool offered, std::uint32_t tickedBit) const;
    void StoreBox(int control, bool offered, std::uint32_t tickedBit) const;
    void StoreOptions() const;
    void StoreChoice() const;
    bool Has(std::uint32_t options) const;
    bool OffersOption() const { return Has(OptionKeepsCheckedOut | OptionGetsLatest); }

    OrvixFileListDialogParams& m_params;
    std::vector<OrvixFileEntry*> m_entries;
    std::vector<std::wstring> m_recentComments;
    TableView m_files;
};
