// OLongPath.cpp: reading the root of a path, then its names.

#include "OLongPath.h"

#include "OFileUrl.h"

#include <array>
#include <cstdint>
#include <vector>

namespace {

constexpr std::size_t kLongestName = 255;

enum class UnitKind : std::uint8_t { Plain, Separator, Refused };

constexpr std::array<UnitKind, 128> MakeKinds() {
    std::array<UnitKind, 128> kinds{};
    for (std::size_t i = 0; i < 32; ++i) {
        kinds[i] = UnitKind::Refused;
    }
    for (char const unit : {'<', '>', ':', '"', '|', '?', '*'}) {
        kinds[static_cast<unsigned char>(unit)] = UnitKind::Refused;
    }
    kinds['\\'] = UnitKind::Separator;
    kinds['/'] = UnitKind::Separator;
    return kinds;
}

constexpr std::array<UnitKind, 128> kKinds = MakeKinds();

UnitKind KindOf(unsigned short unit) noexcept { return unit < kKinds.size() ? kKinds[unit] : UnitKind::Plain; }

bool IsSeparator(unsigned short unit) noexcept { return unit == '\\' || unit == '/'; }

unsigned short Upper(unsigned short unit) noexcept {
    return unit >= 'a' && unit <= 'z' ? static_cast<unsigned short>(unit - 'a' + 'A') : unit;
}

bool IsLetter(unsigned short unit) noexcept { return Upper(unit) >= 'A' && Upper(unit) <= 'Z'; }

bool EqualsIgnoringCase(OUnitsView text, std::string_view upper) noexcept {
    if (text.size() != upper.size()) {
        return false;
    }
    for (std::size_t i = 0; i < upper.size(); ++i) {
        if (Upper(text[i]) != static_cast<unsigned char>(upper[i])) {
            return false;
        }
    }
    return true;
}

// "1" to "9", and the raised digits that the system takes for them.
bool IsPortNumber(unsigned short unit) noexcept {
    return (unit >= '1' && unit <= '9') || unit == 0xB9 || unit == 0xB2 || unit == 0xB3;
}

// The system looks at what stands before the first dot, blanks at its end left out.
bool IsDevice(OUnitsView name) noexcept {
    unsigned short const first = Upper(name[0]);
    if (first != 'C' && first != 'P' && first != 'A' && first != 'N' && first != 'L') {
        return false;
    }
    OUnitsView base = name.substr(0, name.find('.'));
    while (!base.empty() && base.back() == ' ') {
        base.remove_suffix(1);
    }
    for (char const *const device : {"CON", "PRN", "AUX", "NUL", "CONIN$", "CONOUT$"}) {
        if (EqualsIgnoringCase(base, device)) {
            return true;
        }
    }
    bool const isPort = base.size() == 4 && IsPortNumber(base[3]);
    return isPort && (EqualsIgnoringCase(base.substr(0, 3), "COM") || EqualsIgnoringCase(base.substr(0, 3), "LPT"));
}

// What OIsValidName asks beyond the single units.
bool IsValidWhole(OUnitsView name) noexcept {
    return !name.empty() && name.size() <= kLongestName && name.back() != '.' && name.back() != ' ' && !IsDevice(name);
}

// A path that is read from its beginning.
class Reader {
  public:
    explicit Reader(OUnitsView text) : m_Rest(text) {}

    bool IsAtEnd() const { return m_Rest.empty(); }
    OUnitsView Rest() const { return m_Rest; }
    void Skip(std::size_t count) { m_Rest.remove_prefix(count); }

    void SkipSeparators() {
        while (!m_Rest.empty() && IsSeparator(m_Rest.front())) {
            m_Rest.remove_prefix(1);
        }
    }

    /// The text up to the next separator, which stays.
    OUnitsView TakeName() {
        std::size_t end = 0;
        while (end < m_Rest.size() && !IsSeparator(m_Rest[end])) {
            ++end;
        }
        OUnitsView const name = m_Rest.substr(0, end);
        m_Rest.remove_prefix(end);
        return name;
    }

    bool BeginsWithDrive() const { return m_Rest.size() >= 2 && IsLetter(m_Rest[0]) && m_Rest[1] == ':'; }
    bool BeginsWithShare() const { return m_Rest.size() >= 2 && IsSeparator(m_Rest[0]) && IsSeparator(m_Rest[1]); }

  private:
    OUnitsView m_Rest;
};

// A full path as it grows: the root, which ".." never leaves, and the names below it.
class Builder {
  public:
    void SetDrive(unsigned short letter) {
        m_Text = {Upper(letter), ':', '\\'};
        m_RootLength = m_Text.size();
    }

    /// A root that needs a separator before the first name: "\\server\share" or "\\?\Volume{...}".
    void SetRoot(KTUnits root) {
        m_Text = std::move(root);
        m_RootLength = m_Text.size();
    }

    /// Starts from a full path that the system gave; its root is what a drive or share takes.
    bool SetFolder(KTUnits const &folder);

    /// Adds the names of `reader` to its end.
    bool AddNames(Reader &reader) {
        for (;;) {
            reader.SkipSeparators();
            if (reader.IsAtEnd()) {
                return m_Text.size() <= kOLongestPath;
            }
            if (!AddName(reader.TakeName())) {
                return false;
            }
        }
    }

    KTUnits Take() { return std::move(m_Text); }

    /// The root alone.
    void CutToRoot() { m_Text.resize(m_RootLength); }

