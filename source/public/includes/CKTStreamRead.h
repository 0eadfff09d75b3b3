// CKTStreamRead.h: the typed stream that reads.

#pragma once

#include "IKTStream.h"

#include "KTBeginExports.h"

/// Reads values from a transport, which it owns: see IKTStream for the format. A copy, and a target of an assignment,
/// shares the transport of its source, so only one of the two may be destroyed while it holds it. One stream belongs to
/// one thread at a time.
///
/// Two results are easily misread. An array that is swapped is swapped whole, elements included that no bytes came for.
/// Reading an array of reals stops with the first bad state, and returns how many were read until then: the last one
/// counts if all of it came.
class KT_PUBLIC_API CKTStreamRead : public IKTStream {
  public:
    /// Has no transport. REQUIRES: SetXferBytes before anything but swapping, direction, Comment and Close is asked for.
    CKTStreamRead();
    CKTStreamRead(CKTStreamRead const &other);
    CKTStreamRead &operator=(CKTStreamRead const &other);

    /// Deletes the transport.
    ~CKTStreamRead() override;

    /// Takes over the transport; null is allowed. The previous one is not deleted.
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

  private:
    template <typename Value> bool TakeWhole(Value &value);
    template <typename Value> bool TakeNumber(Value &value);
    bool TakeString(KTString &value, bool utf8, bool withCount);
    int XferByteReverse(unsigned char *buffer, int count);
    bool ReadReal(KTReal &value);

    // The order of the fields is part of the binary interface.
    IKTXferBytes *m_Transport = nullptr;
    KTBool16 m_Swapping = 0;
    KTBool16 m_IsPlain = 0; // whether neither stream nor transport is a host's own; in what was left of 8 bytes
};

#include "KTEndExports.h"
