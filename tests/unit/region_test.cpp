#include <support/region_text.h>

#include <tessella/region_cut.h>
#include <tessella/region_storage.h>

#include <gtest/gtest.h>
#include <limits>
#include <new>
#include <thread>

namespace {

using Strings = std::vector<std::string>;

/// The assertions that the check raises for these bands.
Strings Complaints(char const* bands)
{
    CollectAssertions();
    GrRegion copy;
    copy = RegionOf(bands);
    return TakeAssertions();
}

}

TEST(Region, QueriesSeeHalfOpenIntervalsAndNothingInAnEmptyOne)
{
    auto const seen = [](GrRegion const& region) {
        GrRect outer{7, 7, 7, 7};
        int x = 7, y = 7;
        region.GetOuterRect(outer);
        region.GetSomePoint(x, y);
        return std::tuple(outer, x, y);
    };
    for (GrRegion const& region : {GrRegion(), GrRegion(GrRect{3, 3, 3, 9}), RegionOf("1..5: | 7..9:")}) {
        EXPECT_FALSE(region || region.Contains(0, 0) || region.Contains(3, 3));
        EXPECT_EQ(seen(region), std::tuple(GrRect{}, 0, 0));
    }
    GrRegion region = RegionOf("-4..-2: | -2..0: 5..7 | 0..3: | 5..6: -9..-8 8..9 | 6..7:");
    EXPECT_TRUE(static_cast<bool>(region));
    EXPECT_EQ(seen(region), std::tuple(GrRect{-9, -2, 9, 6}, 5, -2));
    for (auto const& [x, y] : {std::pair(5, -2), {6, -1}, {-9, 5}, {8, 5}})
        EXPECT_TRUE(region.Contains(x, y)) << x << " " << y;
    for (auto const& [x, y] : {std::pair(4, -1), {7, -1}, {5, -3}, {5, 0}, {-8, 5}, {8, 4}, {8, 6}})
        EXPECT_FALSE(region.Contains(x, y)) << x << " " << y;
    EXPECT_EQ(region.FindBand(0), &region.bands.items[2]);
    EXPECT_TRUE(region.FindBand(3) == nullptr && region.FindBand(-5) == nullptr);
    region.Offset(-3, 10);
    region.Offset(1, 0);
    EXPECT_EQ(BandsText(region), "6..8: | 8..10: 3..5 | 10..13: | 15..16: -11..-10 6..7 | 16..17:");
    GrRect const empty{2, 2, 2, 18};
    EXPECT_EQ(seen((region += empty) -= empty), std::tuple(GrRect{-11, 8, 7, 16}, 3, 8));
    EXPECT_EQ(BandsText(region &= empty), "");
}

TEST(Region, DamagedRangesDoNotMakeMoreThanThereIsRoomFor)
{
    CollectAssertions();
    GrRegion region = RegionOf("0..1: 0..15");
    region &= RegionOf("0..1: 0..1 20..2 4..5 20..6 8..9");
    EXPECT_LE(region.bands.items[0].item_count, region.bands.items[0].item_capacity);
}

