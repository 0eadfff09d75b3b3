// TransformsFuzz.cpp: splitting, replacing, and reading numbers of any text.
//
// Input: the first line is the text, the second what is searched, the third what replaces it.

#include "KTString.h"

#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

namespace {

void Check(bool holds) {
    if (!holds) {
        std::abort();
    }
}

// Cut at each delimiter and joined again with one, the text has the same length and the same pieces.
void CheckSplit(KTString const &text, KTString const &delimiters) {
    std::vector<KTString> const pieces = text.Split(delimiters);
    Check(!pieces.empty());
    KTString joined = pieces[0];
    for (std::size_t i = 1; i < pieces.size(); ++i) {
        Check(delimiters.find(text[joined.size()]) != KTString::npos);
        joined += text[joined.size()];
        joined += pieces[i];
    }
    Check(joined == text);
    for (KTString const &piece : pieces) {
        Check(piece.find_first_of(delimiters) == KTString::npos);
    }
}

// Replacement by hand, in the order laid down: from the beginning again after each one.
KTString ReplacedFromTheBeginning(KTString text, KTString const &find, KTString const &with) {
    for (auto at = text.find(find); at != KTString::npos; at = text.find(find)) {
        text.replace(at, find.size(), with);
    }
    return text;
}

void CheckReplace(KTString const &text, KTString const &find, KTString const &with) {
    KTString once(text);
    once.ReplaceAll2(find, with);
    if (find.empty()) {
        Check(once == text);
        return;
    }
    std::size_t count = 0;
    for (auto at = text.find(find); at != KTString::npos; at = text.find(find, at + find.size())) {
        ++count;
    }
    Check(once.size() + count * find.size() == text.size() + count * with.size());
    if (with.size() < find.size()) { // each replacement shortens the text, so this ends
        KTString all(text);
        Check(all.ReplaceAll(find, with) == ReplacedFromTheBeginning(text, find, with));
        Check(all.find(find) == KTString::npos);
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const *data, std::size_t size) {
    std::string const bytes(reinterpret_cast<char const *>(data), size < 4096 ? size : 4096);
    std::vector<KTString> lines = KTString(bytes.c_str()).Split("\n");
    lines.resize(lines.size() < 3 ? 3 : lines.size());
    CheckSplit(lines[0], lines[1]);
    CheckReplace(lines[0], lines[1], lines[2]);
    static_cast<void>(lines[0].GetIntValue(std::hex));
    static_cast<void>(lines[0].GetUInt64Value());
    static_cast<void>(lines[0].GetDoubleValue());
    static_cast<void>(lines[0].GetPointerValue());
    static_cast<void>(lines[0].ContainsAny(lines[1], OString::kAnyOfIgnoreCase));
    return 0;
}
