#include "IsolationSettings.h"

#include <windows.h>

#include <fstream>

namespace
{

constexpr wchar_t Section[] = L"Isolation";
constexpr wchar_t NameKey[] = L"Name";
constexpr wchar_t LibraryKey[] = L"Library";
constexpr wchar_t BitsKey[] = L"Bits";
constexpr wchar_t PatienceKey[] = L"SecondsWithoutAnswer";

constexpr UINT LongestPatience = 24 * 60 * 60; // seconds

std::wstring ReadText(const std::filesystem::path& file, const wchar_t* key)
{
    std::wstring text(32768, L'\0');
    text.resize(
        GetPrivateProfileStringW(Section, key, L"", text.data(), static_cast<DWORD>(text.size()), file.c_str()));
    return text;
}

} // namespace

IsolationSettings IsolationSettings::Read(const std::filesystem::path& folder)
{
    const std::filesystem::path file = folder / FileName;
    IsolationSettings settings;
    settings.name = ReadText(file, NameKey);
    settings.library = std::filesystem::path(ReadText(file, LibraryKey)).make_preferred();
    settings.bits = GetPrivateProfileIntW(Section, BitsKey, settings.bits, file.c_str()) == 32 ? 32 : 64;
    settings.program = folder / (settings.bits == 32 ? L"scc_host32.exe" : L"scc_host64.exe");
    const UINT patience = GetPrivateProfileIntW(Section, PatienceKey, 0, file.c_str());
    if (patience >= 1 && patience <= LongestPatience)
    {
        settings.patience = std::chrono::seconds(patience);
    }
    if (settings.name.empty())
    {
        settings.name = settings.library.stem();
    }
    return settings;
}

bool IsolationSettings::Write(const std::filesystem::path& folder) const
{
    // In UTF-16, so that every path can be named.
    const std::wstring text = std::wstring(L"\xFEFF[") + Section + L"]\r\n" + NameKey + L'=' + name + L"\r\n" +
                              LibraryKey + L'=' + library.wstring() + L"\r\n" + BitsKey + L'=' + std::to_wstring(bits) +
                              L"\r\n" + PatienceKey + L'=' + std::to_wstring(patience.count()) + L"\r\n";
    std::ofstream file(folder / FileName, std::ios::binary | std::ios::trunc);
    file.write(reinterpret_cast<const char*>(text.data()), static_cast<std::streamsize>(text.size() * sizeof(wchar_t)));
    file.close();
    return !file.fail();
}