  private:
    bool AddName(OUnitsView name) {
        if (name.size() == 1 && name[0] == '.') {
            return true;
        }
        if (name.size() == 2 && name[0] == '.' && name[1] == '.') {
            DropLast();
            return true;
        }
        if (!OIsValidName(name)) {
            return false;
        }
        if (m_Text.back() != '\\') {
            m_Text.push_back('\\');
        }
        m_Text.append(name);
        return true;
    }

    void DropLast() {
        std::size_t const separator = m_Text.rfind('\\');
        m_Text.resize(separator == KTUnits::npos || separator < m_RootLength ? m_RootLength : separator);
    }

    KTUnits m_Text;
    std::size_t m_RootLength = 0;
};

// "server\share" below a prefix that is as long as the result has it: "\\".
bool ReadShare(Reader &reader, Builder &builder) {
    reader.SkipSeparators();
    OUnitsView const server = reader.TakeName();
    reader.SkipSeparators();
    OUnitsView const share = reader.TakeName();
    if (!OIsValidName(server) || !OIsValidName(share)) {
        return false;
    }
    KTUnits root = {'\\', '\\'};
    root.append(server).push_back('\\');
    root.append(share);
    builder.SetRoot(std::move(root));
    return true;
}

// Behind "\\?\": a drive, "UNC\server\share", or a volume by its identity.
bool ReadExtended(Reader &reader, Builder &builder) {
    if (reader.BeginsWithDrive() && reader.Rest().size() > 2 && IsSeparator(reader.Rest()[2])) {
        builder.SetDrive(reader.Rest()[0]);
        reader.Skip(2);
        return true;
    }
    OUnitsView const name = reader.TakeName();
    if (EqualsIgnoringCase(name, "UNC")) {
        return ReadShare(reader, builder);
    }
    if (!OIsValidName(name) || !EqualsIgnoringCase(name.substr(0, 7), "VOLUME{")) {
        return false;
    }
    KTUnits root = {'\\', '\\', '?', '\\'};
    root.append(name);
    builder.SetRoot(std::move(root));
    return true;
}

// What begins with two separators: a share, or one of the two prefixes. Devices ("\\.\") are no files.
bool ReadDoubleSeparator(Reader &reader, Builder &builder) {
    reader.Skip(2);
    OUnitsView const rest = reader.Rest();
    bool const isPrefix = rest.size() >= 2 && IsSeparator(rest[1]);
    if (isPrefix && rest[0] == '?') {
        reader.Skip(2);
        return ReadExtended(reader, builder);
    }
    if ((isPrefix && rest[0] == '.') || (!rest.empty() && IsSeparator(rest[0]))) {
        return false;
    }
    return ReadShare(reader, builder);
}

bool Builder::SetFolder(KTUnits const &folder) {
    Reader reader(folder);
    if (reader.BeginsWithDrive()) {
        SetDrive(folder[0]);
        reader.Skip(2);
    } else if (!reader.BeginsWithShare() || !ReadDoubleSeparator(reader, *this)) {
        return false;
    }
    return AddNames(reader);
}

// Everything up to the first name.
bool ReadRoot(Reader &reader, Builder &builder, OCurrentFolders const &current) {
    if (reader.BeginsWithDrive()) {
        unsigned short const letter = Upper(reader.Rest()[0]);
        reader.Skip(2);
        if (!reader.IsAtEnd() && IsSeparator(reader.Rest()[0])) {
            builder.SetDrive(letter);
            return true;
        }
        return builder.SetFolder(current.Get(letter));
    }
    if (reader.BeginsWithShare()) {
        return ReadDoubleSeparator(reader, builder);
    }
    if (!builder.SetFolder(current.Get(0))) {
        return false;
    }
    if (IsSeparator(reader.Rest()[0])) {
        builder.CutToRoot();
    }
    return true;
}

std::optional<KTUnits> MakeFullPath(OUnitsView path, OCurrentFolders const &current) {
    Reader reader(path);
    Builder builder;
    if (path.empty() || !ReadRoot(reader, builder, current) || !builder.AddNames(reader)) {
        return std::nullopt;
    }
    return builder.Take();
}

} // namespace

bool OIsValidName(OUnitsView name) noexcept {
    for (unsigned short const unit : name) {
        if (KindOf(unit) != UnitKind::Plain) {
            return false;
        }
    }
    return IsValidWhole(name);
}

bool OIsPlainFullPath(OUnitsView path) noexcept {
    if (path.size() < 4 || path.size() > kOLongestPath || path[0] < 'A' || path[0] > 'Z' || path[1] != ':' ||
        path[2] != '\\') {
        return false;
    }
    std::size_t start = 3;
    for (std::size_t i = start; i < path.size(); ++i) {
        UnitKind const kind = KindOf(path[i]);
        if (kind == UnitKind::Plain) {
            continue;
        }
        // A name in front of each back slash; "." and ".." end with a dot, so they are no plain names either.
        if (path[i] != '\\' || !IsValidWhole(path.substr(start, i - start))) {
            return false;
        }
        start = i + 1;
    }
    return IsValidWhole(path.substr(start));
}

std::optional<KTUnits> OMakeFullPath(OUnitsView path, OCurrentFolders const &current) {
    if (OIsPlainFullPath(path)) {
        return KTUnits(path);
    }
    if (OIsFileUrl(path)) {
        std::optional<KTUnits> const written = OReadFileUrl(path);
        return written ? MakeFullPath(*written, current) : std::nullopt;
    }
    return MakeFullPath(path, current);
}
