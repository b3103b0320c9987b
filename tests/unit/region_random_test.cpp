#include <support/region_judge.h>
#include <support/region_text.h>
#include <support/seed.h>
#include <tessella/pixel/clip_walk.h>
#include <tessella/region_cut.h>

#include <gtest/gtest.h>

#include <array>
#include <bitset>
#include <random>
#include <sstream>

// Random lists of operations on a few regions. After each one the library must agree with a judge. A list
// that fails is shrunk and printed in the form that kReplay takes.

namespace {

/// With a rectangle: + - & =. With another region: u(nite) s(ubtract) i(ntersect) a(ssign). And m(ove),
/// c(lear).
struct Operation {
    char kind;
    int target, other;
    GrRect rect;
};
using Operations = std::vector<Operation>;
template <typename Region>
using Regions = std::array<Region, 3>;

/// What is wrong after some operation, or "".
using Judge = std::string(Operations const&);

/// Paste a shrunk list here to step through it.
Operations const kReplay = {};

template <typename Region>
Region& Perform(Regions<Region>& regions, Operation const& o)
{
    Region& target = regions.at(static_cast<std::size_t>(o.target));
    Region const& other = regions.at(static_cast<std::size_t>(o.other));
    if (target.bands.item_count > 1000) target.Clear();  // overlapping bands can double with every union
    switch (o.kind) {
    case '+': target += o.rect; break;
    case '-': target -= o.rect; break;
    case '&': target &= o.rect; break;
    case '=': target = o.rect; break;
    case 'u': target += other; break;
    case 's': target -= other; break;
    case 'i': target &= other; break;
    case 'a': target = other; break;
    case 'm': target.Offset(o.rect.x1, o.rect.y1); break;
    default: target.Clear();
    }
    return target;
}

std::string State(GrRegion const& region, std::vector<std::string> const& reports)
{
    std::string text = BandsText(region) + "\n  capacities " + CapacitiesText(region) + "\n";
    for (std::string const& report : reports)
        text.append("  ").append(report).append("\n");
    return text;
}

std::string AgainstPlainSteps(Operations const& operations)
{
    Regions<GrRegion> ours;
    Regions<PlainRegion> theirs;
    TakeAssertions();
    PlainRegion::TakeReports();
    for (Operation const& o : operations) {
        GrRegion const& our = Perform(ours, o);
        GrRegion const& their = Perform(theirs, o);
        std::string const we = State(our, TakeAssertions());
        std::string const they = State(their, PlainRegion::TakeReports());
        if (we != they) return std::string("library: ").append(we).append("judge:   ").append(they);
    }
    return "";
}

constexpr int kSide = 48, kLeast = -8;
using Pixels = std::bitset<kSide * kSide>;

Pixels PixelsOf(GrRegion const& region)
{
    Pixels pixels;
    for (int i = 0; i < region.bands.item_count; ++i)
        for (int k = 0; k < region.bands.items[i].item_count; ++k)
            for (int y = region.bands.items[i].r1; y < region.bands.items[i].r2; ++y)
                for (int x = region.bands.items[i].items[k].r1; x < region.bands.items[i].items[k].r2; ++x)
                    pixels.set(static_cast<std::size_t>((y - kLeast) * kSide + x - kLeast));
    return pixels;
}

/// True if the bands do not follow one on the other, so that merges no longer promise sets of pixels.
bool HasHole(GrRegion const& region)
{
    for (int i = 1; i < region.bands.item_count; ++i)
        if (GrRegion::Band const* b = &region.bands.items[i]; b->r1 >= b->r2 || b[-1].r2 != b->r1)
            return true;
    return false;
}

int judgedByPixels = 0;

std::string AgainstPixels(Operations const& operations)
{
    Regions<GrRegion> regions;
    for (Operation const& o : operations) {
        GrRegion& target = regions.at(static_cast<std::size_t>(o.target));
        bool const withRegion = std::string("usi").find(o.kind) != std::string::npos;
        GrRegion const other(withRegion ? regions.at(static_cast<std::size_t>(o.other)) : GrRegion(o.rect));
        if (HasHole(target)) target = GrRect{0, 0, 20, 20};
        Pixels const a = PixelsOf(target), b = PixelsOf(other);
        bool const unites = o.kind == '+' || o.kind == 'u', subtracts = o.kind == '-' || o.kind == 's';
        Pixels const expected = unites ? a | b : subtracts ? a & ~b : a & b;
        Perform(regions, o);
        if (HasHole(other)) continue;
        ++judgedByPixels;
        if (PixelsOf(target) != expected) return "wrong pixels: " + BandsText(target);
        for (int i = 0; i < kSide * kSide; ++i)
            if (target.Contains(i % kSide + kLeast, i / kSide + kLeast) !=
                expected[static_cast<std::size_t>(i)])
                return "Contains: " + BandsText(target);
    }
    return "";
}

/// Around all bands, those without ranges included; and whether some overlap.
struct Hull {
    GrRect around{1000, 1000, -1000, -1000};
    bool overlaps = false, upsideDown = false;

