// UnitTraitsTest.cpp: what strings do with runs of units, for every length around the sizes of their blocks, beside plain
// loops. The runs are vectors of just their size, so that a sanitizer sees what is read or written beyond them.

#include "KTUnitTraits.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <numeric>
#include <vector>

namespace {

using Traits = KTUnitTraits;
using UnitRun = std::vector<unsigned short>;

constexpr std::size_t kLongest = 70; // above twice the largest block

// Units that are all different.
UnitRun Numbered(std::size_t count) {
    UnitRun run(count);
    std::iota(run.begin(), run.end(), static_cast<unsigned short>(1000));
    return run;
}

// One unit, then itself with single bits changed: what a search by blocks may take for it.
UnitRun Neighbours(unsigned short unit, std::size_t count) {
    UnitRun run(count);
    for (std::size_t i = 0; i < count; ++i) {
        run[i] = static_cast<unsigned short>(unit ^ (1U << (i % 16)));
    }
    return run;
}

constexpr unsigned short kUnits[] = {0x0000, 0x0001, 0x0041, 0x00FF, 0x0100, 0x7FFF, 0x8000, 0x8001, 0xFFFF};
constexpr unsigned short kOne[] = {'a', 'b', 'c', 'd', 'e'};
constexpr unsigned short kOther[] = {'a', 'b', 'c', 'd', 'f'};
static_assert(Traits::compare(kOne, kOther, 5) == -1 && Traits::compare(kOther, kOne, 5) == 1);
static_assert(Traits::find(kOne, 5, 'e') == kOne + 4 && Traits::find(kOne, 5, 'f') == nullptr);

} // namespace

TEST(UnitTraits, CopyTakesAllUnitsAndNoMore) {
    for (std::size_t count = 0; count <= kLongest; ++count) {
        UnitRun const from = Numbered(count);
        UnitRun to(count);
        EXPECT_EQ(Traits::copy(to.data(), from.data(), count), to.data());
        EXPECT_EQ(to, from) << count;
        UnitRun wider(count + 2, 7);
        Traits::copy(wider.data() + 1, from.data(), count);
        EXPECT_EQ(wider.front(), 7) << count;
        EXPECT_EQ(wider.back(), 7) << count;
    }
}

TEST(UnitTraits, MoveMayOverlap) {
    for (std::size_t count = 0; count <= kLongest; ++count) {
        for (std::size_t distance = 0; distance <= count; ++distance) {
            UnitRun const before = Numbered(count + distance);
            UnitRun up = before;
            EXPECT_EQ(Traits::move(up.data() + distance, up.data(), count), up.data() + distance);
            EXPECT_TRUE(std::equal(before.begin(), before.end() - static_cast<std::ptrdiff_t>(distance),
                                   up.begin() + static_cast<std::ptrdiff_t>(distance)))
                << count << " up " << distance;
            UnitRun down = before;
            EXPECT_EQ(Traits::move(down.data(), down.data() + distance, count), down.data());
            EXPECT_TRUE(std::equal(before.begin() + static_cast<std::ptrdiff_t>(distance), before.end(), down.begin()))
                << count << " down " << distance;
        }
    }
}

TEST(UnitTraits, CompareFindsTheFirstDifferenceAndHasUnitsUnsigned) {
    for (std::size_t count = 0; count <= kLongest; ++count) {
        UnitRun const run = Numbered(count);
        EXPECT_EQ(Traits::compare(run.data(), UnitRun(run).data(), count), 0) << count;
        for (std::size_t at = 0; at < count; ++at) {
            UnitRun larger = run;
            larger[at] = 0xFFFF;
            if (at + 1 < count) {
                larger[at + 1] = 0; // a later difference says nothing
            }
            EXPECT_EQ(Traits::compare(run.data(), larger.data(), count), -1) << count << " at " << at;
            EXPECT_EQ(Traits::compare(larger.data(), run.data(), count), 1) << count << " at " << at;
            EXPECT_EQ(Traits::compare(run.data(), larger.data(), at), 0) << count << " up to " << at;
        }
    }
}

TEST(UnitTraits, FindReturnsTheFirstPlaceOfAnyUnit) {
    for (unsigned short const unit : kUnits) {
        for (std::size_t count = 0; count <= kLongest; ++count) {
            UnitRun run = Neighbours(unit, count);
            EXPECT_EQ(Traits::find(run.data(), count, unit), nullptr) << unit << " in " << count;
            for (std::size_t at = count; at-- > 0;) {
                run[at] = unit;
                EXPECT_EQ(Traits::find(run.data(), count, unit), run.data() + at) << unit << " in " << count;
            }
        }
    }
}
