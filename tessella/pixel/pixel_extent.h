#pragma once

/// The addresses of some pixels, from the first to behind the last.
struct GrPixelExtent {
    unsigned char const* begin;
    unsigned char const* end;

    bool Meets(GrPixelExtent const& other) const { return begin < other.end && other.begin < end; }
};
