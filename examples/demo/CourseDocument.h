// CourseDocument.h: a whole course as one document, and its way to and from a file through the typed streams.
//
// One function, Xfer, does both directions. What it leaves in the file (XferString: UTF-8 with its length):
//
//     i32      kDocumentMark
//     i32      kDocumentVersion
//     string   title
//     i32      number of files; for each: string name, i32 kind, i64 size, string SHA-256 digest,
//                                  i32 bytes kept, the bytes
//     i32      number of texts; for each: string key, string text
//     i32      number of captions; for each: f64 start, f64 end, string text
//     i32      kDocumentMark again, by which a document that was cut off is known

#pragma once

#include "IKTStream.h"
#include "KTFile.h"
#include "ReadCourse.h"

#include <vector>

constexpr KTInt32 kDocumentMark = 0x4B544344;
constexpr KTInt32 kDocumentVersion = 2;

struct DocumentFile {
    KTString name;
    KTInt32 kind = 0; ///< a FileKind
    KTInt64 size = 0;
    KTString digest;                  ///< SHA-256 of the file in hexadecimal; empty if it could not be read
    std::vector<unsigned char> bytes; ///< all of them, or none of a file that is too large to keep
};

/// What the digests of a document showed.
struct DigestCheck {
    std::size_t checked = 0;
    std::size_t right = 0;
};

class CourseDocument {
  public:
    CourseDocument() = default;

    /// The course's files, with what was read from its texts.
    CourseDocument(CourseFolder const &folder, std::vector<TextResult> const &texts);

    /// Writes the document to the stream, or fills it from there. Whether all of it came, and the stream is well.
    bool Xfer(IKTStream &stream);

    /// Saves the document as a file, which it replaces. False, and whatever there was room for in the file, if it could
    /// not be written whole.
    bool Save(KTFile const &file);

    /// Reads the document from a file. False if it is missing, cut off, or no document.
    bool Load(KTFile const &file);

    /// How many files have the digest that was stored with them. Only those are looked at whose bytes the document keeps.
    DigestCheck CheckDigests() const;

    KTString title = "Course";
    std::vector<DocumentFile> files;
    std::vector<DictionaryEntry> entries;
    std::vector<Cue> cues;
};
