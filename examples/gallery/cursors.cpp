#include "cursors.h"

#include "pages.h"

#include <algorithm>
#include <cstring>
#include <span>
#include <string_view>

namespace gallery {

namespace {

/// '#' is ink, '.' paper, anything else is seen through.
struct Shape {
    std::span<char const* const> rows;
    Point hotSpot;
};

constexpr char const* kArrow[] = {"#", "##", "#.#", "#..#", "#...#", "#....#", "#.....#", "#......#",
    "#.......#", "#........#", "#.....#####", "#..#..#", "#.# #..#", "##  #..#", "#    #..#", "     #..#",
    "      ##"};
constexpr char const* kHand[] = {"     ##", "    #..#", "    #..#", "    #..#", "    #..###", "    #..#..###",
    "    #..#..#..##", "### #..#..#..#.#", "#..##..#..#..#.#", "#...#..........#", " #.............#",
    "  #............#", "  #...........#", "   #..........#", "    #........#", "    #........#",
    "    ##########"};
constexpr char const* kBeam[] = {"###.###", "...#...", "  .#.", "  .#.", "  .#.", "  .#.", "  .#.", "  .#.",
    "  .#.", "  .#.", "  .#.", "  .#.", "  .#.", "  .#.", "  .#.", "...#...", "###.###"};
constexpr char const* kCross[] = {"       ...", "       .#.", "       .#.", "       .#.", "       .#.",
    "       .#.", "       ...", ".......   .......", ".#####.   .#####.", ".......   .......", "       ...",
    "       .#.", "       .#.", "       .#.", "       .#.", "       .#.", "       ..."};
constexpr char const* kGlass[] = {"#############", " #.........#", " #.........#", " #.#######.#",
    " #..#####..#", "  #..###..#", "   #..#..#", "    #...#", "     #.#", "    #...#", "   #..#..#",
    "  #...#...#", " #...###...#", " #..#####..#", " #.#######.#", " #.........#", "#############"};
constexpr char const* kArrows[] = {"        #", "       #.#", "      #...#", "     #.....#", "     ###.###",
    "   ##  #.#  ##", "  #.#  #.#  #.#", " #..####.####..#", "#...............#", " #..####.####..#",
    "  #.#  #.#  #.#", "   ##  #.#  ##", "     ###.###", "     #.....#", "      #...#", "       #.#",
    "        #"};
constexpr Shape kShapes[kCursorCount / 2] = {{kArrow, {0, 0}}, {kHand, {5, 0}}, {kBeam, {3, 8}},
    {kCross, {8, 8}}, {kGlass, {6, 8}}, {kArrows, {8, 8}}};

constexpr int kSide = 20;   // of all cursors, shadows included
constexpr int kShadow = 2;  // how far it falls, to the right and down

char DotAt(Shape const& shape, int x, int y)
{
    if (x < 0 || y < 0 || y >= static_cast<int>(shape.rows.size())) return ' ';
    char const* const row = shape.rows[static_cast<std::size_t>(y)];
    return x < static_cast<int>(std::strlen(row)) ? row[x] : ' ';
}

bool HasShadow(int index) { return index % 2 != 0; }

/// The colour of a pixel, with its alpha.
GrColor ColorAt(int index, int x, int y)
{
    Shape const& shape = kShapes[index / 2];
    if (char const dot = DotAt(shape, x, y); dot != ' ') return dot == '#' ? kInk : Rgb(255, 255, 255);
    int covered = 0;
    for (int dy = -1; dy <= 1 && HasShadow(index); ++dy)
        for (int dx = -1; dx <= 1; ++dx)
            covered += DotAt(shape, x - kShadow + dx, y - kShadow + dy) != ' ';
    return WithAlpha(0, covered * 14);
}

/// Draws a cursor enlarged, the middle of its shape at a point.
void DrawCursor(Plate const& plate, int index, Point middle, int scale)
{
    auto const& rows = kShapes[index / 2].rows;
    std::size_t width = 0;
    for (std::string_view const row : rows)
        width = std::max(width, row.size());
    Point const corner = {
        middle.x - static_cast<int>(width) * scale / 2, middle.y - static_cast<int>(rows.size()) * scale / 2};
    for (int y = 0; y < kSide; ++y)
        for (int x = 0; x < kSide; ++x) {
            GrColor const color = ColorAt(index, x, y);
            GrRect const dot{corner.x + x * scale, corner.y + y * scale, corner.x + (x + 1) * scale,
                corner.y + (y + 1) * scale};
            plate.context.SetForeColor(color | 0xFF000000);
            if (GrAlpha(color) == 255)
                plate.context.FillRegion(dot);
            else if (GrAlpha(color) > 0)
                plate.context.FillRegionAlpha(dot, GrAlpha(color));
        }
}

}

std::unique_ptr<GrCursor> NewCursor(int index)
{
    auto const [hotX, hotY] = kShapes[index / 2].hotSpot;
    auto const colorAt = [index](int x, int y) { return ColorAt(index, x, y); };
    if (HasShadow(index)) {
        auto image = NewAlphaImage(kSide, kSide, colorAt);
        return std::unique_ptr<GrCursor>(GrCursor::CreateInstance(image.release(), nullptr, hotX, hotY));
    }
    auto image = std::make_unique<GrImage>(kSide, kSide, 0);
    std::unique_ptr<GrContext> const context(image->GetContext());
    auto mask = NewMask(kSide, kSide, [&](int x, int y) {
        context->SetForeColor(colorAt(x, y));
        context->DrawPixel(x, y);
        return GrAlpha(colorAt(x, y)) != 0;
    });
    return std::unique_ptr<GrCursor>(GrCursor::CreateInstance(image.release(), mask.release(), hotX, hotY));
}

void DrawCursors(Plate const& page)
{
    std::vector<DrawPlate> plates;
    plates.reserve(kCursorCount);
    for (int index = 0; index < kCursorCount; ++index)
        plates.push_back([index](Plate const& plate) {
            DrawChecks(plate, 8, kPaper, kShade);
            plate.Fill(GrRect{0, plate.height * 3 / 4, plate.width, plate.height}, Hue(index / 2));
            int const scale = std::max(1, plate.height * 7 / 10 / kSide);
            DrawCursor(plate, index, {plate.width / 2, plate.height * 3 / 8}, scale);
            int const count = std::max(1, plate.width / 36);
            for (int i = 0; i < count; ++i)
                DrawCursor(plate, index, {plate.width * (2 * i + 1) / (2 * count), plate.height * 7 / 8}, 1);
        });
    DrawPlates(page, kCursorColumns, plates);
}

}
