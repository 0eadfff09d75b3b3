// KTBase64.cpp: Base64 character by character and group by group; long runs are handed to KTBase64Sse41.cpp.

#include "KTBase64.h"

#include "KTAssert.h"
#include "OUtfBlocks.h"
#include "OUtfSse41.h"

#include <cctype>

namespace {

using KTBase64::Byte;

constexpr std::size_t kGroupBytes = 3;
constexpr std::size_t kGroupCharacters = 4;
constexpr char kPad = '=';

// Whole groups of three bytes, all of them.
char *EncodeGroups(Byte const *from, Byte const *end, char *to) {
    char const *const alphabet = KTBase64::kAlphabet.data();
    for (; from != end; from += kGroupBytes, to += kGroupCharacters) {
        unsigned const bits = (unsigned{from[0]} << 16) | (unsigned{from[1]} << 8) | from[2];
        to[0] = alphabet[bits >> 18];
        to[1] = alphabet[(bits >> 12) & 63];
        to[2] = alphabet[(bits >> 6) & 63];
        to[3] = alphabet[bits & 63];
    }
    return to;
}

// The last one or two bytes, if any are left: two or three characters, their last one's missing bits 0, and the padding.
char *EncodeRest(Byte const *from, std::size_t left, char *to) {
    if (left == 0) {
        return to;
    }
    char const *const alphabet = KTBase64::kAlphabet.data();
    unsigned const bits = (unsigned{from[0]} << 16) | (left == 2 ? unsigned{from[1]} << 8 : 0U);
    to[0] = alphabet[bits >> 18];
    to[1] = alphabet[(bits >> 12) & 63];
    to[2] = left == 2 ? alphabet[(bits >> 6) & 63] : kPad;
    to[3] = kPad;
    return to + kGroupCharacters;
}

// Collects bits of characters and gives bytes.
class Decoder {
  public:
    Decoder(std::string_view text, bool usesRuns, char *to)
        : m_From(reinterpret_cast<Byte const *>(text.data())), m_End(m_From + text.size()), m_To(to),
          m_UsesRuns(usesRuns) {}

    // Decodes all, and returns whether every character was legal.
    bool Run() {
        while (true) {
            if (m_BitCount == 0) {
                TakeGroups();
            }
            if (m_From == m_End) {
                return true;
            }
            if (!TakeOne()) {
                return false;
            }
        }
    }

    char const *Written() const { return m_To; }

  private:
    std::size_t Left() const { return static_cast<std::size_t>(m_End - m_From); }

    // While no bits are pending, four characters of the alphabet are three bytes. Stops before other characters.
    void TakeGroups() {
        if (m_UsesRuns) {
            std::size_t const taken = KTBase64::DecodeRunSse41(m_From, Left(), m_To);
            m_From += taken;
            m_To += taken / kGroupCharacters * kGroupBytes;
        }
        auto const &values = KTBase64::kValues;
        for (; Left() >= kGroupCharacters; m_From += kGroupCharacters, m_To += kGroupBytes) {
            unsigned const a = values[m_From[0]];
            unsigned const b = values[m_From[1]];
            unsigned const c = values[m_From[2]];
            unsigned const d = values[m_From[3]];
            if ((a | b | c | d) == KTBase64::kNoValue) {
                return;
            }
            unsigned const bits = (a << 18) | (b << 12) | (c << 6) | d;
            m_To[0] = static_cast<char>(bits >> 16);
            m_To[1] = static_cast<char>(bits >> 8);
            m_To[2] = static_cast<char>(bits);
        }
    }

    // One character of any kind. False if it is not legal.
    bool TakeOne() {
        Byte const character = *m_From++;
        Byte const value = KTBase64::kValues[character];
        if (value == KTBase64::kNoValue) {
            return std::isspace(character) != 0 || character == kPad;
        }
        m_Bits = (m_Bits << 6) | value;
        m_BitCount += 6;
        if (m_BitCount >= 8) {
            m_BitCount -= 8;
            *m_To++ = static_cast<char>(m_Bits >> m_BitCount);
            m_Bits &= (1U << m_BitCount) - 1;
        }
        return true;
    }

    Byte const *m_From;
    Byte const *m_End;
    char *m_To;
    bool m_UsesRuns;
    unsigned m_Bits = 0;     // those that have not become a byte yet
    unsigned m_BitCount = 0; // how many, 0 to 6
};

} // namespace

bool KTBase64::IsWhole(std::size_t written, std::size_t size) {
    if (written == size) {
        return true;
    }
    KTAssertFailed("", "source/private/utils/KTPublicUtils", 231);
    return false;
}

std::string KTBase64::Encode(std::string_view bytes, Runs runs) {
    std::size_t const size = EncodedSize(bytes.size());
    std::size_t written = 0;
    std::string text;
    OUtf::FillExactly(text, size, [bytes, runs, &written](char *const to) {
        auto const *const from = reinterpret_cast<Byte const *>(bytes.data());
        bool const usesRuns = runs == Runs::Fastest && OUtf::HasSse41();
        std::size_t const taken = usesRuns ? EncodeRunSse41(from, bytes.size(), to) : 0;
        std::size_t const rest = bytes.size() % kGroupBytes;
        Byte const *const end = from + (bytes.size() - rest);
        char *const next = EncodeGroups(from + taken, end, to + taken / kGroupBytes * kGroupCharacters);
        written = static_cast<std::size_t>(EncodeRest(end, rest, next) - to);
    });
    if (!IsWhole(written, size)) {
        text.clear();
    }
    return text;
}

std::string KTBase64::Decode(std::string_view text, Runs runs) {
    // Room for all characters as bytes, for the last two or three, and for what a run writes too much.
    std::size_t const room = text.size() / kGroupCharacters * kGroupBytes + 2 * kGroupCharacters;
    bool const usesRuns = runs == Runs::Fastest && OUtf::HasSse41();
    bool isLegal = true;
    std::string bytes;
    auto const decode = [&](char *to) {
        Decoder decoder(text, usesRuns, to);
        isLegal = decoder.Run();
        return static_cast<std::size_t>(decoder.Written() - to);
    };
#if defined(__cpp_lib_string_resize_and_overwrite)
    bytes.resize_and_overwrite(room, [&](char *to, std::size_t) { return decode(to); });
#else
    bytes.resize(room);
    bytes.erase(decode(bytes.data()));
#endif
    if (!isLegal) {
        throw std::invalid_argument("This contains characters not legal in a base64 encoded string.");
    }
    return bytes;
}
