#include "Icons.h"

#include <objidl.h>
#include <propidl.h>

#include <algorithm>
#include <string_view>
#include <vector>

// The headers of GDI+ use min and max without a namespace.
namespace Gdiplus
{

using std::max; // NOLINT(misc-unused-using-decls)
using std::min; // NOLINT(misc-unused-using-decls)

} // namespace Gdiplus
#include <gdiplus.h>

namespace
{

constexpr Gdiplus::ARGB Blue = 0xFF2F6FD0;
constexpr Gdiplus::ARGB Green = 0xFF2E9B4F;
constexpr Gdiplus::ARGB Grey = 0xFF8A8F98;
constexpr Gdiplus::ARGB Orange = 0xFFE08A1E;
constexpr Gdiplus::ARGB Purple = 0xFF8A56C2;
constexpr Gdiplus::ARGB Red = 0xFFCC3B3B;
constexpr Gdiplus::ARGB Yellow = 0xFFE3B341;

/// White lines on a coloured disc, or one coloured shape. The lines are in a grid of 16 by 16. Each point is two
/// hexadecimal digits, x and y; a space begins a new line.
struct Drawing
{
    Gdiplus::ARGB color;
    std::string_view lines;
    bool isDisc = true;
};

/// In the order of `Icon`.
constexpr Drawing Drawings[] = {
    {Green, "848C 48C8"},            // Add: plus
    {Blue, "5AA5B66B5B5A"},          // CheckOut: pen
    {Green, "8C84 5784B7"},          // CheckIn: arrow up
    {Orange, "57B7BB7B 755779"},     // Undo: arrow back
    {Blue, "848C 598CB9"},           // GetLatest: arrow down
    {Purple, "8488B9"},              // History: clock
    {Grey, "B69465486B9CBA B4B696"}, // Refresh: open circle
    {Grey, "848C 48C8"},             // NotControlled: plus
    {Green, "487BC5"},               // CheckedIn: check mark
    {Blue, "5AA5B66B5B5A"},          // CheckedOut: pen
    {Purple, "58B8BB5B58 6865A5A8"}, // CheckedOutByOther: lock
    {Orange, "5AA5B66B5B5A"},        // Modified: pen
    {Yellow, "848C 598CB9"},         // OutOfDate: arrow down
    {Red, "55BB 5BB5"},              // Deleted: cross
    {Grey, "48C8"},                  // Excluded: bar
    {Grey, "8489 8B8C"},             // Unknown: exclamation mark
    {Yellow, "136375E5ED1D", false}, // Folder
};

float Coordinate(char digit)
{
    return static_cast<float>(digit <= '9' ? digit - '0' : digit - 'A' + 10);
}

std::vector<Gdiplus::PointF> PointsOf(std::string_view line)
{
    std::vector<Gdiplus::PointF> points;
    for (std::size_t i = 0; i + 1 < line.size(); i += 2)
    {
        points.emplace_back(Coordinate(line[i]), Coordinate(line[i + 1]));
    }
    return points;
}

void Draw(Gdiplus::Graphics& canvas, const Drawing& drawing)
{
    const Gdiplus::SolidBrush fill{Gdiplus::Color(drawing.color)};
    if (!drawing.isDisc)
    {
        const auto points = PointsOf(drawing.lines);
        canvas.FillPolygon(&fill, points.data(), static_cast<INT>(points.size()));
        return;
    }
    canvas.FillEllipse(&fill, 0.5F, 0.5F, 15.0F, 15.0F);
    Gdiplus::Pen pen(Gdiplus::Color(0xFFFFFFFF), 1.5F);
    pen.SetLineJoin(Gdiplus::LineJoinRound);
    pen.SetStartCap(Gdiplus::LineCapRound);
    pen.SetEndCap(Gdiplus::LineCapRound);
    std::string_view rest = drawing.lines;
    while (!rest.empty())
    {
        const std::size_t end = std::min(rest.find(' '), rest.size());
        const auto points = PointsOf(rest.substr(0, end));
        canvas.DrawLines(&pen, points.data(), static_cast<INT>(points.size()));
        rest.remove_prefix(std::min(end + 1, rest.size()));
    }
}

UniqueIcon MakeIcon(const Drawing& drawing, int size)
{
    Gdiplus::Bitmap picture(size, size, PixelFormat32bppARGB);
    Gdiplus::Graphics canvas(&picture);
    canvas.SetSmoothingMode(Gdiplus::SmoothingModeAntiAlias);
    canvas.ScaleTransform(static_cast<float>(size) / 16, static_cast<float>(size) / 16);
    Draw(canvas, drawing);
    HICON icon = nullptr;
    picture.GetHICON(&icon);
    return UniqueIcon(icon);
}

} // namespace

UniqueImageList MakeIcons(int size)
{
    constexpr int Count = static_cast<int>(std::size(Drawings));
    static_assert(Count == static_cast<int>(Icon::Folder) + 1, "every icon has a drawing");
    UniqueImageList images(ImageList_Create(size, size, ILC_COLOR32, Count, 0));
    for (const Drawing& drawing : Drawings)
    {
        ImageList_ReplaceIcon(images.get(), -1, MakeIcon(drawing, size).get());
    }
    return images;
}

DrawingSession::DrawingSession()
{
    const Gdiplus::GdiplusStartupInput input;
    Gdiplus::GdiplusStartup(&m_token, &input, nullptr);
}

DrawingSession::~DrawingSession()
{
    Gdiplus::GdiplusShutdown(m_token);
}
