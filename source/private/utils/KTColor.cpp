// KTColor.cpp: colours and the stops of gradients.

#include "KTColor.h"

#include <cmath>

namespace {

constexpr double kTolerance = 1e-5; // amounts nearer than this are the same
constexpr double kHighestByte = 255.0;

bool IsNear(KTReal const &a, KTReal const &b) { return std::fabs((a - b).AsDouble()) < kTolerance; }

// The byte whose lowest bit is `shift`, as an amount of 0 to 1.
KTReal AmountOfByte(KTUInt32 argb, int shift) { return ((argb >> shift) & 0xFFU) / kHighestByte; }

// The checked conversion; the sign goes, as the bits are all that counts.
KTUInt32 BitsOfAmount(KTReal const &amount) {
    return static_cast<KTUInt32>(static_cast<KTInt32>(amount * kHighestByte));
}

KTReal ComponentOrZero(std::vector<KTReal> const &components, std::size_t n) {
    return n < components.size() ? components[n] : KTReal(0.0);
}

} // namespace

KTColor::KTColor() : m_Components(3, KTReal(0.0)) {}

KTColor::KTColor(KTUInt32 argb)
    : m_Components{AmountOfByte(argb, 16), AmountOfByte(argb, 8), AmountOfByte(argb, 0)},
      m_Alpha(AmountOfByte(argb, 24)) {}

KTColor::KTColor(KTColor const &other) = default;
KTColor &KTColor::operator=(KTColor const &other) = default;
KTColor::~KTColor() = default;

void KTColor::GetResultantARGB(KTARGB &argb) const {
    argb.alpha = m_Alpha;
    argb.red = ComponentOrZero(m_Components, 0) * m_TransparencyFactor;
    argb.green = ComponentOrZero(m_Components, 1) * m_TransparencyFactor;
    argb.blue = ComponentOrZero(m_Components, 2) * m_TransparencyFactor;
}

void KTColor::GetARGB(KTARGB &argb) const {
    argb = {m_Alpha, ComponentOrZero(m_Components, 0), ComponentOrZero(m_Components, 1),
            ComponentOrZero(m_Components, 2)};
}

KTReal KTColor::GetAlpha() const { return m_Alpha; }

KTErrorCodeEnum KTColor::SetAlpha(KTReal const &alpha) {
    m_Alpha = alpha;
    return kKTErrorNone;
}

KTReal KTColor::GetResultantAlpha() const { return m_Alpha * m_TransparencyFactor; }

KTReal KTColor::GetTransparencyFactor() { return m_TransparencyFactor; }

KTErrorCodeEnum KTColor::SetTransparencyFactor(KTReal const &factor) {
    m_TransparencyFactor = factor;
    return kKTErrorNone;
}

KTColor::ColorSpaceEnum KTColor::GetColorSpace() const { return m_ColorSpace; }

std::vector<KTReal> const &KTColor::GetColorData() const { return m_Components; }

int KTColor::GetNumComponents() const { return static_cast<int>(m_Components.size()); }

KTReal KTColor::GetNthComponent(int n) const { return m_Components[static_cast<std::size_t>(n)]; }

KTErrorCodeEnum KTColor::SetColorSpace(ColorSpaceEnum space) {
    m_ColorSpace = space;
    return kKTErrorNone;
}

KTErrorCodeEnum KTColor::SetColorData(ColorSpaceEnum space, std::vector<KTReal> const &components) {
    m_Components = components; // may throw, so the space comes second
    m_ColorSpace = space;
    return kKTErrorNone;
}

KTErrorCodeEnum KTColor::SetColorData(std::vector<KTReal> const &components) {
    m_Components = components;
    return kKTErrorNone;
}

KTBool16 KTColor::IsEqual(KTColor const *other) const {
    if (other == nullptr || m_ColorSpace != other->GetColorSpace() ||
        m_Components.size() != other->m_Components.size()) {
        return 0;
    }
    for (std::size_t n = 0; n < m_Components.size(); ++n) {
        if (!IsNear(m_Components[n], other->m_Components[n])) {
            return 0;
        }
    }
    return 1;
}

KTUInt32 KTColor::GetColorAsUInt() const {
    KTUInt32 const alpha = BitsOfAmount(GetAlpha()) << 24;
    if (m_Components.empty()) {
        return alpha;
    }
    KTUInt32 const red = BitsOfAmount(ComponentOrZero(m_Components, 0)) & 0xFFU;
    KTUInt32 const green = BitsOfAmount(ComponentOrZero(m_Components, 1)) & 0xFFU;
    KTUInt32 const blue = BitsOfAmount(ComponentOrZero(m_Components, 2)) & 0xFFU;
    return alpha | red << 16 | green << 8 | blue;
}

KTBool16 KTColor::operator==(KTColor const &other) const {
    bool const sameAmounts = IsNear(m_Alpha, other.m_Alpha) && IsNear(m_TransparencyFactor, other.m_TransparencyFactor);
    return sameAmounts && IsEqual(&other) != 0 ? 1 : 0;
}

KTBool16 KTColor::operator!=(KTColor const &other) const { return *this == other ? 0 : 1; }

KTColorStop::KTColorStop() = default;

KTColorStop::KTColorStop(KTColor const &colorValue, KTReal const &positionValue)
    : color(colorValue), position(positionValue) {}

KTBool16 KTColorStop::operator==(KTColorStop const &other) const {
    return IsNear(position, other.position) && (color == other.color) != 0 ? 1 : 0;
}

KTBool16 KTColorStop::operator!=(KTColorStop const &other) const { return *this == other ? 0 : 1; }

bool KTColorStop::operator<(KTColorStop const &other) const {
    bool const isNan = std::isnan(position.AsDouble());
    bool const otherIsNan = std::isnan(other.position.AsDouble());
    return isNan || otherIsNan ? !isNan : position < other.position;
}
