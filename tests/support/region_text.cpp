#include <support/region_text.h>

#include <common/assert.h>

#include <algorithm>
#include <cstdlib>
#include <sstream>
#include <utility>

namespace {

std::vector<std::string> assertions;

void Collect(int, int, int, char const* text)
{
    static std::string const kHead = "Assertion failed: ";
    static std::string const kModule = std::string(", file ") + GR_SOURCE("tessella/region") + ", line ";
    std::string const report = text;
    std::size_t const end = report.find(kModule);
    bool const wellFormed = report.starts_with(kHead) && end != std::string::npos;
    assertions.push_back(
        wellFormed ? report.substr(kHead.size(), end - kHead.size()) : "malformed: " + report);
}

std::istream& operator>>(std::istream& in, GrRange& range)
{
    char dot = 0;
    return in >> range.r1 >> dot >> dot >> range.r2;
}

std::ostream& operator<<(std::ostream& out, GrRange const& range)
{
    return out << range.r1 << ".." << range.r2;
}

template <typename T>
void Append(GrItemArray<T>& list, T*& slot)
{
    T* const larger = new T[static_cast<std::size_t>(list.item_count) + 1]();
    std::copy_n(reinterpret_cast<char*>(list.items), sizeof(T) * static_cast<std::size_t>(list.item_count),
        reinterpret_cast<char*>(larger));
    delete[] list.items;
    list.items = larger;
    slot = &larger[list.item_count];
    list.item_capacity = ++list.item_count;
}

}

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
    std::ostringstream out;
    out << region.bands.item_capacity << ":";
    int last = region.bands.item_capacity;
    while (last > region.bands.item_count && region.bands.items[last - 1].items == nullptr)
        --last;
    for (int i = 0; i < last; ++i) {
        GrRegion::Band const& band = region.bands.items[i];
        out << (i == region.bands.item_count ? " | " : " ")
            << (band.items == nullptr ? 0 : band.item_capacity);
    }
    return out.str();
}

GrRegion RegionOf(std::string const& text)
{
    GrRegion region;
    std::istringstream bandTexts(text);
    for (std::string bandText; std::getline(bandTexts, bandText, '|');) {
        std::istringstream in(bandText);
        GrRegion::Band* band = nullptr;
        Append(region.bands, band);
        char colon = 0;
        in >> static_cast<GrRange&>(*band) >> colon;
        for (GrRange range{}; in >> range;) {
            GrRange* slot = nullptr;
            Append(*band, slot);
            *slot = range;
        }
    }
    return region;
}

void CollectAssertions()
{
    setenv("VELLUM_SAFE_ASSERT", "event", 1);
    assertEventSink = Collect;
}

std::vector<std::string> TakeAssertions() { return std::exchange(assertions, {}); }
