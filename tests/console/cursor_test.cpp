#include <support/on_console.h>
#include <tessella.h>
#include <tessella/screen_guard.h>

#include <gtest/gtest.h>

#include <atomic>
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
        desk.Compare();
        for (int i = 0; i < 40; ++i) {
            desk.FillSomewhere();
            desk.Compare();
        }
    });
}

TEST(Cursor, FollowsTheMouseUnderDrawingAndSurvivesAChangeOfMode)
{
    RunInEachMode([](Desk& desk, console::VirtualConsole& screen) {
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
        std::atomic<bool> stop{false};
        std::thread mover([&] {
            for (int i = 0; !stop; ++i)
                screen.MoveMouse(i % 7 - 3, i % 5 - 2);
        });
        for (int i = 0; i < 30; ++i) {
            Sizes sizes;
            ASSERT_TRUE(GrChangeMode(sizes.width, sizes.height, sizes.depth, 0));
            std::unique_ptr<GrImage> image = std::make_unique<GrImage>(9, 9, 8);
            std::unique_ptr<GrCursor> const cursor(GrCursor::CreateInstance(image.release(), nullptr, 4, 4));
            cursor->Activate();
            GrScreen.context->FillRegion(GrRect{0, 0, kWidth, kHeight});
        }
        stop = true;
        mover.join();
    });
}

}
