// The headers of library files, read by the tool.

#include "Files.h"
#include "LibraryImage.h"
#include "TempFolder.h"

#include <windows.h>

#include <gmock/gmock.h>

#include <algorithm>
#include <cstring>

namespace
{

using testing::Contains;

class LibraryImageTest : public testing::Test
{
protected:
    /// What is read from a file of these bytes.
    std::optional<LibraryImage> Read(const std::string& bytes)
    {
        const std::filesystem::path file = m_folder.Path() / L"library.dll";
        WriteBytes(file, bytes);
        return LibraryImage::Read(file.wstring());
    }

    /// A library that needs another one.
    const std::string m_good = ReadBytes(std::filesystem::path(ORVIX_RECORDING_MSSCCI) / L"recording_dependent.dll");

private:
    TempFolder m_folder;
};

} // namespace

TEST_F(LibraryImageTest, NamesWhatALibraryNeeds)
{
    const std::optional<LibraryImage> image = Read(m_good);
    ASSERT_TRUE(image);
    EXPECT_TRUE(image->IsFor64Bit());
    EXPECT_THAT(image->imports, Contains("scc_dependency.dll"));
    EXPECT_THAT(image->imports, Contains("KERNEL32.dll"));
}

TEST_F(LibraryImageTest, IsNoneOfAFileThatIsMissingOrNoLibrary)
{
    EXPECT_FALSE(LibraryImage::Read(L"C:\\gone.dll"));
    EXPECT_FALSE(Read(""));
    EXPECT_FALSE(Read("MZ"));
    EXPECT_FALSE(Read(std::string(1000, 'M')));
}

TEST_F(LibraryImageTest, OfACutFileIsWhatIsThere)
{
    for (std::size_t size = 0; size < 1024; size += 8)
    {
        const std::optional<LibraryImage> image = Read(m_good.substr(0, size));
        EXPECT_TRUE(!image || image->imports.empty()) << size;
    }
}

TEST_F(LibraryImageTest, BelievesNoFieldOfAHeader)
{
    IMAGE_DOS_HEADER start = {};
    ASSERT_GT(m_good.size(), 4096u);
    std::memcpy(&start, m_good.data(), sizeof start);
    const auto headers = static_cast<std::size_t>(start.e_lfanew);
    const std::string beginning =
        m_good.substr(0, m_good.find("scc_dependency.dll") + 4096); // the rest is not looked at
    for (std::size_t offset = 0; offset < 0x300; offset += 4)
    {
        for (const char* field : {"\xFF\xFF\xFF\x7F", "\xFF\xFF\xFF\xFF", "\xF0\xFF\x00\x00"})
        {
            std::string bad = beginning;
            bad.replace(offset == 0 ? 0x3C : headers + offset, 4, field, 4);
            if (const std::optional<LibraryImage> image = Read(bad))
            {
                EXPECT_LE(image->imports.size(), 1000u) << offset;
                for (const std::string& name : image->imports)
                {
                    EXPECT_LE(name.size(), 260u) << offset;
                }
            }
        }
    }
}

TEST_F(LibraryImageTest, EndsAnImportTableThatHasNoEnd)
{
    IMAGE_DOS_HEADER start = {};
    std::memcpy(&start, m_good.data(), sizeof start);
    const auto headers = static_cast<std::size_t>(start.e_lfanew);
    // All of the code section's content counts as the table.
    std::string bad = m_good;
    IMAGE_NT_HEADERS64 nt = {};
    IMAGE_SECTION_HEADER section = {};
    std::memcpy(&nt, bad.data() + headers, sizeof nt);
    std::memcpy(&section, bad.data() + headers + sizeof nt, sizeof section);
    nt.OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_IMPORT].VirtualAddress = section.VirtualAddress;
    std::memcpy(bad.data() + headers, &nt, sizeof nt);
    std::fill_n(bad.begin() + section.PointerToRawData, section.SizeOfRawData, '\x01');
    ASSERT_GT(section.SizeOfRawData / sizeof(IMAGE_IMPORT_DESCRIPTOR), 1000u);
    const std::optional<LibraryImage> image = Read(bad);
    ASSERT_TRUE(image);
    EXPECT_EQ(image->imports.size(), 1000u);
}
