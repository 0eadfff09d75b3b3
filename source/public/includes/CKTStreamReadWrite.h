// CKTStreamReadWrite.h: the typed streams that read and write in turns, on any transport or on a temporary file.

#pragma once

#include "IKTReadWriteStream.h"
#include "KTFile.h"

#include "KTBeginExports.h"

class CKTStreamRead;
class CKTStreamWrite;

/// Reads and writes values on one transport, which it owns, by a reader and a writer of its own. It reads at first.
///
/// Swapping is only remembered here, on purpose: the reader and the writer have flags of their own that stay false, so
/// numbers are little-endian whatever was set.
///
/// A copy, and a target of an assignment, shares the transport, the reader and the writer of its source: only one of the
/// two may be destroyed. One stream belongs to one thread at a time.
class KT_PUBLIC_API CKTStreamReadWrite : public IKTReadWriteStream {
  public:
    /// Has no transport. REQUIRES: SetXferBytes before anything but mode, swapping, Comment and Close is asked for.
    CKTStreamReadWrite();
    CKTStreamReadWrite(CKTStreamReadWrite const &other);
    CKTStreamReadWrite &operator=(CKTStreamReadWrite const &other);

    /// Deletes the transport.
    ~CKTStreamReadWrite() override;

    /// Takes over the transport, for the reader and the writer as well; null is allowed. The previous one is not deleted.
    void SetXferBytes(IKTXferBytes *transport);

    int XferByte(unsigned char *buffer, int count) override;
    unsigned char XferByte(unsigned char &value) override;
    KTString XferString(KTString &value, bool utf8, bool withCount) override;
    int XferBool(KTBool16 *values, int count) override;
    KTBool16 XferBool(KTBool16 &value) override;
    int XferInt16(short *values, int count) override;
    short XferInt16(short &value) override;
    int XferInt32(int *values, int count) override;
    int XferInt32(int &value) override;
    long long XferInt64(long long &value) override;
    int XferID(int *values, int count) override;
    int XferID(int &value) override;
    int XferPropertyID(int *values, int count) override;
    int XferPropertyID(int &value) override;
    int XferRealNumber(KTReal *values, int count) override;
    KTReal &XferRealNumber(KTReal &value) override;
    void Comment(char *text) override;
    int Seek(int offset, KTSeekFromWhere origin) override;
    unsigned int Tell() override;
    void SetEndOfStream() override;
    void Flush() override;
    KTStreamState GetStreamState() override;
    KTBool16 IsReading() const override;
    KTBool16 IsWriting() const override;
    void SetSwapping(KTBool16 swapping) override;
    KTBool16 GetSwapping() const override;

  protected:
    KTBool16 Open() override;

  public:
    void Close() override;

    /// Any mode but kModeRead writes.
    KTErrorCodeEnum SetMode(Mode mode) override;
    Mode GetMode() const override;

  protected:
    /// Deletes the reader and the writer, calls Close and deletes the transport. A second call finds nothing left.
    virtual void Destroy();

  private:
    // The order of the fields is part of the binary interface.
    IKTXferBytes *m_Transport = nullptr;
    CKTStreamRead *m_Reader;
    CKTStreamWrite *m_Writer;
    IKTStream *m_Current; // the reader or the writer
    KTBool16 m_Swapping = 0;
    Mode m_Mode = kModeRead;
};

/// Reads and writes values in a new temporary file ".ikt" in the session folder, and deletes the file with itself. If the
/// file could not be created, the state is closed. The session folder is made by its first use, which is not locked: see
/// KTFileUtil.
class KT_PUBLIC_API CKTTempFileStreamReadWrite : public CKTStreamReadWrite {
  public:
    CKTTempFileStreamReadWrite();

    /// Shares everything, the file included: only one of the two may be destroyed.
    CKTTempFileStreamReadWrite(CKTTempFileStreamReadWrite const &other);
    CKTTempFileStreamReadWrite &operator=(CKTTempFileStreamReadWrite const &other);

    /// Closes the file, then deletes it.
    ~CKTTempFileStreamReadWrite() override;

  private:
    KTFile m_File;
};

#include "KTEndExports.h"
