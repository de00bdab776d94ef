#include "DialogsTest.h"
#include "OrvixDialogOption.h"
#include "OrvixOperation.h"
#include "OrvixPrompt.h"
#include "Picture.h"
#include "TempFolder.h"

#include <string>

namespace
{

constexpr std::uint32_t AllAnswers = OrvixPromptOption::OfferYesToAll | OrvixPromptOption::OfferNoToAll;

/// Makes the pictures of the guides in every run and defines what they show. They are kept in the folder that
/// ORVIX_PICTURES in the environment names.
class DialogPictures : public DialogsTest
{
protected:
    /// The user saves a picture and closes the dialog.
    Handler TakePicture(const wchar_t* name) const
    {
        return [this, name](const DialogWindow& dialog) {
            const std::string picture = ::TakePicture(dialog.Handle(), name, m_pictures.Path());
            EXPECT_EQ(picture.substr(1, 3), "PNG");
            dialog.Press(VK_ESCAPE);
        };
    }

private:
    TempFolder m_pictures;
};

TEST_F(DialogPictures, OfThePrompt)
{
    ShowPrompt(AllAnswers | OrvixPromptOption::OfferStopAsking, TakePicture(L"prompt.png"), OrvixPromptID::None,
               nullptr, L"The file bridge.model is checked in. Check it out before you change it?");
}

TEST_F(DialogPictures, OfTheFileList)
{
    namespace State = OrvixFileState;
    m_params.SetMessage(L"These files will be checked in. Clear those that stay as they are.");
    m_params.SetComment(L"The bridge stands on four pillars.");
    AddFile(L"C:\\town\\models\\bridge.model", State::Controlled | State::CheckedOut | State::Modified);
    AddFile(L"C:\\town\\models\\church.model", State::Controlled | State::CheckedOut);
    AddFile(L"C:\\town\\models\\drafts\\tower.model", State::Controlled | State::CheckedOutByOther, false);
    AddFile(L"C:\\town\\textures\\brick.tex", State::NotControlled);
    AddFile(L"C:\\town\\textures\\slate.tex", State::Controlled | State::CheckedOut | State::OutOfDate);
    ShowFileList(OrvixDialogOption::EntriesCanBeCleared | OrvixDialogOption::OfferKeepCheckedOut |
                     OrvixDialogOption::OfferRemember | OrvixDialogOption::ForOperation(OrvixOperation::CheckIn),
                 TakePicture(L"file-list.png"));
    m_host.colors = {{COLOR_BTNFACE, RGB(32, 32, 32)},    {COLOR_BTNTEXT, RGB(235, 235, 235)},
                     {COLOR_WINDOW, RGB(24, 24, 24)},     {COLOR_WINDOWTEXT, RGB(235, 235, 235)},
                     {COLOR_HIGHLIGHT, RGB(38, 79, 120)}, {COLOR_HIGHLIGHTTEXT, RGB(255, 255, 255)},
                     {COLOR_GRAYTEXT, RGB(130, 130, 130)}};
    m_params.SetMessage(L"The changes in these files will be discarded.");
    ShowFileList(OrvixDialogOption::EntriesCanBeCleared | OrvixDialogOption::ForOperation(OrvixOperation::UndoCheckOut),
                 TakePicture(L"file-list-dark.png"));
}

TEST_F(DialogPictures, OfThePromptEditor)
{
    m_services->RegisterPrompt(1, L"Check files out before they are changed?", OrvixPromptAction::Yes, AllAnswers,
                               true);
    m_services->RegisterPrompt(2, L"Add new files to source control?", OrvixPromptAction::Ask, AllAnswers, true);
    m_services->RegisterPrompt(3, L"Overwrite files that were changed by hand?", OrvixPromptAction::NoToAll, AllAnswers,
                               true);
    ShowEditor([this](const DialogWindow& dialog) {
        dialog.SelectRow(L"Prompts:", 0);
        TakePicture(L"prompt-editor.png")(dialog);
    });
}

} // namespace
