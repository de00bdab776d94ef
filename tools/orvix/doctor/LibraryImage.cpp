#include "LibraryImage.h"

#include "FilePath.h"
#include "IsolatedLoad.h"
#include "ModulePath.h"
#include "Text.h"

#include <windows.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <set>
#include <string_view>

namespace
{

constexpr std::size_t MaxName = 260;
constexpr std::size_t MaxImports = 1000;
constexpr DWORD MaxExports = 10000;

/// Reads parts of a program file.
class ImageReader
{
public:
    explicit ImageReader(const std::wstring& path) : m_stream(std::filesystem::path(path), std::ios::binary) {}

    template <typename Part>
    bool Read(std::uint64_t offset, Part& part)
    {
        m_stream.clear();
        m_stream.seekg(static_cast<std::streamoff>(offset));
        return static_cast<bool>(m_stream.read(reinterpret_cast<char*>(&part), sizeof part));
    }

    bool ReadSections(std::uint64_t offset, unsigned int count)
    {
        m_sections.resize(count);
        for (unsigned int i = 0; i < count; ++i)
        {
            if (!Read(offset + i * sizeof(IMAGE_SECTION_HEADER), m_sections[i]))
            {
                return false;
            }
        }
        return true;
    }

    /// The offset in the file of an address of the loaded image; empty when no section holds the address.
    std::optional<std::uint64_t> OffsetOf(DWORD address) const
    {
        for (const IMAGE_SECTION_HEADER& section : m_sections)
        {
            if (address >= section.VirtualAddress && address - section.VirtualAddress < section.SizeOfRawData)
            {
                return std::uint64_t{section.PointerToRawData} + (address - section.VirtualAddress);
            }
        }
        return std::nullopt;
    }

    std::string ReadName(DWORD address)
    {
        std::string name;
        const std::optional<std::uint64_t> offset = OffsetOf(address);
        char character = 0;
        while (offset && name.size() < MaxName && Read(*offset + name.size(), character) && character != '\0')
        {
            name += character;
        }
        return name;
    }

private:
    std::ifstream m_stream;
    std::vector<IMAGE_SECTION_HEADER> m_sections;
};

std::vector<std::string> ReadImports(ImageReader& reader, DWORD address)
{
    std::vector<std::string> names;
    const std::optional<std::uint64_t> table = reader.OffsetOf(address);
    IMAGE_IMPORT_DESCRIPTOR descriptor = {};
    while (table && names.size() < MaxImports && reader.Read(*table + names.size() * sizeof descriptor, descriptor) &&
           descriptor.Name != 0)
    {
        names.push_back(reader.ReadName(descriptor.Name));
    }
    return names;
}

bool HasExport(ImageReader& reader, DWORD address, std::string_view name)
{
    IMAGE_EXPORT_DIRECTORY directory = {};
    const std::optional<std::uint64_t> table = reader.OffsetOf(address);
    if (!table || !reader.Read(*table, directory))
    {
        return false;
    }
    const std::optional<std::uint64_t> names = reader.OffsetOf(directory.AddressOfNames);
    const DWORD count = std::min<DWORD>(directory.NumberOfNames, MaxExports);
    DWORD nameAddress = 0;
    for (DWORD i = 0; names && i < count && reader.Read(*names + i * sizeof nameAddress, nameAddress); ++i)
    {
        if (reader.ReadName(nameAddress) == name)
        {
            return true;
        }
    }
    return false;
}

bool IsInWindowsFolder(const std::wstring& path)
{
    std::wstring folder(MAX_PATH, L'\0');
    folder.resize(GetWindowsDirectoryW(folder.data(), static_cast<UINT>(folder.size())));
    return PathBelow(folder, path) != path;
}

/// Adds what is missing for the library of this path, and follows each library that is there. `seen` holds the keys of
/// the names examined so far.
void AddMissing(const std::wstring& path, const std::wstring& shownAs, const UniqueActivationContext& context,
                std::set<std::wstring>& seen, std::vector<LibraryImage::Missing>& missing)
{
    const std::optional<LibraryImage> image = LibraryImage::Read(path);
    if (!image)
    {
        return;
    }
    for (const std::string& import : image->imports)
    {
        const std::wstring name = Wide(import);
        if (name.empty() || !seen.insert(PathKey(name)).second)
        {
            continue;
        }
        const UniqueModule module = LoadLibraryIsolated(name.c_str(), context, DONT_RESOLVE_DLL_REFERENCES);
        if (!module)
        {
            missing.push_back({name, shownAs, GetLastError()});
        }
        else if (const std::wstring found = ModulePath(module.Get()); !IsInWindowsFolder(found))
        {
            AddMissing(found, name, context, seen, missing);
        }
    }
}

} // namespace

std::optional<LibraryImage> LibraryImage::Read(const std::wstring& path)
{
    ImageReader reader(path);
    IMAGE_DOS_HEADER start = {};
    if (!reader.Read(0, start) || start.e_magic != IMAGE_DOS_SIGNATURE || start.e_lfanew < 0)
    {
        return std::nullopt;
    }
    const auto offset = static_cast<std::uint64_t>(start.e_lfanew);
    struct
    {
        DWORD signature;
        IMAGE_FILE_HEADER file;
    } beginning = {}; // the same for every machine
    if (!reader.Read(offset, beginning) || beginning.signature != IMAGE_NT_SIGNATURE)
    {
        return std::nullopt;
    }
    IMAGE_NT_HEADERS64 headers = {};
    LibraryImage image;
    image.machine = beginning.file.Machine;
    if (image.IsFor64Bit() && reader.Read(offset, headers) &&
        headers.OptionalHeader.Magic == IMAGE_NT_OPTIONAL_HDR64_MAGIC &&
        headers.OptionalHeader.NumberOfRvaAndSizes > IMAGE_DIRECTORY_ENTRY_IMPORT &&
        reader.ReadSections(offset + offsetof(IMAGE_NT_HEADERS64, OptionalHeader) +
                                headers.FileHeader.SizeOfOptionalHeader,
                            headers.FileHeader.NumberOfSections))
    {
        image.imports =
            ReadImports(reader, headers.OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_IMPORT].VirtualAddress);
    }
    return image;
}

bool LibraryImage::Is32BitWith(const std::wstring& path, std::string_view name)
{
    ImageReader reader(path);
    IMAGE_DOS_HEADER start = {};
    IMAGE_NT_HEADERS32 headers = {};
    return reader.Read(0, start) && start.e_lfanew >= 0 &&
           reader.Read(static_cast<std::uint64_t>(start.e_lfanew), headers) &&
           headers.OptionalHeader.Magic == IMAGE_NT_OPTIONAL_HDR32_MAGIC &&
           headers.OptionalHeader.NumberOfRvaAndSizes > IMAGE_DIRECTORY_ENTRY_EXPORT &&
           reader.ReadSections(static_cast<std::uint64_t>(start.e_lfanew) +
                                   offsetof(IMAGE_NT_HEADERS32, OptionalHeader) +
                                   headers.FileHeader.SizeOfOptionalHeader,
                               headers.FileHeader.NumberOfSections) &&
           HasExport(reader, headers.OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_EXPORT].VirtualAddress, name);
}

bool LibraryImage::IsFor64Bit() const
{
    return machine == IMAGE_FILE_MACHINE_AMD64;
}

std::vector<LibraryImage::Missing> LibraryImage::FindMissing(const std::wstring& path,
                                                             const UniqueActivationContext& context)
{
    std::vector<Missing> missing;
    std::set<std::wstring> seen;
    AddMissing(path, std::filesystem::path(path).filename().wstring(), context, seen, missing);
    return missing;
}
