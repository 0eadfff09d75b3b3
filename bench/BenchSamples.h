// BenchSamples.h: texts of a given size in UTF-8.
//
// Words are drawn at random, with a fixed seed, from a short list for each script, and joined by spaces and punctuation
// as such texts have them. So every run measures the same text, and a branch predictor cannot learn it by heart.

#pragma once

#include <array>
#include <cstddef>
#include <string>

namespace bench {

enum class Script { kAscii, kLatin, kCyrillic, kCjk, kEmoji };

inline constexpr std::array kScripts{Script::kAscii, Script::kLatin, Script::kCyrillic, Script::kCjk, Script::kEmoji};

/// The script's name in benchmark names.
char const *NameOf(Script script);

/// Well-formed UTF-8 without zero bytes, exactly `size` bytes long (spaces fill the end where a word does not fit).
std::string SampleText(Script script, std::size_t size);

} // namespace bench
