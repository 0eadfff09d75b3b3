// KTAnimation.cpp: keyframes and the transform at a frame.

#include "KTAnimation.h"

#include "KTInterpolator.h"

#include <algorithm>
#include <cmath>
#include <iterator>

namespace {

// While it lives, interpolation is linear.
class LinearModeScope {
  public:
    LinearModeScope() { KTInterpolator::SetInterpolationMode(kKTInterpolationLinear); }
    LinearModeScope(LinearModeScope const &) = delete;
    LinearModeScope &operator=(LinearModeScope const &) = delete;
    ~LinearModeScope() { KTInterpolator::SetInterpolationMode(m_Mode); }

  private:
    KTInterpolationModeEnum const m_Mode = KTInterpolator::GetInterpolationMode();
};

// Where `frame` lies between two others, 0 to 1. In 64 bits, as frames may be any int.
float PositionBetween(long long frame, long long start, long long end) {
    float const position = static_cast<float>(frame - start) / static_cast<float>(end - start);
    return std::clamp(position, 0.0F, 1.0F);
}

// The frame at the eased position of `frame` in the whole animation. A float does not hold every frame of a long
// animation, so the end is not left to the product.
long long WarpedFrame(int frame, int first, int last) {
    float const eased = KTInterpolator::Interpolate(0.0F, 1.0F, PositionBetween(frame, first, last));
    if (eased >= 1.0F) {
        return last;
    }
    float const passed = eased * static_cast<float>(static_cast<long long>(last) - first);
    return first + static_cast<long long>(std::trunc(static_cast<double>(passed) + 0.5));
}

} // namespace

KTAnimation::KTAnimation() = default;
KTAnimation::KTAnimation(KTAnimation const &other) = default;
KTAnimation &KTAnimation::operator=(KTAnimation const &other) = default;
KTAnimation::~KTAnimation() = default;

void KTAnimation::AddKeyframe(KTKeyframe const &keyframe) { m_Keyframes.insert_or_assign(keyframe.frame, keyframe); }

bool KTAnimation::RemoveKeyframe(int const &frame) { return m_Keyframes.erase(frame) != 0; }

void KTAnimation::RemoveAllKeyframes() { m_Keyframes.clear(); }

bool KTAnimation::GetKeyframe(int const &frame, KTKeyframe &keyframe) const {
    auto const found = m_Keyframes.find(frame);
    if (found == m_Keyframes.end()) {
        return false;
    }
    keyframe = found->second;
    return true;
}

std::vector<KTKeyframe> KTAnimation::GetKeyframes() const {
    std::vector<KTKeyframe> keyframes;
    keyframes.reserve(m_Keyframes.size());
    for (auto const &[frame, keyframe] : m_Keyframes) {
        keyframes.push_back(keyframe);
    }
    return keyframes;
}

std::size_t KTAnimation::GetNumKeyframes() const { return m_Keyframes.size(); }

KTTransform KTAnimation::GetTransform(int const &frame) const {
    if (m_Keyframes.empty()) {
        return {};
    }
    auto const first = m_Keyframes.begin();
    auto const last = std::prev(m_Keyframes.end());
    // The segment's end is the successor of some keyframe, so never the first one.
    auto end = m_Keyframes.lower_bound(frame);
    if (end == first) {
        ++end;
    }
    if (end == m_Keyframes.end()) {
        return last->second.transform;
    }
    auto const start = std::prev(end);
    long long const warped = WarpedFrame(frame, first->first, last->first);
    float const local = PositionBetween(warped, start->first, end->first);
    LinearModeScope const linear;
    return KTTransform::Interpolate(start->second.transform, end->second.transform, local);
}
