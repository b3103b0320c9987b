#include <support/region_text.h>
#include <tessella/region_cut.h>

#include <gtest/gtest.h>

#include <random>
#include <thread>

namespace {

/// Joined, cut and moved at random, so that bands overlap, touch, lie empty or leave holes, as merges produce
/// them.
class RandomRegions {
public:
    explicit RandomRegions(unsigned seed) : random(seed) {}

    GrRect Rect()
    {
        int const x = Number(-10, 30), y = Number(-10, 30);
        return {x, y, x + Number(0, 20), y + Number(0, 12)};
    }
    GrRegion Region()
    {
        GrRegion region;
        for (int steps = Number(0, 14); steps > 0; --steps) {
            if (Number(0, 2) != 0)
                region += Rect();
            else
                region -= Rect();
        }
        return region;
    }

private:
    int Number(int from, int to) { return std::uniform_int_distribution(from, to)(random); }

    std::mt19937 random;
};

TEST(RegionCut, GivesTheBandsOfACopyThatIsIntersected)
{
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    CollectAssertions();
    RandomRegions random(seed);
    GrRegion cut;  // keeps its storage, and with it the traces of earlier results
    for (int round = 0; round < 20000; ++round) {
        GrRegion const region = random.Region();
        GrRegion const other = random.Region();
        GrRect const rect = random.Rect();
        for (bool const byRect : {false, true}) {
            GrRegion expected(region);
            byRect ? expected &= rect : expected &= other;
            byRect ? CutRegion(cut, region, rect) : CutRegion(cut, region, other);
            if (!expected)
                ASSERT_FALSE(cut);
            else
                ASSERT_EQ(BandsText(cut), BandsText(expected))
                    << BandsText(region) << " cut by " << BandsText(byRect ? GrRegion(rect) : other);
        }
    }
    TakeAssertions();
}

TEST(LocalRegion, NestedScopesHaveTheirOwnAndThreadsDoNotShare)
{
    LocalRegion const outer;
    outer.Get() = GrRect{0, 0, 5, 5};
    GrRegion* freed = nullptr;
    {
        LocalRegion const inner;
        EXPECT_NE(&inner.Get(), &outer.Get());
        freed = &inner.Get();
        std::thread([&] {
            LocalRegion const elsewhere;
            EXPECT_NE(&elsewhere.Get(), &inner.Get());
            EXPECT_NE(&elsewhere.Get(), &outer.Get());
        }).join();
    }
    LocalRegion const again;
    EXPECT_EQ(&again.Get(), freed) << "storage is used again";
    EXPECT_TRUE(outer.Get().Contains(4, 4));
}

}
