// WODigest.cpp: digests by the system's cryptography, CNG.

#include "ODigest.h"

#include <windows.h>

#include <bcrypt.h>

#include <algorithm>
#include <cstdio>
#include <limits>
#include <new>
#include <stdexcept>

namespace {

constexpr NTSTATUS kNoMemory = static_cast<NTSTATUS>(0xC0000017);

// The algorithms' own handles, which Windows 10 has and nobody opens or closes; older headers do not name them.
constexpr ULONG_PTR kSha1 = 0x31;
constexpr ULONG_PTR kSha256 = 0x41;

void Require(NTSTATUS status) {
    if (status == kNoMemory) {
        throw std::bad_alloc();
    }
    if (status < 0) {
        char text[64];
        std::snprintf(text, sizeof text, "digest refused by the system, status 0x%08lX",
                      static_cast<unsigned long>(status));
        throw std::runtime_error(text);
    }
}

} // namespace

void ODigest::DeleteState::operator()(State *state) const noexcept { BCryptDestroyHash(state); }

ODigest::ODigest(ODigestKind kind) : m_Kind(kind) {
    auto *const algorithm = reinterpret_cast<BCRYPT_ALG_HANDLE>(kind == ODigestKind::Sha1 ? kSha1 : kSha256);
    BCRYPT_HASH_HANDLE hash = nullptr;
    Require(BCryptCreateHash(algorithm, &hash, nullptr, 0, nullptr, 0, 0));
    m_State.reset(static_cast<State *>(hash));
}

void ODigest::Add(void const *bytes, std::size_t size) {
    // The system takes sizes of 32 bits, and its parameter is not constant although it only reads.
    constexpr std::size_t kMost = std::numeric_limits<ULONG>::max();
    auto *next = static_cast<unsigned char *>(const_cast<void *>(bytes));
    while (size != 0) {
        std::size_t const part = std::min(size, kMost);
        Require(BCryptHashData(m_State.get(), next, static_cast<ULONG>(part), 0));
        next += part;
        size -= part;
    }
}

void ODigest::Finish(unsigned char *digest) {
    ULONG const size = m_Kind == ODigestKind::Sha1 ? kOSha1Size : kOSha256Size;
    Require(BCryptFinishHash(m_State.get(), digest, size, 0));
}
