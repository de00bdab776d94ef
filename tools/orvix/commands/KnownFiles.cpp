#include "KnownFiles.h"

#include "ExceptionBarrier.h"
#include "FilePath.h"
#include "ToolError.h"

#include <algorithm>
#include <cwchar>
#include <string_view>

namespace
{

constexpr std::size_t LongestPath = 32760; // characters, less than Windows takes
constexpr std::size_t MostFiles = 1'000'000;

/// Whether a path may have this character. Windows takes the controls from 0x7F to 0x9F, which terminals obey.
bool IsOfPath(wchar_t c)
{
    constexpr std::wstring_view Special = L"<>:\"/|?*";
    const bool isControl = c < L' ' || (c >= 0x7F && c < 0xA0);
    return !isControl && Special.find(c) == std::wstring_view::npos;
}

} // namespace

void KnownFiles::Take(void* self, const wchar_t* path)
{
    KnownFiles& files = *static_cast<KnownFiles*>(self);
    if (!Completes([&] { files.Add(path); }))
    {
        files.m_isComplete = false;
    }
}

void KnownFiles::Add(const wchar_t* path)
{
    if (path == nullptr || wcsnlen(path, LongestPath + 1) > LongestPath)
    {
        return;
    }
    const std::wstring_view named(path);
    const std::wstring below = PathBelow(m_folder, path);
    const std::wstring full = m_prefix + below;
    if (below.empty() || below.size() == named.size() || !std::all_of(below.begin(), below.end(), IsOfPath) ||
        FullPath(full) != full)
    {
        return;
    }
    if (m_paths.size() == MostFiles)
    {
        m_isComplete = false;
        return;
    }
    m_paths.emplace(PathKey(full), full);
}

const std::map<std::wstring, std::wstring>& KnownFiles::Paths() const
{
    if (!m_isComplete)
    {
        throw ToolError(ExitCode::Failed,
                        L"the provider names too many files in " + m_folder + L"; name a folder below it");
    }
    return m_paths;
}
