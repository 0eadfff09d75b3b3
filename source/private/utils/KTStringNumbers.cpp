// KTStringNumbers.cpp: numbers appended as text, and text read as numbers.

#include "KTString.h"

#include "KTAssert.h"
#include "OFormat.h"

#include <cstdarg>
#include <cstdint>
#include <sstream>

namespace {

constexpr std::size_t kNumberBuffer = 100;
constexpr char kReportPath[] = "source/private/utils/KTString";

void ReportTooLong() { KTAssertFailed("Number does not fit the buffer", kReportPath, 312); }

// Formats into the number buffer and appends the text; what does not fit is reported and nothing is appended.
KTErrorCodeEnum AppendFormatted(KTString &text, char const *format, ...) {
    char buffer[kNumberBuffer];
    std::va_list values;
    va_start(values, format);
    int const length = OFormatTruncating(buffer, sizeof buffer, format, values);
    va_end(values);
    if (length < 0) {
        ReportTooLong();
    } else {
        text += buffer;
    }
    return kKTErrorNone;
}

// Whether no conversion of the format would read its value as a pointer. Flags, width, precision and sizes of every
// run-time may stand before the conversion's letter, those of near and far pointers included. A per cent sign behind
// any of them begins anew, as run-times differ there.
bool ReadsOnlyNumbers(std::string const &format) {
    constexpr char kBetween[] = "-+ #'0123456789.*$hlLqjztIwFN";
    for (std::size_t at = format.find('%'); at != std::string::npos; at = format.find('%', at)) {
        std::size_t const start = at + 1;
        at = format.find_first_not_of(kBetween, start);
        if (at == std::string::npos) {
            return true;
        }
        if (std::string("sSZn").find(format[at]) != std::string::npos) {
            return false;
        }
        if (format[at] != '%' || at == start) {
            ++at;
        }
    }
    return true;
}

template <typename Value> Value ReadValue(KTString const &text, KTString::BaseManipulator base) {
    std::wistringstream stream(text.GetWstring());
    Value value{};
    if (base != nullptr) {
        stream >> base;
    }
    stream >> value;
    return value;
}

} // namespace

KTErrorCodeEnum KTString::AppendNumber(int number) { return AppendNumber(number, KTString("%d")); }

KTErrorCodeEnum KTString::AppendNumber(int number, KTString const &format) {
    std::string const utf8 = format.GetUTF8String();
    if (!ReadsOnlyNumbers(utf8)) {
        KTAssertFailed("Number format reads a pointer", kReportPath, 301);
        return kKTErrorNone;
    }
    return AppendFormatted(*this, utf8.c_str(), number);
}

KTErrorCodeEnum KTString::AppendUNumber(unsigned int number) { return AppendFormatted(*this, "%u", number); }

KTErrorCodeEnum KTString::AppendUInt64(KTUInt64 number) {
    return AppendFormatted(*this, "%llu", static_cast<unsigned long long>(number));
}

KTErrorCodeEnum KTString::AppendPointer(void *pointer) {
    return AppendUInt64(static_cast<KTUInt64>(reinterpret_cast<std::uintptr_t>(pointer)));
}

KTErrorCodeEnum KTString::AppendRealNumber(KTReal number, int precision) {
    if (precision >= static_cast<int>(kNumberBuffer)) {
        ReportTooLong(); // so many digits never fit: the run-time need not make them first
        return kKTErrorNone;
    }
    std::string const format = "%." + std::to_string(precision) + "f";
    return AppendFormatted(*this, format.c_str(), number.AsDouble());
}

KTUInt32 KTString::GetIntValue(BaseManipulator base) const { return ReadValue<KTUInt32>(*this, base); }

KTUInt64 KTString::GetUInt64Value(BaseManipulator base) const { return ReadValue<KTUInt64>(*this, base); }

double KTString::GetDoubleValue() const { return ReadValue<double>(*this, nullptr); }

void *KTString::GetPointerValue() const { return ReadValue<void *>(*this, nullptr); }
