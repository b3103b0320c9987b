#include <bench/pixman_region.h>
#include <bench/rows.h>
#include <bench/shapes.h>
#include <tessella/region_cut.h>

#include <benchmark/benchmark.h>
#include <pixman.h>

#include <memory>

// What every drawing operation begins with: the part of a rectangle that the clip lets through, in a region
// that is needed until the pixels are painted. We borrow one for that time; pixman's stays from pass to pass.

namespace {

struct Clip {
    Clip(int ranges) : ours(ScreenWithHoles(7, ranges)), theirs(NewPixmanRegion(ours)) {}
    GrRegion ours;
    PixmanRegion theirs;
};

void Cut(pixman_region32_t* result, pixman_region32_t* clip, GrRect const& rect)
{
    pixman_region32_intersect_rect(result, clip, rect.x1, rect.y1, static_cast<unsigned>(rect.x2 - rect.x1),
        static_cast<unsigned>(rect.y2 - rect.y1));
}

void AddCutRow(std::string const& row, std::shared_ptr<Clip const> const& clip, RectLoop cuts)
{
    AddContender(row, kOurs, [clip, cuts](benchmark::State& state) {
        RectLoop next = cuts;
        for (auto _ : state) {
            LocalRegion local;
            CutRegion(local.Get(), clip->ours, next.Next());
            benchmark::DoNotOptimize(local.Get().bands.items);
        }
    });
    AddContender(row, kPixman, [clip, cuts](benchmark::State& state) {
        RectLoop next = cuts;
        PixmanRegion const local = NewPixmanRegion();
        for (auto _ : state) {
            Cut(local.get(), clip->theirs.get(), next.Next());
            benchmark::DoNotOptimize(local->data);
        }
    });
    PixmanRegion const theirs = NewPixmanRegion();
    for (int i = 0; i < RectLoop::kCount; ++i) {
        GrRect const rect = cuts.Next();
        LocalRegion ours;
        CutRegion(ours.Get(), clip->ours, rect);
        Cut(theirs.get(), clip->theirs.get(), rect);
        ExpectSame(SamePixels(ours.Get(), theirs.get()), row);
    }
}

}

void AddRows()
{
    for (int const ranges : {1, 10, 100, 1'000}) {
        auto const clip = std::make_shared<Clip const>(ranges);
        std::string const size = ", clip of " + std::to_string(ranges) + (ranges == 1 ? " range" : " ranges");
        AddCutRow("cut of 16x16" + size, clip, {16, 16});
        AddCutRow("cut of 300x200" + size, clip, {300, 200});
        AddCutRow("cut of 1000x700" + size, clip, {1000, 700});
    }
}
