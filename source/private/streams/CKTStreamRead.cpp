// CKTStreamRead.cpp: the typed stream that reads.

#include "CKTStreamRead.h"

#include "OByteOrder.h"
#include "OFileShortcut.h"
#include "OStreamReport.h"
#include "OStreamText.h"

#include <algorithm>
#include <new>
#include <typeinfo>

namespace {

constexpr char kReportPath[] = "source/private/streams/CKTStreamRead";
constexpr int kMemoryLine = 92;
constexpr int kBoolLine = 131;

// Reads a number through the transport; what does not come of it stays as it was. Not inlined, as nearly all numbers are
// read ahead, and those calls need no frame then.
template <typename Value> [[gnu::noinline]] Value ReadNumber(IKTXferBytes *transport, bool isReversed, Value &value) {
    Value bytes = isReversed ? OReversed(value) : value;
    transport->Read(&bytes, sizeof bytes);
    value = isReversed ? OReversed(bytes) : bytes;
    return value;
}

} // namespace

CKTStreamRead::CKTStreamRead() = default;

// The copy may become part of a class that derives: it is not taken for a plain stream.
CKTStreamRead::CKTStreamRead(CKTStreamRead const &other)
    : IKTStream(other), m_Transport(other.m_Transport), m_Swapping(other.m_Swapping) {}

CKTStreamRead &CKTStreamRead::operator=(CKTStreamRead const &other) {
    if (this != &other) {
        SetXferBytes(other.m_Transport);
        m_Swapping = other.m_Swapping;
    }
    return *this;
}

CKTStreamRead::~CKTStreamRead() {
    delete m_Transport;
    m_Transport = nullptr;
}

// Only the library's own stream on its own transport may go past the virtual tables: hosts that derive see every call.
void CKTStreamRead::SetXferBytes(IKTXferBytes *transport) {
    m_Transport = transport;
    m_IsPlain = OFileShortcut::IsFor(transport) && typeid(*this) == typeid(CKTStreamRead) ? 1 : 0;
}

// Takes the value's bytes out of those read ahead, as they are; false, and nothing done, if that way is not open.
template <typename Value> inline bool CKTStreamRead::TakeWhole(Value &value) {
    return m_IsPlain != 0 && OFileShortcut::Take(static_cast<FileXferBytes &>(*m_Transport), value);
}

// The same for a number in the stream's byte order.
template <typename Value> inline bool CKTStreamRead::TakeNumber(Value &value) {
    Value bytes = 0;
    if (!TakeWhole(bytes)) {
        return false;
    }
    value = m_Swapping == 0 ? bytes : OReversed(bytes);
    return true;
}

// ---- bytes and text ----

int CKTStreamRead::XferByte(unsigned char *buffer, int count) {
    unsigned int const size = OArrayBytes<unsigned char>(count);
    auto const copy = [=](unsigned char const *from) { OCopyBytes(buffer, from, size); };
    if (m_IsPlain != 0 && size != 0 && OFileShortcut::Take(static_cast<FileXferBytes &>(*m_Transport), size, copy)) {
        return count;
    }
    return static_cast<int>(m_Transport->Read(buffer, size));
}

unsigned char CKTStreamRead::XferByte(unsigned char &value) {
    if (!TakeWhole(value)) {
        m_Transport->Read(&value, sizeof value);
    }
    return value;
}

// Makes the text of the bytes read ahead, if its length and all of it are there. An empty one may be the file's last
// value, which asks the file whether there is more.
inline bool CKTStreamRead::TakeString(KTString &value, bool utf8, bool withCount) {
    auto &file = static_cast<FileXferBytes &>(*m_Transport);
    int count = 0;
    if (!withCount) {
        count = OStreamTextSize(value, utf8);
    } else if (OFileShortcut::Peek(file, count)) {
        count = m_Swapping == 0 ? count : OReversed(count);
    }
    unsigned int const before = withCount ? sizeof count : 0;
    return count > 0 && OFileShortcut::Take(file, before, static_cast<unsigned int>(count), [&](auto const *bytes) {
               OAssignStreamText(value, bytes, static_cast<std::size_t>(count), utf8);
           });
}

KTString CKTStreamRead::XferString(KTString &value, bool utf8, bool withCount) try {
    if (m_IsPlain != 0 && TakeString(value, utf8, withCount)) {
        return value;
    }
    int count = 0; // stays so where the stream has ended
    if (withCount) {
        XferInt32(count);
    } else {
        count = OStreamTextSize(value, utf8);
    }
    OStreamTextReader text;
    text.Fill(count, [this](unsigned char *bytes, int size) { return XferByte(bytes, size); });
    text.Assign(value, utf8);
    return value;
} catch (std::bad_alloc const &) {
    OStreamReport("CKTStreamRead::XferString - out of memory", kReportPath, kMemoryLine);
    return {};
}

