// TimerSlotsTest.cpp: the table of a fixed number of slots, by itself and beside a plain model.

#include "KTFixedSizedSlots.h"
#include "KTTimerService.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <memory>
#include <random>
#include <type_traits>
#include <vector>

namespace {

constexpr int kSize = 50;

struct Element {
    int value = 0;
    bool operator==(Element const &) const = default;
};

using Slots = KTFixedSizedSlots<Element, kSize>;

// The ids from the newest element to the oldest.
template <typename AnySlots> std::vector<KTInt64> Used(AnySlots const &slots) {
    std::vector<KTInt64> ids;
    for (KTInt64 id = slots.GetFirstUsed(); id != 0; id = slots.GetNextUsed(id)) {
        ids.push_back(id);
    }
    return ids;
}

// The same in vectors: free ids, the next one last; used ids, the newest first.
struct Model {
    Model() {
        for (KTInt64 id = kSize; id >= 1; --id) {
            free.push_back(id);
        }
    }

    KTInt64 Allocate(Element const &element) {
        if (free.empty()) {
            return 0;
        }
        KTInt64 const id = free.back();
        free.pop_back();
        used.insert(used.begin(), id);
        elements[static_cast<std::size_t>(id)] = element;
        return id;
    }

    bool Free(KTInt64 id) {
        if (auto const found = std::find(used.begin(), used.end(), id); found != used.end()) {
            used.erase(found);
            free.push_back(id);
        }
        return id >= 1 && id <= kSize;
    }

    bool IsUsed(KTInt64 id) const { return std::find(used.begin(), used.end(), id) != used.end(); }

    std::vector<KTInt64> free;
    std::vector<KTInt64> used;
    Element elements[kSize + 1];
};

} // namespace

TEST(TimerSlots, HandOutIdsFromOneToTheCapacityAndThenNone) {
    Slots slots;
    EXPECT_EQ(kSize, slots.GetCapacity());
    EXPECT_EQ(0, slots.GetFirstUsed());
    for (KTInt64 id = 1; id <= kSize; ++id) {
        ASSERT_EQ(id, slots.Allocate({static_cast<int>(id) * 10}));
    }
    EXPECT_EQ(0, slots.Allocate({1}));
    EXPECT_EQ(0, slots.Allocate({2}));
    EXPECT_EQ(70, slots.Find(7).value);
    EXPECT_TRUE(slots.Free(7));
    EXPECT_EQ(7, slots.Allocate({8}));
    EXPECT_EQ(8, slots.Find(7).value);
    EXPECT_EQ(0, slots.Allocate({3}));
}

TEST(TimerSlots, AFreedSlotIsTheNextOneHandedOut) {
    Slots slots;
    for (int i = 0; i < 5; ++i) {
        slots.Allocate({i});
    }
    slots.Free(2);
    slots.Free(4);
    EXPECT_EQ(4, slots.Allocate({0}));
    EXPECT_EQ(2, slots.Allocate({0}));
    EXPECT_EQ(6, slots.Allocate({0}));
}

TEST(TimerSlots, AreWalkedFromTheNewestElementToTheOldest) {
    Slots slots;
    for (int i = 0; i < 5; ++i) {
        slots.Allocate({i});
    }
    EXPECT_EQ((std::vector<KTInt64>{5, 4, 3, 2, 1}), Used(slots));
    slots.Free(5); // the head
    EXPECT_EQ((std::vector<KTInt64>{4, 3, 2, 1}), Used(slots));
    slots.Free(3); // in between
    EXPECT_EQ((std::vector<KTInt64>{4, 2, 1}), Used(slots));
    slots.Free(1); // the end
    EXPECT_EQ((std::vector<KTInt64>{4, 2}), Used(slots));
    slots.Allocate({9}); // slot 1 again, now the newest
    EXPECT_EQ((std::vector<KTInt64>{1, 4, 2}), Used(slots));
    for (KTInt64 const id : {4, 2, 1}) {
        slots.Free(id);
    }
    EXPECT_TRUE(Used(slots).empty());
}

TEST(TimerSlots, UnknownIdsSelectTheScratchElement) {
    Slots slots;
    slots.Allocate({1});
    Element &scratch = slots.Find(0);
    EXPECT_EQ(Element{}, scratch);
    for (KTInt64 const id : {KTInt64{-1}, KTInt64{51}, KTInt64{2}, std::numeric_limits<KTInt64>::max(),
                             std::numeric_limits<KTInt64>::min(), (KTInt64{1} << 32) + 1}) {
        EXPECT_EQ(&scratch, &slots.Find(id)) << id;
    }
    EXPECT_NE(&scratch, &slots.Find(1));
    slots.Find(2).value = 99;
    EXPECT_EQ(1, slots.Find(1).value);
    EXPECT_EQ(std::vector<KTInt64>{1}, Used(slots));
}

