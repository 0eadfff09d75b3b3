// OStreamText.h: texts on their way between strings and the bytes of a stream.

#pragma once

#include "KTString.h"

#include <cstddef>
#include <memory>
#include <string>

/// Bytes that the text takes in UTF-8 or UTF-16, at most those of the largest signed 32-bit number. Throws std::bad_alloc.
int OStreamTextSize(KTString const &text, bool utf8);

/// Short texts need no memory from the heap.
inline constexpr std::size_t kOShortTextUnits = 256;

/// Makes the text of the bytes of one: UTF-8 up to the first zero byte, or whole units of UTF-16. Throws std::bad_alloc.
void OAssignStreamText(KTString &text, unsigned char const *bytes, std::size_t count, bool utf8);

/// Puts a short text where it is to lie: all UTF-16, and UTF-8 of ASCII. False if it is anything else; what then lies
/// there is nothing. REQUIRES: room for the bytes, one for each character if they are UTF-8.
bool OPutStreamText(KTString const &text, unsigned char *to, bool utf8) noexcept;

/// The bytes of a text that is to be written. REQUIRES: the text stays as it is meanwhile.
class OStreamTextWriter {
  public:
    /// Throws std::bad_alloc.
    OStreamTextWriter(KTString const &text, bool utf8);
    OStreamTextWriter(OStreamTextWriter const &) = delete;
    OStreamTextWriter &operator=(OStreamTextWriter const &) = delete;
    ~OStreamTextWriter() = default;

    /// The bytes; transports take them as variable ones, and only read them.
    void *Bytes() const { return m_Bytes; }
    unsigned int Count() const { return m_Count; }

  private:
    void *m_Bytes;
    unsigned int m_Count;
    std::string m_Long;
    unsigned char m_Short[kOShortTextUnits]; // only what is used is ever written
};

/// The bytes of a text that is read. Their number comes from the stream and is not trusted: memory is taken in pieces,
/// as the bytes before them have come.
class OStreamTextReader {
  public:
    // NOLINTNEXTLINE(cppcoreguidelines-pro-type-member-init,modernize-use-equals-default): clears no array
    OStreamTextReader() {}
    OStreamTextReader(OStreamTextReader const &) = delete;
    OStreamTextReader &operator=(OStreamTextReader const &) = delete;
    ~OStreamTextReader() = default;

    /// Reads up to `count` bytes, or none for a negative count, by calls of read(bytes, size), which returns how many
    /// came; one that returns fewer is the last. Throws std::bad_alloc.
    template <typename Read> void Fill(int count, Read read) {
        do {
            int const size = count <= m_Capacity ? RestOf(count) : MakeRoom(count);
            int const came = read(reinterpret_cast<unsigned char *>(m_Units) + m_Count, size);
            m_Count += came < 0 ? 0 : came > size ? size : came;
            if (came < size) {
                break;
            }
        } while (m_Count < count);
    }

    /// Makes the text of the bytes: UTF-8 up to the first zero byte, or whole units of UTF-16. Throws std::bad_alloc.
    void Assign(KTString &text, bool utf8) const;

  private:
    int RestOf(int count) const { return count < 0 ? 0 : count - m_Count; }
    int MakeRoom(int count);

    unsigned short m_Short[kOShortTextUnits]; // only what is used is ever written
    unsigned short *m_Units = m_Short;
    int m_Capacity = sizeof m_Short; // bytes
    int m_Count = 0;                 // bytes
    std::unique_ptr<unsigned short[]> m_Long;
};
