#include <support/canvas.h>
#include <support/planar_screen.h>
#include <support/random_blits.h>
#include <support/random_text.h>
#include <support/seed.h>
#include <support/shape_model.h>
#include <tessella/pixel/fill_rows.h>
#include <tessella/screen.h>
#include <tessella/screen_guard.h>
#include <tessella/video_mode.h>

#include <gtest/gtest.h>

#include <memory>
#include <random>

#include <sys/mman.h>

// Random drawing on contexts of every format, over images and over a screen with a row pitch of its own,
// judged by a canvas: after each operation every byte must be the same, also those that belong to no pixel.

namespace {

constexpr int kWidth = 53, kHeight = 37;

class RandomDrawing {
public:
    RandomDrawing(GrContext& drawnContext, Canvas& judgingCanvas, unsigned seed)
        : context(drawnContext), canvas(judgingCanvas), random(seed)
    {}

    void Step()
    {
        switch (Number(0, 17)) {
        case 0: Both([region = Shape()](auto& c) { c.SetClipRegion(region); }); break;
        case 1: Both([rect = Rect()](auto& c) { c.ExcludeClipRect(rect); }); break;
        case 2: Both([region = Shape()](auto& c) { c.ExcludeClipRegion(region); }); break;
        case 3: Both([](auto& c) { c.ResetClipRegion(); }); break;
        case 4: Both([x = Number(-9, 9), y = Number(-9, 9)](auto& c) { c.SetOrigin(x, y); }); break;
        case 5: Both([color = Color()](auto& c) { c.SetForeColor(color); }); break;
        case 6: Both([color = Color()](auto& c) { c.SetBackColor(color); }); break;
        case 7: SetPattern(); break;
        case 8: Both([mode = Number(0, 1) ? 4u : Color()](auto& c) { c.SetRasterMode(mode); }); break;
        case 9: {
            int const x = Number(-5, kWidth + 5), y = Number(-5, kHeight + 5);
            Both([=](auto& c) { c.DrawPixel(x, y); });
            EXPECT_EQ(context.GetPixel(x, y), canvas.GetPixel(x, y)) << x << ", " << y;
            break;
        }
        case 10:
        case 11: Both([region = Shape()](auto& c) { c.FillRegion(region); }); break;
        default: DrawShape();
        }
    }

private:
    template <typename Operation>
    void Both(Operation operation)
    {
        operation(context);
        operation(canvas);
    }

    void DrawShape()
    {
        auto const paint = [this](int px, int py) { canvas.DrawPixel(px, py); };
        int const x = Number(-30, kWidth), y = Number(-30, kHeight), w = Number(-2, 60), h = Number(-2, 40);
        int const x2 = Number(0, 4) ? Number(-30, kWidth + 30) : x, y2 = Number(0, 4) ? y + h : y;
        int const start = Angle(), sweep = Angle();
        std::vector<std::int16_t> xy(static_cast<std::size_t>(2 * Number(2, 7)));
        for (auto& coordinate : xy)
            coordinate = static_cast<std::int16_t>(Number(-20, kWidth));
        switch (Number(0, 3)) {
        case 0: context.DrawLine(x, y, x2, y2), model::Line(paint, x, y, x2, y2); break;
        case 1:
            context.FillPolygon(xy.data(), static_cast<unsigned>(xy.size() / 2));
            model::Polygon(paint, xy);
            break;
        case 2:
            context.DrawArc(x, y, w, h, start, sweep);
            model::DrawArc(paint, x, y, w, h, start, sweep);
            break;
        default: context.FillArc(x, y, w, h, start, sweep); model::FillArc(paint, x, y, w, h, start, sweep);
        }
    }
    int Angle() { return Number(0, 2) ? Number(-40000, 40000) : Number(-9, 9) * 2880; }

    int Number(int from, int to) { return std::uniform_int_distribution(from, to)(random); }
    GrColor Color() { return static_cast<GrColor>(random()); }
    GrRect Rect()
    {
        int const x = Number(-15, kWidth), y = Number(-15, kHeight);
        return {x, y, x + Number(0, 40), y + Number(0, 30)};
    }
    /// Only cut from one rectangle, never joined: joining may leave holes between bands, which the canvas, a
    /// plain set of pixels, does not have.
    GrRegion Shape()
    {
        GrRegion region = Rect();
        for (int cuts = Number(0, 3); cuts > 0; --cuts)
            region -= Rect();
        return region;
    }
    void SetPattern()
    {
        std::uint8_t bits[8];
        int const kind = Number(0, 3);
        for (auto& byte : bits)
            byte = kind == 0 ? 0xFF : kind == 1 ? 0 : static_cast<std::uint8_t>(random());
        int const dx = Number(-20, 20), dy = Number(-20, 20);
        bool const transparent = Number(0, 1) != 0;
        Both([&](auto& c) { c.SetPattern(bits, dx, dy, transparent); });
    }

