// DictionaryBytes.h: the bytes that a dictionary is read from and written to.
//
//     file or memory --ByteSource--> BufferedSource --lines--> text form
//                                    DictionaryBuffer <--cursor-- binary form
//     any form --ByteSink--> file or memory
//
// A DictionaryBuffer is memory of its own or a view of the file, whichever the source thinks better.
//
// No class here is locked; distinct objects may be used from any thread.

#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <stdexcept>
#include <string>
#include <string_view>

namespace orvik_private {

/// Whether two runs are equal. Keys are short and compared all the time, which is why no function of the run-time
/// library is called for it: 8 bytes at a time, the last of them together with some that were there before.
inline bool EqualBytes(std::string_view left, std::string_view right) noexcept {
    std::size_t const size = left.size();
    if (size != right.size()) {
        return false;
    }
    auto const differ = [&](std::size_t at) {
        std::uint64_t a = 0;
        std::uint64_t b = 0;
        std::memcpy(&a, left.data() + at, sizeof a);
        std::memcpy(&b, right.data() + at, sizeof b);
        return a ^ b;
    };
    constexpr std::size_t kWord = sizeof(std::uint64_t);
    if (size >= kWord) {
        std::uint64_t difference = differ(size - kWord);
        for (std::size_t at = 0; at + kWord < size && difference == 0; at += kWord) {
            difference = differ(at);
        }
        return difference == 0;
    }
    for (std::size_t at = 0; at < size; ++at) {
        if (left[at] != right[at]) {
            return false;
        }
    }
    return true;
}

/// The first place of a byte, or the size: 16 bytes at a time, for the same reason.
inline std::size_t FindByte(std::string_view bytes, char byte) noexcept {
    constexpr std::size_t kAtOnce = 16;
    std::size_t at = 0;
    for (; at + kAtOnce <= bytes.size(); at += kAtOnce) {
        bool isThere = false;
        for (std::size_t i = 0; i < kAtOnce; ++i) {
            isThere |= bytes[at + i] == byte;
        }
        if (isThere) {
            break;
        }
    }
    while (at < bytes.size() && bytes[at] != byte) {
        ++at;
    }
    return at;
}

/// A whole binary file in memory, which a dictionary's entries go on pointing into. Its bytes may be changed; the file
/// does not see it.
class DictionaryBuffer {
  public:
    DictionaryBuffer() = default;
    DictionaryBuffer(DictionaryBuffer const &) = delete;
    DictionaryBuffer &operator=(DictionaryBuffer const &) = delete;
    virtual ~DictionaryBuffer() = default;

    unsigned char *Bytes() const noexcept { return m_Bytes; }
    std::size_t Size() const noexcept { return m_Size; }

  protected:
    void SetBytes(unsigned char *bytes, std::size_t size) noexcept {
        m_Bytes = bytes;
        m_Size = size;
    }

  private:
    unsigned char *m_Bytes = nullptr;
    std::size_t m_Size = 0;
};

/// Memory that the buffer owns. Its contents are indeterminate at first.
class OwnBuffer final : public DictionaryBuffer {
  public:
    /// Throws std::bad_alloc.
    explicit OwnBuffer(std::size_t size) : m_Own(std::make_unique_for_overwrite<unsigned char[]>(size)) {
        SetBytes(m_Own.get(), size);
    }

    /// Leaves the first bytes only. REQUIRES: size <= Size().
    void Shorten(std::size_t size) noexcept { SetBytes(m_Own.get(), size); }

  private:
    std::unique_ptr<unsigned char[]> m_Own;
};

/// Where bytes come from, from the first to the last.
class ByteSource {
  public:
    ByteSource() = default;
    ByteSource(ByteSource const &) = delete;
    ByteSource &operator=(ByteSource const &) = delete;
    virtual ~ByteSource() = default;

    /// Bytes in all, when the source was opened. Of a binary file that grows meanwhile no more than these are read.
    virtual std::uint64_t Size() const = 0;

    /// Reads up to `count` bytes; fewer only at the end or after a failure of the device, which Failed then tells.
    virtual std::size_t Read(void *bytes, std::size_t count) = 0;

    /// Whether the device failed on the way.
    virtual bool Failed() const = 0;

    /// All of the source's bytes, whatever has been read of them, without reading them; null when they are better read.
    /// Nothing can be read afterwards if it is not null.
    virtual std::shared_ptr<DictionaryBuffer> Map() { return nullptr; }
};

/// Where bytes go to.
class ByteSink {
  public:
    ByteSink() = default;
    ByteSink(ByteSink const &) = delete;
    ByteSink &operator=(ByteSink const &) = delete;
    virtual ~ByteSink() = default;

