// CourseFiles.cpp: the walk through a course folder.

#include "CourseFiles.h"

#include "Table.h"
#include "WDisk.h"

#include <algorithm>
#include <array>
#include <set>
#include <string_view>

namespace {

constexpr std::size_t kMostFiles = 100'000;
constexpr std::array kTextEndings = {".txt", ".ini", ".csv", ".srt", ".vtt", ".xml", ".md", ".json"};

// A folder that is still to be listed.
struct Pending {
    KTPath path;
    KTString name; // below the course folder, with a slash at its end
};

bool EndsWith(KTString const &name, char const *ending) {
    KTString const wanted(ending);
    if (name.size() < wanted.size()) {
        return false;
    }
    KTString tail = name.substr(name.size() - wanted.size());
    for (unsigned short &unit : tail) {
        if (unit >= 'A' && unit <= 'Z') {
            unit = static_cast<unsigned short>(unit - 'A' + 'a');
        }
    }
    return tail == wanted;
}

FileKind KindOf(KTString const &name) {
    if (EndsWith(name, ".png")) {
        return FileKind::Picture;
    }
    bool const isText = std::any_of(kTextEndings.begin(), kTextEndings.end(),
                                    [&](char const *ending) { return EndsWith(name, ending); });
    return isText ? FileKind::Text : FileKind::Other;
}

class Walk {
  public:
    explicit Walk(KTPath const &folder) { m_Pending.push_back({folder, KTString()}); }

    CourseFolder Run() {
        while (!m_Pending.empty() && m_Result.files.size() < kMostFiles) {
            Pending const folder = std::move(m_Pending.back());
            m_Pending.pop_back();
            Enter(folder);
        }
        if (m_Result.files.size() >= kMostFiles) {
            m_Result.notes.push_back("stopped after " + std::to_string(kMostFiles) + " files");
        }
        std::sort(m_Result.files.begin(), m_Result.files.end(),
                  [](CourseFile const &a, CourseFile const &b) { return a.name < b.name; });
        std::sort(m_Result.notes.begin(), m_Result.notes.end());
        return std::move(m_Result);
    }

  private:
    void Enter(Pending const &folder) {
        std::optional<DiskIdentity> const identity = DiskIdentify(folder.path);
        if (identity && !m_Entered.insert(*identity).second) {
            Note(folder.name, "folder seen before, not entered again");
            return;
        }
        std::optional<std::vector<DiskEntry>> const entries = DiskList(folder.path);
        if (!entries) {
            Note(folder.name, "folder cannot be listed");
            return;
        }
        for (DiskEntry const &entry : *entries) {
            Add(folder, entry);
        }
    }

    void Add(Pending const &folder, DiskEntry const &entry) {
        KTPath path(folder.path);
        path.Append(entry.name);
        KTString const name = folder.name + entry.name;
        if (!entry.isFolder) {
            m_Result.files.push_back({path, name, entry.size, KindOf(name)});
        } else if (entry.isLink) {
            Note(name, "link to a folder, not followed");
        } else {
            m_Pending.push_back({path, name + "/"});
        }
    }

    void Note(KTString const &name, char const *what) {
        m_Result.notes.push_back(Printable(name.empty() ? KTString(".") : name) + ": " + what);
    }

    std::vector<Pending> m_Pending;
    std::set<DiskIdentity> m_Entered;
    CourseFolder m_Result;
};

} // namespace

CourseFolder FindCourseFiles(KTPath const &folder) { return Walk(folder).Run(); }

PictureSize ReadPictureSize(KTPath const &file) {
    // byte   0  8 signature
    // byte   8  4 length and 4 type of the first chunk, "IHDR"
    // byte  16  4 width, 4 height, most significant byte first
    constexpr std::size_t kHeader = 24;
    constexpr std::string_view kSignature = "\x89PNG\r\n\x1A\n";
    DiskBytes const start = DiskRead(file, kHeader);
    if (!start.problem.empty()) {
        return {0, 0, start.problem};
    }
    std::string_view const bytes = start.bytes;
    if (bytes.size() < kHeader || !bytes.starts_with(kSignature) || bytes.substr(12, 4) != "IHDR") {
        return {0, 0, "not a PNG picture"};
    }
    auto const number = [bytes](std::size_t at) {
        KTUInt32 value = 0;
        for (char const byte : bytes.substr(at, 4)) {
            value = (value << 8) | static_cast<unsigned char>(byte);
        }
        return value;
    };
    return {number(16), number(20), ""};
}

std::string DescribePicture(KTPath const &file) {
    PictureSize const size = ReadPictureSize(file);
    return size.problem.empty() ? std::to_string(size.width) + " x " + std::to_string(size.height) : size.problem;
}
