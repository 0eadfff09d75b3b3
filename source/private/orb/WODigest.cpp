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

struct DestroyHash {
    using pointer = BCRYPT_HASH_HANDLE;
    void operator()(BCRYPT_HASH_HANDLE hash) const noexcept { BCryptDestroyHash(hash); }
};

} // namespace

struct ODigest::State {
    std::unique_ptr<BCRYPT_HASH_HANDLE, DestroyHash> hash;
    ULONG size = 0;
};

ODigest::ODigest(ODigestKind kind) : m_State(std::make_unique<State>()) {
    bool const isSha1 = kind == ODigestKind::Sha1;
    auto *const algorithm = reinterpret_cast<BCRYPT_ALG_HANDLE>(isSha1 ? kSha1 : kSha256);
    BCRYPT_HASH_HANDLE hash = nullptr;
    Require(BCryptCreateHash(algorithm, &hash, nullptr, 0, nullptr, 0, 0));
    m_State->hash.reset(hash);
    m_State->size = isSha1 ? kOSha1Size : kOSha256Size;
}

ODigest::~ODigest() = default;

void ODigest::Add(void const *bytes, std::size_t size) {
    // The system takes sizes of 32 bits, and its parameter is not constant although it only reads.
    constexpr std::size_t kMost = std::numeric_limits<ULONG>::max();
    auto *next = static_cast<unsigned char *>(const_cast<void *>(bytes));
    while (size != 0) {
        std::size_t const part = std::min(size, kMost);
        Require(BCryptHashData(m_State->hash.get(), next, static_cast<ULONG>(part), 0));
        next += part;
        size -= part;
    }
}

void ODigest::Finish(unsigned char *digest) {
    Require(BCryptFinishHash(m_State->hash.get(), digest, m_State->size, 0));
}
