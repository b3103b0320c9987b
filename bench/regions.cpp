#include <bench/pixman_region.h>
#include <bench/rows.h>
#include <bench/shapes.h>

#include <benchmark/benchmark.h>
#include <pixman.h>

#include <array>
#include <memory>

// Two complex regions, whose result goes into a third one that lives on, storage and all, from pass to pass:
// what a user does to get a new region out of two. Our operators work in place, so for us that is a copy and
// the operation; pixman writes its result to where it is told.

namespace {

struct Pair {
    Pair(int ranges)
        : a(ComplexRegion(3, ranges)), b(ComplexRegion(4, ranges)), theirA(NewPixmanRegion(a)),
          theirB(NewPixmanRegion(b))
    {}
    GrRegion a, b;
    PixmanRegion theirA, theirB;
};

using Ours = GrRegion& (GrRegion::*)(GrRegion const&);
using Theirs = decltype(&pixman_region32_union);

void AddPairRow(std::string const& row, std::shared_ptr<Pair const> const& pair, Ours ours, Theirs theirs)
{
    AddContender(row, kOurs, [pair, ours](benchmark::State& state) {
        GrRegion result;
        for (auto _ : state) {
            result = pair->a;
            (result.*ours)(pair->b);
            benchmark::DoNotOptimize(result.bands.items);
        }
    });
    AddContender(row, kPixman, [pair, theirs](benchmark::State& state) {
        PixmanRegion const result = NewPixmanRegion();
        for (auto _ : state) {
            theirs(result.get(), pair->theirA.get(), pair->theirB.get());
            benchmark::DoNotOptimize(result->data);
        }
    });
    GrRegion ourResult(pair->a);
    (ourResult.*ours)(pair->b);
    PixmanRegion const theirResult = NewPixmanRegion();
    theirs(theirResult.get(), pair->theirA.get(), pair->theirB.get());
    ExpectSame(SamePixels(ourResult, theirResult.get()), row);
}

struct Point {
    int x, y;
};

/// The next of some points all over the screen, for ever.
class Points {
public:
    Points()
    {
        RectSource source(5, {0, 0, kScreenWidth, kScreenHeight}, 1);
        for (Point& point : points) {
            GrRect const pixel = source.Next();
            point = {pixel.x1, pixel.y1};
        }
    }
    Point Next() { return points[++last % points.size()]; }

private:
    std::array<Point, 1024> points{};
    std::size_t last = 0;
};

void AddPointRow(std::string const& row, std::shared_ptr<Pair const> const& pair)
{
    AddContender(row, kOurs, [pair](benchmark::State& state) {
        Points points;
        for (auto _ : state) {
            auto const [x, y] = points.Next();
            benchmark::DoNotOptimize(pair->a.Contains(x, y));
        }
    });
    AddContender(row, kPixman, [pair](benchmark::State& state) {
        Points points;
        for (auto _ : state) {
            auto const [x, y] = points.Next();
            benchmark::DoNotOptimize(pixman_region32_contains_point(pair->theirA.get(), x, y, nullptr));
        }
    });
}

}

void AddRows()
{
    for (int const ranges : {50, 500, 5'000}) {
        auto const pair = std::make_shared<Pair const>(ranges);
        std::string const size = ", " + std::to_string(ranges) + " ranges each";
        AddPairRow("region + region" + size, pair, &GrRegion::operator+=, pixman_region32_union);
        AddPairRow("region - region" + size, pair, &GrRegion::operator-=, pixman_region32_subtract);
        AddPairRow("region & region" + size, pair, &GrRegion::operator&=, pixman_region32_intersect);
        AddPointRow("point in region, " + std::to_string(ranges) + " ranges", pair);
    }
}
