// DictionaryBytes.cpp: memory as source and sink, and the buffer before a source.

#include "DictionaryBytes.h"

#include <algorithm>

namespace orvik_private {

std::size_t MemorySource::Read(void *bytes, std::size_t count) {
    count = std::min(count, m_Bytes.size() - m_At);
    if (count != 0) {
        std::memcpy(bytes, m_Bytes.data() + m_At, count);
    }
    m_At += count;
    return count;
}

void MemorySink::Write(void const *bytes, std::size_t count) {
    m_Bytes.append(static_cast<char const *>(bytes), count);
}

BufferedSource::BufferedSource(ByteSource &source)
    : m_Source(source), m_Piece(std::make_unique_for_overwrite<unsigned char[]>(kPiece)) {}

std::string_view BufferedSource::Peek(std::size_t count) {
    while (m_End < count) {
        std::size_t const got = m_Source.Read(m_Piece.get() + m_End, kPiece - m_End);
        if (got == 0) {
            break;
        }
        m_End += got;
    }
    return {reinterpret_cast<char const *>(m_Piece.get()), std::min(count, m_End)};
}

bool BufferedSource::Fill() {
    if (m_Piece == nullptr) {
        return false;
    }
    m_Before += m_End;
    m_At = 0;
    m_End = m_Source.Read(m_Piece.get(), kPiece);
    return m_End != 0;
}

std::uint64_t BufferedSource::Left() const {
    std::uint64_t const size = m_Source.Size();
    return size > Position() ? size - Position() : 0;
}

std::shared_ptr<DictionaryBuffer> BufferedSource::TakeRest(bool mayMap) {
    std::shared_ptr<DictionaryBuffer> rest;
    if (mayMap && Position() == 0) {
        rest = m_Source.Map();
    }
    if (rest == nullptr) {
        auto const own = std::make_shared<OwnBuffer>(static_cast<std::size_t>(Left()));
        own->Shorten(ReadRest(own->Bytes(), own->Size()));
        rest = own;
    }
    m_Piece.reset();
    m_Before = m_Source.Size();
    m_At = m_End = 0;
    return rest;
}

std::size_t BufferedSource::ReadRest(unsigned char *bytes, std::size_t room) {
    std::size_t done = std::min(room, m_End - m_At);
    std::memcpy(bytes, m_Piece.get() + m_At, done);
    while (done < room) {
        std::size_t const got = m_Source.Read(bytes + done, room - done);
        if (got == 0) {
            break;
        }
        done += got;
    }
    return done;
}

} // namespace orvik_private
