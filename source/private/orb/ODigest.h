// ODigest.h: the message digests SHA-1 and SHA-256 (FIPS 180-4), fed piece by piece.
//
//     ODigest digest(ODigestKind::Sha256);
//     digest.Add(head, headSize);
//     digest.Add(body, bodySize);
//     unsigned char result[kOSha256Size];
//     digest.Finish(result);
//
// On Windows the system's cryptography (CNG) computes them. A digest belongs to one thread at a time. What the system
// cannot do throws: std::bad_alloc when memory is short, else std::runtime_error with the status.

#pragma once

#include <cstddef>
#include <memory>

enum class ODigestKind { Sha1, Sha256 };

inline constexpr std::size_t kOSha1Size = 20;   // bytes
inline constexpr std::size_t kOSha256Size = 32; // bytes
inline constexpr std::size_t kOShaBlock = 64;   // bytes that both digest at a time

/// One digest under way.
class ODigest {
  public:
    explicit ODigest(ODigestKind kind);

    /// Takes the next bytes of the message. `bytes` may be null when `size` is 0.
    void Add(void const *bytes, std::size_t size);

    /// Writes the digest of all bytes so far, kOSha1Size or kOSha256Size bytes. The last call to this object.
    void Finish(unsigned char *digest);

  private:
    struct State; // what the system keeps; on Windows its handle stands for the address
    struct DeleteState {
        void operator()(State *state) const noexcept;
    };

    ODigestKind m_Kind;
    std::unique_ptr<State, DeleteState> m_State;
};
