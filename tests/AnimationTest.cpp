// AnimationTest.cpp: keyframes, and the transform at a frame against a plain walk through all of them.

#include "InterpolationMode.h"

#include "KTAnimation.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <cmath>
#include <limits>
#include <random>
#include <type_traits>
#include <utility>
#include <vector>

namespace {

// A transform that tells by its first element where it lies; the other elements and the colour follow it.
KTTransform At(float value) {
    KTTransform transform;
    transform.matrix(0, 0) = value;
    transform.matrix(2, 3) = -value;
    transform.color = {value, 0, 2 * value, 1};
    return transform;
}

float ValueOf(KTTransform const &transform) { return transform.matrix(0, 0); }

KTAnimation Animation(std::vector<std::pair<int, float>> const &keyframes) {
    KTAnimation animation;
    for (auto const &[frame, value] : keyframes) {
        animation.AddKeyframe({At(value), frame});
    }
    return animation;
}

float ValueAt(KTAnimation const &animation, int frame) { return ValueOf(animation.GetTransform(frame)); }

std::vector<int> FramesOf(KTAnimation const &animation) {
    std::vector<int> frames;
    for (KTKeyframe const &keyframe : animation.GetKeyframes()) {
        frames.push_back(keyframe.frame);
    }
    return frames;
}

float Clamped(float position) { return std::min(std::max(position, 0.0F), 1.0F); }

// The same by walking from keyframe to keyframe; for frames whose differences are exact as floats.
KTTransform WalkedTransform(std::vector<KTKeyframe> const &keyframes, int frame) {
    if (keyframes.empty()) {
        return {};
    }
    std::size_t k = 0;
    while (k + 1 < keyframes.size() && keyframes[k + 1].frame < frame) {
        ++k;
    }
    if (k + 1 == keyframes.size()) {
        return keyframes[k].transform;
    }
    int const first = keyframes.front().frame;
    int const span = keyframes.back().frame - first;
    float const global = Clamped(static_cast<float>(frame - first) / static_cast<float>(span));
    float const eased = KTInterpolator::Interpolate(0.0F, 1.0F, global);
    int const warped = first + static_cast<int>(std::trunc(eased * static_cast<float>(span) + 0.5));
    int const length = keyframes[k + 1].frame - keyframes[k].frame;
    float const local = Clamped(static_cast<float>(warped - keyframes[k].frame) / static_cast<float>(length));
    ScopedInterpolationMode const linear(kKTInterpolationLinear);
    return KTTransform::Interpolate(keyframes[k].transform, keyframes[k + 1].transform, local);
}

} // namespace

// ---- keyframes ----

TEST(Keyframe, IsATransformAndAFrame) {
    EXPECT_EQ(KTKeyframe(), KTKeyframe(KTTransform(), 0));
    KTKeyframe const keyframe(At(3), -7);
    EXPECT_EQ(keyframe.frame, -7);
    EXPECT_EQ(keyframe.transform, At(3));
    EXPECT_NE(keyframe, KTKeyframe(At(3), 7));
    EXPECT_NE(keyframe, KTKeyframe(At(4), -7));
}

TEST(Animation, KeepsKeyframesInOrderOfTheirFrames) {
    KTAnimation animation = Animation({{30, 3}, {-10, 1}, {INT_MAX, 5}, {0, 2}, {INT_MIN, 4}});
    EXPECT_EQ(FramesOf(animation), (std::vector<int>{INT_MIN, -10, 0, 30, INT_MAX}));
    EXPECT_EQ(animation.GetNumKeyframes(), 5U);
    EXPECT_EQ(animation.GetKeyframes()[3], KTKeyframe(At(3), 30));
}

TEST(Animation, AKeyframeReplacesTheOneAtItsFrame) {
    KTAnimation animation = Animation({{0, 1}, {30, 3}});
    animation.AddKeyframe({At(9), 30});
    EXPECT_EQ(animation.GetNumKeyframes(), 2U);
    EXPECT_EQ(animation.GetKeyframes()[1], KTKeyframe(At(9), 30));
}

TEST(Animation, KeyframesAreFoundAndRemovedByTheirFrame) {
    KTAnimation animation = Animation({{0, 1}, {30, 3}, {60, 6}});
    KTKeyframe found;
    EXPECT_TRUE(animation.GetKeyframe(30, found));
    EXPECT_EQ(found, KTKeyframe(At(3), 30));
    EXPECT_FALSE(animation.GetKeyframe(31, found));
    EXPECT_EQ(found, KTKeyframe(At(3), 30)) << "left alone";
    EXPECT_FALSE(animation.RemoveKeyframe(29));
    EXPECT_EQ(animation.GetNumKeyframes(), 3U);
    EXPECT_TRUE(animation.RemoveKeyframe(30));
    EXPECT_FALSE(animation.RemoveKeyframe(30));
    EXPECT_EQ(FramesOf(animation), (std::vector<int>{0, 60}));
    animation.RemoveAllKeyframes();
    EXPECT_EQ(animation.GetNumKeyframes(), 0U);
    EXPECT_TRUE(animation.GetKeyframes().empty());
}