TEST(Region, ItemsOfABandAreInsertedRemovedAndAssigned)
{
    CollectAssertions();
    GrRegion region = RegionOf("0..1: 0..1 2..3 4..5");
    GrRegion::Band& band = region.bands.items[0];
    band.RemoveItems(2, 2);
    band.InsertItemAfter(-1);
    band.items[0] = {-2, -1};
    band.InsertItemAfter(1);
    band.items[2] = {1, 2};
    EXPECT_EQ(BandsText(region), "0..1: -2..-1 0..1 1..2 2..3");
    EXPECT_EQ(band.item_capacity, 13);
    band.RemoveItems(0, 1);
    band.InsertItemAfter(22);
    EXPECT_EQ(std::pair(band.item_count, band.item_capacity), std::pair(24, 33));
    band.item_count = 2;
    auto const before = BandsText(region);
    band.RemoveItems(-1, 0);
    band.RemoveItems(1, 0);
    band.RemoveItems(1, 2);
    band.RemoveItems(20, 20);
    band.InsertItemAfter(-5);
    band.AddRange(3, 3);
    EXPECT_EQ(BandsText(region), before) << "misuse changes nothing";
    EXPECT_EQ(
        TakeAssertions(), (Strings{"from>=0", "to>=from", "to<items.item_count", "to<items.item_count"}));
    EXPECT_THROW(band.InsertItemAfter(std::numeric_limits<int>::max()), std::bad_alloc);
    GrRange const* const storage = band.items;
    band = RegionOf("5..7: 4..5 8..9").bands.items[0];
    EXPECT_EQ(BandsText(region), "5..7: 4..5 8..9");
    EXPECT_EQ(band.items, storage) << "a smaller capacity keeps the block";
}

// Tops are compared with tops, starts with starts, and a predecessor at 0 not at all. Damaged ranges are
// reported band by band; the list as a whole is judged by its bands.
TEST(RegionCheck, ReportsWhatIsOutOfOrderAndWhere)
{
    Strings const list{"false", "VerifyRegion(*this)"}, ranges{"false", "VerifyBand(*item)"};
    for (char const* bands : {"1..1: 0..4", "-9..-8: | 3..2:", "2..3: 0..4 | 1..2: 0..4"})
        EXPECT_EQ(Complaints(bands), list) << bands;
    for (char const* bands : {"1..2: 4..4", "1..2: 4..6 4..7", "1..2: 4..6 3..7"})
        EXPECT_EQ(Complaints(bands), ranges) << bands;
    EXPECT_EQ(Complaints("1..2: 2..1 | 2..3: 2..4 | 3..4: 5..5 | 3..3:"),
        (Strings{
            "false", "VerifyBand(*item)", "false", "VerifyBand(*item)", "false", "VerifyRegion(*this)"}));
    for (char const* bands :
        {"1..5: 0..4 | 1..6: 1..9 2..4 | 3..4: 1..9 2..3 3..4", "0..5: 0..4 | -3..6: 0..4 -2..4 | -2..0:",
            "-2147483648..2147483647: -2147483648..-1 -1..2147483647"})
        EXPECT_EQ(Complaints(bands), Strings{}) << bands;
}

TEST(RegionCheck, BothFormsStopAtTheSameBand)
{
    if (!WideRegistersPresent()) GTEST_SKIP() << "this processor has only the plain form";
    for (int count = 0; count <= 40; ++count) {
        std::string text = "0..1: 5..6 | 1..2:";
        for (int i = 0; i < count; ++i)
            text.append(" ").append(std::to_string(2 * i)).append("..").append(std::to_string(2 * i + 1));
        GrRegion region = RegionOf(text + " | 2..3: 5..6");
        auto const stop = [&region](auto form) { return form(region.bands.items, EndOf(region.bands), -9); };
        EXPECT_EQ(stop(FirstImperfectPlain), EndOf(region.bands));
        for (int end = 0; end < 2 * count; ++end) {
            int& damaged = (&region.bands.items[1].items->r1)[end];
            damaged -= 2;
            for (int delta = -2; delta <= 2; ++delta, ++damaged)
                EXPECT_EQ(stop(FirstImperfectPlain), stop(FirstImperfectWide))
                    << count << " " << end << " " << delta;
            damaged -= 3;
        }
    }
}

TEST(LocalRegion, NestedScopesHaveTheirOwnAndThreadsDoNotShare)
{
    LocalRegion const outer;
    GrRegion* const freed = &LocalRegion().Get();
    LocalRegion const inner;
    EXPECT_EQ(&inner.Get(), freed) << "storage is used again";
    EXPECT_NE(&inner.Get(), &outer.Get());
    std::thread([&] { EXPECT_NE(&LocalRegion().Get(), &inner.Get()); }).join();
}
