#include <tessella/region_cut.h>

#include <tessella/region_storage.h>

using Band = GrRegion::Band;

namespace {

/// Makes room without regard for capacities: a scratch region keeps the largest block it ever had.
template <typename T>
void Reserve(GrItemArray<T>& list, int need)
{
    if (need > list.item_capacity) Resize(list, GrownCapacity(list.item_capacity, need));
}

/// The ranges that the two bands share, into `result`.
void IntersectRanges(Band& result, Band const& band, Band const& other)
{
    result.item_count = 0;
    if (band.item_count == 0 || other.item_count == 0) return;
    GrRange const* next = band.items + FirstEndingAfter(band, other.items[0].r1);
    GrRange const* const end = band.items + band.item_count;
    GrRange const* kept = other.items;
    GrRange const* const keptEnd = kept + other.item_count;
    Reserve(result, static_cast<int>(end - next) + other.item_count);
    GrRange* out = result.items;
    while (next != end && kept != keptEnd) {
        GrRange const common{std::max(next->r1, kept->r1), std::min(next->r2, kept->r2)};
        if (common.r1 < common.r2) *out++ = common;
        if (kept->r2 >= next->r2)
            ++next;
        else
            ++kept;
    }
    result.item_count = static_cast<int>(out - result.items);
}

/// The bands of a result, appended one by one.
class Output {
public:
    explicit Output(GrItemArray<Band>& bands) : list(bands) { list.item_count = 0; }

    /// Appends the rows `r1` to `r2`, if there are any, with what `band` and `other` share; rows that show
    /// the same as those above them only make that band longer.
    void Append(int r1, int r2, Band const& band, Band const& other)
    {
        if (r1 >= r2) return;
        Reserve(list, list.item_count + 1);
        Band& added = list.items[list.item_count];
        added.r1 = r1;
        added.r2 = r2;
        IntersectRanges(added, band, other);
        if (list.item_count > 0 && (&added)[-1].r1 < r2 && added == (&added)[-1])
            (&added)[-1].r2 = r2;
        else
            ++list.item_count;
    }

private:
    GrItemArray<Band>& list;
};

/// The steps of `region &= other`, with `top` the upper end of what is left of the band at `from`. Bands that
/// overlap others may begin, or even end, above the first one of `other`: only what lies below that counts.
void Cut(GrRegion& result, GrItemArray<Band> const& region, GrItemArray<Band> const& other)
{
    Output output(result.bands);
    Band const* src = other.items;
    Band const* const srcEnd = src + other.item_count;
    Band const* from = region.items + FirstEndingAfter(region, src->r1);
    Band const* const end = region.items + region.item_count;
    int const first = src->r1;
    int top = from != end ? std::max(from->r1, first) : 0;
    while (src != srcEnd && from != end) {
        if (src->r2 <= top) {
            ++src;
        } else if (top < src->r1) {
            output.Append(top, std::min(src->r1, from->r2), *from, *src);
            top = src->r1;
        } else if (src->r2 >= from->r2) {
            output.Append(top, from->r2, *from, *src);
            if (src->r2 == from->r2) ++src;
            if (++from != end) top = std::max(from->r1, first);
        } else {
            output.Append(top, src->r2, *from, *src);
            top = src->r2;
            ++src;
        }
    }
    GR_ASSERT_TEXT(VerifyRegion(result), "VerifyRegion(*this)");
}

bool IsOneRectangle(GrItemArray<Band> const& bands)
{
    return bands.item_count == 1 && bands.items[0].item_count == 1;
}

/// The case of windows and clips without a shape, which most drawing meets: a rectangle cut out of one.
void CutRectangle(GrRegion& result, Band const& band, GrRect const& rect)
{
    int const x1 = std::max(band.items[0].r1, rect.x1);
    int const x2 = std::min(band.items[0].r2, rect.x2);
    int const y1 = std::max(band.r1, rect.y1);
    int const y2 = std::min(band.r2, rect.y2);
    result.bands.item_count = 0;
    if (x1 >= x2 || y1 >= y2) return;
    Reserve(result.bands, 1);
    Band& cut = result.bands.items[0];
    Reserve(cut, 1);
    cut.r1 = y1;
    cut.r2 = y2;
    cut.items[0] = {x1, x2};
    cut.item_count = result.bands.item_count = 1;
}

void CutList(GrRegion& result, GrRegion const& region, GrItemArray<Band> const& other)
{
    if (!region || !ExtentsMeet(region.bands, other))
        result.bands.item_count = 0;
    else
        Cut(result, region.bands, other);
}

}

void CutRegion(GrRegion& result, GrRegion const& region, GrRegion const& other)
{
    if (IsOneRectangle(region.bands) && IsOneRectangle(other.bands)) {
        Band const& band = other.bands.items[0];
        CutRectangle(result, region.bands.items[0], {band.items[0].r1, band.r1, band.items[0].r2, band.r2});
    } else if (other) {
        CutList(result, region, other.bands);
    } else {
        result.bands.item_count = 0;
    }
}

void CutRegion(GrRegion& result, GrRegion const& region, GrRect const& rect)
{
    if (IsOneRectangle(region.bands)) {
        CutRectangle(result, region.bands.items[0], rect);
    } else if (rect.IsEmpty()) {
        result.bands.item_count = 0;
    } else {
        GrRange range{rect.x1, rect.x2};
        Band band;
        band.r1 = rect.y1;
        band.r2 = rect.y2;
        band.items = &range;
        band.item_count = band.item_capacity = 1;
        CutList(result, region, {&band, 1, 1});
    }
}

/// Returns the thread's regions when it ends. Static objects that draw after that get new ones.
struct LocalRegion::Release {
    ~Release()
    {
        while (unused) {
            Scratch* const first = unused;
            unused = first->next;
            delete first;
        }
    }
};

constinit thread_local LocalRegion::Scratch* LocalRegion::unused = nullptr;

LocalRegion::Scratch* LocalRegion::NewScratch()
{
    thread_local Release const release;
    return new Scratch;
}
