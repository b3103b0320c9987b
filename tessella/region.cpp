#include <tessella/region_storage.h>

using Band = GrRegion::Band;

namespace {

/// The operand of the operators that take a rectangle: one band with one range, or none.
class SingleRegion {
public:
    SingleRegion()
    {
        Allocate(region.bands, 1);
        Allocate(region.bands.items[0], 1);
    }

    GrRegion const& Load(GrRect const& rect)
    {
        Band& band = region.bands.items[0];
        region.bands.item_count = rect.IsEmpty() ? 0 : 1;
        band.item_count = 1;
        band.r1 = rect.y1;
        band.r2 = rect.y2;
        band.items[0] = {rect.x1, rect.x2};
        return region;
    }

private:
    GrRegion region;
};

SingleRegion rectRegion;

Band const* FirstWithRanges(GrItemArray<Band> const& bands)
{
    Band const* const first = bands.items;
    return std::find_if(first, first + bands.item_count, [](Band const& band) { return band.item_count != 0; });
}

/// True if all bands and ranges are in perfect order, without looking for what is wrong: a stricter question than
/// VerifyRegion's, but one quick pass without branches that depend on the data.
bool InPerfectOrder(GrItemArray<Band> const& bands)
{
    bool ordered = true;
    Band const* const end = bands.items + bands.item_count;
    for (Band const* band = bands.items; band != end; ++band) {
        ordered &= band->r1 < band->r2;
        if (band != bands.items) ordered &= band[-1].r1 <= band->r1;
        GrRange const* const ranges = band->items;
        for (int i = 0; i < band->item_count; ++i)
            ordered &= ranges[i].r1 < ranges[i].r2;
        for (int i = 1; i < band->item_count; ++i)
            ordered &= ranges[i - 1].r1 < ranges[i].r1;
    }
    return ordered;
}

/// False, and reported, if a range ends before it begins or begins before its predecessor does. A predecessor
/// that begins at 0 is not compared.
bool VerifyBand(Band const& band)
{
    int previous = 0;
    for (int i = 0; i < band.item_count; ++i) {
        GrRange const& range = band.items[i];
        if (range.r1 >= range.r2 || (previous != 0 && range.r1 <= previous)) return GR_ASSERT_TEXT(false, "false");
        previous = range.r1;
    }
    return true;
}

}

bool VerifyRegion(GrRegion const& region)
{
    if (InPerfectOrder(region.bands)) return true;
    int previous = 0;
    for (int i = 0; i < region.bands.item_count; ++i) {
        Band const* const item = &region.bands.items[i];
        if (item->r1 >= item->r2) return GR_ASSERT_TEXT(false, "false");
        if (previous != 0 && item->r1 < previous) return GR_ASSERT_TEXT(false, "false");
        previous = item->r1;
        GR_ASSERT(VerifyBand(*item));
    }
    return true;
}

GrRegion::GrRegion(GrRect const& rect) { *this = rect; }

GrRegion::GrRegion(GrRegion const& other) { *this = other; }

GrRegion::~GrRegion() { Clear(); }

void GrRegion::Clear()
{
    for (int i = 0; i < bands.item_capacity; ++i)
        delete[] bands.items[i].items;
    delete[] bands.items;
    bands = {};
}

GrRegion::operator bool() const { return FirstWithRanges(bands) != bands.items + bands.item_count; }

GrRegion& GrRegion::operator=(GrRect const& rect)
{
    bands.item_count = 0;
    if (rect.IsEmpty()) return *this;
    if (bands.items == nullptr) Allocate(bands, kGrowth);
    Band& band = bands.items[0];
    if (band.items == nullptr) Allocate(band, kGrowth);
    band.r1 = rect.y1;
    band.r2 = rect.y2;
    band.items[0] = {rect.x1, rect.x2};
    band.item_count = 1;
    bands.item_count = 1;
    return *this;
}

GrRegion& GrRegion::operator=(GrRegion const& other)
{
    if (&other == this) return *this;
    if (other.bands.item_capacity > bands.item_capacity) Resize(bands, other.bands.item_capacity);
    for (int i = 0; i < other.bands.item_count; ++i)
        bands.items[i] = other.bands.items[i];
    bands.item_count = other.bands.item_count;
    GR_ASSERT(VerifyRegion(*this));
    return *this;
}

GrRegion& GrRegion::operator+=(GrRect const& rect)
{
    if (rect.IsEmpty()) return *this;
    if (!*this) return *this = rect;
    return *this += rectRegion.Load(rect);
}

GrRegion& GrRegion::operator-=(GrRect const& rect)
{
    if (rect.IsEmpty()) return *this;
    return *this -= rectRegion.Load(rect);
}

GrRegion& GrRegion::operator&=(GrRect const& rect)
{
    if (rect.IsEmpty()) {
        bands.item_count = 0;
        return *this;
    }
    return *this &= rectRegion.Load(rect);
}

void GrRegion::Offset(int dx, int dy)
{
    if (dx == 0 && dy == 0) return;
    for (int i = 0; i < bands.item_count; ++i) {
        Band& band = bands.items[i];
        band.r1 += dy;
        band.r2 += dy;
        if (dx != 0) band.Offset(dx);
    }
}

void GrRegion::GetOuterRect(GrRect& rect) const
{
    rect = {};
    Band const* const first = FirstWithRanges(bands);
    Band const* const end = bands.items + bands.item_count;
    for (Band const* band = first; band != end; ++band) {
        if (band->item_count == 0) continue;
        GrRange span{};
        band->GetFullRange(span);
        if (band == first) rect = {span.r1, band->r1, span.r2, band->r2};
        rect.x1 = std::min(rect.x1, span.r1);
        rect.x2 = std::max(rect.x2, span.r2);
        rect.y2 = band->r2;
    }
}

void GrRegion::GetSomePoint(int& x, int& y) const
{
    x = y = 0;
    if (!*this) return;
    Band const* const first = FirstWithRanges(bands);
    if (!GR_ASSERT_TEXT(first != bands.items + bands.item_count, "i<bands.item_count")) return;
    y = first->r1;
    x = first->items[0].r1;
}

bool GrRegion::Contains(int x, int y) const
{
    Band const* const band = FindBand(y);
    return band != nullptr && Locate(*band, x) != nullptr;
}

Band const* GrRegion::FindBand(int y) const { return Locate(bands, y); }
