// BenchText.cpp: UTF-8 to KTString and back, beside the system's calls and two libraries, each used the way its
// documentation shows: the result is a fresh string every time.
//
// memcpy stands beside ASCII text of 64 KiB twice. "memcpy" moves as many bytes as the conversion, read and written
// ones counted: UTF-8 of 64 KiB becomes 128 KiB of units, 192 KiB in all, and so does a copy of 96 KiB.
// "memcpy-source" copies the conversion's source alone. Both copy between strings that are there already, while the
// conversion makes its own.

#include "Bench.h"
#include "BenchSamples.h"

#include "KTString.h"

#include <boost/nowide/convert.hpp>
#include <utf8.h>
#include <windows.h>

#include <cstring>
#include <iterator>

namespace bench {

namespace {

constexpr char kDecode[] = "utf8-decode";
constexpr char kEncode[] = "utf8-encode";
constexpr char kSystem[] = "system";
constexpr char kUtfcpp[] = "utfcpp";
constexpr char kNowide[] = "nowide";

// Room for a result of two bytes for each byte, or for strings that double while they grow.
constexpr std::size_t kRoom = 6;

struct Size {
    char const *name;
    std::size_t bytes;
};

constexpr Size kSizes[] = {{"64", 64}, {"1K", 1024}, {"64K", 65536}, {"1M", 1048576}};

std::wstring SystemWiden(char const *bytes) {
    int const size = static_cast<int>(std::strlen(bytes));
    int const count = MultiByteToWideChar(CP_UTF8, 0, bytes, size, nullptr, 0);
    std::wstring text(static_cast<std::size_t>(count), L'\0');
    MultiByteToWideChar(CP_UTF8, 0, bytes, size, text.data(), count);
    return text;
}

std::string SystemNarrow(std::wstring const &text) {
    int const count = static_cast<int>(text.size());
    int const size = WideCharToMultiByte(CP_UTF8, 0, text.data(), count, nullptr, 0, nullptr, nullptr);
    std::string bytes(static_cast<std::size_t>(size), '\0');
    WideCharToMultiByte(CP_UTF8, 0, text.data(), count, bytes.data(), size, nullptr, nullptr);
    return bytes;
}

std::u16string UtfcppWiden(char const *bytes) {
    std::u16string text;
    utf8::utf8to16(bytes, bytes + std::strlen(bytes), std::back_inserter(text));
    return text;
}

std::string UtfcppNarrow(std::u16string const &text) {
    std::string bytes;
    utf8::utf16to8(text.begin(), text.end(), std::back_inserter(bytes));
    return bytes;
}

// Registers a contender that calls `convert` on its own copy of the input.
template <typename Input, typename Convert>
void AddConversion(Task const &task, char const *contender, Input const &input, std::size_t bytes, Convert convert) {
    Add(task, contender, [input, bytes, convert](benchmark::State &state) mutable {
        HeapRoom const room(kRoom * bytes);
        for (auto _ : state) {
            auto result = convert(input);
            benchmark::DoNotOptimize(result.data());
            benchmark::ClobberMemory();
        }
        state.SetBytesProcessed(static_cast<std::int64_t>(bytes) * state.iterations());
    });
}

// KTString shows its units through c_str() alone.
struct OurUnits {
    KTString text;
    unsigned short const *data() const { return text.c_str(); }
};

void AddDecode(Task const &task, std::string const &bytes) {
    std::size_t const size = bytes.size();
    AddConversion(task, kOurs, bytes, size, [](std::string const &input) {
        return OurUnits{KTString(input.c_str(), KTString::kKTEncodingUTF8)};
    });
    AddConversion(task, kSystem, bytes, size, [](std::string const &input) { return SystemWiden(input.c_str()); });
    AddConversion(task, kUtfcpp, bytes, size, [](std::string const &input) { return UtfcppWiden(input.c_str()); });
    AddConversion(task, kNowide, bytes, size,
                  [](std::string const &input) { return boost::nowide::widen(input.c_str()); });
}

void AddEncode(Task const &task, std::string const &bytes) {
    std::size_t const size = bytes.size();
    AddConversion(task, kOurs, KTString(bytes.c_str(), KTString::kKTEncodingUTF8), size,
                  [](KTString const &input) { return input.GetUTF8String(); });
    AddConversion(task, kSystem, SystemWiden(bytes.c_str()), size, SystemNarrow);
    AddConversion(task, kUtfcpp, UtfcppWiden(bytes.c_str()), size, UtfcppNarrow);
    AddConversion(task, kNowide, SystemWiden(bytes.c_str()), size,
                  [](std::wstring const &input) { return boost::nowide::narrow(input); });
}

void AddMemcpy(Task const &task, char const *contender, std::size_t size) {
    AddConversion(task, contender, std::string(size, 'a'), size,
                  [to = std::string(size, 'b')](std::string const &input) mutable {
                      std::memcpy(to.data(), input.data(), input.size());
                      return std::string_view(to);
                  });
}

} // namespace

void AddTextBenchmarks() {
    DescribeGroup(kDecode, "KTString from zero-terminated UTF-8");
    DescribeGroup(kEncode, "KTString::GetUTF8String");
    for (char const *group : {kDecode, kEncode}) {
        ExpectSpeed(group, kSystem, 1.0);
        ExpectSpeed(group, kUtfcpp, 2.0);
        ExpectSpeed(group, kNowide, 2.0);
        ExpectSpeed(group, "memcpy", 0.5);
    }
    for (Script const script : kScripts) {
        for (Size const &size : kSizes) {
            std::string const bytes = SampleText(script, size.bytes);
            Task const decode{kDecode, NameOf(script), size.name};
            Task const encode{kEncode, NameOf(script), size.name};
            AddDecode(decode, bytes);
            AddEncode(encode, bytes);
            if (script == Script::kAscii && size.bytes == kSizes[2].bytes) {
                AddMemcpy(decode, "memcpy", size.bytes * 3 / 2);
                AddMemcpy(decode, "memcpy-source", size.bytes);
                AddMemcpy(encode, "memcpy", size.bytes * 3 / 2);
                AddMemcpy(encode, "memcpy-source", size.bytes * 2);
            }
        }
    }
}

} // namespace bench
