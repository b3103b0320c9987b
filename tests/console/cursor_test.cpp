#include <support/on_console.h>
#include <tessella.h>
#include <tessella/cursor_state.h>
#include <tessella/mouse.h>
#include <tessella/screen_guard.h>

#include <gtest/gtest.h>

#include <chrono>
#include <cstring>
#include <memory>
#include <random>
#include <thread>

// Cursors over a picture that changes. The same picture is painted beside the screen, where no cursor comes,
// and with the cursor drawn onto a copy of it, at the pointer's place, it must be what the screen shows.

namespace {

constexpr int kWidth = 96, kHeight = 64;

struct Shape {
    int size, hotX, hotY;
    bool masked;
};

class Desk {
public:
    Desk(console::VirtualConsole& virtualConsole, unsigned seed) : screen(virtualConsole), random(seed)
    {
        picture.reset(plain.GetContext());
        Fill({0, 0, kWidth, kHeight});
    }

    int Pick(int count) { return static_cast<int>(random() % static_cast<unsigned>(count)); }

    void Activate(Shape const& wanted)
    {
        shape = wanted;
        bits = std::make_unique<GrBitmap>(shape.size, shape.size);
        for (int i = 0; i < (shape.size + 7) / 8 * shape.size; ++i)
            bits->data[i] = static_cast<unsigned char>(random());
        std::unique_ptr<GrCursor> const before = std::move(cursor);
        cursor.reset(GrCursor::CreateInstance(
            MakeImage().release(), shape.masked ? CopyOf(*bits).release() : nullptr, shape.hotX, shape.hotY));
        look = MakeImage();
        cursor->Activate();
        if (before) Compare();
    }
    void Deactivate()
    {
        cursor.reset();
        Fill({0, 0, kWidth, kHeight});
    }

    void Fill(GrRect const& rect)
    {
        auto const color = static_cast<GrColor>(random() & 0xFFFFFF);
        for (GrContext* const context : {GrScreen.context, picture.get()}) {
            context->SetForeColor(color);
            context->FillRegion(rect);
        }
    }
    void FillSomewhere()
    {
        int const x = Pick(kWidth), y = Pick(kHeight);
        Fill({x, y, std::min(x + 1 + Pick(30), kWidth), std::min(y + 1 + Pick(30), kHeight)});
        ASSERT_EQ(GrScreen.context->GetPixel(x, y), picture->GetPixel(x, y))
            << "the cursor is no pixel of it";
    }
    void Move(int dx, int dy)
    {
        ASSERT_TRUE(screen.MoveMouse(dx, dy, 0, button));
        auto const accelerated = [](int delta) { return delta < -5 || delta > 5 ? 2 * delta : delta; };
        pointerX = std::clamp(pointerX + accelerated(dx), 0, kWidth);
        pointerY = std::clamp(pointerY + accelerated(dy), 0, kHeight);
    }
    /// All packets have been looked at when the last one, a click, has.
    void AwaitPointer()
    {
        button ^= 1;
        Move(0, 0);
        int x = -1, y = -1;
        unsigned buttons = 0;
        for (int i = 0; i < 20'000 && buttons != (button ? 3u : 7u); ++i) {
            GrGetCursorPos(x, y, buttons);
            std::this_thread::sleep_for(std::chrono::microseconds(i < 1000 ? 10 : 1000));
        }
        ASSERT_EQ(std::pair(x, y), std::pair(pointerX, pointerY));
    }

    /// The session goes on in the same mode, with the pointer in the middle and no cursor.
    void ChangeMode()
    {
        Sizes sizes;
        ASSERT_TRUE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 0));
        pointerX = kWidth / 2;
        pointerY = kHeight / 2;
        cursor.reset();
        Compare();
    }

    void Compare()
    {
        std::size_t const row = kWidth * GrScreen.bytesPerPixel;
        GrImage wanted(kWidth, kHeight, 0);
        std::memcpy(wanted.pixels, plain.pixels, row * kHeight);
        if (cursor) DrawOnto(wanted);
        std::scoped_lock const lock(screenMutex);
        for (int y = 0; y < kHeight; ++y)
            ASSERT_EQ(std::memcmp(GrScreen.fbMemory + static_cast<std::size_t>(y) * GrScreen.stride,
                          wanted.pixels + static_cast<std::size_t>(y) * row, row),
                0)
                << "row " << y << ", pointer at " << pointerX << ", " << pointerY;
        EXPECT_TRUE(std::all_of(GrScreen.fbMemory + GrScreen.height * GrScreen.stride,
            GrScreen.fbMemory + GrScreen.fbLength, [](auto byte) { return byte == 0; }))
            << "below the screen";
    }

