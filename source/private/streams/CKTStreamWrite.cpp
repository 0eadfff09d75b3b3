// CKTStreamWrite.cpp: the typed stream that writes.

#include "CKTStreamWrite.h"

#include "OByteOrder.h"
#include "OFileShortcut.h"
#include "OStreamReport.h"
#include "OStreamText.h"

#include <cstring>
#include <new>
#include <typeinfo>

namespace {

constexpr char kReportPath[] = "source/private/streams/CKTStreamWrite";
constexpr int kMemoryLine = 84;
constexpr int kBoolArrayLine = 118;
constexpr int kBoolLine = 129;

} // namespace

CKTStreamWrite::CKTStreamWrite() = default;

// The copy may become part of a class that derives: it is not taken for a plain stream.
CKTStreamWrite::CKTStreamWrite(CKTStreamWrite const &other)
    : IKTStream(other), m_Transport(other.m_Transport), m_Swapping(other.m_Swapping) {}

CKTStreamWrite &CKTStreamWrite::operator=(CKTStreamWrite const &other) {
    if (this != &other) {
        SetXferBytes(other.m_Transport);
        m_Swapping = other.m_Swapping;
    }
    return *this;
}

CKTStreamWrite::~CKTStreamWrite() {
    delete m_Transport;
    m_Transport = nullptr;
}

// Only the library's own stream on its own transport may go past the virtual tables: hosts that derive see every call.
void CKTStreamWrite::SetXferBytes(IKTXferBytes *transport) {
    m_Transport = transport;
    m_IsPlain = OFileShortcut::IsFor(transport) && typeid(*this) == typeid(CKTStreamWrite) ? 1 : 0;
}
IKTXferBytes *CKTStreamWrite::GetXferBytes() { return m_Transport; }

template <typename Value> inline void CKTStreamWrite::WriteValue(Value const &value) {
    if (m_IsPlain == 0 || !OFileShortcut::Put(static_cast<FileXferBytes &>(*m_Transport), value)) {
        Value copy = value; // transports take variable bytes, and only read them
        m_Transport->Write(&copy, sizeof copy);
    }
}

template <typename Value> inline bool CKTStreamWrite::PutWhole(Value const &value) {
    return m_IsPlain != 0 && OFileShortcut::Put(static_cast<FileXferBytes &>(*m_Transport), value);
}

inline unsigned int CKTStreamWrite::WriteBytes(void *bytes, unsigned int count) {
    auto const copy = [=](unsigned char *to) { OCopyBytes(to, static_cast<unsigned char const *>(bytes), count); };
    if (m_IsPlain != 0 && OFileShortcut::Put(static_cast<FileXferBytes &>(*m_Transport), count, copy)) {
        return count;
    }
    return m_Transport->Write(bytes, count);
}

// ---- bytes and text ----

int CKTStreamWrite::XferByte(unsigned char *buffer, int count) {
    return static_cast<int>(WriteBytes(buffer, OArrayBytes<unsigned char>(count)));
}

unsigned char CKTStreamWrite::XferByte(unsigned char &value) {
    WriteValue(value);
    return value;
}

// Encodes the text where it is to lie, if it needs no conversion but of the size of its characters.
inline bool CKTStreamWrite::PutString(KTString const &value, bool utf8, bool withCount) {
    std::size_t const units = value.size();
    if (units > kOShortTextUnits) {
        return false;
    }
    auto const count = static_cast<int>(utf8 ? units : units * sizeof(unsigned short));
    unsigned int const before = withCount ? sizeof count : 0;
    return OFileShortcut::PutIf(static_cast<FileXferBytes &>(*m_Transport), before + static_cast<unsigned int>(count),
                                [&](unsigned char *to) {
                                    if (withCount) {
                                        int const stored = m_Swapping == 0 ? count : OReversed(count);
                                        std::memcpy(to, &stored, sizeof stored);
                                    }
                                    return OPutStreamText(value, to + before, utf8);
                                });
}

KTString CKTStreamWrite::XferString(KTString &value, bool utf8, bool withCount) try {
    if (m_IsPlain != 0 && PutString(value, utf8, withCount)) {
        return value;
    }
    OStreamTextWriter const text(value, utf8);
    if (withCount) {
        int count = static_cast<int>(text.Count());
        XferInt32(count);
    }
    WriteBytes(text.Bytes(), text.Count());
    return value;
} catch (std::bad_alloc const &) {
    OStreamReport("CKTStreamWrite::XferString - out of memory", kReportPath, kMemoryLine);
    return {};
}

