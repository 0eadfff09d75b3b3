// Base64Test.cpp: Base64 against the vectors of RFC 4648, against a plain model with random input, and its refusals.

#include "KTBase64.h"
#include "KTPublicUtils.h"

#include <gtest/gtest.h>

#include <cctype>
#include <random>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace {

constexpr char kTooLarge[] = "Converting too large a string to base64.";
constexpr char kIllegal[] = "This contains characters not legal in a base64 encoded string.";
constexpr char kCharacters[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";

std::string Encoded(std::string const &bytes) { return KTPublicUtils::Base64_encode(bytes); }
std::string Decoded(std::string const &text) { return KTPublicUtils::Base64_decode(text); }

// What Base64_decode throws, or "".
std::string Refusal(std::string const &text) {
    try {
        Decoded(text);
        return "";
    } catch (std::invalid_argument const &problem) {
        return problem.what();
    }
}

// The plain model: a bit at a time.
std::string ModelEncoded(std::string const &bytes) {
    std::string bits;
    for (char const byte : bytes) {
        for (int bit = 7; bit >= 0; --bit) {
            bits += ((static_cast<unsigned char>(byte) >> bit) & 1) != 0 ? '1' : '0';
        }
    }
    std::string text;
    for (std::size_t at = 0; at < bits.size(); at += 6) {
        std::string six = bits.substr(at, 6);
        six.resize(6, '0');
        text += kCharacters[std::stoul(six, nullptr, 2)];
    }
    text.resize((bytes.size() + 2) / 3 * 4, '=');
    return text;
}

std::string ModelDecoded(std::string const &text) {
    std::string bits;
    for (char const character : text) {
        if (std::isspace(static_cast<unsigned char>(character)) != 0 || character == '=') {
            continue;
        }
        std::size_t const value = std::string(kCharacters).find(character);
        if (value == std::string::npos) {
            throw std::invalid_argument("");
        }
        for (int bit = 5; bit >= 0; --bit) {
            bits += ((value >> bit) & 1) != 0 ? '1' : '0';
        }
    }
    std::string bytes;
    for (std::size_t at = 0; at + 8 <= bits.size(); at += 8) {
        bytes += static_cast<char>(std::stoul(bits.substr(at, 8), nullptr, 2));
    }
    return bytes;
}

std::string RandomBytes(std::mt19937 &random, std::size_t size) {
    std::string bytes(size, '\0');
    for (char &byte : bytes) {
        byte = static_cast<char>(random());
    }
    return bytes;
}

std::vector<std::pair<std::string, std::string>> const kVectors = {{"", ""},
                                                                   {"f", "Zg=="},
                                                                   {"fo", "Zm8="},
                                                                   {"foo", "Zm9v"},
                                                                   {"foob", "Zm9vYg=="},
                                                                   {"fooba", "Zm9vYmE="},
                                                                   {"foobar", "Zm9vYmFy"},
                                                                   {"ab", "YWI="}};

} // namespace

TEST(Base64, PublishedVectorsBothWays) {
    for (auto const &[bytes, text] : kVectors) {
        EXPECT_EQ(Encoded(bytes), text);
        EXPECT_EQ(Decoded(text), bytes);
    }
}

// Each value at each place of a group, in texts long enough for every way through the code.
TEST(Base64, EveryCharacterStandsForItsValue) {
    for (std::size_t const repeat : {1U, 10U}) {
        for (unsigned value = 0; value < 64; ++value) {
            for (unsigned place = 0; place < 4; ++place) {
                std::string group = "AAAA";
                group[place] = kCharacters[value];
                unsigned const bits = value << (18 - 6 * place);
                std::string const three = {static_cast<char>(bits >> 16), static_cast<char>(bits >> 8),
                                           static_cast<char>(bits)};
                std::string text;
                std::string bytes;
                for (std::size_t i = 0; i < repeat; ++i) {
                    text += group;
                    bytes += three;
                }
                EXPECT_EQ(Encoded(bytes), text);
                EXPECT_EQ(Decoded(text), bytes);
            }
        }
    }
}

