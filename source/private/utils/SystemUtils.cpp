// SystemUtils.cpp: identifiers, protected texts on streams, and what this system does not offer.

#include "KTSystemUtils.h"

#include "KTAssert.h"
#include "ODataProtection.h"
#include "OGuid.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <utility>

namespace {

constexpr char kSourcePath[] = "source/private/utils/SystemUtils";
constexpr int kPiece = 64 * 1024; // bytes read at once, so that a wrong count takes no memory

std::span<unsigned char const> BytesWithTerminator(KTString const &text) {
    return {reinterpret_cast<unsigned char const *>(text.c_str()), (text.size() + 1) * sizeof(unsigned short)};
}

bool IsGood(IKTStream &stream) {
    KTStreamState const state = stream.GetStreamState();
    return state != kKTStreamStateError && state != kKTStreamStateClosed;
}

bool WriteCounted(IKTStream &stream, std::vector<unsigned char> &bytes) {
    auto count = static_cast<int>(bytes.size());
    return stream.XferInt32(&count, 1) == 1 && stream.XferByte(bytes.data(), count) == count && IsGood(stream);
}

// Empty if the stream ends too early, or the count is none. A transport may say that it has ended when it gave all that
// was asked for, so only the counts tell.
std::vector<unsigned char> ReadCounted(IKTStream &stream) {
    int left = 0;
    if (stream.XferInt32(&left, 1) != 1) {
        return {};
    }
    std::vector<unsigned char> bytes;
    while (left > 0) {
        int const wanted = std::min(left, kPiece);
        std::size_t const filled = bytes.size();
        bytes.resize(filled + static_cast<std::size_t>(wanted));
        if (stream.XferByte(bytes.data() + filled, wanted) != wanted) {
            return {};
        }
        left -= wanted;
    }
    return bytes;
}

// Nothing, but a report, if the bytes are no units that end in a zero unit.
bool TakeText(std::span<unsigned char const> bytes, KTString &text) {
    constexpr std::size_t kUnit = sizeof(unsigned short);
    std::size_t const last = bytes.size() - std::min(bytes.size(), kUnit);
    if (bytes.empty() || bytes.size() % kUnit != 0 || bytes[last] != 0 || bytes[last + 1] != 0) {
        KTAssertFailed("string is not null terminated", kSourcePath, 196);
        return false;
    }
    KTString read; // filled in place: no copy of a secret may stay behind in freed memory
    read.append(last / kUnit, 0);
    if (last != 0) {
        std::memcpy(&read[0], bytes.data(), last);
    }
    text = std::move(read);
    return true;
}

} // namespace

KTString KTSystemUtils::CreateGUID() {
    OGuidText text{};
    switch (OMakeGuid(text)) {
    case OGuidResult::kMade:
        break;
    case OGuidResult::kNotGenerated:
        KTAssertFailed("Failed to generate a GUID", kSourcePath, 88);
        break;
    case OGuidResult::kNotWritten:
        KTAssertFailed("Failed to convert GUID to string", kSourcePath, 83);
        break;
    }
    return KTString(text.data());
}

KTErrorCodeEnum KTSystemUtils::EncryptStringUsingSystemCredentials(KTString const &text, IKTStream &stream) {
    if (stream.IsWriting() == 0) {
        return kKTErrorFailed;
    }
    std::vector<unsigned char> bytes = OProtectData(BytesWithTerminator(text));
    if (bytes.empty() || bytes.size() > static_cast<std::size_t>(std::numeric_limits<int>::max())) {
        return kKTErrorFailed;
    }
    return WriteCounted(stream, bytes) ? kKTErrorNone : kKTErrorFailed;
}

KTErrorCodeEnum KTSystemUtils::DecryptStringUsingSystemCredentials(IKTStream &stream, KTString &text) {
    if (stream.IsReading() == 0) {
        return kKTErrorFailed;
    }
    std::vector<unsigned char> const bytes = ReadCounted(stream);
    std::optional<OSecretBytes> const secret = bytes.empty() ? std::nullopt : OUnprotectData(bytes);
    return secret && TakeText(secret->Get(), text) ? kKTErrorNone : kKTErrorFailed;
}

bool KTSystemUtils::GetAppFocused() {
    KTAssertFailed("GetAppFocused - Not implemented", kSourcePath, 231);
    return false;
}

bool KTSystemUtils::IsConnectedToNetwork() {
    KTAssertFailed("IsConnectedToNetwork - Not implemented", kSourcePath, 238);
    return false;
}

KTErrorCodeEnum KTSystemUtils::OpenURL(KTString const &) {
    KTAssertFailed("Not implemented OpenURL", kSourcePath, 245);
    return kKTErrorFailed;
}
