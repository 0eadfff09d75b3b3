// TextLines.h: the lines of a settings or caption file.
//
// A file that begins with FF FE holds UTF-16 units, low byte first, from its third byte on; any other file holds bytes
// from its first on. It is read in chunks of 1,024 of them.
//
//     line    = *blank *(unit except CR and LF; CR is dropped) (LF / end of the file)
//     blank   = space / tab                          dropped at the start of a line, kept anywhere else
//
// So a line may go on in any number of chunks, and a CR between blanks does not keep the ones behind it. A line of bytes
// is UTF-8 if it is well-formed, else text in the system's ANSI code page, as older programs write it. EF BB BF at the
// start of a file marks UTF-8 and is no text. An odd last byte of UTF-16 is dropped.

#pragma once

#include "DictionaryConversion.h"
#include "IKTStream.h"

#include <array>
#include <cstddef>
#include <optional>
#include <string>

/// Reads lines that have anything in them, one by one. The stream must outlive the object, which one thread uses.
class TextLines {
  public:
    /// What a zero, byte or unit, is.
    enum class Zeros {
        AreText,    ///< a character like any other
        EndTheChunk ///< what the chunk holds from the zero on is dropped; a line goes on in the next chunk
    };

    static constexpr std::size_t kChunk = 1024;

    /// Reads the mark. REQUIRES: the stream reads, and is at its beginning.
    TextLines(IKTStream &stream, Zeros zeros);

    TextLines(TextLines const &) = delete;
    TextLines &operator=(TextLines const &) = delete;
    ~TextLines() = default;

    /// The next line that is not empty, without its end, valid until the next call; nothing at the end of the file, or
    /// once the stream has failed: a line that a failure cut is not given. Throws std::bad_alloc.
    std::optional<orvik_private::UnitsView> Next();

    /// Whether the stream was not ready, or failed on the way.
    bool HasFailed() const noexcept { return m_HasFailed; }

    /// Whether the file holds UTF-16.
    bool IsUtf16() const noexcept { return m_IsUtf16; }

  private:
    void CheckStream();
    bool ReadChunk();
    template <typename Unit, typename Text> bool Gather(Unit const *chunk, Text &line);
    bool GatherFromChunk();
    std::optional<orvik_private::UnitsView> Line();

    IKTStream &m_Stream;
    Zeros m_Zeros;
    bool m_IsUtf16 = false;
    bool m_IsAtStart = true;
    bool m_IsAtEnd = false;
    bool m_HasFailed = false;
    std::size_t m_Next = 0; // of the chunk's units
    std::size_t m_End = 0;
    std::string m_Bytes; // the line so far, of a file of bytes
    KTUnits m_Units;     // the line so far, of a file of units; else the line as text
    std::array<unsigned char, kChunk> m_ByteChunk{};
    std::array<unsigned short, kChunk> m_UnitChunk{};
};
