#include "LoadFindings.h"

#include "FilePath.h"
#include "LibraryImage.h"
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
