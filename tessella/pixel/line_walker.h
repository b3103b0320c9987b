#pragma once

#include <tessella/region.h>

#include <cstdint>

/// Follows a slanting line from its upper end, a pixel at a time along its longer axis. How steep it is comes
/// from the numbers of its columns and rows of pixels, both ends counted.
struct GrLineWalker {
    int x, y;              ///< the present pixel
    std::uint64_t left;    ///< pixels from here to the lower end, both counted
    std::uint64_t longer;  ///< pixels along the longer axis, which is x where both are the same
    std::uint64_t shorter;
    std::uint64_t error = 0;  ///< below `longer`
    int longX, longY;         ///< one step along the longer axis, made for every pixel
    int shortX, shortY;       ///< one along the other, made where `error` + `shorter` reaches `longer`

    /// `y1` is above `y2`.
    GrLineWalker(int x1, int y1, int x2, int y2);

    struct Run {
        std::uint64_t count;  ///< at least 1
        bool inside;
    };

    /// The pixels from the present one on that are all inside, or all outside, of `region` together. `left`
    /// is not 0.
    Run NextRun(GrRegion const& region) const;

    void Step()
    {
        x += longX;
        y += longY;
        error += shorter;
        if (error < longer) return;
        error -= longer;
        x += shortX;
        y += shortY;
    }

    /// Moves on by so many pixels, at most by `left`.
    void Skip(std::uint64_t count);

private:
    std::uint64_t CountWithin(GrRect const& rect) const;
};
