#include <tessella/coordinates.h>
#include <tessella/region_storage.h>

using Band = GrRegion::Band;

namespace {

// Regions of one rectangle are made and thrown away all the time; what that takes stands here once, without
// the calls through which the exported operators reach each other.

void Assign(GrItemArray<Band>& bands, GrRect const& rect)
{
    bands.item_count = 0;
    if (rect.IsEmpty()) return;
    if (bands.items == nullptr) Allocate(bands, kGrowth);
    Band& band = bands.items[0];
    if (band.items == nullptr) Allocate(band, kGrowth);
    band.r1 = rect.y1;
    band.r2 = rect.y2;
    band.items[0] = {rect.x1, rect.x2};
    band.item_count = 1;
    bands.item_count = 1;
}

void Release(GrItemArray<Band> const& bands)
{
    Band const* const end = bands.items + bands.item_capacity;
    for (Band const* band = bands.items; band < end; ++band)
        DeleteSlots(band->items, band->item_capacity);
    DeleteSlots(bands.items, bands.item_capacity);
}

}

// The delegation makes the object whole, so that its destructor runs if the assignment throws.
GrRegion::GrRegion(GrRect const& rect) : GrRegion() { Assign(bands, rect); }

GrRegion::GrRegion(GrRegion const& other) : GrRegion() { *this = other; }

GrRegion::~GrRegion() { Release(bands); }

void GrRegion::Clear()
{
    Release(bands);
    bands = {};
}

GrRegion::operator bool() const { return HasRanges(bands); }

GrRegion& GrRegion::operator=(GrRect const& rect)
{
    Assign(bands, rect);
    return *this;
}

GrRegion& GrRegion::operator=(GrRegion const& other)
{
    if (&other == this) return *this;
    if (other.bands.item_capacity > bands.item_capacity) Resize(bands, other.bands.item_capacity);
    for (int i = 0; i < other.bands.item_count; ++i)
        Assign(bands.items[i], other.bands.items[i]);
    bands.item_count = other.bands.item_count;
    CheckRegion(*this);
    return *this;
}

void GrRegion::Offset(int dx, int dy)
{
    if (dx == 0 && dy == 0) return;
    for (int i = 0; i < bands.item_count; ++i) {
        Band& band = bands.items[i];
        band.r1 = Moved(band.r1, dy);
        band.r2 = Moved(band.r2, dy);
        if (dx != 0) band.Offset(dx);
    }
}

void GrRegion::GetOuterRect(GrRect& rect) const
{
    rect = {};
    Band const* const first = FirstWithRanges(bands);
    Band const* const end = EndOf(bands);
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
    if (!HasRanges(bands)) return;
    Band const* const first = FirstWithRanges(bands);
    if (!GR_ASSERT_TEXT(first != EndOf(bands), "i<bands.item_count")) return;
    y = first->r1;
    x = first->items[0].r1;
}

bool GrRegion::Contains(int x, int y) const
{
    Band const* const band = FindBand(y);
    return band != nullptr && Locate(*band, x) != nullptr;
}

Band const* GrRegion::FindBand(int y) const { return Locate(bands, y); }
