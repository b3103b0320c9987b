#include <support/region_text.h>

#include <tessella/region_storage.h>

#include <gtest/gtest.h>

namespace {

using Strings = std::vector<std::string>;

/// The assertions that the check raises for these bands.
Strings Complaints(char const* bands)
{
    CollectAssertions();
    TakeAssertions();
    GrRegion copy;
    copy = RegionOf(bands);
    return TakeAssertions();
}

}

TEST(Region, NothingIsInAnEmptyOne)
{
    for (GrRegion const& region : {GrRegion(), GrRegion(GrRect{3, 3, 3, 9}), RegionOf("1..5: | 7..9:")}) {
        int x = 7;
        int y = 7;
        GrRect outer{7, 7, 7, 7};
        region.GetSomePoint(x, y);
        region.GetOuterRect(outer);
        EXPECT_FALSE(static_cast<bool>(region));
        EXPECT_EQ(std::pair(x, y), std::pair(0, 0));
        EXPECT_EQ(outer, (GrRect{}));
        EXPECT_FALSE(region.Contains(0, 0) || region.Contains(3, 3));
    }
}

TEST(Region, QueriesSeeHalfOpenIntervals)
{
    GrRegion const region = RegionOf("-4..-2: | -2..0: 5..7 | 0..3: | 5..6: -9..-8 8..9 | 6..7:");
    GrRect outer{};
    region.GetOuterRect(outer);
    EXPECT_EQ(outer, (GrRect{-9, -2, 9, 6}));
    int x = 0;
    int y = 0;
    region.GetSomePoint(x, y);
    EXPECT_EQ(std::pair(x, y), std::pair(5, -2));
    EXPECT_TRUE(
        region.Contains(5, -2) && region.Contains(6, -1) && region.Contains(-9, 5) && region.Contains(8, 5));
    for (auto const& [px, py] : {std::pair(4, -1), {7, -1}, {5, -3}, {5, 0}, {-8, 5}, {8, 4}, {8, 6}})
        EXPECT_FALSE(region.Contains(px, py)) << px << " " << py;
    EXPECT_EQ(region.FindBand(0), &region.bands.items[2]);
    EXPECT_EQ(region.FindBand(3), nullptr);
    EXPECT_EQ(region.FindBand(-5), nullptr);
}

TEST(Region, OffsetMovesBandsAndRanges)
{
    GrRegion region = RegionOf("0..2: 0..4 6..7 | 2..3:");
    region.Offset(-3, 10);
    EXPECT_EQ(BandsText(region), "10..12: -3..1 3..4 | 12..13:");
    region.Offset(3, 0);
    EXPECT_EQ(BandsText(region), "10..12: 0..4 6..7 | 12..13:");
}

TEST(Region, EmptyRectangles)
{
    GrRegion region(GrRect{0, 0, 4, 4});
    GrRect const empty{2, 2, 2, 8};
    region += empty;
    region -= empty;
    EXPECT_EQ(BandsText(region), "0..4: 0..4");
    region &= empty;
    EXPECT_EQ(BandsText(region), "");
    EXPECT_EQ(CapacitiesText(region), "10: | 10");
    region += GrRect{1, 1, 2, 2};
    EXPECT_EQ(BandsText(region = empty), "");
}

TEST(RegionBand, ItemsAreInsertedAndRemoved)
{
    CollectAssertions();
    GrRegion region = RegionOf("0..1: 0..1 2..3 4..5");
    GrRegion::Band& band = region.bands.items[0];
    band.RemoveItems(2, 2);
    EXPECT_EQ(BandsText(region), "0..1: 0..1 2..3");
    band.InsertItemAfter(-1);
    band.items[0] = {-2, -1};
    band.InsertItemAfter(1);
    band.items[2] = {1, 2};
    EXPECT_EQ(BandsText(region), "0..1: -2..-1 0..1 1..2 2..3");
    EXPECT_EQ(band.item_capacity, 13);
    band.RemoveItems(0, 1);
    EXPECT_EQ(BandsText(region), "0..1: 1..2 2..3");
    band.InsertItemAfter(22);
    EXPECT_EQ(band.item_count, 24);
    EXPECT_EQ(band.item_capacity, 33);
    EXPECT_EQ(TakeAssertions(), Strings{});
    band.item_count = 2;
    band.RemoveItems(1, 0);
    EXPECT_EQ(TakeAssertions(), Strings{"to>=from"});
    band.item_count = 2;
    band.RemoveItems(1, 2);
    EXPECT_EQ(TakeAssertions(), Strings{"to<items.item_count"});
}