private:
    static std::unique_ptr<GrBitmap> CopyOf(GrBitmap const& bitmap)
    {
        auto copy = std::make_unique<GrBitmap>(bitmap.width, bitmap.height);
        copy->Load(bitmap.data);
        return copy;
    }
    /// The same picture each time for the same shape.
    std::unique_ptr<GrImage> MakeImage() const
    {
        auto image = std::make_unique<GrImage>(shape.size, shape.size, shape.masked ? 0 : 8);
        for (int i = 0; i < shape.size * shape.size * image->bytes; ++i)
            image->pixels[i] = static_cast<unsigned char>(i * 37 % 80);
        for (int i = 0; !shape.masked && i < shape.size * shape.size; ++i)
            image->alphaPlane[i] = static_cast<unsigned char>(i * 29);
        return image;
    }
    void DrawOnto(GrImage& target) const
    {
        std::unique_ptr<GrContext> const context(target.GetContext());
        int const left = pointerX - shape.hotX, top = pointerY - shape.hotY;
        GrRect const place{std::max(left, 0), std::max(top, 0), std::min(left + shape.size, kWidth),
            std::min(top + shape.size, kHeight)};
        int const sx = place.x1 - left, sy = place.y1 - top;
        if (shape.masked)
            context->DrawImageMaskedDirect(place, *look, *bits, sx, sy);
        else
            context->DrawImageAlphaDirect(place, look.get(), sx, sy, {true, false, false, 0});
    }

    console::VirtualConsole& screen;
    std::mt19937 random;
    Shape shape{};
    std::unique_ptr<GrBitmap> bits;
    std::unique_ptr<GrImage> look;
    std::unique_ptr<GrCursor> cursor;
    GrImage plain{kWidth, kHeight, 0};
    std::unique_ptr<GrContext> picture;
    int pointerX = kWidth / 2, pointerY = kHeight / 2;
    unsigned button = 0;
};

void RunInEachMode(void (*body)(Desk&, console::VirtualConsole&))
{
    for (char const* const mode : {"96x64x8", "96x64x15", "96x64x16", "96x64x24", "96x64x32"}) {
        SCOPED_TRACE(mode);
        auto const outcome = OnConsole(mode, nullptr, [&](console::VirtualConsole& screen) {
            Sizes sizes;
            ASSERT_TRUE(Init(sizes));
            {
                Desk desk(screen, 11);
                body(desk, screen);
            }
            GrDone();
        });
        EXPECT_EQ(outcome.err, "");
    }
}

TEST(Cursor, StandsOnThePictureWhateverIsPaintedAndWhereverItGoes)
{
    RunInEachMode([](Desk& desk, console::VirtualConsole&) {
        for (int step = 0; step < 600 && !testing::Test::HasFailure(); ++step) {
            if (step % 60 == 0)
                desk.Activate({1 + desk.Pick(24), desk.Pick(20), desk.Pick(20), desk.Pick(2) == 0});
            if (step % 120 == 50) desk.Deactivate();  // every other one is followed by the next
            int const reach = desk.Pick(4) == 0 ? 60 : 9;
            if (desk.Pick(3) == 0)
                desk.FillSomewhere();
            else
                desk.Move(desk.Pick(2 * reach) - reach, desk.Pick(2 * reach) - reach);
            desk.AwaitPointer();
            desk.Compare();
        }
    });
}

TEST(Cursor, ComesBackAfterAChangeOfMode)
{
    RunInEachMode([](Desk& desk, console::VirtualConsole&) {
        desk.Activate({10, 2, 3, true});
        desk.Move(9, 9);
        desk.AwaitPointer();
        desk.ChangeMode();
        desk.Activate({10, 5, 5, true});
        EXPECT_TRUE(cursorVisible) << "drawing has to know of it";
        desk.Compare();
        for (int i = 0; i < 40; ++i) {
            desk.FillSomewhere();
            desk.Compare();
        }
    });
}

/// The byte at a place of an 8-bit screen is the square's, below.
bool Shows(int x, int y)
{
    return GrScreen.fbMemory[static_cast<unsigned>(y) * GrScreen.stride + static_cast<unsigned>(x)] == 0xA5;
}

