#include <support/region_text.h>

#include <gtest/gtest.h>

// The rules of the merges that surprise, each worked by hand. A region is written as its bands, "rows:
// ranges".

namespace {

std::string Merged(char const* region, char operation, char const* with)
{
    CollectAssertions();
    GrRegion result = RegionOf(region);
    GrRegion const other = RegionOf(with);
    return BandsText(operation == '+' ? result += other
            : operation == '-'        ? result -= other
                                      : result &= other);
}

}

TEST(RegionRules, BandsSplitWhereTheOtherBeginsAndGapsAboveAreFilledWithABand)
{
    EXPECT_EQ(Merged("0..6: 0..4", '+', "3..8: 6..9"), "0..3: 0..4 | 3..6: 0..4 6..9 | 6..8: 6..9");
    EXPECT_EQ(Merged("0..6: 0..4", '-', "3..8: 2..9"), "0..3: 0..4 | 3..6: 0..2");
    EXPECT_EQ(Merged("0..6: 0..4", '&', "3..8: 2..9"), "3..6: 2..4");
    EXPECT_EQ(Merged("5..6: 0..4", '+', "0..2: 0..4"), "0..2: 0..4 | 2..5: | 5..6: 0..4");
    EXPECT_EQ(Merged("0..2: 0..4", '+', "5..6: 0..4"), "0..2: 0..4 | 5..6: 0..4");
}

// Ranges are joined when they share a pixel. Joining those that touch would change where error diffusion
// restarts.
TEST(RegionRules, TouchingRangesStayApart)
{
    GrRegion region = RegionOf("0..1: 0..10");
    GrRegion::Band& band = region.bands.items[0];
    band.AddRange(10, 20);
    EXPECT_EQ(BandsText(region), "0..1: 0..10 10..20");
    EXPECT_FALSE(band == RegionOf("0..1: 0..20").bands.items[0]);
    band.AddRange(5, 15);
    EXPECT_EQ(BandsText(region), "0..1: 0..20");
    band.AddRange(30, 40);
    band.AddRange(20, 30);
    EXPECT_EQ(BandsText(region), "0..1: 0..20 20..30 30..40");
    band.AddRange(19, 31);
    EXPECT_EQ(BandsText(region), "0..1: 0..40");
    EXPECT_EQ(Merged("0..4: 5..9", '-', "0..4: 0..5"), "0..4: 5..9");
    EXPECT_EQ(Merged("0..4: 0..9", '&', "0..4: 0..5 5..7"), "0..4: 0..5 5..7");
}

// An empty band keeps the list contiguous, which is where later unions find their place. Committing compares
// ranges and nothing else, so equal bands are joined across a hole, and empty ones with each other.
TEST(RegionRules, EmptyBandsStayAndEqualOnesAreJoinedAcrossAHole)
{
    EXPECT_EQ(Merged("0..2: 0..4 | 2..4: 0..5 | 4..6: 0..4", '-', "2..4: -1..9"),
        "0..2: 0..4 | 2..4: | 4..6: 0..4");
    EXPECT_EQ(Merged("0..2: 0..4 | 2..4: | 4..6: 0..4", '-', "-1..9: -1..9"), "0..6:");
    EXPECT_EQ(Merged("0..2: 0..4 | 5..6: 0..4", '-', "0..1: 0..1"), "0..1: 1..4 | 1..6: 0..4");
}

// A band merged in part no longer adds rows of its own above the next band, but is copied whole if it ends
// there. What is appended begins where the list ends and is not joined.
TEST(RegionRules, AUnionIntoAHoleOverlapsOrLeavesRowsOut)
{
    EXPECT_EQ(Merged("0..5: 0..4 | 7..9: 0..6", '+', "0..6: 8..9"),
        "0..5: 0..4 8..9 | 0..6: 8..9 | 6..7: | 7..9: 0..6");
    EXPECT_EQ(Merged("0..5: 0..4 | 7..9: 0..6", '+', "0..10: 8..9"),
        "0..5: 0..4 8..9 | 7..9: 0..6 8..9 | 9..10: 8..9");
    EXPECT_EQ(Merged("0..2: 0..4", '+', "1..3: 0..4"), "0..2: 0..4 | 2..3: 0..4");
    EXPECT_TRUE(TakeAssertions().empty());  // tops are compared with tops, so none is out of order
}

TEST(RegionRules, AUnionWithAHoleInTheOtherIsReportedAndGoesOn)
{
    EXPECT_EQ(Merged("0..10: 0..4", '+', "2..4: 6..7 | 12..14: 6..7"),
        "0..2: 0..4 | 2..4: 0..4 6..7 | 4..12: 0..4 | 12..10: 0..4 6..7 | 12..14: 6..7");
    EXPECT_EQ(TakeAssertions(),
        (std::vector<std::string>{"src_from->r1 <= dst_from->r2", "false", "VerifyRegion(*this)"}));
}

// Rows that meet no band of the other region are cut with its next band: empty in most regions, but not
// behind a hole.
TEST(RegionRules, AnIntersectionAcrossAHoleMeetsTheBandBelowIt)
{
    EXPECT_EQ(
        Merged("0..12: 0..9", '&', "2..4: 1..3 | 4..6: | 6..8: 2..5"), "2..4: 1..3 | 4..6: | 6..8: 2..5");
    EXPECT_EQ(Merged("0..12: 0..9", '&', "2..4: 1..3 | 6..8: 2..5"), "2..4: 1..3 | 4..8: 2..5");
}

// 10 slots at first; a capacity taken over from a rectangle operand is 1, and grows by 10 from there.
TEST(RegionRules, StorageStaysAndCapacitiesAreTakenOverAndGrowByTens)
{
    GrRegion region(GrRect{0, 0, 4, 4});
    region += GrRect{0, 6, 4, 7};
    region += GrRect{6, 6, 9, 8};
    EXPECT_EQ(CapacitiesText(region), "10: 10 11 1");
    GrRegion exact = RegionOf("0..1: 0..9 | 1..2: 0..8 | 2..3: 0..7");
    exact -= GrRect{2, 1, 3, 2};
    EXPECT_EQ(CapacitiesText(exact), "3: 1 11 1") << "one hole needs one slot more than was read";
    exact += GrRect{20, -3, 30, -2};
    EXPECT_EQ(CapacitiesText(exact), "13: 1 0 1 11 1");
    GrRegion const small(GrRect{0, 0, 1, 1});
    exact = small;
    EXPECT_EQ(CapacitiesText(exact), "13: 10 | 0 1 11 1") << "a smaller list of bands takes no capacity over";
    GrRegion const& same = exact;
    EXPECT_EQ(BandsText(((exact += same) &= same) = same), "0..1: 0..1");
    EXPECT_EQ(BandsText(exact -= same), "");
    EXPECT_EQ(CapacitiesText(exact), "13: | 10 0 1 11 1");
    exact.Clear();
    EXPECT_EQ(CapacitiesText(exact), "0:");
}
