// KTAnimation.h: an object's transform over time, from keyframes.
//
//     KTAnimation animation;
//     animation.AddKeyframe(KTKeyframe(start, 0));
//     animation.AddKeyframe(KTKeyframe(end, 100));
//     KTTransform const now = animation.GetTransform(50);
//
// The process-wide interpolation mode (KTInterpolator.h) eases the animation as a whole, from its first to its last
// keyframe, not each segment between two keyframes.
//
// Threads: animations are evaluated on one thread at a time, different ones too, as GetTransform switches the
// process-wide mode meanwhile. All other operations may run on any thread, on one animation by one thread at a time.

#pragma once

#include "KTGraphicsStructs.h"

#include <cstddef>
#include <map>
#include <vector>

#include "KTBeginExports.h"

/// A transform and the frame at which it is reached. Frames are counted in whatever rate the host plays; any int will
/// do, negative ones too. 84 bytes.
struct KTKeyframe {
    KTTransform transform;
    int frame = 0;

    /// The default transform at frame 0.
    constexpr KTKeyframe() = default;

    constexpr KTKeyframe(KTTransform const &transformValue, int frameNumber)
        : transform(transformValue), frame(frameNumber) {}

    friend constexpr bool operator==(KTKeyframe const &a, KTKeyframe const &b) = default;
};

/// Keyframes in ascending order of their frames, one a frame.
class KT_PUBLIC_API KTAnimation {
  public:
    /// No keyframes.
    KTAnimation();

    KTAnimation(KTAnimation const &other);
    KTAnimation &operator=(KTAnimation const &other);
    ~KTAnimation();

    // ---- keyframes: each call takes logarithmic time unless it says otherwise ----

    /// Adds the keyframe, or replaces the one at its frame. Throws std::bad_alloc, which leaves the animation as it was.
    void AddKeyframe(KTKeyframe const &keyframe);

    /// Removes the keyframe at that frame. False if there is none.
    bool RemoveKeyframe(int const &frame);

    /// Removes all of them, in linear time.
    void RemoveAllKeyframes();

    /// Stores the keyframe at exactly that frame and returns true; returns false and leaves `keyframe` alone if there is
    /// none.
    bool GetKeyframe(int const &frame, KTKeyframe &keyframe) const;

    /// All keyframes in ascending order of their frames, copied in linear time.
    std::vector<KTKeyframe> GetKeyframes() const;

    /// How many there are, in constant time.
    std::size_t GetNumKeyframes() const;

    // ---- playing ----

    /// The transform at a frame, in time logarithmic in the number of keyframes.
    ///
    /// Without keyframes the default transform; with one, or beyond the last, that keyframe's. Otherwise the segment is
    /// the one whose end is the first keyframe after the first one at or beyond `frame`; the place within it comes from
    /// the eased position in the whole animation, as a frame, rounded half up:
    ///
    ///     global = (frame - first) / (last - first)                in float, clamped to 0..1
    ///     warped = first + int(Interpolate(0, 1, global) * (last - first) + 0.5)     the product in float
    ///     local  = (warped - start) / (end - start)                in float, clamped to 0..1
    ///
    /// and the transforms of the segment's two keyframes are interpolated linearly at `local`. So while easing carries
    /// the warped frame out of the segment, the segment's nearer keyframe is shown.
    ///
    /// Throws KTLCException, "kKTErrorInternal", when the process-wide mode is unknown. The mode is linear during the
    /// last step and restored afterwards.
    KTTransform GetTransform(int const &frame) const;

  private:
    std::map<int, KTKeyframe> m_Keyframes;
};

#include "KTEndExports.h"