TEST(TimerSlots, RefuseToFreeWhatIsOutsideTheTable) {
    Slots slots;
    slots.Allocate({1});
    for (KTInt64 const id : {KTInt64{0}, KTInt64{-1}, KTInt64{51}, std::numeric_limits<KTInt64>::max(),
                             std::numeric_limits<KTInt64>::min(), (KTInt64{1} << 32) + 1}) {
        EXPECT_FALSE(slots.Free(id)) << id;
    }
    EXPECT_EQ(std::vector<KTInt64>{1}, Used(slots));
}

TEST(TimerSlots, FreeingAFreeSlotLosesNothing) {
    Slots slots;
    for (int i = 0; i < 3; ++i) {
        slots.Allocate({i});
    }
    EXPECT_TRUE(slots.Free(2));
    EXPECT_TRUE(slots.Free(2));
    EXPECT_TRUE(slots.Free(40));
    EXPECT_EQ((std::vector<KTInt64>{3, 1}), Used(slots));
    EXPECT_EQ(2, slots.Allocate({0}));
    EXPECT_EQ(4, slots.Allocate({0}));
}

TEST(TimerSlots, AFreedElementIsZeroed) {
    KTFixedSizedSlots<std::shared_ptr<int>, 3> slots;
    auto const value = std::make_shared<int>(1);
    EXPECT_EQ(1, slots.Allocate(value));
    EXPECT_EQ(2, value.use_count());
    EXPECT_TRUE(slots.Free(1));
    EXPECT_EQ(1, value.use_count());
    EXPECT_EQ(nullptr, slots.Find(0));
}

TEST(TimerSlots, OneSlotIsATableToo) {
    KTFixedSizedSlots<Element, 1> slots;
    EXPECT_EQ(1, slots.Allocate({5}));
    EXPECT_EQ(0, slots.Allocate({6}));
    EXPECT_EQ(5, slots.Find(1).value);
    EXPECT_TRUE(slots.Free(1));
    EXPECT_EQ(0, slots.GetFirstUsed());
    EXPECT_EQ(1, slots.Allocate({7}));
    EXPECT_FALSE(slots.Free(2));
}

TEST(TimerSlots, HaveAVirtualDestructor) {
    EXPECT_TRUE(std::has_virtual_destructor_v<Slots>);
    EXPECT_TRUE(std::has_virtual_destructor_v<KTTimerService::CTimerSlots>);
    EXPECT_TRUE((std::is_same_v<KTTimerService::CTimerSlots, KTFixedSizedSlots<KTTimerService::CTimerInfo, 50>>));
}

TEST(TimerSlots, BehaveAsAPlainModelDoes) {
    char const *const wanted = std::getenv("KT_MODEL_SEED");
    unsigned int const seed =
        wanted != nullptr ? static_cast<unsigned int>(std::strtoul(wanted, nullptr, 10)) : std::random_device()();
    SCOPED_TRACE("KT_MODEL_SEED=" + std::to_string(seed));
    std::mt19937 random(seed);
    auto const draw = [&random](int from, int to) { return std::uniform_int_distribution(from, to)(random); };
    Slots slots;
    Model model;
    int leaning = 6; // of ten operations, how many allocate: fills and empties the table in turn
    for (int step = 0; step < 20'000; ++step) {
        if (step % 200 == 0) {
            leaning = draw(2, 8);
        }
        if (draw(0, 9) < leaning) {
            Element const element{step};
            ASSERT_EQ(model.Allocate(element), slots.Allocate(element)) << step;
        } else {
            KTInt64 const id = draw(-1, kSize + 2);
            ASSERT_EQ(model.Free(id), slots.Free(id)) << step;
        }
        ASSERT_EQ(model.used, Used(slots)) << step;
        KTInt64 const id = draw(-1, kSize + 2);
        ASSERT_EQ(model.IsUsed(id), &slots.Find(id) != &slots.Find(0)) << step;
        if (model.IsUsed(id)) {
            ASSERT_EQ(model.elements[id], slots.Find(id)) << step;
        }
    }
}