    GrContext& context;
    Canvas& canvas;
    std::mt19937 random;
};

/// `image` is what the context draws on, or null for a screen; `look` brings its pixels up to date.
void Judge(
    GrContext& context, GrImage const* image, unsigned char const* pixels, Canvas& canvas,
    std::function<void()> const& look = [] {})
{
    unsigned const seed = NewSeed();
    SCOPED_TRACE("seed " + std::to_string(seed));
    RandomDrawing drawing(context, canvas, seed);
    RandomBlits blits(context, image, canvas, ~seed);
    RandomText text(context, canvas, seed + 1);
    for (int step = 0; step < 1500; ++step) {
        drawing.Step();
        if (step % 3 == 0) blits.Step();
        if (step % 3 == 1) text.Step();
        ASSERT_FALSE(testing::Test::HasFailure()) << "step " << step;
        look();
        ASSERT_EQ(std::memcmp(pixels, canvas.memory.data(), canvas.memory.size()), 0) << "step " << step;
    }
}

TEST(Contexts, ImagesOfEveryFormatMatchTheCanvas)
{
    for (ImageKind const& format : kImageKinds)
        for (int kind = 0; kind < 4; ++kind) {
            Canvas canvas(format, kWidth, kHeight, kWidth * format.bytes);
            GrImage image(kWidth, kHeight, new unsigned char[canvas.memory.size()](),
                kind & 1 ? new unsigned char[kWidth * kHeight] : nullptr,
                format.flags | (kind & 2 ? GrImageNoDither : 0u));
            image.bits = format.bits;
            image.bytes = format.bytes;
            for (int i = 0; image.alphaPlane && i < kWidth * kHeight; ++i)
                image.alphaPlane[i] = static_cast<unsigned char>(i % 3 ? 255 : i);
            std::unique_ptr<GrContext> const context(image.GetContext());
            Judge(*context, &image, image.pixels, canvas);
        }
}

/// Gives the screen back its state without a mode.
struct ResetScreen {
    ~ResetScreen() { GrScreen = {}; }
};

/// A screen in this process' memory, rows being five bytes longer than they need to be. The context sees all
/// of it but a margin, and its base origin lies in there.
template <typename Surface, typename Colors>
void JudgeScreen(unsigned bits, unsigned colorBits)
{
    SCOPED_TRACE(bits * 100 + colorBits);
    int const stride = kWidth * Surface::kBytes + 5;
    Canvas canvas(Canvas::FormatOf<Surface, Colors>(), kWidth, kHeight, stride);
    std::vector<unsigned char> memory(canvas.memory.size());
    ResetScreen const reset;
    GrScreen.fbMemory = memory.data();
    GrScreen.stride = static_cast<std::uint32_t>(stride);
    std::vector<std::int32_t> errors(kWidth * 3);
    GrScreen.ditherLine = errors.data();
    auto const* const mode = FindVideoMode(bits, colorBits);
    ASSERT_NE(mode, nullptr);
    GrRegion const limit = GrRect{2, 1, kWidth - 3, kHeight - 4};
    std::unique_ptr<GrContext> const context(mode->createScreenContext(limit, 5, 6));
    canvas.SetLimit(limit);
    canvas.SetBaseOrigin(5, 6);
    Judge(*context, nullptr, memory.data(), canvas);
}

TEST(Contexts, ScreensOfEveryModeMatchTheCanvas)
{
    JudgeScreen<GrSurface8, GrColors8>(8, 18);
    JudgeScreen<GrSurface16, GrColors15>(16, 15);
    JudgeScreen<GrSurface16, GrColors16>(16, 16);
    JudgeScreen<GrSurface24, GrColors24>(24, 24);
    JudgeScreen<GrSurface32, GrColors24>(32, 24);
}

TEST(Contexts, ThePlanarScreenMatchesTheCanvas)
{
    Canvas::Format format = Canvas::FormatOf<GrSurface8, GrColors4>();
    format.readable = false;
    Canvas canvas(format, kWidth, kHeight, kWidth);
    PlanarScreen screen((kWidth + 7) / 8);
    std::vector<unsigned char> pixels(canvas.memory.size());
    GrRegion const limit = GrRect{2, 1, kWidth - 3, kHeight - 4};
    std::unique_ptr<GrContext> const context(FindVideoMode(4, 18)->createScreenContext(limit, 5, 6));
    canvas.SetLimit(limit);
    canvas.SetBaseOrigin(5, 6);
    context->FillRegion(GrRegion());
    Judge(*context, nullptr, pixels.data(), canvas, [&] {
        screen.Follow(pixels, kWidth);
        for (unsigned char& pixel : canvas.memory)
            pixel &= 15;
    });
}

TEST(Contexts, BandsThatOverlapReachNothingOutside)
{
    GrRegion region = GrRect{10, 5, 14, 12};
    region += GrRect{0, 16, 12, 27};
    testing::internal::CaptureStderr();  // the bands are out of order now, which is reported
    region += GrRect{15, -2, 21, 14};
    std::vector<unsigned char> memory(20 * 24, 7);
    GrImage image(20, 20, memory.data() + 20 * 2, nullptr, 0);
    image.bits = 8;
    image.bytes = 1;
    std::unique_ptr<GrContext> const context(image.GetContext());
    context->FillRegion(region);
    context->SetClipRegion(region);
    context->FillRegion(GrRect{-9, -9, 30, 30});
    context->DrawLine(17, -9, 17, 30);
    EXPECT_EQ(context->GetPixel(17, -1), 0u);
    testing::internal::GetCapturedStderr();
    image.Detach();
    for (std::size_t i = 0; i < 20 * 2; ++i)
        EXPECT_TRUE(memory[i] == 7 && memory[i + 20 * 22] == 7) << i;
    EXPECT_EQ(memory[20 * 2 + 17], 0) << "what lies on the surface is painted";
}

TEST(Contexts, WithoutAMappingTheScreenPaintsNothing)
{
    ResetScreen const reset;
    for (void* const memory : {static_cast<void*>(nullptr), MAP_FAILED}) {
        GrScreen.fbMemory = static_cast<unsigned char*>(memory);
        GrScreen.stride = 64;
        std::unique_ptr<GrContext> const context(
            FindVideoMode(32, 24)->createScreenContext(GrRect{0, 0, 16, 16}, 0, 0));
        context->FillRegion(GrRect{0, 0, 16, 16});
        context->DrawPixel(3, 3);
        EXPECT_EQ(context->GetPixel(3, 3), 0u);
    }
}

TEST(Rows, FillAndInvertWritePixelsOfAnyWidthAndNothingElse)
{
    constexpr int kRows = 3, kSpare = 7;
    std::uint32_t const pixel = 0x87654321;
    for (int bytes = 1; bytes <= 4; ++bytes)
        for (int width = 1; width <= 210; ++width)
            for (bool const invert : {false, true}) {
                int const stride = width * bytes + kSpare;
                std::vector<unsigned char> expected(static_cast<std::size_t>(stride * kRows) + 3);
                for (std::size_t i = 0; i < expected.size(); ++i)
                    expected[i] = static_cast<unsigned char>(i * 37);
                std::vector<unsigned char> actual = expected;
                for (int y = 0; y < kRows; ++y)
                    for (int i = 0; i < width * bytes; ++i) {
                        unsigned char& byte = expected[static_cast<std::size_t>(3 + y * stride + i)];
                        byte = static_cast<unsigned char>(invert ? ~byte : pixel >> i % bytes * 8);
                    }
                GrRows const rows{actual.data() + 3, stride, width, kRows};
                if (invert)
                    InvertRows(rows, bytes);
                else if (bytes == 1)
                    FillRows8(rows, static_cast<std::uint8_t>(pixel));
                else if (bytes == 2)
                    FillRows16(rows, static_cast<std::uint16_t>(pixel));
                else
                    (bytes == 3 ? FillRows24 : FillRows32)(rows, pixel);
                ASSERT_EQ(actual, expected) << width << " pixels of " << bytes << " bytes, invert " << invert;
            }
}

}