// The last byte of the value comes first. Returns the number of bytes read.
int CKTStreamRead::XferByteReverse(unsigned char *buffer, int count) {
    int done = 0;
    while (done < count && m_Transport->Read(buffer + (count - 1 - done), 1) != 0) {
        ++done;
    }
    return done;
}

// ---- integers ----

int CKTStreamRead::XferBool(KTBool16 *values, int count) { return XferInt16(values, count); }

KTBool16 CKTStreamRead::XferBool(KTBool16 &value) {
    short number = value;
    if (!TakeNumber(number)) {
        XferInt16(number);
    }
    if (number != 0 && number != 1) {
        OStreamReport("CKTStreamRead::XferBool - this isn't a bool you are reading. Something's wrong.", kReportPath,
                      kBoolLine);
    }
    value = number;
    return value;
}

int CKTStreamRead::XferInt16(short *values, int count) {
    unsigned int const read = m_Transport->Read(values, OArrayBytes<short>(count));
    if (m_Swapping != 0 && count >= 1) {
        std::transform(values, values + count, values, [](short value) { return OReversed(value); });
    }
    return static_cast<int>(read / sizeof(short));
}

short CKTStreamRead::XferInt16(short &value) {
    return TakeNumber(value) ? value : ReadNumber(m_Transport, m_Swapping != 0, value);
}

int CKTStreamRead::XferInt32(int *values, int count) {
    unsigned int const read = m_Transport->Read(values, OArrayBytes<int>(count));
    if (m_Swapping != 0 && count >= 1) {
        std::transform(values, values + count, values, [](int value) { return OReversed(value); });
    }
    return static_cast<int>(read / sizeof(int));
}

int CKTStreamRead::XferInt32(int &value) {
    return TakeNumber(value) ? value : ReadNumber(m_Transport, m_Swapping != 0, value);
}

long long CKTStreamRead::XferInt64(long long &value) {
    if (long long bytes = 0; TakeWhole(bytes)) {
        value = m_Swapping == 0 ? OHalvesExchanged(bytes) : OReversed(bytes);
        return value;
    }
    int high = OHighHalf(value);
    int low = OLowHalf(value);
    XferInt32(high);
    XferInt32(low);
    value = OJoined(high, low);
    return value;
}

int CKTStreamRead::XferID(int *values, int count) {
    for (int i = 0; i < count; ++i) {
        XferID(values[i]);
    }
    return count;
}

int CKTStreamRead::XferID(int &value) { return XferInt32(value); }

int CKTStreamRead::XferPropertyID(int *values, int count) {
    for (int i = 0; i < count; ++i) {
        XferID(values[i]);
    }
    return count;
}

int CKTStreamRead::XferPropertyID(int &value) { return XferInt32(value); }

// ---- reals ----

int CKTStreamRead::XferRealNumber(KTReal *values, int count) {
    int read = 0;
    for (int i = 0; i < count && GetStreamState() == kKTStreamStateGood; ++i) {
        read += ReadReal(values[i]) ? 1 : 0;
    }
    return read;
}

KTReal &CKTStreamRead::XferRealNumber(KTReal &value) {
    ReadReal(value);
    return value;
}

// Whether all bytes of the number came.
bool CKTStreamRead::ReadReal(KTReal &value) {
    double number = value.AsDouble();
    auto *const bytes = reinterpret_cast<unsigned char *>(&number);
    constexpr int size = sizeof number;
    if (m_Swapping == 0 && TakeWhole(number)) {
        value = number;
        return true;
    }
    int const read = m_Swapping == 0 ? XferByte(bytes, size) : XferByteReverse(bytes, size);
    value = number;
    return read == size;
}

// ---- everything else ----

void CKTStreamRead::Comment(char *) {}
int CKTStreamRead::Seek(int offset, KTSeekFromWhere origin) {
    return static_cast<int>(m_Transport->Seek(offset, origin));
}
unsigned int CKTStreamRead::Tell() { return m_Transport->Tell(); }
void CKTStreamRead::SetEndOfStream() { m_Transport->SetEndOfStream(); }
void CKTStreamRead::Flush() { m_Transport->Flush(); }
KTStreamState CKTStreamRead::GetStreamState() { return m_Transport->GetStreamState(); }
KTBool16 CKTStreamRead::IsReading() const { return 1; }
KTBool16 CKTStreamRead::IsWriting() const { return 0; }
void CKTStreamRead::SetSwapping(KTBool16 swapping) { m_Swapping = swapping; }
KTBool16 CKTStreamRead::GetSwapping() const { return m_Swapping; }
KTBool16 CKTStreamRead::Open() { return 1; }
void CKTStreamRead::Close() {}
