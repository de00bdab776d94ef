#include "DialogsTest.h"

#include "Display.h"
#include "Files.h"
#include "OrvixClientInfo.h"
#include "OrvixDialogOption.h"

DialogsTest::DialogsTest()
{
    Restart();
    m_params.SetTitle(Title);
    m_params.SetMessage(L"These files are opened.");
    m_params.SetOrvixFileList(&m_list);
}

void DialogsTest::SetUp()
{
    if (!HasDisplay())
    {
        GTEST_SKIP() << "no display to show dialogs on";
    }
}

void DialogsTest::Restart()
{
    m_services.reset(); // saves the answers before the next one reads them
    m_services = MakeOrvixServices();
    OrvixClientInfo info;
    info.SetConfigFilePath(m_config.Text().c_str());
    info.SetIOrvixClientAccess(&m_host);
    m_services->Initialize(&info, 0);
}

std::int32_t DialogsTest::ShowPrompt(std::uint32_t options, const Handler& handle, std::uint32_t promptID,
                                     bool* dontAskAgain, const std::wstring& message)
{
    const User user(Title, handle);
    return m_services->ShowPrompt(nullptr, const_cast<wchar_t*>(Title), const_cast<wchar_t*>(message.c_str()), options,
                                  promptID, dontAskAgain);
}

OrvixFileEntry& DialogsTest::AddFile(const wchar_t* path, unsigned long flagsOut, bool checked)
{
    OrvixFileEntry* entry = m_list.CreateEntry(path, nullptr, checked ? OrvixFileSelection::Selected : 0, 0);
    entry->SetFlagsOut(flagsOut);
    m_list.AddActiveEntry(entry);
    return *entry;
}

std::int32_t DialogsTest::ShowFileList(std::uint32_t options, const Handler& handle)
{
    m_params.SetOptions(options);
    const User user(Title, handle);
    return m_services->ShowFileListDialog(nullptr, &m_params);
}

std::int32_t DialogsTest::ShowFileList(const Handler& handle)
{
    return ShowFileList(OrvixDialogOption::EntriesCanBeCleared, handle);
}

std::int32_t DialogsTest::ShowEditor(const Handler& handle)
{
    const User user(L"Stored answers", handle);
    return m_services->EditPrompts(nullptr, nullptr);
}

std::string DialogsTest::PromptFile() const
{
    return ReadBytes(m_config.Path() / L"OrvixPrompts.xml");
}
