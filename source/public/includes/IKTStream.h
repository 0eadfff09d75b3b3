// IKTStream.h: the typed stream, in which every persistent object writes and reads itself.
//
// One sequence of calls does both: each Xfer takes its value by reference, a writer stores it, a reader fills it in.
//
//     void Lesson::Xfer(IKTStream &stream) {
//         stream.XferInt32(m_Number);
//         stream.XferString(m_Title, true, true);
//         stream.XferRealNumber(m_Length);
//     }
//
// The bytes are those below in the order of the calls, and nothing else: no header, tags, padding or alignment.
//
//     XferByte                             u8
//     XferBool                             i16, 0 or 1
//     XferInt16                            i16
//     XferInt32, XferID, XferPropertyID    i32
//     XferInt64                            two i32: first the high 32 bits, then the low 32 bits
//     XferRealNumber                       f64, IEEE 754
//     XferString, UTF-8                    [i32 byte count]  UTF-8 bytes, no terminator
//     XferString, UTF-16                   [i32 byte count]  UTF-16 units, always little-endian, no terminator
//     arrays                               the elements one after the other, no count
//     Comment                              nothing
//
// Numbers are little-endian, or big-endian while swapping is set. A 64-bit integer has its high half first either way,
// so without swapping it is not the little-endian layout: 0x0102030405060708 gives 04 03 02 01 08 07 06 05.
//
// Streams throw nothing and have no errors of their own: a failure shows in the counts that are returned and in the
// transport's state. A value that is read short keeps what it held, as far as no bytes came for it.

#pragma once

#include "IKTXferBytes.h"
#include "KTReal.h"
#include "KTString.h"
#include "KTTypes.h"

#include "KTBeginExports.h"

/// Reads or writes typed values. CKTStreamRead, CKTStreamWrite and CKTStreamReadWrite do so on a transport; KTStreamUtil
/// makes them. One stream belongs to one thread at a time.
class KT_PUBLIC_API IKTStream {
  public:
    IKTStream();
    IKTStream(IKTStream const &other);
    IKTStream &operator=(IKTStream const &other);
    virtual ~IKTStream();

    // ---- values ----
    //
    // The forms for one value return the value. The array forms take a pointer to `count` elements and that number, and
    // return how many were moved; a negative count moves nothing. REQUIRES: an array pointer is not null unless the
    // count is 0 or negative.

    /// `count` bytes as they are. Returns the number of bytes moved.
    virtual int XferByte(unsigned char *buffer, int count) = 0;
    virtual unsigned char XferByte(unsigned char &value) = 0;

    /// A string: as UTF-8 with `utf8`, else as UTF-16. With `withCount` its length in bytes stands before it. Without, a
    /// reader reads as many bytes as the string passed in occupies in that encoding, so give it one of the right
    /// length. Returns a copy of the string.
    ///
    /// A reader takes no count on trust: memory is used for the bytes that really come, and when the data end early, the
    /// value is made of those. A negative count reads as 0. UTF-8 text ends at its first zero byte, if it has one, and
    /// malformed text is read as KTString reads it; an odd byte at the end of UTF-16 text is dropped.
    /// REQUIRES: a string that is written takes less than 2 GiB in the chosen encoding.
    virtual KTString XferString(KTString &value, bool utf8, bool withCount) = 0;

    /// Booleans in 16 bits. For one value, anything but 0 and 1 is reported as an assertion; a writer then stores 1 in
    /// its place, a reader hands it on.
    virtual int XferBool(KTBool16 *values, int count) = 0;
    virtual KTBool16 XferBool(KTBool16 &value) = 0;

    /// Integers of 16, 32 and 64 bits.
    virtual int XferInt16(short *values, int count) = 0;
    virtual short XferInt16(short &value) = 0;
    virtual int XferInt32(int *values, int count) = 0;
    virtual int XferInt32(int &value) = 0;
    virtual long long XferInt64(long long &value) = 0;

    /// Identifiers of objects and properties: integers of 32 bits. The array forms return `count`, whatever was moved.
    virtual int XferID(int *values, int count) = 0;
    virtual int XferID(int &value) = 0;
    virtual int XferPropertyID(int *values, int count) = 0;
    virtual int XferPropertyID(int &value) = 0;

    /// Real numbers.
    virtual int XferRealNumber(KTReal *values, int count) = 0;
    virtual KTReal &XferRealNumber(KTReal &value) = 0;

    /// A remark for whoever traces the calls; leaves nothing on the stream.
    virtual void Comment(char *text) = 0;

    // ---- the transport ----

    /// Moves to `offset` bytes from `origin`; returns the new position.
    virtual int Seek(int offset, KTSeekFromWhere origin) = 0;

    /// The current position in bytes; see the transport for what it counts while it reads ahead.
    virtual unsigned int Tell() = 0;

    /// Ends the data at the current position.
    virtual void SetEndOfStream() = 0;

    /// Passes on what the transport still holds back.
    virtual void Flush() = 0;

    /// How the transport is doing.
    virtual KTStreamState GetStreamState() = 0;

    // ---- direction and byte order ----

    /// 1 if values are read now, else 0.
    virtual KTBool16 IsReading() const = 0;

    /// 1 if values are written now, else 0.
    virtual KTBool16 IsWriting() const = 0;

    /// Whether numbers are big-endian on the stream; false at first. Strings' contents never are.
    virtual void SetSwapping(KTBool16 swapping) = 0;
    virtual KTBool16 GetSwapping() const = 0;

  protected:
    /// Prepares the stream for use; returns whether it is ready.
    virtual KTBool16 Open() = 0;

  public:
    /// Ends the use of the stream. The streams of this library do nothing here: deleting one closes its transport.
    virtual void Close() = 0;
};

#include "KTEndExports.h"
