#include <tessella/bitmap.h>
#include <tessella/event_wait_l.h>
#include <tessella/image.h>
#include <tessella/mouse.h>
#include <tessella/mouse_emulation.h>
#include <tessella/pixel/screen_base.h>
#include <tessella/pixel/surface.h>
#include <tessella/screen_guard.h>
#include <tessella/video_mode.h>

#include <gtest/gtest.h>

#include <chrono>
#include <future>
#include <limits>
#include <memory>
#include <mutex>
#include <type_traits>
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

TEST(ContextState, ClipLiesWithinTheLimitAndIsSeenFromTheOrigin)
{
    GrImage const image(20, 20, GrImageTrueColor);
    auto const context = ImageContext(image);
    int x = -1, y = -1;
    context->SetOrigin(7, 7);
    context->SetBaseOrigin(2, 3);
    context->GetOrigin(x, y);
    EXPECT_TRUE(x == 0 && y == 0);
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
    GrRegion clip;
    context->GetClipRegion(clip);
    EXPECT_TRUE(clip.Contains(-1, -1) && clip.Contains(3, 3) && !clip.Contains(4, 3));
    context->SetRasterMode(77);
    EXPECT_EQ(context->GetRasterMode(), 77u);
}

static_assert(!std::is_base_of_v<GrContextI, GrScreenContextBase>);
// The back colour of new contexts.
static_assert(GrSurface8::kAllBits == 0xFF && GrSurface16::kAllBits == 0xFFFF);
static_assert(GrSurface24::kAllBits == 0xFFFFFF && GrSurface32::kAllBits == 0xFFFFFFFF);

TEST(ContextState, CoordinatesBeyondTheirRangeAreClippedAway)
{
    constexpr int kMin = std::numeric_limits<int>::min(), kMax = std::numeric_limits<int>::max();
    GrRect const all{kMin, kMin, kMax, kMax};
    GrImage image(4, 4, GrImageTrueColor);
    auto const context = ImageContext(image);
    for (int const origin : {3, -3}) {
        context->ResetClipRegion();
        context->SetOrigin(origin, origin);
        context->SetClipRegion(all);
        context->SetForeColor(100);
        context->FillRegion(all);
        EXPECT_EQ(context->GetPixel(-origin, -origin), 100u);
        context->DrawPixel(kMax, kMin);
        EXPECT_EQ(context->GetPixel(kMin, kMax), 0u);
        context->SetForeColor(200);
        context->DrawLine(kMax, kMax, kMin, kMin);
        EXPECT_EQ(context->GetPixel(1 - origin, 1 - origin), 200u);
        context->DrawArc(kMax - 2, kMax - 2, 5, 5, kMin, kMin);
        context->FillArc(kMin, 0, kMax, 2, kMax, 100);
        context->FillArc(-50, -1'000'000, 100, 1'000'001, 0, 23040);
        context->ExcludeClipRect(all);
        EXPECT_EQ(ClipRect(*context), (GrRect{-origin, -origin, -origin, -origin}));
    }
    context->ResetClipRegion();
    for (int const origin : {kMin, -1, 0, 1, kMax})
        for (GrRect const& rect : {all, {kMax, kMax, kMin, kMin}, {5, 0, -5, 9}}) {
            context->SetOrigin(origin, origin);
            context->CopyFromContext(rect, context.get(), kMax, kMin);
            context->CopyFromContext(rect, nullptr, 0, 0);
            context->DrawBitmap(rect.x1, rect.y1, GrBitmap(0, 0));
            context->DrawImageDirect({5, 0, -5, 9}, image, 0, 0);
            context->DrawImageAlpha(rect, nullptr, kMin, kMax, {true, false, true, 9});
        }
    context->SetBaseOrigin(kMin, kMin);
    context->SetOrigin(-1, -1);
    int x = 0, y = 0;
    context->GetOrigin(x, y);
    EXPECT_EQ(x, 0) << "stopped at the end of the range";
}

TEST(LoadTime, StateStandsBeforeAnySession)
{
    EXPECT_EQ(GrScreen.fbFd, -1);
    EXPECT_EQ(mouseFd, -1);
    EXPECT_EQ(mouseButtons, 7u);
    EXPECT_EQ(emulatedButtons, 7u);
    EXPECT_EQ(hideCount, 1u);
    auto const lockTwice = [](auto& mutex) {
        std::scoped_lock const once(mutex);
        EXPECT_TRUE(mutex.try_lock()) << "recursive";
        mutex.unlock();
    };
    lockTwice(screenMutex);
    lockTwice(grabMutex);
}

bool FreeForOthers()
{
    auto const tryLock = [] { return std::unique_lock(screenMutex, std::try_to_lock).owns_lock(); };
    return std::async(std::launch::async, tryLock).get();
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
    static constexpr GrRect kInside{2, 2, 4, 4};
    struct Case {
        bool waits;
        void (*draw)(GrContext& c);
    };
    hideCount = 0;
    for (Case const& test : {Case{true, [](auto& c) { c.FillRegion(GrRegion()); }},
             Case{true, [](auto& c) { c.FillRegion(kInside); }},
             Case{true, [](auto& c) { c.DrawLine(1, 1, 1, 5); }},
             Case{false, [](auto& c) { c.DrawLine(16, 1, 20, 5); }},
             Case{false, [](auto& c) { c.DrawArc(9, 9, 20, 20, 0, 5760); }},
             Case{true, [](auto& c) { c.FillArc(9, 9, 20, 20, 5760, 5760); }},
             Case{false, [](auto& c) { c.FillArc(50, 50, 20, 20, 100, 200); }},
             Case{true, [](auto& c) { c.FillArc(0, -8, 20, 20, 5760, 2000); }},
             Case{true, [](auto& c) { c.DrawPixel(1, 1); }}, Case{false, [](auto& c) { c.DrawPixel(16, 1); }},
             Case{true, [](auto& c) { c.GetPixel(1, 1); }}, Case{false, [](auto& c) { c.GetPixel(1, -1); }},
             Case{true, [](auto& c) { c.FillRegionAlpha(kInside, 9); }},
             Case{true, [](auto& c) { c.CopyFromContext(kInside, &c, 0, 0); }},
             Case{false, [](auto& c) { c.DrawImageAlphaDirect(kInside, nullptr, 0, 0, {}); }}}) {
        screenMutex.lock();
        auto const drawn = std::async(std::launch::async, [&] { test.draw(*context); });
        if (test.waits)
            EXPECT_EQ(drawn.wait_for(std::chrono::milliseconds(30)), std::future_status::timeout);
        else
            drawn.wait();
        screenMutex.unlock();
    }
    hideCount = 1;
    GrScreen = {};
}

}
