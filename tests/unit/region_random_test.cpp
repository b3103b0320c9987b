#include <support/region_judge.h>
#include <support/region_text.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <functional>
#include <random>
#include <set>
#include <sstream>

// Random lists of operations on a few regions, done by the library and by the plain steps. After each one the
// two must agree in everything that a region records, and must have raised the same assertions. A list that
// fails is shrunk and printed in the form that kReplay takes.

namespace {

enum Kind {
    AddRect,
    SubtractRect,
    IntersectRect,
    AddRegion,
    SubtractRegion,
    IntersectRegion,
    SetRect,
    SetRegion,
    Move,
    Clear
};
constexpr char const* kKindNames[] = {"AddRect", "SubtractRect", "IntersectRect", "AddRegion",
    "SubtractRegion", "IntersectRegion", "SetRect", "SetRegion", "Move", "Clear"};
constexpr int kRegions = 3;
constexpr int kMostBands =
    1000;  // lists with overlapping bands can double with every union: they start again

struct Operation {
    Kind kind;
    int target, other;
    GrRect rect;
};
using Operations = std::vector<Operation>;

/// Paste a shrunk list here to step through it.
Operations const kReplay = {};

std::string Text(Operations const& operations)
{
    std::ostringstream out;
    for (Operation const& o : operations)
        out << "    {" << kKindNames[o.kind] << ", " << o.target << ", " << o.other << ", {" << o.rect.x1
            << ", " << o.rect.y1 << ", " << o.rect.x2 << ", " << o.rect.y2 << "}},\n";
    return out.str();
}

void ByLibrary(std::array<GrRegion, kRegions>& regions, Operation const& o)
{
    GrRegion& target = regions[static_cast<std::size_t>(o.target)];
    GrRegion const& other = regions[static_cast<std::size_t>(o.other)];
    switch (o.kind) {
    case AddRect: target += o.rect; break;
    case SubtractRect: target -= o.rect; break;
    case IntersectRect: target &= o.rect; break;
    case AddRegion: target += other; break;
    case SubtractRegion: target -= other; break;
    case IntersectRegion: target &= other; break;
    case SetRect: target = o.rect; break;
    case SetRegion: target = other; break;
    case Move: target.Offset(o.rect.x1, o.rect.y1); break;
    case Clear: target.Clear(); break;
    }
}

void ByJudge(std::array<GrRegion, kRegions>& regions, Operation const& o)
{
    GrRegion& target = regions[static_cast<std::size_t>(o.target)];
    GrRegion const& other = regions[static_cast<std::size_t>(o.other)];
    switch (o.kind) {
    case AddRect: judge::Add(target, o.rect); break;
    case SubtractRect: judge::Subtract(target, o.rect); break;
    case IntersectRect: judge::Intersect(target, o.rect); break;
    case AddRegion: judge::Add(target, other); break;
    case SubtractRegion: judge::Subtract(target, other); break;
    case IntersectRegion: judge::Intersect(target, other); break;
    case SetRect: judge::Assign(target, o.rect); break;
    case SetRegion: judge::Assign(target, other); break;
    case Move: target.Offset(o.rect.x1, o.rect.y1); break;
    case Clear: target.Clear(); break;
    }
}

/// What the library and the judge disagree about after some operation, or "".
std::string Difference(Operations const& operations)
{
    std::array<GrRegion, kRegions> ours;
    std::array<GrRegion, kRegions> theirs;
    TakeAssertions();
    judge::TakeReports();
    for (Operation const& o : operations) {
        ByLibrary(ours, o);
        ByJudge(theirs, o);
        auto const target = static_cast<std::size_t>(o.target);
        auto const state = [target](auto const& regions, auto const& reports) {
            std::string text =
                BandsText(regions[target]) + "\n  capacities " + CapacitiesText(regions[target]) + "\n";
            for (std::string const& report : reports)
                text += "  " + report + "\n";
            return text;
        };
        std::string const we = state(ours, TakeAssertions());
        std::string const they = state(theirs, judge::TakeReports());
        if (we != they) return std::string("library: ").append(we).append("judge:   ").append(they);
        if (ours[target].bands.item_count > kMostBands) {
            ours[target].Clear();
            theirs[target].Clear();
        }
    }
    return "";
}

/// Leaves out operations, in ever smaller pieces, as long as the list still fails.
Operations Shrunk(Operations operations, std::function<std::string(Operations const&)> const& failure)
{
    for (std::size_t piece = operations.size(); piece > 0; piece /= 2) {
        for (std::size_t at = 0; at + piece <= operations.size();) {
            Operations fewer = operations;
            auto const first = fewer.begin() + static_cast<std::ptrdiff_t>(at);
            fewer.erase(first, first + static_cast<std::ptrdiff_t>(piece));
            if (failure(fewer).empty())
                at += piece;
            else
                operations = fewer;
        }
    }
    return operations;
}

/// Runs lists of operations until `total` have been done; `span` is the extent of coordinates.
void ExpectNoFailure(int total, std::vector<int> const& lengths, std::vector<int> const& spans,
    std::vector<int> const& kinds, std::function<std::string(Operations const&)> const& failure)
{
    std::uint32_t const seed = std::random_device{}();
    std::printf("seed %u\n", seed);
    std::mt19937 random(seed);
    auto const below = [&random](int n) { return static_cast<int>(random() % static_cast<unsigned>(n)); };
    for (int done = 0; done < total;) {
        int const length = lengths[static_cast<std::size_t>(below(static_cast<int>(lengths.size())))];
        int const span = spans[static_cast<std::size_t>(below(static_cast<int>(spans.size())))];
        int const largest = 1 + below(span);
        Operations operations;
        for (int i = 0; i < length; ++i) {
            auto const kind =
                static_cast<Kind>(kinds[static_cast<std::size_t>(below(static_cast<int>(kinds.size())))]);
            int const x = below(span) - span / 4;
            int const y = below(span) - span / 4;
            operations.push_back(
                {kind, below(kRegions), below(kRegions), {x, y, x + below(largest), y + below(largest)}});
            if (kind == Move) operations.back().rect = {below(7) - 3, below(7) - 3, 0, 0};
        }
        if (!failure(operations).empty()) {
            Operations const few = Shrunk(operations, failure);
            FAIL() << "seed " << seed << "\n" << Text(few) << failure(few);
        }
        done += length;
    }
}

/// The pixels of a region, row by row.
using Pixels = std::set<std::pair<int, int>>;

Pixels PixelsOf(GrRect const& rect)
{
    Pixels pixels;
    for (int y = rect.y1; y < rect.y2; ++y)
        for (int x = rect.x1; x < rect.x2; ++x)
            pixels.emplace(y, x);
    return pixels;
}

Pixels PixelsOf(GrRegion const& region)
{
    Pixels pixels;
    for (int i = 0; i < region.bands.item_count; ++i) {
        GrRegion::Band const& band = region.bands.items[i];
        for (int k = 0; k < band.item_count; ++k)
            pixels.merge(PixelsOf(GrRect{band.items[k].r1, band.r1, band.items[k].r2, band.r2}));
    }
    return pixels;
}

/// True if the bands do not follow one on the other, so that merges no longer promise sets of pixels.
bool HasHole(GrRegion const& region)
{
    for (int i = 0; i < region.bands.item_count; ++i) {
        GrRegion::Band const& band = region.bands.items[i];
        if (band.r1 >= band.r2 || (i > 0 && (&band)[-1].r2 != band.r1)) return true;
    }
    return false;
}

int judgedByPixels = 0;

/// As above, with sets of pixels as the judge. Operations with regions that have a vertical hole are not
/// judged.
std::string PixelDifference(Operations const& operations)
{
    std::array<GrRegion, kRegions> regions;
    for (Operation const& o : operations) {
        GrRegion& target = regions[static_cast<std::size_t>(o.target)];
        bool const withRegion = o.kind == AddRegion || o.kind == SubtractRegion || o.kind == IntersectRegion;
        GrRegion const other = withRegion ? regions[static_cast<std::size_t>(o.other)] : GrRegion(o.rect);
        if (HasHole(target)) target = GrRect{0, 0, 20, 20};
        Pixels expected;
        Pixels const a = PixelsOf(target);
        Pixels const b = PixelsOf(other);
        auto const into = std::inserter(expected, expected.end());
        switch (o.kind) {
        case AddRect:
        case AddRegion: std::set_union(a.begin(), a.end(), b.begin(), b.end(), into); break;
        case SubtractRect:
        case SubtractRegion: std::set_difference(a.begin(), a.end(), b.begin(), b.end(), into); break;
        default: std::set_intersection(a.begin(), a.end(), b.begin(), b.end(), into); break;
        }
        ByLibrary(regions, o);
        if (HasHole(other)) continue;
        ++judgedByPixels;
        if (PixelsOf(target) != expected) return "wrong pixels: " + BandsText(target) + "\n";
        GrRect outer{};
        target.GetOuterRect(outer);
        for (int y = outer.y1 - 1; y <= outer.y2; ++y)
            for (int x = outer.x1 - 1; x <= outer.x2; ++x)
                if (target.Contains(x, y) != expected.contains({y, x}))
                    return "Contains: " + BandsText(target) + "\n";
        int x = 0;
        int y = 0;
        target.GetSomePoint(x, y);
        if (target ? std::pair(y, x) != *expected.begin() : x != 0 || y != 0 || !expected.empty())
            return "GetSomePoint: " + BandsText(target) + "\n";
    }
    return "";
}

constexpr int kEveryKind[] = {AddRect, AddRect, AddRect, SubtractRect, SubtractRect, IntersectRect, AddRegion,
    SubtractRegion, SubtractRegion, IntersectRegion, SetRect, SetRegion, Move, Clear};
constexpr int kMostlyRects[] = {AddRect, AddRect, AddRect, AddRect, AddRect, AddRect, SubtractRect,
    SubtractRect, SubtractRect, AddRegion, SubtractRegion, SetRegion, Move, Move, Move, Move};
constexpr int kMerges[] = {
    AddRect, AddRect, SubtractRect, IntersectRect, AddRegion, SubtractRegion, IntersectRegion};

}

TEST(RegionRandom, MergesEqualThePlainSteps)
{
    CollectAssertions();
    EXPECT_EQ(Difference(kReplay), "");
    ExpectNoFailure(
        200'000, {5, 20, 60}, {6, 12, 40}, {std::begin(kEveryKind), std::end(kEveryKind)}, Difference);
}

TEST(RegionRandom, LargeListsEqualThePlainSteps)
{
    CollectAssertions();
    ExpectNoFailure(
        20'000, {200, 1000}, {100, 400}, {std::begin(kMostlyRects), std::end(kMostlyRects)}, Difference);
}

TEST(RegionRandom, MergesEqualSetsOfPixels)
{
    CollectAssertions();
    ExpectNoFailure(20'000, {10, 40}, {8, 20}, {std::begin(kMerges), std::end(kMerges)}, PixelDifference);
    EXPECT_GT(judgedByPixels, 10'000);
}
