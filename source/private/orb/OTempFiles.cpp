// OTempFiles.cpp: unique names and what is created under them.

#include "OTempFiles.h"

#include "OFolder.h"
#include "OLongPath.h"

#include <atomic>
#include <cstdint>
#include <random>
#include <utility>

namespace {

constexpr int kMostAttempts = 1000;

// A number that no other process is likely to start from.
std::uint64_t RandomStart() {
    std::random_device device;
    return (static_cast<std::uint64_t>(device()) << 32) | device();
}

// One to one: different numbers give different results that do not look alike (splitmix64's finish).
std::uint64_t Scatter(std::uint64_t value) {
    value = (value ^ (value >> 30)) * 0xBF58476D1CE4E5B9U;
    value = (value ^ (value >> 27)) * 0x94D049BB133111EBU;
    return value ^ (value >> 31);
}

// Calls `create` with new paths until it does something else than meet an existing name.
template <typename Create>
OPath CreateUnique(OPath const &folder, KTUnits const &before, KTUnits const &after, Create const &create) {
    for (int attempt = 0; attempt < kMostAttempts; ++attempt) {
        KTUnits name = before;
        name.append(OMakeUniqueText().GetUnits()).append(after);
        if (folder.IsEmpty() || !OIsValidName(name)) {
            return {};
        }
        OPath path(folder);
        path.Append(OString(std::move(name)));
        OError const error = create(path);
        if (error == OError::None) {
            return path;
        }
        // A name whose file is about to vanish is denied instead; it counts as taken if it is still there.
        bool const taken = error == OError::AlreadyExists || (error == OError::AccessDenied && OExists(path));
        if (!taken) {
            return {};
        }
    }
    return {};
}

} // namespace

OString OMakeUniqueText() {
    static std::atomic<std::uint64_t> next{RandomStart()};
    std::uint64_t value = Scatter(next.fetch_add(1, std::memory_order_relaxed));
    constexpr char kDigits[] = "0123456789abcdef";
    KTUnits text(16, '0');
    for (std::size_t i = text.size(); i-- > 0;) {
        text[i] = static_cast<unsigned char>(kDigits[value & 15]);
        value >>= 4;
    }
    return OString(std::move(text));
}

OPath OMakeUniqueFile(OPath const &folder, OString const &prefix, OString const &extension) {
    return CreateUnique(folder, prefix.GetUnits(), extension.GetUnits(),
                        [](OPath const &path) { return OMakeFile(path, false); });
}

OPath OMakeUniqueFolder(OPath const &folder, OString const &prefix, OString const &name) {
    KTUnits before = prefix.GetUnits();
    before.append(name.GetUnits());
    if (!before.empty()) {
        before.push_back('-');
    }
    return CreateUnique(folder, before, {}, [](OPath const &path) { return OMakeFolder(path, false); });
}
