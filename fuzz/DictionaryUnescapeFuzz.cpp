// DictionaryUnescapeFuzz.cpp: any units with escapes and entities.
//
// Input: the first byte selects the table, then UTF-16.

#include "DictionaryUnescape.h"

#include <cstdint>
#include <cstdlib>
#include <cstring>

using namespace orvik_private;

namespace {

void Check(bool holds) {
    if (!holds) {
        std::abort();
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const *data, std::size_t size) {
    if (size == 0) {
        return 0;
    }
    CaretTable const table = data[0] % 2 == 0 ? CaretTable::First : CaretTable::Second;
    KTUnits text((size - 1) / 2, 0);
    if (!text.empty()) {
        std::memcpy(text.data(), data + 1, text.size() * 2);
    }
    std::size_t problems = 0;
    KTUnits const quiet = Unescape(text, table);
    Check(quiet == Unescape(text, table, [&](EscapeProblem const &problem) {
              Check(problem.at < text.size());
              ++problems;
          }));
    Check(quiet.size() <= text.size());
    Check(MayHaveEscapes(text) || quiet == text);
    Check(MayHaveEscapes(text) || problems == 0);

    // Doubled, escape characters stand for themselves.
    KTUnits doubled;
    for (unsigned short const unit : text) {
        if (unit == '#') {
            continue; // begins an entity, which nothing takes its meaning from
        }
        doubled.push_back(unit);
        if (unit == '\\' || unit == '^') {
            doubled.push_back(unit);
        }
    }
    KTUnits plain;
    for (unsigned short const unit : text) {
        if (unit != '#') {
            plain.push_back(unit);
        }
    }
    Check(Unescape(doubled, table) == plain);
    return 0;
}
