// KTPublicUtils.h: digests, encodings and other small helpers without a home of their own.
//
//     KTString const hash = KTPublicUtils::GenerateHash(title, kKTHashSHA256); // 64 hexadecimal digits
//     std::string const text = KTPublicUtils::Base64_encode("ab");            // "YWI="
//
// The digests are SHA-1 and SHA-256 (FIPS 180-4), computed by the operating system. SHA-1 no longer resists collisions:
// it is here for signatures and formats that ask for it.

#pragma once

#include "KTString.h"

#include <string>

#include "KTBeginExports.h"

class IKTStream;
class IKTStringDictionary;

/// The functions that GenerateHash knows.
enum KTHashFunctionEnum : int {
    kKTHashSHA256 = 0 ///< SHA-256: a digest of 32 bytes
};

/// Static helpers. Unless said otherwise any thread may call them, also at the same time, and they throw
/// std::bad_alloc when memory is short; a digest that the system refuses for another reason throws
/// std::runtime_error.
class KT_PUBLIC_API KTPublicUtils {
  public:
    KTPublicUtils() = delete;

    // ---- digests ----

    /// The digest of everything in the stream, from its beginning to its end, as lower-case hexadecimal (64 digits).
    /// Needs at most 512 KiB of memory whatever the stream's size, and leaves the stream at its end. A stream that is
    /// null, not in good state or not reading is reported as the assertion "Generate Hash - not valid stream" and gives
    /// an empty string; so does a stream that ends before its size. A function other than kKTHashSHA256 is reported as
    /// "Algorithm - Hashing not implemented" and gives an empty string. REQUIRES: a stream of less than 4 GiB, as
    /// positions in streams are. One thread at a time for each stream.
    static KTString GenerateHash(IKTStream *stream, KTHashFunctionEnum const &function);

    /// The digest of the string's UTF-8 form, without a terminator, printed the same way; functions as above.
    static KTString GenerateHash(KTString const &text, KTHashFunctionEnum const &function);

    /// The digest of `length` bytes, printed the same way. Null bytes are reported as "GenerateHash bytes NULL" and
    /// give an empty string, whatever the length and the function.
    static KTString GenerateHash(unsigned char const *bytes, unsigned int length, KTHashFunctionEnum const &function);

    /// Writes the SHA-1 digest of `length` bytes to `digest`, 20 bytes. `data` may be null when the length is 0.
    /// REQUIRES: digest has room for 20 bytes. It may lie in the data.
    static void GenerateSHA1Digest(unsigned char const *data, unsigned int const &length, unsigned char *digest);

    /// Writes the HMAC-SHA1 signature (RFC 2104) of the message to `signature`, 20 bytes, and 20 to `signatureLength`.
    /// Keys of more than 64 bytes count by their SHA-1 digest. A message or key may be null when its length is 0.
    /// REQUIRES: a message of at most 4,032 bytes, which is what callers may rely on and is not checked; room for 20
    /// bytes.
    static void GetHMACSignature(unsigned char const *message, unsigned int const &messageLength,
                                 unsigned char const *key, unsigned int const &keyLength, unsigned char *signature,
                                 unsigned int &signatureLength);

    // ---- Base64 (RFC 4648, section 4: the standard alphabet) ----

    /// The bytes as Base64, padded with "=" to a multiple of four characters, without line breaks. Throws
    /// std::length_error("Converting too large a string to base64.") for more than 0xBFFFFFFFFFFFFFFD bytes.
    static std::string Base64_encode(std::string const &bytes);

    /// The bytes that the text stands for. White space (as isspace classifies) and "=" are skipped wherever they stand;
    /// bits left over at the end are dropped. Any other character, "-" and "_" and those above 127 included, throws
    /// std::invalid_argument("This contains characters not legal in a base64 encoded string.").
    static std::string Base64_decode(std::string const &text);

    // ---- others ----

    /// The time now as HTTP's fixed-length date (RFC 2616, section 3.3.1), "Sun, 06 Nov 1994 08:49:37 GMT". English in
    /// every locale.
    static KTString GetRFC2616GMTTime();

    /// A number from 0 to `maximum`, by the C run-time's generator: rand() modulo (maximum + 1), so never above
    /// RAND_MAX, which is 32,767 on Windows. The first call in the process seeds the generator of its thread with the
    /// time. Not for secrets. WRONG: 0xFFFFFFFF, which divides by 0 and ends the process. What other threads' calls do
    /// to the generator is the run-time's business; nothing is locked here.
    static unsigned int GetARandomNumber(unsigned int maximum);

    /// The text, ": " and the number as a standard output stream writes it by default (six significant digits), for
    /// example "fps: 29.97".
    static std::string ConstructLogStr(std::string text, float value);

    /// The process-wide string dictionary (KTStringDictionary.h), made by the first call. Not locked: the first call is
    /// to be made on one thread, at start-up. If there is no memory for it the assertion
    /// "KTStringDictionary::GetStringDictionary()" is reported and KTLCException (kKTErrorInternal) thrown.
    static IKTStringDictionary &GetStringDictionary();
};

#include "KTEndExports.h"
