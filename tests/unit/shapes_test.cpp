#include <tessella/image.h>

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <string>

// Hand-worked cases of what is odd in shapes. Everything is inverted, so a pixel painted twice would show as a
// hole.

namespace {

using Draw = std::function<void(GrContext&)>;

/// The picture that is left behind, a text of rows.
std::string Drawn(int width, int height, Draw const& draw)
{
    GrImage const image(width, height, GrImageTrueColor);
    std::unique_ptr<GrContext> const context(image.GetContext());
    context->SetRasterMode(0);
    draw(*context);
    std::string picture;
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x)
            picture += context->GetPixel(x, y) != 0 ? '#' : '.';
        picture += '\n';
    }
    return picture;
}

Draw Arc(int w, int h, int start, int sweep)
{
    return [=](GrContext& c) { c.DrawArc(0, 0, w, h, start, sweep); };
}
Draw Pie(int w, int h, int start, int sweep)
{
    return [=](GrContext& c) { c.FillArc(0, 0, w, h, start, sweep); };
}

TEST(Shapes, LinesRunDownwardByNumbersOfPixels)
{
    EXPECT_EQ(Drawn(4, 2, [](auto& c) { c.DrawLine(0, 0, 3, 1); }), "##..\n..##\n");
    EXPECT_EQ(Drawn(4, 2, [](auto& c) { c.DrawLine(3, 1, 0, 0); }), "##..\n..##\n");
    EXPECT_EQ(Drawn(4, 3, [](auto& c) { c.DrawLine(0, 2, 3, 0); }), "..##\n.#..\n#...\n")
        << "no mirror image";
    EXPECT_EQ(Drawn(2, 2, [](auto& c) { c.DrawLine(1, 1, 1, 1); }), "..\n.#\n");
}

TEST(Shapes, PolygonsLeaveOutTheirLastRowAndColumn)
{
    static constexpr std::int16_t kSquare[] = {1, 1, 4, 1, 4, 3, 1, 3};
    EXPECT_EQ(Drawn(6, 4, [](auto& c) { c.FillPolygon(kSquare, 4); }), "......\n.###..\n.###..\n......\n");
    EXPECT_EQ(Drawn(6, 4, [](auto& c) { c.FillPolygon(kSquare, 2); }), Drawn(6, 4, [](auto&) {}));
}

TEST(Shapes, EllipsesOfFewPixels)
{
    EXPECT_EQ(Drawn(5, 5, Arc(4, 4, 0, 23040)), ".###.\n#...#\n#...#\n#...#\n.###.\n");
    EXPECT_EQ(Drawn(2, 6, Arc(1, 5, 0, 23040)), "..\n..\n##\n##\n..\n..\n") << "no tall oval";
    EXPECT_EQ(Drawn(2, 5, Arc(0, 4, 0, 23040)), "..\n..\n#.\n..\n..\n");
    EXPECT_EQ(Drawn(5, 5, Pie(4, 4, 0, -23041)), ".....\n.###.\n.###.\n.###.\n.....\n");
    std::string const nothing = Drawn(5, 5, [](auto&) {});
    for (auto const& draw :
        {Pie(1, 4, 0, 23040), Pie(4, 1, 100, 200), Arc(-1, 4, 0, 23040), Arc(4, 4, 5760, 0)})
        EXPECT_EQ(Drawn(5, 5, draw), nothing);
}

TEST(Shapes, ArcsOfOneQuadrantReachBackToItsBeginning)
{
    constexpr int kDegree = 64;
    for (int const quadrant : {0, 1, 2, 3}) {
        int const from = quadrant * 90 * kDegree;
        std::string const whole = Drawn(61, 41, Arc(60, 40, from, 20 * kDegree));
        EXPECT_EQ(Drawn(61, 41, Arc(60, 40, from + 10 * kDegree, 10 * kDegree)), whole) << quadrant;
        EXPECT_EQ(Drawn(61, 41, Arc(60, 40, from + 20 * kDegree, -10 * kDegree)), whole) << quadrant;
    }
}

TEST(Shapes, TallEllipsesOfEvenWidthEndShortOfTheirTop)
{
    EXPECT_EQ(Drawn(4, 10, Pie(3, 9, 0, 23040)),
        "....\n....\n.##.\n.##.\n.##.\n.##.\n.##.\n.##.\n....\n....\n");
}

}
