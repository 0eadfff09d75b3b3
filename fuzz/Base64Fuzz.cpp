// Base64Fuzz.cpp: any bytes encoded and back, and any text decoded, each way of the code against a plain decoder.

#include "KTBase64.h"

#include <cctype>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <stdexcept>
#include <string>

namespace {

using KTBase64::Runs;

void Check(bool holds) {
    if (!holds) {
        std::abort();
    }
}

// One bit group after the other; nothing for text that is not legal.
std::optional<std::string> PlainDecoded(std::string const &text) {
    std::string bytes;
    unsigned bits = 0;
    int count = 0;
    for (char const character : text) {
        if (std::isspace(static_cast<unsigned char>(character)) != 0 || character == '=') {
            continue;
        }
        std::size_t const value = KTBase64::kAlphabet.find(character);
        if (value == std::string_view::npos) {
            return std::nullopt;
        }
        bits = (bits << 6) | static_cast<unsigned>(value);
        count += 6;
        if (count >= 8) {
            count -= 8;
            bytes += static_cast<char>(bits >> count);
        }
    }
    return bytes;
}

std::optional<std::string> Decoded(std::string const &text, Runs runs) {
    try {
        return KTBase64::Decode(text, runs);
    } catch (std::invalid_argument const &) {
        return std::nullopt;
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const *data, std::size_t size) {
    // A copy that ends where the input ends, so that the sanitizer sees a read past it.
    std::string const input(reinterpret_cast<char const *>(data), size);
    auto const expected = PlainDecoded(input);
    Check(Decoded(input, Runs::Fastest) == expected);
    Check(Decoded(input, Runs::Plain) == expected);

    std::string const text = KTBase64::Encode(input, Runs::Fastest);
    Check(text.size() == KTBase64::EncodedSize(size));
    Check(text == KTBase64::Encode(input, Runs::Plain));
    Check(Decoded(text, Runs::Fastest) == input);
    return 0;
}
