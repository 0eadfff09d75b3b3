// DictionaryBinaryFuzz.cpp: any bytes as a dictionary file of the binary form.
//
// Input: the file without its 21 bytes of magic, so that no mutation is lost on them.

#include "DictionaryReader.h"

#include <cstdint>
#include <cstdlib>

using namespace orvik_private;

namespace {

void Check(bool holds) {
    if (!holds) {
        std::abort();
    }
}

// What was read is found, and is written and read again as the same entries.
void CheckRoundTrip(DictionaryReader const &dictionary, DictionaryForm const &form) {
    MemorySink sink;
    bool isComplete = false;
    dictionary.Write(sink, form, &isComplete);
    if (!isComplete) {
        return;
    }
    DictionaryReader again;
    MemorySource source(sink.Bytes());
    again.Read(source);
    Check(again.IsValid());
    Check(again.Array().LivingCount() == dictionary.Array().LivingCount());
    KTUnits scratch;
    std::uint32_t at = 0;
    dictionary.Array().ForEach([&](ListedEntry const &entry) {
        Check(again.Array().Key(at) == entry.key);
        Check(form.encoding != kEncodingNone || again.Array().Value(at, scratch) == entry.value);
        ++at;
    });
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const *data, std::size_t size) {
    constexpr std::size_t kMostBytes = 1 << 16; // entries may overlap, so what is written grows with the square
    std::string file("LexiStr Binary Format");
    file.append(reinterpret_cast<char const *>(data), size < kMostBytes ? size : kMostBytes);
    DictionaryReader dictionary;
    unsigned short const before = 'b';
    dictionary.Add("/Before", {&before, 1});
    MemorySource source(file);
    dictionary.Read(source);
    std::uint64_t textBytes = 0;
    dictionary.Array().ForEach([&](ListedEntry const &entry) {
        textBytes += entry.key.size() + entry.value.size();
        Check(entry.key.empty() || dictionary.Array().Find(entry.key) == entry.index);
    });
    Check(dictionary.Array().Find("/Before") >= 0);
    constexpr std::uint64_t kMostText = 1 << 22;
    if (textBytes < kMostText) {
        CheckRoundTrip(dictionary, {true, kEncodingNone, std::endian::little});
        CheckRoundTrip(dictionary, {true, kEncodingUtf8, std::endian::big});
    }
    for (std::uint32_t bucket = 0; bucket < kBucketCount; ++bucket) {
        DictionaryEntry const *entry = dictionary.Legacy().First(bucket);
        for (; entry != nullptr; entry = entry->NextEntry()) {
            Check(entry->Value().Units().size() == entry->Value().UnitLength());
        }
    }
    return 0;
}
