#include "DeskTest.h"
#include "Files.h"
#include "Picture.h"

#include <filesystem>

namespace
{

/// A folder with a short name, which the picture shows. It is deleted at the end.
class Town
{
public:
    Town()
    {
        Clear();
        std::filesystem::create_directories(m_models / L"drafts");
    }
    Town(const Town&) = delete;
    Town& operator=(const Town&) = delete;
    ~Town() { Clear(); }

    std::wstring Text() const { return m_folder.wstring(); }
    void Write(const wchar_t* name, const char* bytes) const { WriteBytes(m_models / name, bytes); }

private:
    void Clear() const
    {
        std::filesystem::create_directories(m_folder);
        for (const auto& item : std::filesystem::recursive_directory_iterator(m_folder))
        {
            SetReadOnly(item.path(), false);
        }
        std::filesystem::remove_all(m_folder);
    }

    std::filesystem::path m_folder = L"C:\\town";
    std::filesystem::path m_models = m_folder / L"models";
};

/// Makes the picture of the program in every run and defines what it shows. It is kept in the folder that
/// ORVIX_PICTURES in the environment names.
class DialogPictures : public DeskTest
{
};

TEST_F(DialogPictures, OfTheHostWithAWindow)
{
    const Town town;
    const TempFolder pictures;
    for (const wchar_t* name : {L"bridge.model", L"church.model", L"house.model", L"station.model", L"tower.model"})
    {
        town.Write(name, "stone");
    }
    m_arguments.project = town.Text();
    Run([&](const Desk& desk) {
        const DialogWindow& window = desk.Window();
        window.Focus(L"Folders");
        window.Press(VK_DOWN);
        desk.Command(ID_ADD, L"Add", [](const DialogWindow& dialog) {
            dialog.ClickCheckBox(L"Files:", 4);
            Confirm(dialog);
        });
        window.SelectRow(Desk::Files, 0);
        desk.Confirm(ID_CHECK_OUT, L"Check out");
        window.SelectRow(Desk::Files, 2);
        desk.Confirm(ID_CHECK_OUT, L"Check out");
        town.Write(L"bridge.model", "four pillars");
        desk.Command(ID_REFRESH);
        window.SelectRow(Desk::Files, 0);
        desk.Command(ID_HISTORY);
        window.UnselectRow(Desk::Files, 0); // a selected icon has another color
        EXPECT_EQ(desk.States(),
                  (Texts{L"Checked out, Modified", L"Checked in", L"Checked out", L"Checked in", L"Not controlled"}));
        EXPECT_EQ(TakePicture(window.Handle(), L"desk.png", pictures.Path()).substr(1, 3), "PNG");
        desk.Close();
        desk.Await(L"Desk").Click(L"Yes");
    });
}

} // namespace
