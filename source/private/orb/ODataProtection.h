// ODataProtection.h: data that only the same user on the same machine can read again.

#pragma once

#include <cstddef>
#include <optional>
#include <span>
#include <vector>

/// Bytes that are overwritten before their memory is given back.
class OSecretBytes {
  public:
    OSecretBytes() = default;
    explicit OSecretBytes(std::span<unsigned char const> bytes) : m_Bytes(bytes.begin(), bytes.end()) {}
    OSecretBytes(OSecretBytes &&other) noexcept = default;
    OSecretBytes(OSecretBytes const &) = delete;
    OSecretBytes &operator=(OSecretBytes const &) = delete;
    OSecretBytes &operator=(OSecretBytes &&) = delete;
    ~OSecretBytes() {
        unsigned char volatile *const bytes = m_Bytes.data(); // volatile: written although nobody reads it
        for (std::size_t i = 0; i < m_Bytes.size(); ++i) {
            bytes[i] = 0;
        }
    }

    std::span<unsigned char const> Get() const { return m_Bytes; }

  private:
    std::vector<unsigned char> m_Bytes;
};

/// The bytes in protected form; empty, which no protected form is, if the system refuses. Throws std::bad_alloc. Any
/// thread.
std::vector<unsigned char> OProtectData(std::span<unsigned char const> data);

/// The bytes that were protected; nothing if these are no protected bytes, were changed, or are another user's. Throws
/// std::bad_alloc. Any thread.
std::optional<OSecretBytes> OUnprotectData(std::span<unsigned char const> bytes);
