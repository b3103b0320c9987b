#pragma once

#include <cstdint>

namespace console {

/// What the screen makes of colours: the one place that decides how a component of fewer bits is shown in
/// eight. It follows QEMU's standard adapter, whose screens ours are compared with.

/// A component of the colour map as the adapter's digital-analog converter shows it: it is 8 bits wide and
/// takes the upper byte, so 0x003F is black.
constexpr std::uint8_t ShownByConverter(std::uint16_t component)
{
    return static_cast<std::uint8_t>(component >> 8);
}

/// The same in the 4-plane mode, whose converter is 6 bits wide and repeats the lowest of them.
constexpr std::uint8_t ShownByNarrowConverter(std::uint16_t component)
{
    unsigned const value = component >> 10;
    return static_cast<std::uint8_t>(value << 2 | (value & 1) * 3);
}

/// A field of a pixel in a mode without a colour map. A 16-bit mode repeats a field's upper bits below it, so
/// that white is full white; a 15-bit mode leaves zeros there, and its white is 0xF8F8F8.
constexpr std::uint8_t ShownField(unsigned value, unsigned length, unsigned depth)
{
    unsigned const upper = value << 8 >> length;
    return static_cast<std::uint8_t>(depth == 16 ? upper | upper >> length : upper);
}

}
