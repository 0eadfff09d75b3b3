// ODataProtection_posix.cpp: for the native developer build, a form that shows changes and protects nothing: four bytes
// that mark it, the data with every bit turned over, and the sum of the data in one byte.

#include "ODataProtection.h"

#include <algorithm>
#include <array>

namespace {

constexpr std::array<unsigned char, 4> kMark = {'K', 'T', 'D', 'P'};

unsigned char SumOf(std::span<unsigned char const> data) {
    unsigned sum = 0;
    for (unsigned char const byte : data) {
        sum = sum * 31 + byte;
    }
    return static_cast<unsigned char>(sum);
}

} // namespace

std::vector<unsigned char> OProtectData(std::span<unsigned char const> data) {
    std::vector<unsigned char> bytes(kMark.begin(), kMark.end());
    for (unsigned char const byte : data) {
        bytes.push_back(static_cast<unsigned char>(~byte));
    }
    bytes.push_back(SumOf(data));
    return bytes;
}

std::optional<OSecretBytes> OUnprotectData(std::span<unsigned char const> bytes) {
    if (bytes.size() <= kMark.size() || !std::equal(kMark.begin(), kMark.end(), bytes.begin())) {
        return std::nullopt;
    }
    std::vector<unsigned char> data;
    for (unsigned char const byte : bytes.subspan(kMark.size(), bytes.size() - kMark.size() - 1)) {
        data.push_back(static_cast<unsigned char>(~byte));
    }
    if (SumOf(data) != bytes.back()) {
        return std::nullopt;
    }
    return std::optional<OSecretBytes>(std::in_place, data);
}
