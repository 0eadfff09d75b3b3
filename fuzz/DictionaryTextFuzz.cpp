// DictionaryTextFuzz.cpp: any bytes as a dictionary file of the text form, in the encoding that its mark says.

#include "DictionaryLines.h"
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

class Counter final : public DictionaryObserver {
  public:
    void OnProblem(DictionaryProblem const &problem) override {
        Check(problem.line >= line || problem.kind == DictionaryProblemKind::Damaged || problem.line == 0);
        line = problem.line;
    }
    std::uint64_t line = 0;
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const *data, std::size_t size) {
    std::string const file(reinterpret_cast<char const *>(data), size);
    DictionaryReader dictionary;
    DictionaryReader observed;
    Counter counter;
    MemorySource source(file);
    MemorySource sameSource(file);
    dictionary.Read(source);
    observed.Read(sameSource, &counter);
    Check(dictionary.IsValid() == observed.IsValid());
    Check(dictionary.Array().EntryTotal() == observed.Array().EntryTotal());

    // Entries that are said to survive the text form do so.
    DictionaryReader survivors;
    dictionary.Array().ForEach([&](ListedEntry const &entry) {
        if (SurvivesTextForm(entry.key, entry.value, kEncodingNone)) {
            survivors.Add(entry.key, entry.value);
        }
    });
    MemorySink sink;
    survivors.Write(sink, {false, kEncodingNone, std::endian::little});
    MemorySource written(sink.Bytes());
    DictionaryReader again;
    again.Read(written);
    Check(again.IsValid());
    Check(again.Array().EntryTotal() == survivors.Array().EntryTotal());
    KTUnits scratch;
    survivors.Array().ForEach([&](ListedEntry const &entry) {
        Check(again.Array().Key(entry.index) == entry.key);
        Check(again.Array().Value(entry.index, scratch) == entry.value);
    });
    return 0;
}
