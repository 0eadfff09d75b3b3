// StreamSupport.h: what the tests of streams have in common: a transport that records, files, and bytes as text.

#pragma once

#include "IKTXferBytes.h"
#include "KTFile.h"
#include "KTString.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

/// A host's transport over a vector: keeps the sizes of all calls, and fails as it is told.
class RecordingTransport : public IKTXferBytes {
  public:
    RecordingTransport() = default;
    explicit RecordingTransport(std::vector<unsigned char> bytes) : data(std::move(bytes)) {}

    unsigned int Read(void *buffer, unsigned int count) override {
        reads.push_back(count);
        auto const left = static_cast<unsigned int>(data.size()) - position;
        if (count > left) {
            state = kKTStreamStateEndOfStream;
            count = left;
        }
        if (count != 0) {
            std::memcpy(buffer, data.data() + position, count);
        }
        position += count;
        return count;
    }
    unsigned int Write(void *buffer, unsigned int count) override {
        writes.push_back(count);
        count = std::min(count, room);
        room -= count;
        if (data.size() < position + count) {
            data.resize(position + count);
        }
        if (count != 0) {
            std::memcpy(data.data() + position, buffer, count);
        }
        position += count;
        return count;
    }
    unsigned int Seek(int offset, KTSeekFromWhere origin) override {
        state = kKTStreamStateGood;
        long long const from = origin == kKTSeekFromBeginning ? 0
                               : origin == kKTSeekFromCurrent ? static_cast<long long>(position)
                                                              : static_cast<long long>(data.size());
        position = static_cast<unsigned int>(from + offset);
        return position;
    }
    unsigned int Tell() override { return position; }
    void Flush() override { ++flushes; }
    KTStreamState GetStreamState() override { return state; }
    void SetEndOfStream() override { data.resize(position); }

    std::vector<unsigned char> data;
    unsigned int position = 0;
    unsigned int room = 0xFFFFFFFF; ///< bytes that are still accepted
    KTStreamState state = kKTStreamStateGood;
    std::vector<unsigned int> reads;
    std::vector<unsigned int> writes;
    int flushes = 0;
};

/// Bytes as "01 FF ".
template <typename Bytes> std::string Hex(Bytes const &bytes) {
    static constexpr char kDigits[] = "0123456789ABCDEF";
    std::string text;
    for (auto const one : bytes) {
        auto const byte = static_cast<unsigned char>(one);
        text += {kDigits[byte >> 4], kDigits[byte & 15], ' '};
    }
    return text;
}

/// The bytes that Hex writes.
inline std::vector<unsigned char> Bytes(std::string const &hex) {
    std::vector<unsigned char> bytes;
    for (std::size_t i = 0; i < hex.size(); i += 3) {
        bytes.push_back(static_cast<unsigned char>(std::stoi(hex.substr(i, 2), nullptr, 16)));
    }
    return bytes;
}

/// Bytes that differ from place to place, so that a shift by any power of two shows.
inline std::string Pattern(std::size_t size, unsigned int seed = 1) {
    std::string text(size, '\0');
    unsigned int number = seed * 2654435761U;
    for (char &character : text) {
        number = number * 1664525U + 1013904223U;
        character = static_cast<char>(number >> 24);
    }
    return text;
}

/// A folder of its own for each test.
class StreamFixture : public testing::Test {
  protected:
    StreamFixture() {
        auto const *const info = testing::UnitTest::GetInstance()->current_test_info();
        m_Folder = std::filesystem::temp_directory_path() / (std::string(info->test_suite_name()) + "." + info->name());
        std::filesystem::remove_all(m_Folder);
        std::filesystem::create_directories(m_Folder);
    }
    ~StreamFixture() override {
        std::error_code ignored;
        std::filesystem::remove_all(m_Folder, ignored);
    }

    std::filesystem::path Path(std::string const &name) const { return m_Folder / name; }

    /// The same for the library; nothing needs to be there.
    KTFile File(std::string const &name) const { return KTFile(KTString(Path(name).string().c_str())); }

    /// A file with that content.
    KTFile File(std::string const &name, std::string const &content) const {
        std::ofstream(Path(name), std::ios::binary) << content;
        return File(name);
    }

    std::string Content(std::string const &name) const {
        std::ifstream file(Path(name), std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

  private:
    std::filesystem::path m_Folder;
};

#if defined(__has_feature)
#if __has_feature(address_sanitizer)
#define KT_CHECKS_LEAKS
#endif
#endif
#if defined(KT_CHECKS_LEAKS)
#include <sanitizer/lsan_interface.h>
/// While it lives, memory that is never freed is no mistake: the library leaves it on purpose.
using LeavesMemory = __lsan::ScopedDisabler;
#else
struct LeavesMemory {
    LeavesMemory() {}
};
#endif

/// Calls of a transport with text for bytes.
inline std::string ReadText(IKTXferBytes &transport, std::size_t count) {
    std::string text(count, '?');
    text.resize(transport.Read(text.data(), static_cast<unsigned int>(count)));
    return text;
}
inline unsigned int WriteText(IKTXferBytes &transport, std::string text) {
    return transport.Write(text.data(), static_cast<unsigned int>(text.size()));
}
