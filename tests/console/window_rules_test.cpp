#include <support/on_console.h>
#include <support/region_judge.h>
#include <support/region_text.h>
#include <tessella.h>
#include <tessella/window_state.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <deque>
#include <random>
#include <sstream>

namespace {

/// The texts of failed assertions, a line for each headline.
std::string Reports(std::string const& log)
{
    std::istringstream lines(log);
    std::string texts;
    static constexpr std::string_view kFailed = "Assertion failed: ";
    for (std::string line; std::getline(lines, line);) {
        if (line.starts_with("-- ")) texts += '\n' + line.substr(3) + ": ";
        if (line.starts_with(kFailed))
            texts += line.substr(kFailed.size(), line.find(", file") - kFailed.size()) + "; ";
    }
    return texts;
}

TEST(Windows, MisuseIsReportedAndHarmless)
{
    auto const outcome = OnConsole("64x48x16", nullptr, [](console::VirtualConsole&) {
        GrWindow::RootWindow();
        GrWindow::SetCallback(nullptr);
        Sizes sizes;
        ASSERT_TRUE(Init(sizes));
        GrWindow& root = *GrWindow::RootWindow();
        GrWindow::InitWindows();  // on a root that is visible
        std::fputs("-- no parent, no callback\n", stderr);
        {
            GrWindow orphan(nullptr, 1, 2, 3, 4, nullptr);
            orphan.Show();
            orphan.Raise();
            orphan.Lower();
            orphan.Move(9, 9);
            delete orphan.GetContext();
        }
        std::fputs("-- linked in twice\n", stderr);
        GrWindow::SetCallback([](GrEvent const&) {});
        {
            GrWindow lower(&root, 0, 0, 9, 9, nullptr), upper(&root, 0, 0, 9, 9, nullptr);
            upper.InsertToParent();
            lower.InsertToParent();
            EXPECT_TRUE(root.first == &lower && root.last == &upper && lower.next == &upper && !upper.next);
            upper.RemoveFromParent();
            upper.RemoveFromParent();
            EXPECT_TRUE(root.first == &lower && root.last == &lower && upper.parent == &root);
            lower.SetParent(nullptr);
            EXPECT_TRUE(!root.first && !root.last);
            lower.parent = &root;
            root.SetParent(&upper);
            EXPECT_FALSE(root.parent);
        }
        std::fputs("-- the root\n", stderr);
        root.Move(5, 5);
        root.Lower();
        root.SetWindowRegion(GrRect{1, 1, 2, 2});
        EXPECT_EQ(root.bounds, (GrRect{0, 0, 64, 48}));
        auto* const parent = new GrWindow(&root, 0, 0, 9, 9, nullptr);
        GrWindow child(parent, 0, 0, 9, 9, nullptr);
        std::fputs("-- children left\n", stderr);
        delete parent;
        EXPECT_EQ(child.parent, nullptr);
        std::fputs("-- the end\n", stderr);
        GrEvent event;
        GrRegion off = GrRect{100, 100, 101, 101};
        EXPECT_TRUE(GrWindow::GetPaintEvent(&event, off));
        GrDone();
        child.FreeContext(child.GetContext());  // of a screen that is gone
    });
    EXPECT_EQ(Reports(outcome.err),
        "Screen->IsVisible(); Screen->IsVisible(); callback != 0; !Screen->IsVisible(); "
        "\nno parent, no callback: p != 0; Callback != 0; parent!=0; parent != 0; parent != 0; parent != 0; "
        "parent != 0; Callback != 0; parent!=0; "
        "\nlinked in twice: next==0; prev==0; nparent!=0; parent!=0; parent!=0; "
        "\nthe root: parent != 0; parent != 0; "
        "\nchildren left: first == 0; last == 0; "
        "\nthe end: window != 0; reg; Callback != 0; parent!=0; ");
}

/// A shape of rectangles thrown anywhere, mostly with gaps between its rows.
GrRegion Scattered(std::mt19937& random)
{
    GrRegion shape;
    for (int i = 0; i < 4; ++i) {
        int const x = static_cast<int>(random() % 24), y = static_cast<int>(random() % 24);
        shape +=
            GrRect{x, y, x + 1 + static_cast<int>(random() % 12), y + 1 + static_cast<int>(random() % 6)};
    }
    return shape;
}

PlainRegion const& Plain(GrRegion const& region) { return static_cast<PlainRegion const&>(region); }

/// The steps of a clip, carried out with plain merges.
void PlainClip(
    PlainRegion& out, GrWindow const& window, GrWindow const* stop, bool fromValid, bool withShadow)
{
    if (!window.IsVisible()) return out.Clear();
    if (!window.parent) {
        if (fromValid)
            out = Plain(ValidRegion);
        else
            out = window.bounds;
    } else {
        PlainClip(out, *window.parent, &window, fromValid, withShadow);
        PlainRegion extent;
        extent = Plain(window.region);
        if (withShadow && window.shadow) extent += Plain(*window.shadow);
        out &= extent;
    }
    for (GrWindow const* child = window.first; child && child != stop && out; child = child->next)
        if (child->IsVisible()) {
            out -= Plain(child->region);
            if (withShadow && child->shadow) out -= Plain(*child->shadow);
        }
}

TEST(Windows, ShapesWithGapsGetTheirPaintAndTheStatedBands)
{
    OnConsole("40x36x16", nullptr, [](console::VirtualConsole&) {
        setenv("VELLUM_SAFE_ASSERT", "none", 1);  // merges with gaps report what they find
        Sizes sizes;
        ASSERT_TRUE(Init(sizes));
        GrWindow::SetCallback([](GrEvent const& event) {  // paint is that of shadows
            if (event.type != GrEventPaint) return;
            GrContext* const context = event.window->GetContext();
            context->FillRegion(GrRect{-99, -99, 99, 99});
            event.window->FreeContext(context);
        });
        std::mt19937 random(7);
        std::deque<GrWindow> windows;
        for (int i = 0; i < 8; ++i) {
            GrWindow* const parent =
                i < 4 ? GrWindow::RootWindow() : &windows[static_cast<std::size_t>(i) - 4];
            windows.emplace_back(parent, 0, 0, 9, 9, nullptr).Show();
        }
        for (int round = 0; round < 400; ++round) {
            for (GrWindow& window : windows) {
                window.Move(static_cast<int>(random() % 30) - 5, static_cast<int>(random() % 30) - 5);
                window.SetWindowRegion(Scattered(random));
                window.SetShadowed(random() % 2 == 0);
                if (random() % 2 == 0) window.Raise();
                if (random() % 4 == 0) window.Lower();
                if (!window.shadow) continue;
                PlainRegion shadow;
                shadow = Plain(window.region);
                shadow.Offset(5, 5);
                shadow -= Plain(window.region);
                ASSERT_EQ(BandsText(*window.shadow), BandsText(shadow));
            }
            GrRegion anywhere = Scattered(random);
            windows[0].DrawShadow(anywhere);  // comes to an end
            GrEvent event;
            for (int events = 0; GrWindow::GetPaintEvent(nullptr); ++events) {
                for (GrWindow& window : windows)
                    for (unsigned const flags : {0u, 1u, 2u, 3u}) {
                        bool const fromValid = (flags & 1) != 0, withShadow = (flags & 2) != 0;
                        GrRegion clip;
                        PlainRegion plain;
                        GrWindow const* const stop = random() % 2 == 0 ? window.first : nullptr;
                        window.DoGetClipRegion(clip, stop, fromValid, withShadow);
                        PlainClip(plain, window, stop, fromValid, withShadow);
                        ASSERT_EQ(BandsText(clip), BandsText(plain));
                    }
                GrRegion before = Screen.bounds;
                before -= ValidRegion;
                int x, y;
                before.GetSomePoint(x, y);
                ASSERT_TRUE(GrWindow::GetPaintEvent(&event));
                GrRegion after = Screen.bounds;
                after -= ValidRegion;
                ASSERT_FALSE(after.Contains(x, y)) << "round " << round;
                ASSERT_LT(events, 40 * 36) << "a pass ends";
            }
        }
        while (!windows.empty())
            windows.pop_back();
        GrDone();
    });
}

TEST(Windows, AHandlerThatThrowsInAShadowLeavesTheScreenUsable)
{
    OnConsole("40x36x16", nullptr, [](console::VirtualConsole& virtualConsole) {
        Sizes sizes;
        ASSERT_TRUE(Init(sizes));
        GrWindow::SetCallback([](GrEvent const& event) {
            if (event.type == GrEventPaint && event.window == GrWindow::RootWindow()) throw std::bad_alloc();
        });
        GrWindow window(GrWindow::RootWindow(), 4, 4, 2000000000, 20, nullptr);
        window.SetShadowed(true);
        window.Show();
        GrEvent event;
        EXPECT_THROW(while (GrWindow::GetPaintEvent(&event)), std::bad_alloc);
        EXPECT_EQ(GrWindow::RootWindow()->context, nullptr);
        GrScreen.context->SetForeColor(GrMakeColor(255, 255, 255));
        GrScreen.context->FillRegion(GrRect{0, 0, 40, 36});
        EXPECT_EQ(virtualConsole.Screen().At(0, 0), 0xFFFFFFu);
        GrWindow::SetCallback([](GrEvent const&) {});
        window.Hide();
        GrDone();
    });
}

}
