#include "FileListDialog.h"

#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "resource.h"

namespace
{

/// FlagsIn: the entry starts ticked.
constexpr unsigned long StartsTicked = 0x1;
/// FlagsOut: the user left the entry ticked.
constexpr unsigned long Ticked = 0x2;

} // namespace

FileListDialog::FileListDialog(IOrvixCoreUIClientAccess* access, OrvixFileListDialogParams& params)
    : Dialog(IDD_FILE_LIST, access), m_params(params)
{
    OrvixFileList& list = *params.GetOrvixFileList();
    for (unsigned int i = 0; i < list.NumActiveEntries(); ++i)
    {
        if (OrvixFileEntry* entry = list.GetActiveFileEntry(i))
            m_entries.push_back(entry);
    }
}

void FileListDialog::OnInit()
{
    SetTitle(m_params.GetTitle());
    SetText(IDC_MESSAGE, m_params.GetMessageW());
    SetText(IDC_COMMENT, m_params.GetComment());

    m_list = ListView(Item(IDC_FILES), Colors(), Has(OfferTicks));
    m_list.AddColumn(0, L"File", m_list.Width());
    for (int row = 0; OrvixFileEntry * entry : m_entries)
    {
        m_list.AddRow(row, entry->GetFile());
        m_list.SetTicked(row, (entry->GetFlagsIn() & StartsTicked) != 0);
        ++row;
    }

    SetText(IDC_OPTION, Has(OptionKeepsCheckedOut) ? L"&Keep checked out" : L"&Get the latest version");
    InitBox(IDC_OPTION, OffersOption(), OptionTicked);
    InitBox(IDC_REMEMBER, Has(OfferRemember), RememberTicked);
}

void FileListDialog::OnCommand(int control, int)
{
    if (control == IDOK)
    {
        StoreOptions();
        StoreChoice();
        End(1);
    }
    else if (control == IDCANCEL)
    {
        StoreOptions();
        End(0);
    }
}

void FileListDialog::InitBox(int control, bool offered, std::uint32_t tickedBit) const
{
    if (offered)
        SetTicked(control, Has(tickedBit));
    else
        Hide(control);
}

void FileListDialog::StoreBox(int control, bool offered, std::uint32_t tickedBit) const
{
    if (!offered)
        return;
    const std::uint32_t options = m_params.GetOptions();
    m_params.SetOptions(IsTicked(control) ? options | tickedBit : options & ~tickedBit);
}

void FileListDialog::StoreOptions() const
{
    StoreBox(IDC_OPTION, OffersOption(), OptionTicked);
    StoreBox(IDC_REMEMBER, Has(OfferRemember), RememberTicked);
}

void FileListDialog::StoreChoice() const
{
    m_params.SetComment(GetText(IDC_COMMENT).c_str());
    const bool choice = Has(OfferTicks);
    for (int row = 0; OrvixFileEntry * entry : m_entries)
    {
        const bool ticked = !choice || m_list.IsTicked(row);
        const unsigned long flags = entry->GetFlagsOut();
        entry->SetFlagsOut(ticked ? flags | Ticked : flags & ~Ticked);
        ++row;
    }
}

bool FileListDialog::Has(std::uint32_t options) const
{
    return (m_params.GetOptions() & options) != 0;
}