TEST(Base64, DecodingSkipsWhiteSpaceAndPaddingAnywhere) {
    EXPECT_EQ(Decoded("YW Jj\n"), "abc");
    EXPECT_EQ(Decoded("YW=Jj"), "abc");
    EXPECT_EQ(Decoded("=Y=W=J=j="), "abc");
    EXPECT_EQ(Decoded(" \t\n\v\f\rYWJj"), "abc");
    EXPECT_EQ(Decoded("===="), "");
    EXPECT_EQ(Decoded(" "), "");
}

TEST(Base64, DecodingDropsLeftoverBits) {
    EXPECT_EQ(Decoded("Y"), "");
    EXPECT_EQ(Decoded("YW"), "a");
    EXPECT_EQ(Decoded("YX"), "a") << "the dropped bits need not be 0";
    EXPECT_EQ(Decoded("YWJ"), "ab");
    EXPECT_EQ(Decoded("YWJjY"), "abc");
}

// All 256 characters, alone and at each place of a long text.
TEST(Base64, OtherCharactersAreRefusedWhereverTheyStand) {
    std::string const text = Encoded(std::string(45, 'x'));
    for (int code = 0; code < 256; ++code) {
        char const character = static_cast<char>(code);
        bool const isSkipped = character == '=' || (code < 128 && std::isspace(code) != 0);
        bool const isLegal =
            isSkipped || (character != '\0' && std::string(kCharacters).find(character) != std::string::npos);
        std::string const expected = isLegal ? "" : kIllegal;
        EXPECT_EQ(Refusal(std::string(1, character)), expected) << code;
        for (std::size_t at = 0; at < text.size(); ++at) {
            std::string changed(text);
            changed[at] = character;
            ASSERT_EQ(Refusal(changed), expected) << code << " at " << at;
        }
        if (isSkipped) {
            for (std::size_t at = 0; at <= text.size(); ++at) {
                std::string longer(text);
                longer.insert(at, 1, character);
                ASSERT_EQ(Decoded(longer), std::string(45, 'x')) << code << " at " << at;
            }
        }
    }
    EXPECT_EQ(Refusal("YW-j"), kIllegal);
    EXPECT_EQ(Refusal("YW_j"), kIllegal);
}

TEST(Base64, EveryLengthGoesBothWays) {
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    for (std::size_t size = 0; size < 200; ++size) {
        std::string const bytes = RandomBytes(random, size);
        std::string const text = Encoded(bytes);
        ASSERT_EQ(text, ModelEncoded(bytes)) << size;
        ASSERT_EQ(Decoded(text), bytes) << size;
    }
    std::string const large = RandomBytes(random, 100'000);
    EXPECT_EQ(Decoded(Encoded(large)), large);
    EXPECT_EQ(Encoded(large).size(), 133'336U);
}

TEST(Base64, RandomTextDecodesAsTheModel) {
    unsigned const seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    for (int round = 0; round < 5000; ++round) {
        std::string text;
        std::size_t const length = random() % 150;
        unsigned const rarity = random() % 2 == 0 ? 5 : 60;
        while (text.size() < length) {
            text += random() % rarity == 0 ? " \r\n\t=="[random() % 6] : kCharacters[random() % 64];
        }
        ASSERT_EQ(Decoded(text), ModelDecoded(text)) << text;
        text.insert(random() % (text.size() + 1), 1, "-_.\0\x80\xFF"[random() % 6]);
        ASSERT_THROW(Decoded(text), std::invalid_argument) << text;
    }
}

TEST(Base64, LinesOfEveryWidthAreJoined) {
    std::string const bytes(1000, '\x5B');
    std::string const text = Encoded(bytes);
    for (std::size_t width = 1; width < 100; ++width) {
        std::string lines;
        for (std::size_t at = 0; at < text.size(); at += width) {
            lines += text.substr(at, width) + "\r\n";
        }
        ASSERT_EQ(Decoded(lines), bytes) << width;
    }
}

// No string of the standard library gets near this limit.
TEST(Base64, SizesBeyondTheLimitAreRefused) {
    EXPECT_EQ(KTBase64::EncodedSize(0xBFFFFFFFFFFFFFFD), 0xFFFFFFFFFFFFFFFCU);
    for (std::size_t const size : {0xBFFFFFFFFFFFFFFEU, 0xFFFFFFFFFFFFFFFFU}) {
        try {
            KTBase64::EncodedSize(size);
            ADD_FAILURE() << size;
        } catch (std::length_error const &problem) {
            EXPECT_STREQ(problem.what(), kTooLarge);
        }
    }
}
