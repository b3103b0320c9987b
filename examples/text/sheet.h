#pragma once

#include <tessella.h>

#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace specimen {

constexpr GrColor kPaper = GrMakeColor(250, 247, 238), kStripe = GrMakeColor(238, 234, 222);
constexpr GrColor kInk = GrMakeColor(28, 32, 44), kFaint = GrMakeColor(128, 124, 116);
constexpr GrColor kMarker = GrMakeColor(255, 232, 150), kBox = GrMakeColor(110, 170, 220);

/// A font as `GrFont::Create` makes it, and how its text is drawn.
struct Style {
    std::u16string_view title;
    char const* face;
    unsigned size;
    bool smooth;
    bool transparent;
};

std::unique_ptr<GrFont> NewFont(Style const& style);
/// The one that all titles and labels are written in.
std::unique_ptr<GrFont> NewLabelFont();

/// The part of the screen that a page is drawn on. The context's origin is its top left corner.
struct Sheet {
    GrContext& context;
    int width, height;

    void Fill(GrRect const& rect, GrColor color) const;
    /// A frame of one pixel around `rect`, outside of it.
    void Frame(GrRect const& rect, GrColor color) const;
    /// Paper with stripes, on which opaque text is told from transparent one.
    void FillStriped(GrRect const& rect) const;
    void Write(int x, int baseline, std::u16string_view text, GrFont& font, GrColor color = kInk,
        bool transparent = true) const;
};

/// What the font measures.
int WidthOf(std::u16string_view text, GrFont& font);

/// Breaks text into lines of at most `width` pixels: at blanks, and between characters of East Asia, where no
/// line begins with a full stop or a comma.
std::vector<std::u16string_view> BreakLines(std::u16string_view text, GrFont& font, int width);

std::u16string Hex(unsigned number, int digits);
std::u16string Decimal(unsigned number);

}
