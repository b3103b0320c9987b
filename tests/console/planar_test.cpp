#include <support/on_console.h>
#include <support/planar_screen.h>
#include <tessella.h>
#include <tessella/cursor_kinds.h>
#include <tessella/cursor_state.h>
#include <tessella/font_base.h>
#include <tessella/pixel/colors.h>
#include <tessella/video_mode.h>

#include <gtest/gtest.h>

#include <functional>
#include <memory>

using console::Request;

namespace {

constexpr std::uint8_t kMixed[8] = {0x05, 0x05, 0x05, 0x05, 0x05, 0x05, 0x05, 0x05};  // columns 0 and 2

/// Each glyph is a dash of three pixels, a pixel behind the pen.
struct Dashes : GrFontBase {
    Dashes() : GrFontBase(false, 400)
    {
        valid = true;
        height = ascent = 1;
    }
    unsigned GetTextWidth(unsigned char const*, unsigned) override { return 0; }
    unsigned GetTextWidthW(unsigned short const*, unsigned) override { return 0; }
    bool GetKerning(int*, unsigned, unsigned) override { return false; }
    bool GetGlyph(unsigned, GrGlyphInfo& glyph) override
    {
        static constexpr unsigned char kBits[] = {0xE0};
        glyph = {1, 1, 5, 3, 1, 1, 1, kBits};
        return true;
    }
};

// What comes at the controller, by the word and the byte: the guard's write mode, masks, colours.
TEST(Planar, EachOperationWritesItsWordsAndStores)
{
    PlanarScreen screen(10);
    std::unique_ptr<GrContext> const context(
        FindVideoMode(4, 0)->createScreenContext(GrRect{0, 0, 80, 30}, 0, 0));
    GrImage image(9, 1, 0);
    for (int i = 0; i < 9; ++i)
        image.pixels[i] = static_cast<unsigned char>(i + 1);
    GrImage wide(11, 2, 0);
    GrImage const grey(2, 1, nullptr, new unsigned char[2]{0, 255}, GrImageHasAlpha);
    using Operation = std::function<void(GrContext&)>;
    auto const fill = [](GrRect const& rect) { return [=](GrContext& c) { c.FillRegion(rect); }; };
    Operation const column = [](GrContext& c) { c.DrawLine(3, 7, 3, 8); };
    Operation const pixel = [](GrContext& c) { c.DrawPixel(9, 1); };
    struct {
        char const* purpose;
        Operation draw;
        std::uint32_t mode;
        std::uint8_t const* pattern;
        bool transparent;
        std::string told;
    } const cases[] = {{"within a byte", fill({3, 0, 5, 1}), 4, nullptr, false, "1808 0=07 "},
        {"its last pixels", fill({3, 0, 8, 1}), 4, nullptr, false, "1f08 0=07 "},
        {"three parts", fill({6, 2, 26, 3}), 4, nullptr, false, "0308 20=07 ff08 21=07 22=07 c008 23=07 "},
        {"whole bytes", fill({8, 0, 16, 1}), 4, nullptr, false, "ff08 1=07 "},
        {"inverted", fill({6, 0, 26, 1}), 6, kMixed, false, "1803 0308 0=ff ff08 1=ff 2=ff c008 3=ff 0003 "},
        {"mixed", fill({0, 0, 3, 1}), 4, kMixed, false, "8008 0=07 4008 0=ff 2008 0=07 "},
        {"inverted where it paints", fill({1, 0, 4, 1}), 0, kMixed, true, "1803 2008 0=ff 0003 "},
        {"a column", column, 4, nullptr, false, "1008 70=07 80=07 "},
        {"an inverted one", column, 5, nullptr, false, "1803 1008 70=ff 80=ff 0003 "},
        {"one that the pattern holds back", column, 4, kMixed, true, "1008 "},
        {"a pixel", pixel, 4, kMixed, false, "4008 11=ff "},
        {"an inverted one", pixel, 99, nullptr, false, "1803 4008 11=ff 0003 "},
        {"one that the pattern holds back", pixel, 4, kMixed, true, ""},
        {"a pixel to read", [](GrContext& c) { EXPECT_EQ(c.GetPixel(0, 0), 0u); }, 4, nullptr, false, ""},
        {"an image",
            [&](GrContext& c) {
                c.DrawImage({6, 0, 9, 1}, image, 1, 0);
            },
            4, nullptr, false, "0208 0=02 0108 0=03 8008 1=04 "},
        {"blended over the back colour",
            [&](GrContext& c) {
                c.DrawImageAlpha({0, 0, 2, 1}, &grey, 0, 0, {true, false, false, 0});
            },
            4, nullptr, false, "8008 0=ff 4008 0=07 "},
        {"opaque text, what is between its glyphs last",
            [](GrContext& c) {
                Dashes dashes;
                c.DrawText(0, 1, reinterpret_cast<unsigned char const*>("--"), 2, &dashes, false);
            },
            4, nullptr, false,
            "0205 4008 0=07 2008 0=07 1008 0=07 0205 0208 0=07 0108 0=07 8008 1=07 "
            "0205 8008 0=ff 0c08 0=ff 4008 1=ff "},
        {"read as the controller gives it",
            [&](GrContext& c) {
                c.ReadImage({5, 2, 14, 3}, image, 0, 0);
            },
            4, nullptr, false,
            "8008 25? 4008 26? 2008 27? 1008 28? 0808 29? 0408 30? 0208 31? 0108 32? 8008 33? "},
        {"read to another place of the image",
            [&](GrContext& c) {
                c.ReadImage({5, 2, 8, 3}, wide, 2, 1);
            },
            4, nullptr, false, "8008 25? 4008 26? 2008 27? "}};
    context->SetForeColor(0xAAAAAA);
    for (unsigned i = 0; i < 9; ++i)
        screen.planes[25 + i] = 0x11223340u + i;
    for (auto const& c : cases) {
        std::uint8_t const solid[8] = {0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF};
        context->SetPattern(c.pattern ? c.pattern : solid, 0, 0, c.transparent);
        context->SetRasterMode(c.mode);
        c.draw(*context);
        EXPECT_EQ(screen.Told(), "0205 " + c.told) << c.purpose;
    }
    EXPECT_TRUE(wide.pixels[13] == 0x42 && wide.pixels[12] == 0 && wide.pixels[14] == 0);
    EXPECT_TRUE(image.pixels[0] == 0x47 && image.pixels[1] == 0x48 && image.pixels[2] == 3);
    context->GetPixel(-1, 0);
    context->DrawImageDirect({0, 0, 1, 1}, image, 2, 0);
    EXPECT_EQ(screen.Told(), "8008 0=03 ") << "no guard";
    EXPECT_EQ(screen.planes[0], 0x1122B3C2u) << "what the mask holds back takes the latches";
}

/// What the screen must show with a cursor on it, where pixels beside those of the shape take the latches.
console::Picture WithCursor(console::Picture shown, GrBitmap const& mask, int left, int top, unsigned color)
{
    auto const at = [&](int x, int y) {
        return &shown.bytes[(static_cast<std::size_t>(y) * shown.width + static_cast<std::size_t>(x)) * 3];
    };
    int const width = static_cast<int>(shown.width), height = static_cast<int>(shown.height);
    int const right = std::min(left + mask.width, width), bottom = std::min(top + mask.height, height);
    auto const* const last = at((right - 1) & ~7, bottom - 1);
    std::vector<std::uint8_t> const latches(last, last + 24);
    for (int y = std::max(top, 0); y < bottom; ++y)
        for (int x = std::max(left, 0); x < right; ++x) {
            int const u = x - left, v = y - top;
            if ((mask.data[v * ((mask.width + 7) / 8) + u / 8] >> u % 8 & 1) == 0) continue;
            std::copy_n(latches.begin(), 24, at(x & ~7, y));
            for (int i = 0; i < 3; ++i)
                at(x, y)[i] = static_cast<std::uint8_t>(color >> (16 - 8 * i));
        }
    return shown;
}

TEST(Planar, CursorSavesThroughTheLatchesAndPutsEverythingBack)
{
    auto const outcome = OnConsole("96x64x4", nullptr, [](console::VirtualConsole& screen) {
        Sizes sizes;
        ASSERT_TRUE(Init(sizes));
        EXPECT_EQ(sizes, (Sizes{96, 64, 4}));
        EXPECT_TRUE(GrScreen.stride == 12 && GrScreen.bytesPerPixel == 1 && GrScreen.fbLength == 0x10000);
        EXPECT_EQ(screen.Count(Request::PutColourMap), 0u);
        for (int i = 0; i < 60; ++i) {
            GrScreen.context->SetForeColor(GrColors4::palette[i % 16]);
            GrScreen.context->FillRegion(GrRect{i % 12 * 8, i / 12 * 13, i % 12 * 8 + 8, i / 12 * 13 + 13});
        }
        auto const plain = screen.Screen();
        auto mask = std::make_unique<GrBitmap>(11, 9);
        for (int i = 0; i < 18; ++i)
            mask->data[i] = static_cast<unsigned char>(i * 41 + 5);
        GrBitmap const& bits = *mask;
        auto image = std::make_unique<GrImage>(11, 9, 0);
        std::fill_n(image->pixels, 99, 12);
        std::unique_ptr<GrCursor> const cursor(
            GrCursor::CreateInstance(image.release(), mask.release(), 4, 3));
        ASSERT_NE(dynamic_cast<GrMaskedCursor4*>(cursor.get()), nullptr);
        cursor->Activate();
        for (auto const& [x, y] : {GrRange{48, 32}, GrRange{47, 33}, GrRange{0, 0}, GrRange{95, 63},
                 GrRange{50, 1}, GrRange{96, 64}, GrRange{2, 60}}) {
            cursor->Move(x, y);
            EXPECT_EQ(screen.Screen().bytes, WithCursor(plain, bits, x - 4, y - 3, 0xFF5757).bytes) << x;
        }
        GrScreen.context->SetForeColor(0);
        auto const asked = screen.Count(Request::PortAccess);
        GrScreen.context->FillRegion(GrRect{0, 40, 96, 64});
        EXPECT_EQ(screen.Count(Request::PortAccess) - asked, 2u) << "to take the cursor away, and to draw";
        GrHideCursor();
        auto const emptied = screen.Screen();
        for (unsigned i = 0; i < 96 * 64; ++i)
            ASSERT_EQ(emptied.At(i % 96, i / 96), i < 96 * 40 ? plain.At(i % 96, i / 96) : 0) << i;
        std::unique_ptr<GrCursor> const blended(
            GrCursor::CreateInstance(new GrImage(3, 3, GrImageHasAlpha), nullptr, 0, 0));
        EXPECT_EQ(dynamic_cast<GrMaskedCursor4*>(blended.get()), nullptr);
        GrDone();
    });
    EXPECT_EQ(outcome.err, "");
}

}
