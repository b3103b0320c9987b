#include <support/region_text.h>

#include <common/assert.h>

#include <algorithm>
#include <cstdlib>
#include <iterator>
#include <sstream>
#include <utility>

static std::vector<std::string> assertions;

static void Collect(int, int, int, char const* text)
{
    static std::string const kHead = "Assertion failed: ", kTail = GR_SOURCE("tessella/region");
    std::string const report = text;
    std::size_t const end =
        report.starts_with(kHead) ? report.find(", file " + kTail + ", line ") : report.npos;
    assertions.push_back(end == report.npos ? report : report.substr(kHead.size(), end - kHead.size()));
}

static std::istream& operator>>(std::istream& in, GrRange& r) { return (in >> r.r1).ignore(2) >> r.r2; }

static std::ostream& operator<<(std::ostream& out, GrRange const& r) { return out << r.r1 << ".." << r.r2; }

std::string BandsText(GrRegion const& region)
{
    std::ostringstream out;
    for (int i = 0; i < region.bands.item_count; ++i) {
        GrRegion::Band const& band = region.bands.items[i];
        out << (i == 0 ? "" : " | ") << static_cast<GrRange const&>(band) << ":";
        for (int k = 0; k < band.item_count; ++k)
            out << " " << band.items[k];
    }
    return out.str();
}

std::string CapacitiesText(GrRegion const& region)
{
    auto const& [bands, count, capacity] = region.bands;
    std::ostringstream out;
    int last = capacity;
    while (last > count && bands[last - 1].items == nullptr)
        --last;
    for (int i = 0; i < last; ++i)
        out << (i == count ? " | " : " ") << (bands[i].items == nullptr ? 0 : bands[i].item_capacity);
    return std::to_string(capacity) + ":" + out.str();
}

GrRegion RegionOf(std::string const& text)
{
    GrRegion region;
    int const count = static_cast<int>(std::count(text.begin(), text.end(), '|')) + 1;
    region.bands = {new GrRegion::Band[static_cast<std::size_t>(count)](), count, count};
    std::istringstream in(text);
    for (GrRegion::Band* band = region.bands.items; in >> static_cast<GrRange&>(*band);
         ++band, in.clear(), in.ignore()) {
        std::vector<GrRange> const ranges(std::istream_iterator<GrRange>(in.ignore()), {});
        std::copy(ranges.begin(), ranges.end(), band->items = new GrRange[ranges.size()]);
        band->item_count = band->item_capacity = static_cast<int>(ranges.size());
    }
    return region;
}

void CollectAssertions()
{
    setenv("VELLUM_SAFE_ASSERT", "event", 1);
    assertEventSink = Collect;
    assertions.clear();
}

std::vector<std::string> TakeAssertions() { return std::exchange(assertions, {}); }
