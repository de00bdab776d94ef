#include "OperationTest.h"

namespace
{

std::string OptionNames(std::uint32_t options)
{
    return BitNames(options, {{DialogOption::EntriesCanBeCleared, "EntriesCanBeCleared"},
                              {DialogOption::OfferKeepCheckedOut, "OfferKeepCheckedOut"},
                              {DialogOption::OfferGetLatest, "OfferGetLatest"},
                              {DialogOption::OptionChecked, "OptionChecked"},
                              {DialogOption::OfferRemember, "OfferRemember"},
                              {DialogOption::RememberChecked, "RememberChecked"}});
}

} // namespace

OperationTest::OperationTest()
{
    m_params.SetOrvixFileList(&m_list);
    m_params.SetComment(L"comment");
    m_script.onFileList = [this](const CoreUIScript::FileList& call) {
        OrvixFileListDialogParams& params = *call.params;
        OrvixFileList& list = *params.GetOrvixFileList();
        m_log.push_back("Dialog " + ActiveNames(&list) + OptionNames(params.GetOptions()));
        for (unsigned int i = 0; i < list.NumActiveEntries(); ++i)
        {
            OrvixFileEntry* entry = list.GetActiveFileEntry(i);
            if (entry == nullptr)
            {
                continue;
            }
            const bool checked = !m_cleared.contains(Narrow(entry->GetFile()));
            entry->SetFlagsOut(checked ? entry->GetFlagsOut() | OrvixFileSelection::Confirmed
                                       : entry->GetFlagsOut() & ~OrvixFileSelection::Confirmed);
        }
        if (m_onDialog)
        {
            m_onDialog(params);
        }
        return m_dialogResult;
    };
}

OrvixFileEntry& OperationTest::AddFile(const wchar_t* name, unsigned long flagsOut)
{
    OrvixFileEntry* entry = m_list.CreateEntry(name, nullptr, 0, 0);
    entry->SetFlagsOut(flagsOut);
    m_list.AddActiveEntry(entry);
    return *entry;
}

void OperationTest::UsePrompts()
{
    m_params.SetDialogPromptID(DialogPrompt);
    m_params.SetOptionPromptID(OptionPrompt);
}

std::int32_t OperationTest::Run(std::uint32_t operations, std::uint32_t flagsOutMask)
{
    return m_services->RunFileListOperation(nullptr, &m_params, false, &m_provider, operations, flagsOutMask);
}