    explicit Hull(GrRegion const& region)
    {
        int bottom = -1000;
        for (auto const& b : BandsOf(region)) {
            upsideDown = upsideDown || b.r1 >= b.r2;
            overlaps = overlaps || upsideDown || b.r1 < bottom;
            bottom = b.r2;
            around.y1 = std::min({around.y1, b.r1, b.r2});
            around.y2 = std::max({around.y2, b.r1, b.r2});
            for (auto const& r : RangesOf(b)) {
                around.x1 = std::min(around.x1, r.r1);
                around.x2 = std::max(around.x2, r.r2);
            }
        }
    }
    bool Contains(Hull const& o) const
    {
        return o.around.x1 >= around.x1 && o.around.y1 >= around.y1 && o.around.x2 <= around.x2 &&
            o.around.y2 <= around.y2;
    }
};

/// A cut has the bands of a copy that is intersected, and is made in storage with traces of earlier ones.
/// Where bands overlap, an intersection may lie anywhere, but a cut is within what it is cut by.
std::string CutAgainstCopy(Operations const& operations)
{
    Regions<GrRegion> regions;
    GrRegion cut;
    for (Operation const& o : operations) {
        GrRegion const& region = Perform(regions, o);
        for (bool const byRect : {false, true}) {
            GrRegion const other(byRect ? o.rect : regions.at(static_cast<std::size_t>(o.other)));
            GrRegion expected(region);
            expected &= other;
            byRect ? CutRegion(cut, region, o.rect) : CutRegion(cut, region, other);
            Hull const whole(region), bounds(other), inner(cut);
            bool const right = whole.overlaps || bounds.overlaps ? bounds.Contains(inner) && !inner.upsideDown
                : expected                                       ? BandsText(cut) == BandsText(expected)
                                                                 : !cut;
            if (!right) return BandsText(region) + " was cut to " + BandsText(cut);
        }
    }
    TakeAssertions();
    return "";
}

/// Leaves out operations, in ever smaller pieces, as long as the list still fails.
Operations Shrunk(Operations operations, Judge& judge)
{
    for (std::size_t piece = operations.size(); piece > 0; piece /= 2) {
        for (std::size_t at = 0; at + piece <= operations.size();) {
            Operations fewer = operations;
            auto const first = fewer.begin() + static_cast<std::ptrdiff_t>(at);
            fewer.erase(first, first + static_cast<std::ptrdiff_t>(piece));
            if (judge(fewer).empty())
                at += piece;
            else
                operations = fewer;
        }
    }
    return operations;
}

/// Judges lists of operations until `total` have been done. A kind comes as often as it stands in `kinds`; a
/// span is the extent of coordinates.
void JudgeLists(int total, std::vector<int> const& lengths, std::vector<int> const& spans,
    std::string const& kinds, Judge& judge)
{
    CollectAssertions();
    EXPECT_EQ(judge(kReplay), "");
    unsigned const seed = NewSeed();
    std::mt19937 random(seed);
    auto const below = [&](auto n) { return static_cast<int>(random() % static_cast<unsigned>(n)); };
    auto const oneOf = [&](auto const& list) { return list[static_cast<std::size_t>(below(list.size()))]; };
    for (int done = 0; done < total;) {
        int const span = oneOf(spans), largest = 1 + below(span);
        Operations operations(static_cast<std::size_t>(oneOf(lengths)));
        for (Operation& o : operations) {
            int const x = below(span) - span / 4, y = below(span) - span / 4;
            o = {oneOf(kinds), below(3), below(3), {x, y, x + below(largest), y + below(largest)}};
            if (o.kind == 'm') o.rect = {below(7) - 3, below(7) - 3, 0, 0};
        }
        done += static_cast<int>(operations.size());
        if (judge(operations).empty()) continue;
        std::ostringstream text;
        operations = Shrunk(operations, judge);
        for (auto const& [kind, target, other, rect] : operations)
            text << "    {'" << kind << "', " << target << ", " << other << ", {" << rect.x1 << ", "
                 << rect.y1 << ", " << rect.x2 << ", " << rect.y2 << "}},\n";
        FAIL() << "seed " << seed << "\n" << text.str() << judge(operations);
    }
}

}

TEST(RegionRandom, MergesEqualThePlainSteps)
{
    JudgeLists(200'000, {5, 20, 60}, {6, 12, 40}, "+++--&ussi=amc", AgainstPlainSteps);
    JudgeLists(20'000, {200, 1000}, {100, 400}, "++++++---usammmm", AgainstPlainSteps);
}

TEST(RegionRandom, MergesEqualSetsOfPixels)
{
    JudgeLists(250'000, {10, 40}, {8, 20}, "++-&usi", AgainstPixels);
    EXPECT_GT(judgedByPixels, 100'000);
}

TEST(RegionRandom, CutsEqualIntersectedCopies)
{
    JudgeLists(40'000, {5, 20}, {12, 40}, "+++--&ussi=am", CutAgainstCopy);
}
