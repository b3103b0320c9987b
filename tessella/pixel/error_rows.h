#pragma once

#include <tessella/color.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>

/// Error diffusion: half of what the conversion of a pixel loses in each channel goes to the pixel on its
/// right and half to the pixel below, with no further weights. The errors of a column are kept in three rows,
/// one a channel, those of the pixel to the left in three scalars.
class GrErrorRows {
public:
    /// Begins with no errors. `rows` has room for three times `columns` and outlives this.
    GrErrorRows(std::int32_t* rows, int columns) : errors(rows), width(columns)
    {
        std::fill_n(rows, std::size_t{3} * static_cast<unsigned>(columns), 0);
    }

    void StartRow() { left[0] = left[1] = left[2] = 0; }

    /// The pixel in column `x` for `color`. Columns that are not asked for keep their errors.
    template <typename Colors>
    typename Colors::Pixel Diffuse(GrColor color, int x)
    {
        std::int32_t wanted[3];
        GrColor target = 0xFF000000;
        for (int i = 0; i < 3; ++i) {
            wanted[i] = std::clamp(static_cast<int>(color >> 8 * i & 0xFF) + Error(i, x) + left[i], 0, 255);
            target |= static_cast<GrColor>(wanted[i]) << 8 * i;
        }
        auto const pixel = Colors::ToPixel(target);
        GrColor const reached = Colors::FromPixel(pixel);
        for (int i = 0; i < 3; ++i)
            left[i] = Error(i, x) = (wanted[i] - static_cast<int>(reached >> 8 * i & 0xFF)) / 2;
        return pixel;
    }

private:
    std::int32_t& Error(int channel, int x) { return errors[std::ptrdiff_t{channel} * width + x]; }

    std::int32_t* errors;
    int width;
    std::int32_t left[3] = {};
};
