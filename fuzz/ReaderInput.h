// ReaderInput.h: fuzzed bytes as a stream, without the disk.

#pragma once

#include "CKTStreamRead.h"
#include "KTLogger.h"

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

inline void Check(bool holds) {
    if (!holds) {
        std::abort();
    }
}

/// Reads from a string that somebody else owns.
class StringTransport : public IKTXferBytes {
  public:
    explicit StringTransport(std::string const &bytes) : m_Bytes(bytes) {}

    unsigned int Read(void *buffer, unsigned int count) override {
        auto const left = static_cast<unsigned int>(m_Bytes.size()) - m_Position;
        m_State = count > left ? kKTStreamStateEndOfStream : m_State;
        count = std::min(count, left);
        if (count != 0) {
            std::memcpy(buffer, m_Bytes.data() + m_Position, count);
        }
        m_Position += count;
        return count;
    }
    unsigned int Write(void *, unsigned int) override { return 0; }
    unsigned int Seek(int offset, KTSeekFromWhere) override {
        m_State = kKTStreamStateGood;
        return m_Position = static_cast<unsigned int>(offset); // the readers only go back to the beginning
    }
    unsigned int Tell() override { return m_Position; }
    void Flush() override {}
    KTStreamState GetStreamState() override { return m_State; }
    void SetEndOfStream() override {}

  private:
    std::string const &m_Bytes;
    unsigned int m_Position = 0;
    KTStreamState m_State = kKTStreamStateGood;
};

inline std::unique_ptr<IKTStream> StreamOn(std::string const &bytes) {
    auto stream = std::make_unique<CKTStreamRead>();
    stream->SetXferBytes(new StringTransport(bytes));
    return stream;
}

/// The stand-in's ANSI code page: Latin-1.
inline std::vector<unsigned short> FromLatin1(std::string const &line) {
    std::vector<unsigned short> units;
    for (char const byte : line) {
        units.push_back(static_cast<unsigned char>(byte));
    }
    return units;
}
