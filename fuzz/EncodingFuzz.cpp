// EncodingFuzz.cpp: any bytes as UTF-8, and any bytes as UTF-16, against plain converters.

#include "OUtf.h"
#include "Units.h"

#include <cstdint>
#include <cstdlib>
#include <cstring>

namespace {

void Check(bool holds) {
    if (!holds) {
        std::abort();
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const *data, std::size_t size) {
    // The copies end where the input ends, so that the sanitizer sees a read past it.
    std::string const bytes(reinterpret_cast<char const *>(data), size);
    Units const expected = ReferenceDecode(bytes);
    OString const decoded = OString::FromUTF8(bytes);
    Check(decoded.GetUnits() == KTUnits(expected.begin(), expected.end()));
    Check(decoded.GetUTF8() == ReferenceEncode(expected));
    Check(OUtf8ToUnitsBaseline(bytes) == decoded.GetUnits());
    Check(KTString(bytes.c_str(), KTString::kKTEncodingBytes).size() == std::strlen(bytes.c_str()));

    Units units(size / 2);
    if (!units.empty()) {
        std::memcpy(units.data(), data, units.size() * 2);
    }
    KTString const text = FromUnits(units);
    Check(text.GetUTF8String() == ReferenceEncode(units));
    Check(OUnitsToUtf8Baseline(units.data(), units.size()) == text.GetUTF8String());
    Check(KTString(text.c_str()).size() == KTUnitTraits::length(text.c_str()));
    return 0;
}
