#include "FileImages.h"

#include "OrvixFileFlags.h"
#include "UniqueGdiObject.h"

#include <shellapi.h>

#include <algorithm>
#include <iterator>
#include <span>
#include <vector>

namespace
{

/// The side of a picture at 96 dots per inch, which is also the grid of the drawings.
constexpr int Side = 16;

constexpr int MostPictures = 64; // room in the list before it grows
constexpr COLORREF Transparent = RGB(255, 0, 255);

constexpr POINT Question[] = {{6, 6}, {6, 5}, {7, 4}, {9, 4}, {10, 5}, {10, 6}, {8, 8}, {8, 10}};
constexpr POINT Plus[] = {{8, 4}, {8, 12}, {8, 8}, {4, 8}, {12, 8}};
constexpr POINT Cross[] = {{5, 5}, {11, 11}, {8, 8}, {11, 5}, {5, 11}};
constexpr POINT Bar[] = {{4, 8}, {12, 8}};
constexpr POINT Arrow[] = {{8, 4}, {8, 11}, {5, 8}, {8, 11}, {11, 8}};
constexpr POINT Pencil[] = {{5, 11}, {6, 8}, {10, 4}, {12, 6}, {8, 10}, {5, 11}};
constexpr POINT Check[] = {{4, 8}, {7, 11}, {12, 5}};
constexpr POINT Square[] = {{6, 6}, {10, 6}, {10, 10}, {6, 10}, {6, 6}};

/// A white line on a disc.
struct StatePicture
{
    unsigned long states; ///< bits of `OrvixFileState`, of which the file has one
    COLORREF color;
    std::span<const POINT> line;
};

/// The first one that fits a file is its picture. The last one fits a file of unknown state.
constexpr StatePicture StatePictures[] = {{OrvixFileState::NotControlled, RGB(110, 110, 110), Plus},
                                          {OrvixFileState::Deleted, RGB(170, 40, 40), Cross},
                                          {OrvixFileState::OutOfDate, RGB(190, 95, 0), Arrow},
                                          {OrvixFileState::Modified, RGB(120, 60, 160), Pencil},
                                          {OrvixFileState::CheckedOut, RGB(20, 120, 50), Check},
                                          {OrvixFileState::CheckedOutByOther, RGB(170, 40, 40), Bar},
                                          {OrvixFileState::Controlled, RGB(30, 90, 180), Square},
                                          {0, RGB(110, 110, 110), Question}};

struct ContextPolicy
{
    using Handle = HDC;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle context) noexcept { DeleteDC(context); }
};

/// Selects an object into a device context while it exists.
class Selection
{
public:
    Selection(HDC context, HGDIOBJ object) : m_context(context), m_previous(SelectObject(context, object)) {}
    Selection(const Selection&) = delete;
    Selection& operator=(const Selection&) = delete;
    ~Selection() { SelectObject(m_context, m_previous); }

private:
    HDC m_context;
    HGDIOBJ m_previous;
};

void Draw(HDC context, const StatePicture& picture, int side)
{
    const auto scaled = [side](LONG length) { return MulDiv(length, side, Side); };
    const RECT all{0, 0, side, side};
    const UniqueGdiObject<HBRUSH> outside(CreateSolidBrush(Transparent));
    FillRect(context, &all, outside.Get());

    const UniqueGdiObject<HBRUSH> disc(CreateSolidBrush(picture.color));
    const UniqueGdiObject<HPEN> edge(CreatePen(PS_SOLID, 1, picture.color));
    const UniqueGdiObject<HPEN> pen(CreatePen(PS_SOLID, scaled(2), RGB(255, 255, 255)));
    const Selection brush(context, disc.Get());
    {
        const Selection thin(context, edge.Get());
        Ellipse(context, scaled(1), scaled(1), scaled(Side), scaled(Side));
    }
    const Selection thick(context, pen.Get());
    std::vector<POINT> line;
    std::transform(picture.line.begin(), picture.line.end(), std::back_inserter(line), [&](const POINT& point) {
        return POINT{scaled(point.x), scaled(point.y)};
    });
    Polyline(context, line.data(), static_cast<int>(line.size()));
}

/// Adds the picture and returns its number.
int AddTo(HIMAGELIST images, const StatePicture& picture, int side)
{
    const HDC screen = GetDC(nullptr);
    const UniqueHandle<ContextPolicy> context(CreateCompatibleDC(screen));
    const UniqueGdiObject<HBITMAP> bitmap(CreateCompatibleBitmap(screen, side, side));
    ReleaseDC(nullptr, screen);
    {
        const Selection canvas(context.Get(), bitmap.Get());
        Draw(context.Get(), picture, side);
    }
    return ImageList_AddMasked(images, bitmap.Get(), Transparent);
}

} // namespace

FileImages::FileImages(UINT dpi)
{
    const int side = MulDiv(Side, static_cast<int>(dpi), USER_DEFAULT_SCREEN_DPI);
    m_images =
        UniqueHandle<ImageListPolicy>(ImageList_Create(side, side, ILC_COLOR32 | ILC_MASK, MostPictures, MostPictures));
    m_firstState = ImageList_GetImageCount(m_images.Get());
    for (const StatePicture& picture : StatePictures)
    {
        AddTo(m_images.Get(), picture, side);
    }
}

int FileImages::OfFile(const std::wstring& name)
{
    const std::size_t dot = name.find_last_of(L'.');
    const std::wstring extension = dot == std::wstring::npos ? L"" : name.substr(dot);
    const auto [known, isNew] = m_byExtension.try_emplace(extension, -1);
    if (isNew)
    {
        known->second = AddIcon(L"file" + extension, FILE_ATTRIBUTE_NORMAL);
    }
    return known->second;
}

int FileImages::OfFolder()
{
    constexpr const wchar_t* Folder = L"\\"; // no extension has this character
    const auto [known, isNew] = m_byExtension.try_emplace(Folder, -1);
    if (isNew)
    {
        known->second = AddIcon(L"folder", FILE_ATTRIBUTE_DIRECTORY);
    }
    return known->second;
}

int FileImages::AddIcon(const std::wstring& name, DWORD attributes)
{
    SHFILEINFOW info{};
    if (SHGetFileInfoW(name.c_str(), attributes, &info, sizeof info,
                       SHGFI_ICON | SHGFI_SMALLICON | SHGFI_USEFILEATTRIBUTES) == 0)
    {
        return -1;
    }
    const int number = ImageList_AddIcon(m_images.Get(), info.hIcon);
    DestroyIcon(info.hIcon);
    return number;
}

int FileImages::OfState(unsigned long state) const
{
    const auto* const found =
        std::find_if(std::begin(StatePictures), std::end(StatePictures),
                     [state](const StatePicture& picture) { return (state & picture.states) != 0; });
    const auto* const last = std::prev(std::end(StatePictures));
    return m_firstState + static_cast<int>(std::min(found, last) - std::begin(StatePictures));
}