TEST(Animation, CopiesAreWholeAndApart) {
    KTAnimation original = Animation({{0, 1}, {30, 3}});
    KTAnimation const copy(original);
    KTAnimation assigned = Animation({{7, 7}});
    assigned = original;
    original.RemoveKeyframe(0);
    original.AddKeyframe({At(9), 30});
    EXPECT_EQ(FramesOf(copy), (std::vector<int>{0, 30}));
    EXPECT_EQ(FramesOf(assigned), (std::vector<int>{0, 30}));
    EXPECT_EQ(copy.GetKeyframes()[1], KTKeyframe(At(3), 30));
    KTAnimation const &itself = assigned;
    assigned = itself;
    EXPECT_EQ(FramesOf(assigned), (std::vector<int>{0, 30}));
}

// ---- the transform at a frame ----

TEST(Animation, WithoutKeyframesIsTheDefaultTransform) {
    EXPECT_EQ(KTAnimation().GetTransform(0), KTTransform());
    EXPECT_EQ(KTAnimation().GetTransform(INT_MIN), KTTransform());
}

TEST(Animation, WithOneKeyframeIsThat) {
    KTAnimation const animation = Animation({{10, 3}});
    for (int const frame : {INT_MIN, 0, 9, 10, 11, INT_MAX}) {
        EXPECT_EQ(animation.GetTransform(frame), At(3)) << frame;
    }
}

TEST(Animation, EasesAsAWhole) {
    KTAnimation const animation = Animation({{0, 0}, {100, 200}});
    EXPECT_EQ(ValueAt(animation, 0), 0.0F);
    EXPECT_EQ(ValueAt(animation, 50), 100.0F) << "half-way";
    EXPECT_EQ(animation.GetTransform(50).color, KTColor4f(100, 0, 200, 1));
    EXPECT_EQ(ValueAt(animation, 15), 0.05F * 200.0F) << "eased to 0.0536, so frame 5";
    EXPECT_EQ(ValueAt(animation, 85), 0.95F * 200.0F);
    EXPECT_EQ(ValueAt(animation, 100), 200.0F);
}

TEST(Animation, ShowsItsEndsOutside) {
    KTAnimation const animation = Animation({{-50, 1}, {0, 5}, {100, 2}});
    for (int const frame : {INT_MIN, -1000, -51, -50}) {
        EXPECT_EQ(animation.GetTransform(frame), At(1)) << frame;
    }
    for (int const frame : {100, 101, 1000, INT_MAX}) {
        EXPECT_EQ(animation.GetTransform(frame), At(2)) << frame;
    }
}

// The segment comes from the frame that is asked for, the place in it from the eased one: while easing is behind, the
// keyframe at the segment's start is held, and while it is ahead, the one at its end.
TEST(Animation, HoldsAKeyframeWhileEasingIsOutsideOfTheSegment) {
    KTAnimation const animation = Animation({{0, 0}, {20, 1}, {80, 2}, {100, 3}});
    EXPECT_EQ(ValueAt(animation, 25), 1.0F) << "eased to frame 15, before the segment from 20 to 80";
    EXPECT_EQ(ValueAt(animation, 75), 2.0F) << "eased to frame 85, behind it";
    EXPECT_EQ(ValueAt(animation, 50), 1.5F);
    EXPECT_EQ(ValueAt(animation, 20), 10.0F / 20.0F) << "a keyframe's own frame belongs to the segment that it ends";
}

TEST(Animation, LinearModeMeetsEveryKeyframe) {
    ScopedInterpolationMode const linear(kKTInterpolationLinear);
    KTAnimation const animation = Animation({{0, 0}, {20, 1}, {80, 2}, {100, 3}});
    EXPECT_EQ(ValueAt(animation, 20), 1.0F);
    EXPECT_EQ(ValueAt(animation, 80), 2.0F);
    EXPECT_EQ(ValueAt(animation, 35), 1.25F);
    EXPECT_EQ(ValueAt(animation, -5), 0.0F);
    EXPECT_EQ(ValueAt(animation, 105), 3.0F);
}

