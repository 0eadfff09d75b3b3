// CKTStreamReadWrite.cpp: the typed streams that read and write in turns.

#include "CKTStreamReadWrite.h"

#include "CKTStreamRead.h"
#include "CKTStreamWrite.h"
#include "KTFileUtil.h"
#include "TempFileXferBytes.h"

#include <memory>

namespace {

constexpr char kExtension[] = ".ikt";
constexpr unsigned int kReadAndWrite = FileXferBytes::kOpenRead | FileXferBytes::kOpenWrite;
constexpr unsigned int kIgnored = 0x3F3F3F3F;

} // namespace

CKTStreamReadWrite::CKTStreamReadWrite() {
    auto reader = std::make_unique<CKTStreamRead>();
    m_Writer = new CKTStreamWrite;
    m_Reader = reader.release();
    m_Current = m_Reader;
}

CKTStreamReadWrite::CKTStreamReadWrite(CKTStreamReadWrite const &other) = default;
CKTStreamReadWrite &CKTStreamReadWrite::operator=(CKTStreamReadWrite const &other) = default;
CKTStreamReadWrite::~CKTStreamReadWrite() { CKTStreamReadWrite::Destroy(); }

void CKTStreamReadWrite::SetXferBytes(IKTXferBytes *transport) {
    m_Transport = transport;
    m_Reader->SetXferBytes(transport);
    m_Writer->SetXferBytes(transport);
}

// The reader and the writer would delete the transport as theirs, so they must forget it first.
void CKTStreamReadWrite::Destroy() {
    if (m_Reader != nullptr) {
        m_Reader->SetXferBytes(nullptr);
        m_Writer->SetXferBytes(nullptr);
    }
    m_Current = nullptr;
    delete m_Reader;
    m_Reader = nullptr;
    delete m_Writer;
    m_Writer = nullptr;
    Close(); // NOLINT(clang-analyzer-optin.cplusplus.VirtualCall): that of the class whose destructor runs
    delete m_Transport;
    m_Transport = nullptr;
}

// ---- mode and byte order ----

KTErrorCodeEnum CKTStreamReadWrite::SetMode(Mode mode) {
    m_Mode = mode;
    if (mode == kModeRead) {
        m_Current = m_Reader;
    } else {
        m_Current = m_Writer;
    }
    return kKTErrorNone;
}

IKTReadWriteStream::Mode CKTStreamReadWrite::GetMode() const { return m_Mode; }
KTBool16 CKTStreamReadWrite::IsReading() const { return m_Mode == kModeRead ? 1 : 0; }
KTBool16 CKTStreamReadWrite::IsWriting() const { return m_Mode == kModeWrite ? 1 : 0; }
void CKTStreamReadWrite::SetSwapping(KTBool16 swapping) { m_Swapping = swapping; }
KTBool16 CKTStreamReadWrite::GetSwapping() const { return m_Swapping; }
KTBool16 CKTStreamReadWrite::Open() { return 1; }
void CKTStreamReadWrite::Close() {}

// ---- what the current stream does ----

int CKTStreamReadWrite::XferByte(unsigned char *buffer, int count) { return m_Current->XferByte(buffer, count); }
unsigned char CKTStreamReadWrite::XferByte(unsigned char &value) { return m_Current->XferByte(value); }
KTString CKTStreamReadWrite::XferString(KTString &value, bool utf8, bool withCount) {
    return m_Current->XferString(value, utf8, withCount);
}
int CKTStreamReadWrite::XferBool(KTBool16 *values, int count) { return m_Current->XferBool(values, count); }
KTBool16 CKTStreamReadWrite::XferBool(KTBool16 &value) { return m_Current->XferBool(value); }
int CKTStreamReadWrite::XferInt16(short *values, int count) { return m_Current->XferInt16(values, count); }
short CKTStreamReadWrite::XferInt16(short &value) { return m_Current->XferInt16(value); }
int CKTStreamReadWrite::XferInt32(int *values, int count) { return m_Current->XferInt32(values, count); }
int CKTStreamReadWrite::XferInt32(int &value) { return m_Current->XferInt32(value); }
long long CKTStreamReadWrite::XferInt64(long long &value) { return m_Current->XferInt64(value); }
int CKTStreamReadWrite::XferID(int *values, int count) { return m_Current->XferID(values, count); }
int CKTStreamReadWrite::XferID(int &value) { return m_Current->XferID(value); }
int CKTStreamReadWrite::XferPropertyID(int *values, int count) { return m_Current->XferPropertyID(values, count); }
int CKTStreamReadWrite::XferPropertyID(int &value) { return m_Current->XferPropertyID(value); }
int CKTStreamReadWrite::XferRealNumber(KTReal *values, int count) { return m_Current->XferRealNumber(values, count); }
KTReal &CKTStreamReadWrite::XferRealNumber(KTReal &value) { return m_Current->XferRealNumber(value); }
void CKTStreamReadWrite::Comment(char *text) { m_Current->Comment(text); }
int CKTStreamReadWrite::Seek(int offset, KTSeekFromWhere origin) { return m_Current->Seek(offset, origin); }
unsigned int CKTStreamReadWrite::Tell() { return m_Current->Tell(); }
void CKTStreamReadWrite::Flush() { m_Current->Flush(); }

// ---- what the transport does ----

KTStreamState CKTStreamReadWrite::GetStreamState() { return m_Transport->GetStreamState(); }
void CKTStreamReadWrite::SetEndOfStream() { m_Transport->SetEndOfStream(); }

// ---- on a temporary file ----

CKTTempFileStreamReadWrite::CKTTempFileStreamReadWrite()
    : m_File(KTFileUtil::GetUniqueTemporaryFile(KTString(kExtension))) {
    auto transport = std::make_unique<TempFileXferBytes>();
    transport->Open(m_File, kReadAndWrite, kIgnored, kIgnored);
    SetXferBytes(transport.release());
}

CKTTempFileStreamReadWrite::CKTTempFileStreamReadWrite(CKTTempFileStreamReadWrite const &other) = default;
CKTTempFileStreamReadWrite &CKTTempFileStreamReadWrite::operator=(CKTTempFileStreamReadWrite const &other) = default;

CKTTempFileStreamReadWrite::~CKTTempFileStreamReadWrite() {
    CKTTempFileStreamReadWrite::Destroy(); // a file that is open could not be deleted
    m_File.Delete();
}
