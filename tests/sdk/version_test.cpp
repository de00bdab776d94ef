// The version in include/OrvixVersion.h is the one that everything else gives.

#include "BuiltFile.h"
#include "Files.h"
#include "OrvixTool.h"
#include "OrvixVersion.h"
#include "TempFolder.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <cstddef>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <vector>

namespace
{

const std::string Version = std::to_string(ORVIX_VERSION_MAJOR) + "." + std::to_string(ORVIX_VERSION_MINOR) + "." +
                            std::to_string(ORVIX_VERSION_PATCH);

/// The VERSIONINFO resource of a file.
class VersionInfo
{
public:
    explicit VersionInfo(const std::filesystem::path& file)
    {
        DWORD ignored = 0;
        m_data.resize(GetFileVersionInfoSizeW(file.c_str(), &ignored));
        if (m_data.empty() || !GetFileVersionInfoW(file.c_str(), 0, static_cast<DWORD>(m_data.size()), m_data.data()))
        {
            throw std::runtime_error("the file has no version resource");
        }
    }

    const VS_FIXEDFILEINFO& Fixed() const { return *static_cast<const VS_FIXEDFILEINFO*>(Query(L"\\")); }

    /// A text, in the first of the languages that the resource names.
    std::wstring Text(const std::wstring& name) const
    {
        const auto* translation = static_cast<const WORD*>(Query(L"\\VarFileInfo\\Translation"));
        wchar_t language[9] = {};
        swprintf_s(language, L"%04x%04x", translation[0], translation[1]);
        return static_cast<const wchar_t*>(Query(L"\\StringFileInfo\\" + std::wstring(language) + L"\\" + name));
    }

private:
    const void* Query(const std::wstring& path) const
    {
        void* value = nullptr;
        UINT size = 0;
        if (!VerQueryValueW(m_data.data(), path.c_str(), &value, &size) || size == 0)
        {
            throw std::runtime_error("the version resource has no " + std::filesystem::path(path).string());
        }
        return value;
    }

    std::vector<std::byte> m_data;
};

class VersionResource : public testing::TestWithParam<const wchar_t*>
{
};

} // namespace

TEST_P(VersionResource, NamesTheFileItsKindAndTheVersion)
{
    const std::filesystem::path file = BuiltFile(GetParam());
    const VersionInfo info(file);

    constexpr DWORD MostSignificant = ORVIX_VERSION_MAJOR << 16 | ORVIX_VERSION_MINOR;
    constexpr DWORD LeastSignificant = ORVIX_VERSION_PATCH << 16;
    EXPECT_EQ(info.Fixed().dwFileVersionMS, MostSignificant);
    EXPECT_EQ(info.Fixed().dwFileVersionLS, LeastSignificant);
    EXPECT_EQ(info.Fixed().dwProductVersionMS, MostSignificant);
    EXPECT_EQ(info.Fixed().dwProductVersionLS, LeastSignificant);
    EXPECT_EQ(info.Fixed().dwFileType, static_cast<DWORD>(file.extension() == L".exe" ? VFT_APP : VFT_DLL));

    const std::wstring version(Version.begin(), Version.end());
    EXPECT_EQ(info.Text(L"FileVersion"), version);
    EXPECT_EQ(info.Text(L"ProductVersion"), version);
    EXPECT_EQ(info.Text(L"ProductName"), L"OrvixCore");
    EXPECT_EQ(info.Text(L"OriginalFilename"), file.filename());
    EXPECT_EQ(info.Text(L"InternalName"), file.stem());
    EXPECT_NE(info.Text(L"FileDescription"), L"");
    EXPECT_NE(info.Text(L"CompanyName"), L"");
}

INSTANTIATE_TEST_SUITE_P(Files, VersionResource,
                         testing::Values(L"OrvixCore.dll", L"OrvixCoreUI.dll", L"braeutil.dll", L"orvix.exe",
                                         L"archive_msscci.dll", L"plugins/archive.dll", L"scc_proxy.dll",
                                         L"scc_host64.exe", L"scc_host32.exe"),
                         [](const auto& file) { return std::filesystem::path(file.param).stem().string(); });

TEST(Version, IsWhatTheToolPrints)
{
    const TempFolder scratch;
    EXPECT_EQ(OrvixTool::Run(BuiltFile(L"orvix.exe").wstring(), scratch.Path(), scratch.Path(), {L"--version"}).output,
              "orvix " + Version + "\n");
}

TEST(Version, HasTheNewestHeadingOfTheChangelog)
{
    const std::string changelog = ReadBytes(ORVIX_CHANGELOG);
    const std::size_t heading = changelog.find("\n## ");
    ASSERT_NE(heading, std::string::npos);
    EXPECT_EQ(changelog.substr(heading + 4, changelog.find_first_of(", \r\n", heading + 4) - heading - 4), Version);
}
