// BenchAnimation.cpp: an animation's transform at a frame, by the number of keyframes, and beside a walk from keyframe
// to keyframe as a host would write it for a few of them. Frames are asked for in random order, as when an author drags
// the play head.

#include "Bench.h"

#include "KTAnimation.h"
#include "KTInterpolator.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <random>
#include <vector>

namespace bench {

namespace {

constexpr char kGroup[] = "animation";
constexpr char kGrowthGroup[] = "animation-growth";
constexpr char kWalk[] = "walk";
constexpr int kFramesBetween = 10;

// Fixed, as a call is so short that on a busy machine one interrupted call would pass for a whole repetition.
constexpr benchmark::IterationCount kCalls = 10'000;

struct Size {
    char const *name;
    int keyframes;
};

constexpr Size kSizes[] = {{"100", 100}, {"1000", 1000}, {"10000", 10'000}};

std::vector<KTKeyframe> Keyframes(int count) {
    std::vector<KTKeyframe> keyframes;
    for (int i = 0; i < count; ++i) {
        auto const x = static_cast<float>(i % 97);
        keyframes.emplace_back(KTTransform({x, 0, 0}, {1, 1, 1}, {0, 0, 1}, x / 97, {1, 1, 1, 1}), kFramesBetween * i);
    }
    return keyframes;
}

std::vector<int> RandomFrames(int count) {
    std::mt19937 random(1);
    std::uniform_int_distribution<int> frame(0, kFramesBetween * (count - 1));
    std::vector<int> frames(4096);
    std::generate(frames.begin(), frames.end(), [&] { return frame(random); });
    return frames;
}

float PositionBetween(int frame, int start, int end) {
    return std::clamp(static_cast<float>(frame - start) / static_cast<float>(end - start), 0.0F, 1.0F);
}

KTTransform WalkTo(std::vector<KTKeyframe> const &keyframes, int frame) {
    std::size_t start = 0;
    while (start + 2 < keyframes.size() && keyframes[start + 1].frame < frame) {
        ++start;
    }
    int const first = keyframes.front().frame;
    int const span = keyframes.back().frame - first;
    float const eased = KTInterpolator::Interpolate(0.0F, 1.0F, PositionBetween(frame, first, first + span));
    int const warped = first + static_cast<int>(std::trunc(eased * static_cast<float>(span) + 0.5));
    float const local = PositionBetween(warped, keyframes[start].frame, keyframes[start + 1].frame);
    KTInterpolator::SetInterpolationMode(kKTInterpolationLinear);
    KTTransform const transform =
        KTTransform::Interpolate(keyframes[start].transform, keyframes[start + 1].transform, local);
    KTInterpolator::SetInterpolationMode(kKTInterpolationEaseInEaseOut);
    return transform;
}

// The next of the frames at each call, over and over.
class FrameCycle {
  public:
    explicit FrameCycle(int keyframes) : m_Frames(RandomFrames(keyframes)) {}
    int Next() { return m_Frames[m_Next++ % m_Frames.size()]; }

  private:
    std::vector<int> m_Frames;
    std::size_t m_Next = 0;
};

void AddLibrary(char const *group, Size const &size) {
    Add({group, "get-transform", size.name}, kOurs, [size](benchmark::State &state) {
        KTAnimation animation;
        for (KTKeyframe const &keyframe : Keyframes(size.keyframes)) {
            animation.AddKeyframe(keyframe);
        }
        FrameCycle frames(size.keyframes);
        for (auto _ : state) {
            benchmark::DoNotOptimize(animation.GetTransform(frames.Next()));
        }
    })->Iterations(kCalls);
}

void AddWalk(Size const &size) {
    Add({kGroup, "get-transform", size.name}, kWalk, [size](benchmark::State &state) {
        std::vector<KTKeyframe> const keyframes = Keyframes(size.keyframes);
        FrameCycle frames(size.keyframes);
        for (auto _ : state) {
            benchmark::DoNotOptimize(WalkTo(keyframes, frames.Next()));
        }
    })->Iterations(kCalls);
}

} // namespace

void AddAnimationBenchmarks() {
    DescribeGroup(kGroup, "KTAnimation::GetTransform beside a walk through the keyframes");
    ExpectSpeed(kGroup, kWalk, 1.0);
    DescribeGrowthGroup(kGrowthGroup, "cost as the keyframes become more");
    for (Size const &size : kSizes) {
        AddLibrary(kGroup, size);
        AddWalk(size);
        AddLibrary(kGrowthGroup, size);
    }
}

} // namespace bench