// The last byte of the value goes first. Returns the number of bytes written.
int CKTStreamWrite::XferByteReverse(unsigned char *buffer, int count) {
    int done = 0;
    while (done < count && m_Transport->Write(buffer + (count - 1 - done), 1) != 0) {
        ++done;
    }
    return done;
}

// ---- integers ----

int CKTStreamWrite::XferBool(KTBool16 *values, int count) {
    OStreamReport("Warning: Using XferBool(KTBool16 *buf, KTInt32 num) is currently not crossplatfom savvy",
                  kReportPath, kBoolArrayLine);
    return XferInt16(values, count);
}

KTBool16 CKTStreamWrite::XferBool(KTBool16 &value) {
    if (value != 0 && value != 1) {
        OStreamReport("CStreamWrite::XferBool - this isn't a bool you are writing", kReportPath, kBoolLine);
    }
    value = value != 0 ? 1 : 0;
    if (m_IsPlain != 0) {
        return CKTStreamWrite::XferInt16(value);
    }
    XferInt16(value);
    return value;
}

int CKTStreamWrite::XferInt16(short *values, int count) {
    if (m_Swapping == 0) {
        return static_cast<int>(m_Transport->Write(values, OArrayBytes<short>(count)) / sizeof(short));
    }
    for (int i = 0; i < count; ++i) {
        WriteValue(OReversed(values[i]));
    }
    return count < 1 ? 0 : count;
}

short CKTStreamWrite::XferInt16(short &value) {
    WriteValue(m_Swapping == 0 ? value : OReversed(value));
    return value;
}

int CKTStreamWrite::XferInt32(int *values, int count) {
    if (m_Swapping == 0) {
        return static_cast<int>(m_Transport->Write(values, OArrayBytes<int>(count)) / sizeof(int));
    }
    for (int i = 0; i < count; ++i) {
        WriteValue(OReversed(values[i]));
    }
    return count < 1 ? 0 : count;
}

int CKTStreamWrite::XferInt32(int &value) {
    WriteValue(m_Swapping == 0 ? value : OReversed(value));
    return value;
}

long long CKTStreamWrite::XferInt64(long long &value) {
    if (PutWhole(m_Swapping == 0 ? OHalvesExchanged(value) : OReversed(value))) {
        return value;
    }
    int high = OHighHalf(value);
    int low = OLowHalf(value);
    XferInt32(high);
    XferInt32(low);
    return value;
}

int CKTStreamWrite::XferID(int *values, int count) {
    for (int i = 0; i < count; ++i) {
        XferID(values[i]);
    }
    return count;
}

int CKTStreamWrite::XferID(int &value) { return XferInt32(value); }

int CKTStreamWrite::XferPropertyID(int *values, int count) {
    for (int i = 0; i < count; ++i) {
        XferID(values[i]);
    }
    return count;
}

int CKTStreamWrite::XferPropertyID(int &value) { return XferInt32(value); }

// ---- reals ----

int CKTStreamWrite::XferRealNumber(KTReal *values, int count) {
    for (int i = 0; i < count; ++i) {
        XferRealNumber(values[i]);
    }
    return count < 1 ? 0 : count;
}

KTReal &CKTStreamWrite::XferRealNumber(KTReal &value) {
    double number = value.AsDouble();
    auto *const bytes = reinterpret_cast<unsigned char *>(&number);
    if (m_Swapping == 0) {
        if (!PutWhole(number)) {
            XferByte(bytes, sizeof number);
        }
    } else {
        XferByteReverse(bytes, sizeof number);
    }
    return value;
}

// ---- everything else ----

void CKTStreamWrite::Comment(char *) {}
int CKTStreamWrite::Seek(int offset, KTSeekFromWhere origin) {
    return static_cast<int>(m_Transport->Seek(offset, origin));
}
unsigned int CKTStreamWrite::Tell() { return m_Transport->Tell(); }
void CKTStreamWrite::SetEndOfStream() { m_Transport->SetEndOfStream(); }
void CKTStreamWrite::Flush() { m_Transport->Flush(); }
KTStreamState CKTStreamWrite::GetStreamState() { return m_Transport->GetStreamState(); }
KTBool16 CKTStreamWrite::IsReading() const { return 0; }
KTBool16 CKTStreamWrite::IsWriting() const { return 1; }
void CKTStreamWrite::SetSwapping(KTBool16 swapping) { m_Swapping = swapping; }
KTBool16 CKTStreamWrite::GetSwapping() const { return m_Swapping; }
KTBool16 CKTStreamWrite::Open() { return 1; }
void CKTStreamWrite::Close() {}
