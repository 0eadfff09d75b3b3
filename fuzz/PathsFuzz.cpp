// PathsFuzz.cpp: any text as a path and as a "file:" URL.
//
// Input: the text as UTF-8; the same bytes are also taken as units.

#include "KTPath.h"
#include "OFileUrl.h"
#include "OUtf.h"
#include "Units.h"

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>

namespace {

void Check(bool holds) {
    if (!holds) {
        std::abort();
    }
}

class AtHome final : public OCurrentFolders {
  public:
    KTUnits Get(unsigned short drive) const override {
        KTUnits folder{'C', ':', '\\', 'h', 'o', 'm', 'e'};
        folder[0] = drive == 0 ? folder[0] : drive;
        return drive == 'Q' ? KTUnits() : folder;
    }
};

KTUnits UnitsFrom(std::string const &ascii) { return OUtf8ToUnits(ascii); }

// A full path is short enough, has no forward slash and no separator at its end, and stays what it is.
void CheckFullPath(OUnitsView text) {
    AtHome const home;
    std::optional<KTUnits> const path = OMakeFullPath(text, home);
    if (!path) {
        return;
    }
    Check(!path->empty() && path->size() <= kOLongestPath);
    Check(path->find('/') == KTUnits::npos && path->find(static_cast<unsigned short>(0)) == KTUnits::npos);
    Check(path->back() != '\\' || path->size() <= 3 || path->substr(0, 4) == UnitsFrom("\\\\?\\"));
    Check(OMakeFullPath(*path, home) == path);
}

void CheckUrl(OUnitsView text) {
    if (!OIsFileUrl(text)) {
        return;
    }
    std::optional<KTUnits> const path = OReadFileUrl(text);
    Check(!path || path->find('/') == KTUnits::npos);
    CheckFullPath(text);
}

// The text as a path below C:\, with each byte escaped, comes back.
void CheckEscapes(KTString const &text) {
    static constexpr char kDigits[] = "0123456789abcdefABCDEF";
    KTString const name = KTString(OString::FromUTF8(text.GetUTF8String())); // no unpaired surrogates
    std::string url("FILE:///C:/");
    bool canStand = true;
    for (char const one : name.GetUTF8String()) {
        auto const byte = static_cast<unsigned char>(one);
        url += {'%', kDigits[byte >> 4], kDigits[byte % 16]};
        canStand = canStand && byte != 0 && byte != '/' && byte != '\\';
    }
    std::optional<KTUnits> const path = OReadFileUrl(UnitsFrom(url));
    KTString const expected = "C:\\" + name;
    Check(path.has_value() == canStand);
    Check(!canStand || KTString(OString(*path)) == expected);
}

void CheckParts(KTString const &text) {
    OPath const path(text.GetOString());
    Check(KTString(path.GetBaseName()) + KTString(path.GetExtension()) == KTString(path.GetFileName()));
    OPath const parent = path.GetParent();
    Check(parent.GetString().GetUnits().size() <= path.GetString().GetUnits().size());
    Check(parent.IsEmpty() || parent.GetString() != path.GetString());
    std::vector<OString> const parts = path.GetComponents();
    for (OString const &part : parts) {
        Check(!part.empty());
    }
    KTPath changed(text);
    changed.Append("name.txt");
    bool const isJoined = text.empty() || text[text.size() - 1] == '\\' || text[text.size() - 1] == '/';
    Check(changed.GetPathAsKTString() == text + (isJoined ? "name.txt" : "\\name.txt"));
    KTPath slashed(text);
    slashed.ReplaceAllBackSlashWithFrontSlash();
    Check(slashed.GetPathAsKTString().find(static_cast<unsigned short>('\\')) == KTString::npos);
    Check(slashed.GetPathAsKTString().size() == text.size());
}

void CheckAll(KTString const &text) {
    OUnitsView const view(text.c_str(), text.size());
    CheckFullPath(view);
    CheckUrl(view);
    CheckEscapes(text);
    CheckParts(text);
    KTString const url = "file:" + text;
    CheckUrl(OUnitsView(url.c_str(), url.size()));
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const *data, std::size_t size) {
    Units units(size / 2);
    if (!units.empty()) {
        std::memcpy(units.data(), data, units.size() * 2);
    }
    CheckAll(KTString(OString::FromUTF8({reinterpret_cast<char const *>(data), size})));
    CheckAll(FromUnits(units));
    return 0;
}