TEST(RegionBand, AssignmentCopiesIntoItsOwnStorage)
{
    GrRegion a = RegionOf("0..1: 0..1 2..3");
    GrRegion const b = RegionOf("5..7: 4..5");
    GrRange const* const storage = a.bands.items[0].items;
    a.bands.items[0] = b.bands.items[0];
    EXPECT_EQ(BandsText(a), "5..7: 4..5");
    EXPECT_EQ(a.bands.items[0].items, storage) << "a smaller capacity keeps the block";
    EXPECT_EQ(a.bands.items[0].item_capacity, 1);
    GrRange span{};
    a.bands.items[0].GetFullRange(span);
    EXPECT_EQ(span, (GrRange{4, 5}));
}

TEST(RegionCheck, ReportsWhatIsOutOfOrderAndWhere)
{
    Strings const list{"false", "VerifyRegion(*this)"};
    Strings const ranges{"false", "VerifyBand(*item)"};
    EXPECT_EQ(Complaints("1..1: 0..4"), list);
    EXPECT_EQ(Complaints("-9..-8: | 3..2:"), list);
    EXPECT_EQ(Complaints("2..3: 0..4 | 1..2: 0..4"), list);
    EXPECT_EQ(Complaints("1..2: 4..4"), ranges);
    EXPECT_EQ(Complaints("1..2: 4..6 4..7"), ranges);
    EXPECT_EQ(Complaints("1..2: 4..6 3..7"), ranges);
    EXPECT_EQ(Complaints("1..2: 1..2 3..4 5..6 7..8 9..10 11..12 13..14 15..16 17..18 19..19"), ranges);
    EXPECT_EQ(Complaints("1..2: 1..2 3..4 5..6 7..8 9..10 11..12 13..14 13..16 17..18 19..20"), ranges);
    // Damaged ranges are reported band by band; the list as a whole is judged by its bands.
    EXPECT_EQ(Complaints("1..2: 2..1 | 2..3: 2..4 | 3..4: 5..5 | 3..3:"),
        (Strings{
            "false", "VerifyBand(*item)", "false", "VerifyBand(*item)", "false", "VerifyRegion(*this)"}));
}

// Tops are compared with tops, starts with starts, and a predecessor at 0 not at all.
TEST(RegionCheck, AcceptsOverlapsAndWhatFollowsZero)
{
    EXPECT_EQ(Complaints("1..5: 0..4 | 1..6: 0..4 | 3..4: 1..9 2..3 3..4"), Strings{});
    EXPECT_EQ(Complaints("0..5: 0..4 | -3..6: 0..4 -2..4 | -2..0:"), Strings{});
    EXPECT_EQ(Complaints("-2147483648..2147483647: -2147483648..-1 -1..2147483647"), Strings{});
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
        EXPECT_EQ(stop(FirstImperfectWide), EndOf(region.bands));
        for (int end = 0; end < 2 * count; ++end) {
            int& damaged = (&region.bands.items[1].items->r1)[end];
            for (int delta = -2; delta <= 2; ++delta) {
                damaged += delta;
                EXPECT_EQ(stop(FirstImperfectPlain), stop(FirstImperfectWide))
                    << count << " " << end << " " << delta;
                damaged -= delta;
            }
        }
    }
}

TEST(RegionCheck, FirstStorageMustBeFirst)
{
    CollectAssertions();
    TakeAssertions();
    GrRange* const owned = new GrRange[1];
    GrItemArray<GrRange> list{owned, 0, 1};
    Allocate(list, 10);
    EXPECT_EQ(TakeAssertions(), Strings{"items==0"});
    EXPECT_EQ(list.item_capacity, 10);
    delete[] owned;
    delete[] list.items;
}
