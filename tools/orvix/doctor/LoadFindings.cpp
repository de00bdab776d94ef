#include "LoadFindings.h"

#include "FilePath.h"
#include "IsolatedLoad.h"
#include "LibraryImage.h"
#include "ModulePath.h"
#include "Text.h"

namespace
{

std::wstring MachineName(std::uint16_t machine)
{
    switch (machine)
    {
    case IMAGE_FILE_MACHINE_I386:
        return L"a 32-bit file (x86)";
    case IMAGE_FILE_MACHINE_ARMNT:
        return L"a 32-bit file (ARM)";
    case IMAGE_FILE_MACHINE_ARM64:
        return L"a file for ARM64";
    default:
        return L"a file for machine " + std::to_wstring(machine);
    }
}

} // namespace

void LoadFindings::AddHeaders(DoctorReport::Subject& subject, const std::wstring& path)
{
    const std::optional<LibraryImage> image = LibraryImage::Read(path);
    if (IsFolder(path))
    {
        subject.AddNote("not-a-library", L"it is a folder");
    }
    else if (!image)
    {
        subject.AddNote("not-a-library", L"it is not a Windows library, or it cannot be read");
    }
    else if (!image->IsFor64Bit())
    {
        subject.AddNote("other-machine",
                        L"it is " + MachineName(image->machine) + L", which a 64-bit (x64) process cannot load");
    }
}

void LoadFindings::AddLoadError(DoctorReport::Subject& subject, const std::wstring& path,
                                const UniqueActivationContext& context, unsigned long error)
{
    subject.AddProblem("does-not-load", L"it does not load: " + SystemMessage(error, path));
    for (const LibraryImage::Missing& missing : LibraryImage::FindMissing(path, context))
    {
        subject.AddNote("missing-dependency", missing.neededBy + L" needs " + missing.name +
                                                  L", which does not load: " +
                                                  SystemMessage(missing.error, missing.name));
    }
}

void LoadFindings::AddCurrentFolder(DoctorReport::Subject& subject, const std::wstring& path,
                                    const UniqueActivationContext& context)
{
    const auto folderOf = [](const std::wstring& file) { return PathKey(file.substr(0, file.find_last_of(L'\\'))); };
    const std::wstring current = PathKey(FullPath(L"."));
    const std::optional<LibraryImage> image = LibraryImage::Read(path);
    if (!image || current == folderOf(path) || current == folderOf(ModulePath(nullptr)))
    {
        return;
    }
    for (const std::string& import : image->imports)
    {
        const UniqueModule module = LoadLibraryIsolated(Wide(import).c_str(), context, DONT_RESOLVE_DLL_REFERENCES);
        if (module && folderOf(ModulePath(module.Get())) == current)
        {
            subject.AddProblem("current-folder", L"it needs " + Wide(import) +
                                                     L", which is found only in the current "
                                                     L"folder of this process: " +
                                                     FullPath(L"."));
        }
    }
}
