#include <bench/pixman_region.h>
#include <bench/rows.h>
#include <bench/shapes.h>

#include <benchmark/benchmark.h>
#include <pixman.h>

#include <memory>

// Regions changed by one rectangle at a time, in a region of the contender's own that begins and ends with
// each pass. pixman has unions and intersections with a rectangle; for a subtraction, its users put the
// rectangle into a region on the stack, which allocates nothing.

namespace {

/// What one pass starts from, and the rectangles that it applies.
struct Task {
    GrRegion start;
    PixmanRegion theirStart;
    std::vector<GrRect> rects;

    Task(GrRegion const& region, std::vector<GrRect> rectangles)
        : start(region), theirStart(NewPixmanRegion(region)), rects(std::move(rectangles))
    {}
};

unsigned Width(GrRect const& rect) { return static_cast<unsigned>(rect.x2 - rect.x1); }
unsigned Height(GrRect const& rect) { return static_cast<unsigned>(rect.y2 - rect.y1); }

struct Union {
    static void Apply(GrRegion& region, GrRect const& rect) { region += rect; }
    static void Apply(pixman_region32_t* region, GrRect const& rect)
    {
        pixman_region32_union_rect(region, region, rect.x1, rect.y1, Width(rect), Height(rect));
    }
};

struct Subtraction {
    static void Apply(GrRegion& region, GrRect const& rect) { region -= rect; }
    static void Apply(pixman_region32_t* region, GrRect const& rect)
    {
        pixman_region32_t cut;
        pixman_region32_init_rect(&cut, rect.x1, rect.y1, Width(rect), Height(rect));
        pixman_region32_subtract(region, region, &cut);
        pixman_region32_fini(&cut);
    }
};

struct Intersection {
    static void Apply(GrRegion& region, GrRect const& rect) { region &= rect; }
    static void Apply(pixman_region32_t* region, GrRect const& rect)
    {
        pixman_region32_intersect_rect(region, region, rect.x1, rect.y1, Width(rect), Height(rect));
    }
};

enum class Check { Pixels, None };

template <typename Operation>
void AddRow(std::string const& row, Check check, std::shared_ptr<Task const> const& task)
{
    AddContender(row, kOurs, [task](benchmark::State& state) {
        for (auto _ : state) {
            GrRegion region(task->start);
            for (GrRect const& rect : task->rects)
                Operation::Apply(region, rect);
            benchmark::DoNotOptimize(region.bands.items);
        }
    });
    AddContender(row, kPixman, [task](benchmark::State& state) {
        for (auto _ : state) {
            pixman_region32_t region;
            pixman_region32_init(&region);
            pixman_region32_copy(&region, task->theirStart.get());
            for (GrRect const& rect : task->rects)
                Operation::Apply(&region, rect);
            benchmark::DoNotOptimize(region.data);
            pixman_region32_fini(&region);
        }
    });
    if (check == Check::None) return;
    GrRegion ours(task->start);
    PixmanRegion const theirs = NewPixmanRegion(task->start);
    for (GrRect const& rect : task->rects) {
        Operation::Apply(ours, rect);
        Operation::Apply(theirs.get(), rect);
    }
    ExpectSame(SamePixels(ours, theirs.get()), row);
}

/// One within the other, from the field to the middle of it.
std::vector<GrRect> NestedFrames(GrRect const& field, int count)
{
    std::vector<GrRect> frames;
    for (int i = 1; i <= count; ++i) {
        int const x = (field.x2 - field.x1) / 4 * i / count;
        int const y = (field.y2 - field.y1) / 4 * i / count;
        frames.push_back({field.x1 + x, field.y1 + y, field.x2 - x, field.y2 - y});
    }
    return frames;
}

GrRegion UnionOf(std::vector<GrRect> const& rects)
{
    GrRegion region;
    for (GrRect const& rect : rects)
        region += rect;
    return region;
}

}

void AddRows()
{
    GrRegion const screen(GrRect{0, 0, kScreenWidth, kScreenHeight});
    for (int const count : {10, 100, 1'000, 10'000}) {
        std::string const n = ", n = " + std::to_string(count);
        auto const random = RandomRects(count);
        auto const sparse = SparseRects(count);
        GrRect const field = SparseField(count);
        auto const task = [](GrRegion const& start, std::vector<GrRect> const& rects) {
            return std::make_shared<Task const>(start, rects);
        };
        // The largest would take longer to check than to measure.
        Check const check = count < 10'000 ? Check::Pixels : Check::None;
        // In random order, unions leave holes in the list of bands, and what merges with such a list has a
        // result of its own, which is no set of pixels.
        AddRow<Union>("unions, random rectangles" + n, Check::None, task({}, random));
        AddRow<Union>("unions, sparse rectangles" + n, check, task({}, sparse));
        AddRow<Subtraction>("subtractions, random rectangles" + n, check, task(screen, random));
        AddRow<Subtraction>("subtractions, sparse rectangles" + n, check, task(field, sparse));
        AddRow<Intersection>("intersections, sparse region with nested rectangles" + n, check,
            task(UnionOf(sparse), NestedFrames(field, count)));
    }
}