TEST(Animation, TheWarpedFrameIsRounded) {
    // Between frames 0 and 3, frame 1 is eased to 0.2619 of the way, 0.79 frames.
    EXPECT_EQ(ValueAt(Animation({{0, 0}, {3, 3}}), 1), 1.0F);
    // Between frames 0 and 10, frame 1 is eased to 0.0238 of the way, 0.24 frames, and frame 2 to 0.95.
    EXPECT_EQ(ValueAt(Animation({{0, 0}, {10, 10}}), 1), 0.0F);
    EXPECT_EQ(ValueAt(Animation({{0, 0}, {10, 10}}), 2), 1.0F);
    // Counted from the first keyframe, so that negative frames are rounded as others are.
    EXPECT_EQ(ValueAt(Animation({{-10, 0}, {0, 10}}), -9), 0.0F);
    EXPECT_EQ(ValueAt(Animation({{-10, 0}, {0, 10}}), -8), 1.0F);
}

TEST(Animation, AllFramesOfIntDoNotOverflow) {
    KTAnimation const animation = Animation({{INT_MIN, 0}, {INT_MAX, 8}});
    EXPECT_EQ(ValueAt(animation, INT_MIN), 0.0F);
    EXPECT_EQ(ValueAt(animation, INT_MAX), 8.0F);
    EXPECT_EQ(ValueAt(animation, -1), 4.0F);
    EXPECT_EQ(ValueAt(animation, 0), 4.0F);
    KTAnimation const three = Animation({{INT_MIN, 0}, {0, 4}, {INT_MAX, 8}});
    EXPECT_EQ(ValueAt(three, INT_MAX), 8.0F);
    EXPECT_EQ(ValueAt(three, INT_MAX - 1), 8.0F);
}

// In single precision, 16,777,217 frames are 16,777,216: the product would end one frame early.
TEST(Animation, ALongAnimationReachesItsEnd) {
    EXPECT_EQ(ValueAt(Animation({{0, 0}, {16'777'216, 1}, {16'777'217, 2}}), 16'777'217), 2.0F);
}

TEST(Animation, RoundsHalfAFrameUp) {
    // Frame 6 of 19 is eased to four and a half, which a product with more digits than its factors would miss.
    EXPECT_FLOAT_EQ(ValueAt(Animation({{0, 0}, {19, 19}}), 6), 5.0F);
}

TEST(Animation, CarriesNanAndInfinity) {
    float const nan = std::numeric_limits<float>::quiet_NaN();
    float const infinity = std::numeric_limits<float>::infinity();
    EXPECT_TRUE(std::isnan(ValueAt(Animation({{0, nan}, {100, 1}}), 50)));
    EXPECT_EQ(ValueAt(Animation({{0, 0}, {100, infinity}}), 50), infinity);
}

// ---- the process-wide mode ----

TEST(Animation, LeavesTheModeAsItWas) {
    KTAnimation const animation = Animation({{0, 0}, {100, 200}});
    animation.GetTransform(50);
    EXPECT_EQ(KTInterpolator::GetInterpolationMode(), kKTInterpolationEaseInEaseOut);
    ScopedInterpolationMode const linear(kKTInterpolationLinear);
    animation.GetTransform(50);
    EXPECT_EQ(KTInterpolator::GetInterpolationMode(), kKTInterpolationLinear);
}

TEST(Animation, AnUnknownModeThrowsAndStays) {
    ScopedInterpolationMode const unknown(kUnknownMode);
    KTAnimation const animation = Animation({{0, 0}, {100, 200}});
    ExpectInternalError(47, [&] { animation.GetTransform(50); });
    EXPECT_EQ(KTInterpolator::GetInterpolationMode(), kUnknownMode);
    EXPECT_EQ(ValueAt(animation, 101), 200.0F) << "nothing to interpolate beyond the last keyframe";
    EXPECT_EQ(KTAnimation().GetTransform(5), KTTransform());
}

// ---- against the walk ----

TEST(Animation, AgreesWithAWalkThroughAllKeyframes) {
    unsigned const seed = std::random_device{}();
    std::mt19937 random(seed);
    for (int round = 0; round < 200; ++round) {
        KTAnimation animation;
        std::vector<KTKeyframe> keyframes;
        int frame = std::uniform_int_distribution<int>(-1000, 1000)(random);
        int const count = std::uniform_int_distribution<int>(0, 12)(random);
        for (int i = 0; i < count; ++i) {
            keyframes.emplace_back(At(std::uniform_real_distribution<float>(-5, 5)(random)), frame);
            frame += std::uniform_int_distribution<int>(1, 100)(random);
        }
        std::vector<KTKeyframe> shuffled = keyframes;
        std::shuffle(shuffled.begin(), shuffled.end(), random);
        for (KTKeyframe const &keyframe : shuffled) {
            animation.AddKeyframe(keyframe);
        }
        for (auto const mode : {kKTInterpolationLinear, kKTInterpolationEaseInEaseOut}) {
            ScopedInterpolationMode const scope(mode);
            for (int asked = -1100; asked <= 2300; asked += 7) {
                ASSERT_EQ(animation.GetTransform(asked), WalkedTransform(keyframes, asked))
                    << "seed " << seed << ", round " << round << ", frame " << asked;
            }
        }
    }
}
