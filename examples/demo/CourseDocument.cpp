// CourseDocument.cpp: a whole course as one document.

#include "CourseDocument.h"

#include "FileXferBytes.h"
#include "KTPublicUtils.h"
#include "KTStreamUtil.h"

#include <algorithm>
#include <memory>

namespace {

constexpr KTUInt64 kMostKept = 8ULL << 20; // of one file
constexpr KTUInt64 kMostKeptInAll = 64ULL << 20;
constexpr int kPiece = 1 << 20;

constexpr KTUInt64 kMostDigested = 1ULL << 28; // of the files that are not kept

using Stream = std::unique_ptr<IKTStream>;

Stream Open(CourseFile const &file) {
    return Stream(KTStreamUtil::CreateFileStreamRead(KTFile(file.path), FileXferBytes::kOpenRead, 0, 0));
}

KTString DigestOf(std::vector<unsigned char> const &bytes) {
    static constexpr unsigned char kNothing = 0;
    return KTPublicUtils::GenerateHash(bytes.empty() ? &kNothing : bytes.data(),
                                       static_cast<unsigned int>(bytes.size()), kKTHashSHA256);
}

// The file's bytes and their digest; both empty if it cannot be read.
void Keep(CourseFile const &file, DocumentFile &entry) {
    Stream const stream = Open(file);
    if (stream != nullptr) {
        entry.bytes.resize(file.size);
        int const count = stream->XferByte(entry.bytes.data(), static_cast<int>(file.size));
        entry.bytes.resize(static_cast<std::size_t>(count));
        entry.digest = DigestOf(entry.bytes);
    }
}

KTString DigestOf(CourseFile const &file) {
    Stream const stream = Open(file);
    return stream == nullptr ? KTString() : KTPublicUtils::GenerateHash(stream.get(), kKTHashSHA256);
}

// Bytes behind their number. A number that is not true costs no more memory than one piece.
void XferBytes(IKTStream &stream, std::vector<unsigned char> &bytes) {
    int count = static_cast<int>(bytes.size());
    stream.XferInt32(count);
    if (stream.IsWriting() != 0) {
        stream.XferByte(bytes.data(), count);
        return;
    }
    bytes.clear();
    for (int left = count; left > 0;) {
        int const piece = std::min(left, kPiece);
        std::size_t const before = bytes.size();
        bytes.resize(before + static_cast<std::size_t>(piece));
        int const came = stream.XferByte(bytes.data() + before, piece);
        bytes.resize(before + static_cast<std::size_t>(came));
        left = came == piece ? left - came : 0;
    }
}

// A list behind its length. Reading stops where the stream does.
template <typename Item, typename XferItem>
void XferList(IKTStream &stream, std::vector<Item> &items, XferItem xferItem) {
    int count = static_cast<int>(items.size());
    stream.XferInt32(count);
    if (stream.IsWriting() != 0) {
        for (Item &item : items) {
            xferItem(item);
        }
        return;
    }
    items.clear();
    for (int i = 0; i < count && stream.GetStreamState() == kKTStreamStateGood; ++i) {
        xferItem(items.emplace_back());
    }
}

void XferDouble(IKTStream &stream, double &number) {
    KTReal real = number;
    number = stream.XferRealNumber(real).AsDouble();
}

bool XferMark(IKTStream &stream, KTInt32 mark) {
    KTInt32 found = stream.IsWriting() != 0 ? mark : 0;
    return stream.XferInt32(found) == mark;
}

} // namespace

CourseDocument::CourseDocument(CourseFolder const &folder, std::vector<TextResult> const &texts) {
    KTUInt64 kept = 0;
    KTUInt64 digested = 0;
    for (CourseFile const &file : folder.files) {
        DocumentFile entry{file.name, static_cast<KTInt32>(file.kind), static_cast<KTInt64>(file.size), {}, {}};
        if (file.size <= kMostKept && kept + file.size <= kMostKeptInAll) {
            Keep(file, entry);
            kept += entry.bytes.size();
        } else if (digested + file.size <= kMostDigested) {
            entry.digest = DigestOf(file);
            digested += file.size;
        }
        files.push_back(std::move(entry));
    }
    for (TextResult const &text : texts) {
        entries.insert(entries.end(), text.entries.begin(), text.entries.end());
        cues.insert(cues.end(), text.cues.begin(), text.cues.end());
    }
}

bool CourseDocument::Xfer(IKTStream &stream) {
    if (!XferMark(stream, kDocumentMark) || !XferMark(stream, kDocumentVersion)) {
        return false;
    }
    stream.XferString(title, true, true);
    XferList(stream, files, [&](DocumentFile &file) {
        stream.XferString(file.name, true, true);
        stream.XferInt32(file.kind);
        stream.XferInt64(file.size);
        stream.XferString(file.digest, true, true);
        XferBytes(stream, file.bytes);
    });
    XferList(stream, entries, [&](DictionaryEntry &entry) {
        stream.XferString(entry.key, true, true);
        stream.XferString(entry.text, true, true);
    });
    XferList(stream, cues, [&](Cue &cue) {
        XferDouble(stream, cue.start);
        XferDouble(stream, cue.end);
        stream.XferString(cue.text, true, true);
    });
    bool const isWhole = XferMark(stream, kDocumentMark);
    stream.Flush();
    KTStreamState const state = stream.GetStreamState();
    // Reading ahead exactly to the end of the file is told as the end of the stream.
    return isWhole && (state == kKTStreamStateGood || (state == kKTStreamStateEndOfStream && stream.IsReading() != 0));
}

bool CourseDocument::Save(KTFile const &file) {
    std::unique_ptr<IKTStream> const stream(
        KTStreamUtil::CreateFileStreamWrite(file, FileXferBytes::kOpenWrite | FileXferBytes::kCreateOrTruncate, 0, 0));
    return stream->GetStreamState() == kKTStreamStateGood && Xfer(*stream);
}

bool CourseDocument::Load(KTFile const &file) {
    std::unique_ptr<IKTStream> const stream(KTStreamUtil::CreateFileStreamRead(file, FileXferBytes::kOpenRead, 0, 0));
    return stream != nullptr && Xfer(*stream);
}

DigestCheck CourseDocument::CheckDigests() const {
    DigestCheck check;
    for (DocumentFile const &file : files) {
        bool const isKept = !file.digest.empty() && static_cast<KTInt64>(file.bytes.size()) == file.size;
        check.checked += isKept ? 1 : 0;
        check.right += isKept && DigestOf(file.bytes) == file.digest ? 1 : 0;
    }
    return check;
}
