#pragma once

#include <tessella/region.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <random>
#include <vector>

/// Rectangles and regions to work on, the same in every run.

constexpr int kScreenWidth = 1024;
constexpr int kScreenHeight = 768;

/// Random rectangles that lie in a given one, not empty and not wider or higher than the largest extent.
class RectSource {
public:
    RectSource(std::uint32_t seed, GrRect const& around, int largestExtent)
        : random(seed), field(around), largest(largestExtent)
    {}
    GrRect Next();

private:
    int Below(int n) { return static_cast<int>(random() % static_cast<unsigned>(n)); }

    std::mt19937 random;
    GrRect field;
    int largest;
};

/// Rectangles of one size all over the screen, one after the other, for ever.
class RectLoop {
public:
    RectLoop(int width, int height);
    GrRect const& Next() { return rects[++last % kCount]; }

    static constexpr int kCount = 64;

private:
    std::array<GrRect, kCount> rects{};
    std::size_t last = 0;
};

/// Anywhere on the screen, up to 100 by 100 pixels: the more there are, the more they overlap.
std::vector<GrRect> RandomRects(int count);

/// Small rectangles of which few meet, in SparseField(count), which grows with their number. The first one is
/// the lowest pixel: with it in place, nothing is ever added behind the end of the list of bands, so the list
/// gets no hole, and no union is reported as damaged.
std::vector<GrRect> SparseRects(int count);
GrRect SparseField(int count);

/// A region of at least `ranges` ranges, and hardly more, out of small rectangles all over the screen.
GrRegion ComplexRegion(std::uint32_t seed, int ranges);

/// What is left of the screen when rectangles are taken away until there are about `ranges` ranges.
GrRegion ScreenWithHoles(std::uint32_t seed, int ranges);

int RangeCount(GrRegion const& region);