/// A square, from 4 left of and above the hot spot to 4 right of and below it. Whenever it is asked for
/// something it counts whether the screen does not show it at a place.
class Square : public GrCursor {
public:
    Square() : GrCursor(new GrImage(8, 8, 0), nullptr, 4, 4)
    {
        std::fill_n(image->pixels, 64, static_cast<unsigned char>(0xA5));
    }
    ~Square() override { Retire(); }
    void DrawShape(GrContext* target, GrRect const& where, int sx, int sy) override
    {
        absent += !Shows(watchedX, watchedY);
        target->DrawImageDirect(where, *image, sx, sy);
    }
    void RestoreRect(GrRect const& area) override
    {
        GrCursor::RestoreRect(area);
        absent += !Shows(watchedX, watchedY);
    }
    int watchedX = 0, watchedY = 0, absent = 0;
};

TEST(Cursor, IsSeenInEveryFrameUnlessDrawingMeetsIt)
{
    OnConsole("96x64x8", nullptr, [](console::VirtualConsole& screen) {
        Sizes sizes;
        ASSERT_TRUE(Init(sizes));
        GrScreen.context->FillRegion(GrRect{0, 0, kWidth, kHeight});
        GrRect const beside{0, 0, 9, 9}, corner{50, 34, 60, 50};
        auto square = std::make_unique<Square>(), other = std::make_unique<Square>();
        square->Activate();
        EXPECT_TRUE(Shows(44, 28) && Shows(51, 35) && !Shows(52, 35)) << "in the middle";
        square->absent = 0;
        for (int i = 0, x = 48, y = 32; i < 49; ++i) {
            square->watchedX = x;
            square->watchedY = y;
            int const dx = i % 7 - 3, dy = (i + i / 7) % 7 - 3;
            GrMouseReport(7, dx, dy, 0);
            x += dx;
            y += dy;
        }
        square->Activate();
        EXPECT_EQ(square->absent, 0);
        {
            GrScreenGuard const guard(beside);
            GrMouseReport(7, 3, 0, 0);
            EXPECT_TRUE(Shows(44, 32) && !Shows(54, 32)) << "stands still while something is drawn";
        }
        EXPECT_TRUE(!Shows(44, 32) && Shows(54, 32)) << "goes where the pointer has gone";
        for (int extended = 0; extended < 3; ++extended) {
            GrScreenGuard const guard(extended ? GrRegion() : GrRegion(corner));
            if (extended == 1) guard.Extend(corner);
            if (extended == 2) guard.Extend(GrRegion(corner));
            EXPECT_FALSE(Shows(47, 28));
            GrScreen.context->SetForeColor(extended % 2 == 0 ? 0x00FF00 : 0x0000FF);
            GrScreen.context->FillRegion(GrRect{40, 20, 50, 40});
            GrHideCursor();
            EXPECT_EQ(GrScreen.context->GetPixel(40, 20), GrScreen.context->GetPixel(49, 30)) << "was hidden";
            EXPECT_FALSE(Shows(54, 35)) << "another guard has ended within";
            other->Activate();
            EXPECT_FALSE(Shows(54, 35));
            other.swap(square);
        }
        EXPECT_TRUE(Shows(54, 35));
        {
            GrScreenGuard const guard(beside);
            other->Activate();
            EXPECT_TRUE(Shows(54, 35)) << "nobody draws but who has the guard";
        }
        other.reset();
        EXPECT_EQ(currentCursor, nullptr);
        screen.ChangeMode(*console::ParseMode("96x64x16"));
        ASSERT_TRUE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 0));
        square->Activate();
        EXPECT_EQ(currentCursor, nullptr) << "of another mode";
        GrDone();
    });
}

TEST(Cursor, FollowsTheMouseUnderDrawing)
{
    RunInEachMode([](Desk& desk, console::VirtualConsole&) {
        desk.Activate({16, 3, 2, true});
        for (int round = 0; round < 20; ++round) {
            std::thread mover([&] {
                for (int i = 0; i < 100; ++i)
                    desk.Move((i * 7 + round) % 13 - 6, (i * 5 + round) % 11 - 5);
            });
            for (int i = 0; i < 50; ++i)
                desk.FillSomewhere();
            mover.join();
            desk.AwaitPointer();
            desk.Compare();
        }
    });
}

}
