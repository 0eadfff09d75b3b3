// OFileShortcut.h: the way of a small value into and out of a file transport's buffers.
//
// Most calls of a typed stream move a few bytes, and most of those bytes are buffered already, or fit the buffer. The
// stream does that much itself, without a call of the transport:
//
//     stream --value--> read-ahead buffer or write buffer          when that is all there is to do
//     stream --value--> IKTXferBytes::Read or Write                otherwise, and for every other kind of transport
//
// What comes out is what Read and Write would have made of the same bytes; they use these functions, too.

#pragma once

#include "FileXferBytes.h"
#include "TempFileXferBytes.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <limits>
#include <typeinfo>

// The first and the last bytes of 2 to 16, as two blocks that may overlap.
template <typename Block> inline void OCopyEnds(unsigned char *to, unsigned char const *from, unsigned int count) {
    Block first;
    Block last;
    std::memcpy(&first, from, sizeof first);
    std::memcpy(&last, from + count - sizeof last, sizeof last);
    std::memcpy(to, &first, sizeof first);
    std::memcpy(to + count - sizeof last, &last, sizeof last);
}

// Values and short texts are a few bytes each: a call of the general function would cost more than the copy.
inline void OCopyBytes(unsigned char *to, unsigned char const *from, unsigned int count) {
    if (count > 16) {
        std::memcpy(to, from, count);
    } else if (count >= 8) {
        OCopyEnds<std::uint64_t>(to, from, count);
    } else if (count >= 4) {
        OCopyEnds<std::uint32_t>(to, from, count);
    } else if (count >= 2) {
        OCopyEnds<std::uint16_t>(to, from, count);
    } else if (count == 1) {
        *to = *from;
    }
}

class OFileShortcut {
  public:
    /// Whether the transport is one of the library's own on files. Hosts' derived ones may do anything in Read and Write.
    static bool IsFor(IKTXferBytes const *transport) {
        return transport != nullptr &&
               (typeid(*transport) == typeid(FileXferBytes) || typeid(*transport) == typeid(TempFileXferBytes));
    }

    /// Takes the value out of the bytes read ahead; false, and nothing done, if they are too few or bytes are gathered.
    template <typename Value> static bool Take(FileXferBytes &file, Value &value) {
        return Take(file, sizeof value, [&](unsigned char const *from) { std::memcpy(&value, from, sizeof value); });
    }

    /// The same by copy(from). REQUIRES: count is not 0.
    template <typename Copy> static bool Take(FileXferBytes &file, unsigned int count, Copy copy) {
        if (count > file.m_ReadAheadFill - file.m_ReadAheadCursor || file.m_WriteFill != 0) {
            return false;
        }
        CountRead(file, count);
        copy(file.m_ReadAheadBuffer + file.m_ReadAheadCursor);
        file.m_ReadAheadCursor += count;
        return true;
    }

    /// Takes `before` bytes and `count` behind them, and copies those, if all are there. REQUIRES: count is not 0; the
    /// first ones are as few as a value's.
    template <typename Copy> static bool Take(FileXferBytes &file, unsigned int before, unsigned int count, Copy copy) {
        unsigned int const available = file.m_ReadAheadFill - file.m_ReadAheadCursor;
        if (available < before || count > available - before || file.m_WriteFill != 0) {
            return false;
        }
        auto const *const from = file.m_ReadAheadBuffer + file.m_ReadAheadCursor + before;
        CountRead(file, before + count);
        file.m_ReadAheadCursor += before + count;
        copy(from); // which may throw: the bytes have been read nevertheless
        return true;
    }

    /// The next value of the bytes read ahead, which it leaves there; false, and nothing done, if they are too few.
    template <typename Value> static bool Peek(FileXferBytes const &file, Value &value) {
        if (sizeof value > file.m_ReadAheadFill - file.m_ReadAheadCursor) {
            return false;
        }
        std::memcpy(&value, file.m_ReadAheadBuffer + file.m_ReadAheadCursor, sizeof value);
        return true;
    }

    /// Puts the value behind the bytes gathered; false, and nothing done, without room or buffer.
    template <typename Value> static bool Put(FileXferBytes &file, Value const &value) {
        return Put(file, sizeof value, [&](unsigned char *to) { std::memcpy(to, &value, sizeof value); });
    }

    /// The same by copy(to).
    template <typename Copy> static bool Put(FileXferBytes &file, unsigned int count, Copy copy) {
        return PutIf(file, count, [&](unsigned char *to) {
            copy(to);
            return true;
        });
    }

    /// The same by copy(to), where nothing counts as put unless it returns true.
    template <typename Copy> static bool PutIf(FileXferBytes &file, unsigned int count, Copy copy) {
        auto const fill = static_cast<unsigned int>(file.m_WriteFill);
        if (file.m_WriteBuffer == nullptr || count > file.m_WriteCapacity - fill || !copy(file.m_WriteBuffer + fill)) {
            return false;
        }
        file.m_WriteFill = static_cast<int>(fill + count);
        return true;
    }

    /// Counts what is asked for; the count stays at its largest value where more would not fit.
    static void CountRead(FileXferBytes &file, unsigned int count) {
        unsigned int const room = std::numeric_limits<unsigned int>::max() - file.m_SequentialReadTotal;
        file.m_SequentialReadTotal += std::min(count, room);
    }
};
