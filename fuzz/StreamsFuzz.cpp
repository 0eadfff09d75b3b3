// StreamsFuzz.cpp: any bytes read by the typed reader, by any list of operations; what was read is written and read again.
//
// Input:   u8     number n of operations, as far as there are bytes
//          u8[n]  the operations, one a byte: its lower four bits are the operation, the others its array length
//          rest   the bytes on the stream

#include "CKTStreamRead.h"
#include "CKTStreamWrite.h"
#include "MemXferBytes.h"

#include <algorithm>
#include <bit>
#include <cstdint>
#include <cstdlib>
#include <span>
#include <string>
#include <vector>

namespace {

using Bytes = std::span<std::uint8_t const>;

void Check(bool holds) {
    if (!holds) {
        std::abort();
    }
}

constexpr int kMost = 15; // elements of an array

// What one operation moves. A reader fills it in, and a writer then makes a stream of it that reads as the same.
struct Value {
    unsigned char bytes[kMost] = {};
    short shorts[kMost] = {};
    int ints[kMost] = {};
    KTReal reals[kMost];
    long long large = 0;
    KTString text = "seven 7";

    bool operator==(Value const &other) const {
        auto const isSameReal = [](KTReal a, KTReal b) {
            return std::bit_cast<std::uint64_t>(a.AsDouble()) == std::bit_cast<std::uint64_t>(b.AsDouble());
        };
        return std::ranges::equal(bytes, other.bytes) && std::ranges::equal(shorts, other.shorts) &&
               std::ranges::equal(ints, other.ints) && std::ranges::equal(reals, other.reals, isSameReal) &&
               large == other.large && text == other.text;
    }
};

void XferText(IKTStream &stream, Value &value, unsigned int form) {
    KTString const returned = stream.XferString(value.text, (form & 1) != 0, (form & 2) != 0);
    Check(returned == value.text);
}

void Xfer(IKTStream &stream, std::uint8_t operation, Value &value) {
    int const count = operation >> 4;
    switch (operation & 0xF) {
    case 0:
        Check(stream.XferByte(value.bytes, count) <= count);
        break;
    case 1:
        stream.XferByte(value.bytes[0]);
        break;
    case 2:
        Check(stream.XferInt16(value.shorts, count) <= count);
        break;
    case 3:
        stream.XferInt16(value.shorts[0]);
        break;
    case 4:
        Check(stream.XferInt32(value.ints, count) <= count);
        break;
    case 5:
        stream.XferInt32(value.ints[0]);
        break;
    case 6:
        stream.XferInt64(value.large);
        break;
    case 7:
        Check(stream.XferID(value.ints, count) == count);
        break;
    case 8:
        stream.XferPropertyID(value.ints[0]);
        break;
    case 9:
        Check(stream.XferRealNumber(value.reals, count) <= count);
        break;
    case 10:
        stream.XferRealNumber(value.reals[0]);
        break;
    case 11:
        stream.SetSwapping(static_cast<KTBool16>(count & 1));
        break;
    default:
        XferText(stream, value, operation & 3U);
        break;
    }
}

void Put(MemXferBytes &transport, Bytes bytes) {
    std::vector<std::uint8_t> copy(bytes.begin(), bytes.end()); // transports take variable bytes
    transport.Write(copy.data(), static_cast<unsigned int>(copy.size()));
    transport.Seek(0, kKTSeekFromBeginning);
}

// The values, and where the last operation before the end of the stream stopped.
std::vector<Value> ReadAll(IKTStream &reader, Bytes operations) {
    std::vector<Value> values;
    for (std::uint8_t const operation : operations) {
        Xfer(reader, operation, values.emplace_back());
        if (reader.GetStreamState() != kKTStreamStateGood) {
            values.pop_back(); // of what came short, nothing is promised but that it does no harm
            break;
        }
    }
    return values;
}

void CheckRoundTrip(std::vector<Value> const &values, Bytes operations) {
    auto *const transport = new MemXferBytes;
    CKTStreamWrite writer;
    writer.SetXferBytes(transport);
    for (std::size_t i = 0; i < values.size(); ++i) {
        Value copy = values[i];
        Xfer(writer, operations[i], copy);
        Check(copy == values[i]);
    }
    unsigned int const size = transport->Tell();
    transport->Seek(0, kKTSeekFromBeginning);
    std::vector<unsigned char> bytes(size);
    Check(transport->Read(bytes.data(), size) == size);
    auto *const again = new MemXferBytes;
    Put(*again, bytes);
    CKTStreamRead reader;
    reader.SetXferBytes(again);
    for (std::size_t i = 0; i < values.size(); ++i) {
        Value value;
        value.text = values[i].text; // a text without a length is read into one of its size
        Xfer(reader, operations[i], value);
        Check(value == values[i]);
    }
    Check(reader.GetStreamState() == kKTStreamStateGood && reader.Tell() == size);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const *data, std::size_t size) {
    constexpr std::size_t kMostBytes = 1 << 16; // texts may triple when they are written, and then fit the transport
    Bytes const input(data, std::min(size, kMostBytes));
    if (input.empty()) {
        return 0;
    }
    std::size_t const count = std::min<std::size_t>(input[0], input.size() - 1);
    Bytes const operations = input.subspan(1, count);
    auto *const transport = new MemXferBytes;
    Put(*transport, input.subspan(1 + count));
    CKTStreamRead reader;
    reader.SetXferBytes(transport);
    CheckRoundTrip(ReadAll(reader, operations), operations);
    return 0;
}
