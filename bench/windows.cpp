#include <bench/pixman_region.h>
#include <bench/rows.h>
#include <bench/shapes.h>

#include <benchmark/benchmark.h>
#include <pixman.h>

#include <memory>

// The visible regions of all windows of a tree, computed afresh for each window in the order that the tree
// has: from the root downward, at every level the siblings above the path are subtracted, topmost first and
// until nothing is left, and then the next window of the path cuts its own shape out of what remains.

namespace {

struct OurRegions {
    using Region = GrRegion;
    static void Assign(Region& out, GrRect const& rect) { out = rect; }
    static void Subtract(Region& out, Region const& region) { out -= region; }
    static void Intersect(Region& out, Region const& region) { out &= region; }
    static bool HoldsPixels(Region const& region) { return static_cast<bool>(region); }
};

struct PixmanRegions {
    struct Region {
        Region() { pixman_region32_init(&region); }
        ~Region() { pixman_region32_fini(&region); }
        Region(Region const&) = delete;
        pixman_region32_t region;
    };
    static void Assign(Region& out, GrRect const& rect)
    {
        pixman_box32_t const box{rect.x1, rect.y1, rect.x2, rect.y2};
        pixman_region32_reset(&out.region, &box);
    }
    static void Subtract(Region& out, Region const& region)
    {
        pixman_region32_subtract(&out.region, &out.region, &region.region);
    }
    static void Intersect(Region& out, Region const& region)
    {
        pixman_region32_intersect(&out.region, &out.region, &region.region);
    }
    static bool HoldsPixels(Region const& region) { return pixman_region32_not_empty(&region.region) != 0; }
};

template <typename Regions>
struct Window {
    typename Regions::Region shape;
    GrRect bounds{};
    Window* parent = nullptr;
    Window* first = nullptr;  // the topmost child
    Window* next = nullptr;   // the sibling below
};

template <typename Regions>
void GetClip(Window<Regions> const& window, Window<Regions> const* stop, typename Regions::Region& out)
{
    if (window.parent == nullptr) {
        Regions::Assign(out, window.bounds);
    } else {
        GetClip<Regions>(*window.parent, &window, out);
        Regions::Intersect(out, window.shape);
    }
    for (auto const* child = window.first; child != nullptr && child != stop && Regions::HoldsPixels(out);
         child = child->next)
        Regions::Subtract(out, child->shape);
}

/// The root and, behind it in the list, `count` windows, of which each lies on top of those before. Of every
/// `family` windows the first lies in the root and the others in the first.
template <typename Regions>
std::vector<Window<Regions>> Tree(int count, int family)
{
    std::vector<Window<Regions>> windows(static_cast<std::size_t>(count) + 1);
    windows[0].bounds = {0, 0, kScreenWidth, kScreenHeight};
    for (int i = 0; i < count; ++i) {
        int const place = i % family;
        Window<Regions>& window = windows[static_cast<std::size_t>(i) + 1];
        window.parent = place == 0 ? &windows[0] : &window - place;
        bool const hasChildren = place == 0 && family > 1;
        window.bounds =
            RectSource(static_cast<std::uint32_t>(i), window.parent->bounds, hasChildren ? 600 : 300).Next();
        Regions::Assign(window.shape, window.bounds);
        window.next = window.parent->first;
        window.parent->first = &window;
    }
    return windows;
}

template <typename Regions>
void AddContenderFor(std::string const& row, char const* contender, int count, int family)
{
    auto const windows = std::make_shared<std::vector<Window<Regions>>>(Tree<Regions>(count, family));
    AddContender(row, contender, [windows](benchmark::State& state) {
        for (auto _ : state) {
            for (auto const& window : *windows) {
                typename Regions::Region clip;
                GetClip<Regions>(window, nullptr, clip);
                benchmark::DoNotOptimize(clip);
            }
        }
    });
}

void AddRow(std::string const& row, int count, int family)
{
    AddContenderFor<OurRegions>(row, kOurs, count, family);
    AddContenderFor<PixmanRegions>(row, kPixman, count, family);

    auto const ours = Tree<OurRegions>(count, family);
    auto const theirs = Tree<PixmanRegions>(count, family);
    for (std::size_t i = 0; i < ours.size(); ++i) {
        GrRegion ourClip;
        GetClip<OurRegions>(ours[i], nullptr, ourClip);
        PixmanRegions::Region theirClip;
        GetClip<PixmanRegions>(theirs[i], nullptr, theirClip);
        ExpectSame(SamePixels(ourClip, &theirClip.region), row);
    }
}

}

void AddRows()
{
    for (int const count : {10, 100, 1'000})
        AddRow("visible regions, " + std::to_string(count) + " windows", count, 1);
    for (int const count : {10, 100, 1'000})
        AddRow("visible regions, " + std::to_string(count) + " windows in families of 10", count, 10);
}
