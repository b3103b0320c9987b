#include <tessella/image.h>

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <string>

// Hand-worked cases of what is odd in shapes. Everything is inverted, so a pixel painted twice would show as
// a hole.

namespace {

/// The picture that is left behind, a text of rows.
std::string Drawn(int width, int height, std::function<void(GrContext&)> const& draw)
{
    GrImage const image(width, height, GrImageTrueColor);
    std::unique_ptr<GrContext> const context(image.GetContext());
    context->SetRasterMode(0);
    draw(*context);
    std::string picture;
    for (int i = 0; i < width * height; ++i) {
        picture += context->GetPixel(i % width, i / width) != 0 ? '#' : '.';
        if (i % width == width - 1) picture += '\n';
    }
    return picture;
}

TEST(Shapes, OfFewPixels)
{
    // Lines run downward, by numbers of pixels.
    EXPECT_EQ(Drawn(4, 2, [](auto& c) { c.DrawLine(0, 0, 3, 1); }), "##..\n..##\n");
    EXPECT_EQ(Drawn(4, 2, [](auto& c) { c.DrawLine(3, 1, 0, 0); }), "##..\n..##\n");
    EXPECT_EQ(Drawn(4, 3, [](auto& c) { c.DrawLine(0, 2, 3, 0); }), "..##\n.#..\n#...\n")
        << "no mirror image";

    // Polygons leave out their last row and column.
    static constexpr std::int16_t kSquare[] = {1, 1, 4, 1, 4, 3, 1, 3};
    EXPECT_EQ(Drawn(6, 4, [](auto& c) { c.FillPolygon(kSquare, 4); }), "......\n.###..\n.###..\n......\n");

    // Ellipses of few columns fall short.
    EXPECT_EQ(Drawn(5, 4, [](auto& c) { c.DrawArc(0, 0, 4, 3, 99, 23040); }), ".###.\n#...#\n#...#\n.###.\n");
    EXPECT_EQ(Drawn(2, 4, [](auto& c) { c.DrawArc(0, 0, 1, 3, 0, -23040); }), "..\n##\n##\n..\n");
    EXPECT_EQ(Drawn(2, 3, [](auto& c) { c.DrawArc(0, 0, 0, 2, 0, 23040); }), "..\n#.\n..\n");
    EXPECT_EQ(
        Drawn(2, 8, [](auto& c) { c.FillArc(-1, -1, 3, 9, 0, 23040); }), "..\n##\n##\n##\n##\n##\n##\n..\n");
}

TEST(Shapes, ArcsOfOneQuadrantReachBackToItsBeginning)
{
    auto const arc = [](int start, int sweep) {
        return Drawn(61, 41, [=](auto& c) { c.DrawArc(0, 0, 60, 40, start, sweep); });
    };
    EXPECT_EQ(arc(640, 640), arc(0, 1280));
    EXPECT_EQ(arc(1280, -640), arc(0, 1280));
}

}
