// ByteStream.h: a plain typed stream over bytes in memory, as a host could derive one, which can be made to fail.

#pragma once

#include "IKTStream.h"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <limits>
#include <string>
#include <vector>

/// Reads or writes `bytes` from `position`. Moves bytes and 32-bit integers; other values are not needed.
class ByteStream : public IKTStream {
  public:
    enum Direction : bool { kReads, kWrites };

    explicit ByteStream(Direction direction, std::vector<unsigned char> content = {})
        : bytes(std::move(content)), m_Direction(direction) {}

    std::vector<unsigned char> bytes;
    std::size_t position = 0;
    std::size_t capacity = std::numeric_limits<std::size_t>::max(); ///< a write past it is cut, as on a full disk
    KTStreamState state = kKTStreamStateGood;
    std::size_t largestRead = 0;

    int XferByte(unsigned char *buffer, int count) override {
        auto const wanted = static_cast<std::size_t>(std::max(count, 0));
        std::size_t const moved = m_Direction == kWrites ? Write(buffer, wanted) : Read(buffer, wanted);
        return static_cast<int>(moved);
    }
    unsigned char XferByte(unsigned char &value) override {
        XferByte(&value, 1);
        return value;
    }
    int XferInt32(int *values, int count) override {
        int moved = 0;
        for (; moved < count; ++moved) {
            unsigned char field[4];
            std::memcpy(field, &values[moved], sizeof field);
            if (m_Swapping != 0 && m_Direction == kWrites) {
                std::reverse(std::begin(field), std::end(field));
            }
            if (XferByte(field, 4) != 4) {
                break;
            }
            if (m_Direction == kReads) {
                if (m_Swapping != 0) {
                    std::reverse(std::begin(field), std::end(field));
                }
                std::memcpy(&values[moved], field, sizeof field);
            }
        }
        return moved;
    }
    int XferInt32(int &value) override {
        XferInt32(&value, 1);
        return value;
    }
    KTStreamState GetStreamState() override { return state; }
    KTBool16 IsReading() const override { return m_Direction == kReads ? 1 : 0; }
    KTBool16 IsWriting() const override { return m_Direction == kWrites ? 1 : 0; }
    void SetSwapping(KTBool16 swapping) override { m_Swapping = swapping; }
    KTBool16 GetSwapping() const override { return m_Swapping; }

    KTString XferString(KTString &value, bool, bool) override { return value; }
    int XferBool(KTBool16 *, int) override { return 0; }
    KTBool16 XferBool(KTBool16 &value) override { return value; }
    int XferInt16(short *, int) override { return 0; }
    short XferInt16(short &value) override { return value; }
    long long XferInt64(long long &value) override { return value; }
    int XferID(int *, int) override { return 0; }
    int XferID(int &value) override { return value; }
    int XferPropertyID(int *, int) override { return 0; }
    int XferPropertyID(int &value) override { return value; }
    int XferRealNumber(KTReal *, int) override { return 0; }
    KTReal &XferRealNumber(KTReal &value) override { return value; }
    void Comment(char *) override {}
    int Seek(int, KTSeekFromWhere) override { return static_cast<int>(position); }
    unsigned int Tell() override { return static_cast<unsigned int>(position); }
    void SetEndOfStream() override {}
    void Flush() override {}
    void Close() override {}

  protected:
    KTBool16 Open() override { return 1; }

  private:
    std::size_t Write(unsigned char const *from, std::size_t count) {
        std::size_t const taken = std::min(count, capacity - std::min(capacity, bytes.size()));
        bytes.insert(bytes.end(), from, from + taken);
        return taken;
    }

    // Says that the data ended as soon as they have been read to the end, as some transports do.
    std::size_t Read(unsigned char *to, std::size_t count) {
        largestRead = std::max(largestRead, count);
        std::size_t const given = std::min(count, bytes.size() - position);
        std::copy_n(bytes.begin() + static_cast<std::ptrdiff_t>(position), given, to);
        position += given;
        if (position == bytes.size()) {
            state = kKTStreamStateEndOfStream;
        }
        return given;
    }

    Direction m_Direction;
    KTBool16 m_Swapping = 0;
};