    /// Takes all the bytes or throws (std::runtime_error when the device fails).
    virtual void Write(void const *bytes, std::size_t count) = 0;
};

/// Reads memory that somebody else owns and keeps as long as the source lives.
class MemorySource final : public ByteSource {
  public:
    explicit MemorySource(std::string_view bytes) : m_Bytes(bytes) {}

    std::uint64_t Size() const override { return m_Bytes.size(); }
    std::size_t Read(void *bytes, std::size_t count) override;
    bool Failed() const override { return false; }

  private:
    std::string_view m_Bytes;
    std::size_t m_At = 0;
};

/// Collects bytes in memory.
class MemorySink final : public ByteSink {
  public:
    void Write(void const *bytes, std::size_t count) override;
    std::string const &Bytes() const { return m_Bytes; }

  private:
    std::string m_Bytes;
};

/// A source read in pieces of 64 KiB, whose beginning can be looked at first.
class BufferedSource {
  public:
    static constexpr std::size_t kPiece = std::size_t{1} << 16;

    explicit BufferedSource(ByteSource &source);

    /// Up to `count` bytes from the present position on, which stays. REQUIRES: nothing has been taken yet, and
    /// count <= kPiece.
    std::string_view Peek(std::size_t count);

    /// The next byte, 0 to 255, or -1 at the end.
    int Take() {
        if (m_At == m_End && !Fill()) {
            return -1;
        }
        return m_Piece[m_At++];
    }

    /// Bytes taken so far.
    std::uint64_t Position() const { return m_Before + m_At; }

    /// Bytes of the source that have not been taken.
    std::uint64_t Left() const;

    /// What is left, fewer bytes if the source failed or got shorter. There is nothing more to take then. With
    /// `mayMap`, and if nothing has been taken yet, it may be a view of the file.
    std::shared_ptr<DictionaryBuffer> TakeRest(bool mayMap);

    bool Failed() const { return m_Source.Failed(); }

  private:
    bool Fill();
    std::size_t ReadRest(unsigned char *bytes, std::size_t room);

    ByteSource &m_Source;
    std::unique_ptr<unsigned char[]> m_Piece;
    std::size_t m_At = 0;
    std::size_t m_End = 0;
    std::uint64_t m_Before = 0; // bytes of earlier pieces
};

/// What is wrong with a binary file; ends the reading of it.
class DamagedFile : public std::runtime_error {
  public:
    DamagedFile(char const *what, std::uint64_t offset) : std::runtime_error(what), m_Offset(offset) {}

    /// The byte of the file that the trouble is at.
    std::uint64_t Offset() const { return m_Offset; }

  private:
    std::uint64_t m_Offset;
};

/// Reads the fields of a binary file in memory. Every read is checked against the end of the bytes and throws
/// DamagedFile past it.
class ByteCursor {
  public:
    ByteCursor(unsigned char *bytes, std::size_t size) : m_Bytes(bytes), m_Size(size) {}

    void SetByteOrder(std::endian order) { m_Order = order; }
    std::endian ByteOrder() const { return m_Order; }

    std::size_t Position() const { return m_At; }
    std::size_t Left() const { return m_Size - m_At; }

    /// Steps over `count` bytes and returns the first of them.
    unsigned char *Take(std::uint64_t count, char const *field) {
        if (count > Left()) {
            throw DamagedFile(field, m_At);
        }
        unsigned char *const first = m_Bytes + m_At;
        m_At += static_cast<std::size_t>(count);
        return first;
    }

    std::uint8_t TakeU8(char const *field) { return *Take(1, field); }
    std::uint16_t TakeU16(char const *field) { return U16At(Take(2, field)); }
    std::uint32_t TakeU32(char const *field) { return U32At(Take(4, field)); }

    /// A field of a table that has been taken as a whole.
    std::uint16_t U16At(unsigned char const *field) const {
        std::uint16_t value = 0;
        std::memcpy(&value, field, sizeof value);
        return m_Order == std::endian::native ? value : static_cast<std::uint16_t>(value << 8 | value >> 8);
    }
    std::uint32_t U32At(unsigned char const *field) const {
        std::uint32_t value = 0;
        std::memcpy(&value, field, sizeof value);
        return m_Order == std::endian::native
                   ? value
                   : value << 24 | (value & 0xFF00U) << 8 | (value >> 8 & 0xFF00U) | value >> 24;
    }

  private:
    unsigned char *m_Bytes;
    std::size_t m_Size;
    std::size_t m_At = 0;
    std::endian m_Order = std::endian::little;
};

} // namespace orvik_private
