#include "Picture.h"

#include "Files.h"

#include <algorithm>
#include <cstdlib>
#include <stdexcept>
#include <utility>

#include <objidl.h>
#include <propidl.h>

// The headers of GDI+ use min and max without a namespace.
namespace Gdiplus
{

using std::max; // NOLINT(misc-unused-using-decls)
using std::min; // NOLINT(misc-unused-using-decls)

} // namespace Gdiplus
#include <gdiplus.h>

namespace
{

/// Starts GDI+ and shuts it down at the end.
class Session
{
public:
    Session()
    {
        const Gdiplus::GdiplusStartupInput input;
        if (Gdiplus::GdiplusStartup(&m_token, &input, nullptr) != Gdiplus::Ok)
        {
            throw std::runtime_error("GDI+ does not start");
        }
    }
    Session(const Session&) = delete;
    Session& operator=(const Session&) = delete;
    ~Session() { Gdiplus::GdiplusShutdown(m_token); }

private:
    ULONG_PTR m_token = 0;
};

constexpr CLSID PngEncoder = {0x557CF406, 0x1A04, 0x11D3, {0x9A, 0x73, 0x00, 0x00, 0xF8, 0x1E, 0xF3, 0x2E}};

} // namespace

void SavePicture(HWND window, const std::filesystem::path& file)
{
    const Session session;
    RECT place{};
    GetWindowRect(window, &place);
    const int width = place.right - place.left;
    const int height = place.bottom - place.top;
    Gdiplus::Bitmap picture(width, height, PixelFormat24bppRGB);
    Gdiplus::Graphics canvas(&picture);
    const HDC target = canvas.GetHDC();
    const HDC screen = GetDC(nullptr);
    const BOOL copied = BitBlt(target, 0, 0, width, height, screen, place.left, place.top, SRCCOPY);
    ReleaseDC(nullptr, screen);
    canvas.ReleaseHDC(target);
    if (!copied || picture.Save(file.c_str(), &PngEncoder, nullptr) != Gdiplus::Ok)
    {
        throw std::runtime_error("the picture cannot be saved");
    }
}

std::string TakePicture(HWND window, const wchar_t* name, const std::filesystem::path& folder)
{
    const wchar_t* kept = _wgetenv(L"ORVIX_PICTURES");
    const auto file = (kept == nullptr ? folder : std::filesystem::path(kept)) / name;
    SendMessageW(window, WM_NCACTIVATE, TRUE, 0); // the first window of a process may look inactive
    // The screen shows what is drawn some time later: when two pictures are equal, it is complete.
    std::string picture;
    std::string previous;
    do
    {
        previous = std::exchange(picture, {});
        std::filesystem::remove(file);
        Sleep(200);
        SavePicture(window, file);
        picture = ReadBytes(file);
    } while (picture != previous);
    return picture;
}
