// CourseDigests.cpp: each file as a stream, and the stream's digest.

#include "CourseDigests.h"

#include "FileXferBytes.h"
#include "KTPublicUtils.h"
#include "KTStreamUtil.h"
#include "Table.h"
#include "WDisk.h"

#include <memory>

namespace {

constexpr std::size_t kNameWidth = 60;
constexpr KTUInt64 kMostDigested = 1ULL << 28; // of all files together

std::string DigestOf(KTPath const &path) {
    DiskBytes const start = DiskRead(path, 1);
    if (!start.problem.empty()) {
        return start.problem; // a device or a pipe might never end
    }
    std::unique_ptr<IKTStream> const stream(
        KTStreamUtil::CreateFileStreamRead(KTFile(path), FileXferBytes::kOpenRead, 0, 0));
    return stream == nullptr ? "cannot be opened"
                             : KTPublicUtils::GenerateHash(stream.get(), kKTHashSHA256).GetUTF8String();
}

} // namespace

std::string ReportDigests(CourseFolder const &folder, ReportLimits const &limits) {
    using enum Table::Align;
    if (folder.files.empty()) {
        return "";
    }
    Table table({{"File", Left}, {"SHA-256", Left}});
    std::size_t rows = 0;
    KTUInt64 bytes = 0;
    for (CourseFile const &file : folder.files) {
        bytes += file.size;
        if (bytes > kMostDigested || rows == limits.rows) {
            break;
        }
        table.AddRow({PrintableTail(file.name, kNameWidth), DigestOf(file.path)});
        ++rows;
    }
    std::string text = "Digests\n" + table.Print();
    if (rows < folder.files.size()) {
        text += bytes > kMostDigested ? "  stopped at 256 MiB\n" : "  more files follow; --all shows everything\n";
    }
    return text + "\n";
}
