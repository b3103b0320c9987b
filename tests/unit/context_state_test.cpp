#include <tessella/event_wait_l.h>
#include <tessella/image.h>
#include <tessella/mouse.h>
#include <tessella/screen.h>
#include <tessella/screen_guard.h>
#include <tessella/video_mode.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstring>
#include <functional>
#include <future>
#include <limits>
#include <memory>
#include <thread>
#include <vector>

namespace {

std::unique_ptr<GrContextI> ImageContext(GrImage const& image)
{
    return std::unique_ptr<GrContextI>(static_cast<GrContextI*>(image.GetContext()));
}

GrRect ClipRect(GrContext& context)
{
    GrRect rect;
    context.GetClipRect(rect);
    return rect;
}

TEST(ContextState, ClipLiesOnTheSurfaceAndIsSeenFromTheOrigin)
{
    GrImage const image(20, 20, GrImageTrueColor);
    auto const context = ImageContext(image);
    context->SetOrigin(3, 4);
    context->SetClipRegion(GrRect{0, 0, 10, 100});
    EXPECT_EQ(ClipRect(*context), (GrRect{0, 0, 10, 16}));
    context->SetOrigin(5, 5);
    EXPECT_EQ(ClipRect(*context), (GrRect{-2, -1, 8, 15}));
    GrRegion clip;
    context->GetClipRegion(clip);
    EXPECT_TRUE(clip.Contains(-2, -1) && clip.Contains(7, 14) && !clip.Contains(8, 14));
}

TEST(ContextState, BaseOriginMovesTheOriginAndLimitBoundsTheClip)
{
    GrImage const image(20, 20, GrImageTrueColor);
    auto const context = ImageContext(image);
    int x = -1, y = -1;
    context->SetOrigin(7, 7);
    context->SetBaseOrigin(2, 3);
    context->GetOrigin(x, y);
    EXPECT_EQ(x, 0);
    EXPECT_EQ(y, 0);
    context->SetOrigin(9, 9);
    context->SetLimitRegion(GrRect{0, 0, 5, 5});
    context->SetOrigin(1, 1);
    context->GetOrigin(x, y);
    EXPECT_EQ(x, 1);
    context->ExcludeClipRect({-1, -1, 2, 20});
    EXPECT_EQ(ClipRect(*context), (GrRect{2, -1, 4, 4}));
    context->ResetClipRegion();
    EXPECT_EQ(ClipRect(*context), (GrRect{-1, -1, 4, 4})) << "the limit stays";
    context->SetClipRegion(GrRect{-9, -9, 99, 99});
    EXPECT_EQ(ClipRect(*context), (GrRect{-1, -1, 4, 4}));
}

TEST(ContextState, AScreenContextStartsAtItsOrigin)
{
    std::unique_ptr<GrContext> const context(
        FindVideoMode(16, 16)->createScreenContext(GrRect{10, 10, 30, 20}, 10, 12));
    EXPECT_EQ(ClipRect(*context), (GrRect{0, -2, 20, 8}));
    int x = -1, y = -1;
    context->GetOrigin(x, y);
    EXPECT_EQ(x, 0);
    context->SetOrigin(1, 0);
    EXPECT_EQ(ClipRect(*context), (GrRect{-1, -2, 19, 8}));
    EXPECT_EQ(context->GetRasterMode(), 4u);
    context->SetRasterMode(77);
    EXPECT_EQ(context->GetRasterMode(), 77u);
    EXPECT_EQ(dynamic_cast<GrContextI*>(context.get()), nullptr);
}

TEST(ContextState, EmptyClipPaintsNothingUntilReset)
{
    GrImage const image(4, 4, GrImageTrueColor);
    auto const context = ImageContext(image);
    context->SetForeColor(0xABCDEF);
    context->SetClipRegion(GrRegion());
    context->FillRegion(GrRect{0, 0, 4, 4});
    context->DrawPixel(1, 1);
    context->ResetClipRegion();
    EXPECT_EQ(context->GetPixel(1, 1), 0u);
    context->FillRegion(GrRect{2, 0, 2, 4});
    EXPECT_EQ(context->GetPixel(2, 1), 0u);
    context->DrawPixel(1, 1);
    EXPECT_EQ(context->GetPixel(1, 1), 0xABCDEFu);
}

/// The place of a virtual function in its class's table, as this platform's C++ ABI keeps it in a pointer to
/// it.
template <typename Pointer>
std::size_t Slot(Pointer function)
{
    std::size_t word;
    std::memcpy(&word, &function, sizeof word);
    return (word - 1) / sizeof(void*);
}

TEST(ContextState, OperationsStandInTheOrderThatApplicationsWereBuiltWith)
{
    std::size_t slot = 2;  // behind the two entries of the destructor
    for (std::size_t const actual : {Slot(&GrContext::SetClipRegion), Slot(&GrContext::GetClipRegion),
             Slot(&GrContext::ExcludeClipRect), Slot(&GrContext::ExcludeClipRegion),
             Slot(&GrContext::ResetClipRegion), Slot(&GrContext::GetClipRect), Slot(&GrContext::SetOrigin),
             Slot(&GrContext::GetOrigin), Slot(&GrContext::SetBackColor), Slot(&GrContext::SetForeColor),
             Slot(&GrContext::SetPattern), Slot(&GrContext::SetRasterMode), Slot(&GrContext::GetRasterMode),
             Slot(&GrContext::GetPixel), Slot(&GrContext::DrawPixel), Slot(&GrContext::FillRegion),
             Slot(&GrContext::FillRegionAlpha), Slot(&GrContext::DrawLine), Slot(&GrContext::DrawArc),
             Slot(&GrContext::FillArc), Slot(&GrContext::FillPolygon), Slot(&GrContext::DrawText),
             Slot(&GrContext::DrawTextW), Slot(&GrContext::DrawBitmap),
             Slot(&GrContext::DrawBitmapTransparent), Slot(&GrContext::DrawImageMasked),
             Slot(&GrContext::DrawImage), Slot(&GrContext::DrawImageAlpha), Slot(&GrContext::ReadImage),
             Slot(&GrContext::DrawImageMaskedDirect), Slot(&GrContext::DrawImageDirect),
             Slot(&GrContext::DrawImageAlphaDirect), Slot(&GrContext::ReadImageDirect),
             Slot(&GrContext::CopyFromContext), Slot(&GrContextI::LoadPixels),
             Slot(&GrContextI::LoadPixelsDithered), Slot(&GrContextI::UnloadPixels),
             Slot(&GrContextI::SetBaseOrigin), Slot(&GrContextI::SetLimitRegion)})
        EXPECT_EQ(actual, slot++);
}

TEST(ContextState, CoordinatesBeyondTheirRangeAreClippedAway)
{
    constexpr int kMin = std::numeric_limits<int>::min(), kMax = std::numeric_limits<int>::max();
    GrImage const image(4, 4, GrImageTrueColor);
    auto const context = ImageContext(image);
    for (int const origin : {3, -3}) {
        context->ResetClipRegion();
        context->SetOrigin(origin, origin);
        context->SetClipRegion(GrRect{kMin, kMin, kMax, kMax});
        context->SetForeColor(static_cast<GrColor>(100 + origin));
        context->FillRegion(GrRect{kMin, kMin, kMax, kMax});
        EXPECT_EQ(context->GetPixel(-origin, -origin), static_cast<GrColor>(100 + origin));
        context->DrawPixel(kMax, kMin);
        EXPECT_EQ(context->GetPixel(kMin, kMax), 0u);
        context->SetForeColor(static_cast<GrColor>(200 + origin));
        context->DrawLine(kMax, kMax, kMin, kMin);
        EXPECT_EQ(context->GetPixel(1 - origin, 1 - origin), static_cast<GrColor>(200 + origin));
        context->DrawArc(kMax - 2, kMax - 2, 5, 5, kMin, kMin);
        context->FillArc(kMin, 0, kMax, 2, kMax, 100);
        context->ExcludeClipRect({kMin, kMin, kMax, kMax});
        EXPECT_EQ(ClipRect(*context), (GrRect{-origin, -origin, -origin, -origin}));
    }
    context->SetBaseOrigin(kMin, kMin);
    context->SetOrigin(-1, -1);
    int x = 0, y = 0;
    context->GetOrigin(x, y);
    EXPECT_EQ(x, 0) << "stopped at the end of the range";
}

TEST(ContextState, BackPixelHasAllBitsSetAtFirst)
{
    struct Case {
        int bits;
        std::vector<unsigned char> pixel;
    };
    static constexpr std::uint8_t kClear[8] = {};
    for (auto const& c : {Case{4, {0xFF}}, Case{8, {0xFF}}, Case{15, {0xFF, 0xFF}}, Case{16, {0xFF, 0xFF}},
             Case{24, {0xFF, 0xFF, 0xFF}}, Case{32, {0xFF, 0xFF, 0xFF, 0xFF}}}) {
        GrImage image(1, 1, new unsigned char[4](), nullptr, 0);
        image.bits = c.bits;
        image.bytes = static_cast<std::int32_t>(c.pixel.size());
        auto const context = ImageContext(image);
        context->SetPattern(kClear, 0, 0, false);
        context->DrawPixel(0, 0);
        EXPECT_TRUE(std::equal(c.pixel.begin(), c.pixel.end(), image.pixels)) << c.bits;
    }
}

TEST(LoadTime, StateStandsBeforeAnySession)
{
    EXPECT_EQ(GrScreen.fbFd, -1);
    EXPECT_EQ(mouseFd, -1);
    EXPECT_EQ(mouseButtons, 7u);
    EXPECT_EQ(emulatedButtons, 7u);
    EXPECT_EQ(hideCount, 1u);
    for (auto* const mutex : {&screenMutex, &grabMutex}) {
        std::scoped_lock const once(*mutex);
        EXPECT_TRUE(mutex->try_lock()) << "recursive";
        mutex->unlock();
    }
}

bool FreeForOthers()
{
    bool free = false;
    std::thread([&] {
        free = screenMutex.try_lock();
        if (free) screenMutex.unlock();
    }).join();
    return free;
}

TEST(ScreenGuard, TakesTheLockOnlyWhileThePointerIsInUse)
{
    {
        GrScreenGuard const guard(GrRegion{});
        EXPECT_EQ(hideCount, 2u);
        EXPECT_TRUE(FreeForOthers());
    }
    EXPECT_EQ(hideCount, 1u);

    hideCount = 0;
    try {
        GrScreenGuard const outer(GrRect{0, 0, 5, 5});
        EXPECT_FALSE(FreeForOthers());
        {
            GrScreenGuard const inner(GrRegion{});
            EXPECT_EQ(hideCount, 2u);
        }
        EXPECT_FALSE(FreeForOthers()) << "the outermost guard keeps it";
        throw 1;
    } catch (int) {
        EXPECT_EQ(hideCount, 0u);
        EXPECT_TRUE(FreeForOthers());
    }
    hideCount = 1;
}

TEST(ScreenGuard, IsHeldByDrawingThatMeetsTheClip)
{
    std::vector<unsigned char> memory(16 * 16 * 4);
    GrScreen.fbMemory = memory.data();
    GrScreen.stride = 64;
    std::unique_ptr<GrContext> const context(
        FindVideoMode(32, 24)->createScreenContext(GrRect{0, 0, 16, 16}, 0, 0));
    struct Case {
        std::function<void()> draw;
        bool waits;
    };
    hideCount = 0;
    for (auto const& c : {Case{[&] {
                                   context->FillRegion(GrRect{2, 2, 4, 4});
                               },
                              true},
             Case{[&] { context->FillRegion(GrRegion()); }, true},
             Case{[&] { context->DrawLine(1, 1, 1, 5); }, true},
             Case{[&] { context->DrawLine(16, 1, 20, 5); }, false},
             Case{[&] { context->DrawArc(9, 9, 20, 20, 0, 5760); }, false},
             Case{[&] { context->FillArc(9, 9, 20, 20, 5760, 5760); }, true},
             Case{[&] { context->FillArc(50, 50, 20, 20, 100, 200); }, false},
             Case{[&] { context->FillArc(0, -8, 20, 20, 5760, 2000); }, true},
             Case{[&] { context->DrawPixel(1, 1); }, true}, Case{[&] { context->GetPixel(1, 1); }, true},
             Case{[&] {
                      context->FillRegionAlpha(GrRect{1, 1, 2, 2}, 9);
                  },
                 true},
             Case{[&] {
                      context->CopyFromContext({0, 0, 1, 1}, context.get(), 0, 0);
                  },
                 true},
             Case{[&] {
                      context->DrawImageAlphaDirect({0, 0, 1, 1}, nullptr, 0, 0, {});
                  },
                 false},
             Case{[&] { context->DrawPixel(16, 1); }, false},
             Case{[&] { context->GetPixel(1, -1); }, false}}) {
        screenMutex.lock();
        auto const drawn = std::async(std::launch::async, c.draw);
        if (c.waits)
            EXPECT_EQ(drawn.wait_for(std::chrono::milliseconds(30)), std::future_status::timeout);
        else
            drawn.wait();
        screenMutex.unlock();
    }
    hideCount = 1;
    GrScreen = {};
}

TEST(VideoMode, IsFoundByBitsFirstAndColourBitsThen)
{
    struct Case {
        unsigned bits, colorBits, depth, bytes;
    };
    for (auto const& c : {Case{8, 0, 8, 1}, Case{8, 24, 8, 1}, Case{16, 15, 15, 2}, Case{16, 16, 16, 2},
             Case{24, 24, 24, 3}, Case{32, 24, 24, 4}}) {
        auto const* const mode = FindVideoMode(c.bits, c.colorBits);
        ASSERT_NE(mode, nullptr) << c.bits;
        EXPECT_EQ(mode->depth, c.depth);
        EXPECT_EQ(mode->bytesPerPixel, c.bytes);
    }
    for (auto const& c : {Case{4, 24, 0, 0}, Case{24, 16, 0, 0}, Case{32, 30, 0, 0}, Case{32, 32, 0, 0},
             Case{16, 24, 0, 0}, Case{15, 15, 0, 0}, Case{16, 12, 0, 0}, Case{1, 3, 0, 0}})
        EXPECT_EQ(FindVideoMode(c.bits, c.colorBits), nullptr) << c.bits << ' ' << c.colorBits;
}

TEST(VideoMode, ColourMapHoldsTheCubeWithRedFastest)
{
    GrColorMap const map = MakeColorMap();
    EXPECT_EQ(map.red[0] | map.green[0] | map.blue[0], 0);
    EXPECT_EQ(map.red[255], 0x3F) << "next to black on the 16-bit scale";
    EXPECT_EQ(map.green[255], 0x3F);
    EXPECT_EQ(map.blue[255], 0x3F);
    EXPECT_EQ(map.red[20 + 36 * 1 + 6 * 2 + 3], 153 << 8);
    EXPECT_EQ(map.green[20 + 36 * 1 + 6 * 2 + 3], 102 << 8);
    EXPECT_EQ(map.blue[20 + 36 * 1 + 6 * 2 + 3], 51 << 8);
    EXPECT_EQ(map.red[235] & map.green[235] & map.blue[235], 255 << 8);
}

}
