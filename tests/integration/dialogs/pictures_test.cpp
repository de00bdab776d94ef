#include "DialogsTest.h"
#include "Files.h"
#include "Picture.h"

#include <array>

namespace
{

/// The pictures of the guides: what is shown in them comes from here, and they are made by every run.
class DialogPictures : public DialogsTest
{
protected:
    /// Lets the user save a picture and leave.
    static std::function<void(const DialogWindow&)> TakePicture(const wchar_t* name)
    {
        return [name](const DialogWindow& dialog) {
            const auto file = std::filesystem::path(ORVIX_PICTURES) / name;
            std::filesystem::remove(file);
            RedrawWindow(dialog.Handle(), nullptr, nullptr, RDW_UPDATENOW | RDW_ALLCHILDREN);
            SavePicture(dialog.Handle(), file);
            EXPECT_EQ(ReadBytes(file).substr(1, 3), "PNG");
            dialog.Press(VK_ESCAPE);
        };
    }
};

TEST_F(DialogPictures, OfThePrompt)
{
    ShowPrompt(0x100 | 0x2 | 0x4, TakePicture(L"prompt.png"), NoPrompt, nullptr,
               L"The file bridge.model is checked in. Check it out before you change it?");
}

TEST_F(DialogPictures, OfTheFileList)
{
    m_params.SetTitle(L"Sesame");
    m_params.SetMessage(L"These files will be checked in. Untick those that are to stay as they are.");
    m_params.SetComment(L"The bridge stands on four pillars.");
    AddFile(L"C:\\town\\models\\bridge.model", 0x2 | 0x4 | 0x80);
    AddFile(L"C:\\town\\models\\church.model", 0x2 | 0x4);
    AddFile(L"C:\\town\\models\\drafts\\tower.model", 0x2 | 0x4 | 0x8 | 0x80, false);
    AddFile(L"C:\\town\\textures\\brick.tex", 0x1);
    AddFile(L"C:\\town\\textures\\slate.tex", 0x2 | 0x4 | 0x10);
    ShowFileList(0x1 | 0x4 | 0x40, TakePicture(L"file-list.png"));
}

TEST_F(DialogPictures, OfThePromptEditor)
{
    m_services->RegisterPrompt(1, L"Check files out before they are changed?", 0x2, 0x106, true);
    m_services->RegisterPrompt(2, L"Add new files to source control?", 0x1, 0x106, true);
    m_services->RegisterPrompt(3, L"Overwrite files that were changed by hand?", 0x10, 0x106, true);
    ShowEditor([](const DialogWindow& dialog) {
        dialog.SelectRow(L"Prompts:", 0);
        TakePicture(L"prompt-editor.png")(dialog);
    });
}

} // namespace
