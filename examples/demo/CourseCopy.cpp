// CourseCopy.cpp: listing, measuring, copying and comparing a course.

#include "CourseCopy.h"

#include "KTFileUtil.h"
#include "Table.h"

#include <algorithm>
#include <vector>

namespace {

constexpr std::size_t kNameWidth = 60;
constexpr KTUInt64 kMostCopied = 1ULL << 28; // a user's own folder may be anything

using Names = std::vector<KTString>;

// The files below the folder in the order of their names; none if it cannot be read.
Names FilesOf(KTPath const &folder) {
    Names names;
    KTFileUtil::GetFileNamesInFolderAtPathRecursively(folder, names);
    std::sort(names.begin(), names.end());
    return names;
}

KTFile FileAt(KTPath path, KTString const &name) {
    path.Append(name);
    return KTFile(path);
}

// "2026-03-01 14:05", in local time.
std::string Date(KTTime const &time) {
    int year = 0;
    int month = 0;
    int day = 0;
    int hour = 0;
    int minute = 0;
    if (!time.GetTime(&year, &month, &day, &hour, &minute, nullptr, nullptr)) {
        return "-";
    }
    KTString text;
    text.AppendNumber(year, "%04d");
    text.AppendNumber(month, "-%02d");
    text.AppendNumber(day, "-%02d");
    text.AppendNumber(hour, " %02d");
    text.AppendNumber(minute, ":%02d");
    return text.GetUTF8String();
}

} // namespace

CourseCopy::CourseCopy(KTPath const &course) : m_Course(course) {
    KTUInt64 bytes = 0;
    for (KTString const &name : FilesOf(course)) {
        bytes += FileAt(course, name).GetSize();
    }
    if (bytes > kMostCopied) {
        return;
    }
    KTPath copy = KTFileUtil::GetSessionTempFolder();
    copy.Append("course");
    if (KTFileUtil::FolderCopy(course, copy) == KTFileUtil::kErrorNone) {
        m_Copy = copy;
    }
}

CourseCopy::~CourseCopy() { KTFileUtil::DeleteAllTempFilesCreated(); }

std::string CourseCopy::Report(ReportLimits const &limits) const {
    using enum Table::Align;
    Names const names = FilesOf(m_Course);
    if (names.empty()) {
        return "";
    }
    Table table({{"File", Left}, {"Bytes", Right}, {"Created", Left}, {"Changed", Left}});
    std::size_t same = 0;
    for (std::size_t i = 0; i < names.size(); ++i) {
        KTFile const file = FileAt(m_Course, names[i]);
        if (i < limits.rows) {
            table.AddRow({PrintableTail(names[i], kNameWidth), Number(file.GetSize()),
                          Date(KTFileUtil::GetFileCreationDate(file)),
                          Date(KTFileUtil::GetFileModificationDate(file))});
        }
        KTFile const copied = FileAt(m_Copy, names[i]);
        bool const isThere = !m_Copy.GetPathAsKTString().empty() && copied.Exists();
        same += isThere && copied.GetSize() == file.GetSize() ? 1 : 0;
    }
    std::string text = "Files on the disk\n" + table.Print();
    if (names.size() > limits.rows) {
        text += "  ... and " + Number(names.size() - limits.rows) + " more; --all shows everything\n";
    }
    if (m_Copy.GetPathAsKTString().empty()) {
        return text + "  not copied to the session folder: too large, or a file cannot be read\n\n";
    }
    return text + "  copied to the session folder: " + Number(same) + " of " + Number(names.size()) + "\n  " +
           Printable(m_Copy.GetPathAsKTString()) + "\n\n";
}
