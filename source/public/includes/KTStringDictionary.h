// KTStringDictionary.h: the process-wide string dictionary.
//
//     KTStringDictionary &texts = *KTStringDictionary::GetStringDictionary();
//     texts.ReadFromFile(KTFile(folder + "\\strings.lxdc"));
//     title = texts.GetKeyValue("$$$/Course/Title=Untitled");
//
// A key is "$$$/Some/Key", optionally with "=" and a default text behind it. What is stored, and found, is the name
// between the two: "$$$/A", "/A" and "$$$/A=x" are one key. A key that begins with "$" but not "$$$", or with nothing
// before its "=", is none. Keys are UTF-8 inside; names are compared byte by byte.
//
// Files are binary ("LexiStr Binary Format") or text: UTF-16 in either byte order with a byte order mark, or bytes of
// the system's ANSI code page; one quoted line "key=text" for each entry. In a text file's texts \n, \r, \t, \b and \"
// are escapes, ^ begins typographic marks (^T is the trade mark sign) and #{name} or #{U+263A} stands for a character by
// its HTML 4.01 name or its number. docs/dictionary.md in the sources describes both forms.
//
// WRONG: relying on a text file for texts with backslashes, carets or "#{": they are written as they stand, and reading
// them takes them for escapes. The binary form keeps every text of up to 32,767 units.

#pragma once

#include "IKTStringDictionary.h"

#include <memory>

#include "KTBeginExports.h"

namespace orvik_private {
class DictionaryReader;
}

/// See the top of this file. Not locked: GetStringDictionary's first call, AddString and ReadFromFile belong to one
/// thread, at start-up; GetKeyValue and WriteToFile may then be called from any number of threads. Every member may
/// throw std::bad_alloc.
class KT_PUBLIC_API KTStringDictionary : public IKTStringDictionary {
  public:
    /// The process-wide dictionary, made by the first call and kept until the process ends; null if there was no memory
    /// for it. Not locked.
    static KTStringDictionary *GetStringDictionary();

    /// The same dictionary, or null before the first call of GetStringDictionary. For reading only.
    static KTStringDictionary *m_StringDictionary;

    KTStringDictionary(KTStringDictionary const &) = delete;
    KTStringDictionary &operator=(KTStringDictionary const &) = delete;

    /// Frees all texts. The process-wide dictionary may be deleted, too; the next call of GetStringDictionary then makes
    /// a new, empty one.
    ~KTStringDictionary() override;

    /// Stores the text's units as they are, without any unescaping, under the key's name; a default in the key is
    /// ignored, and a text that is there is replaced. Always kKTErrorNone, also for what is no key, which adds nothing.
    KTErrorCodeEnum AddString(KTString const &key, KTString const &value) override;

    /// Reads both as UTF-8 and calls the other AddString. kKTErrorFailed if either is null, and nothing is added.
    KTErrorCodeEnum AddString(char const *key, char const *value) override;

    /// The text stored under the key, up to its first zero unit. If there is none, the default behind the key's "=",
    /// with its escapes and entities replaced; each byte of its UTF-8 becomes one unit, sign-extended, so that defaults
    /// should be ASCII: a byte above 127 gives a unit from U+FF80 on. If there is no default either, or the key is none:
    /// an empty string. Never fails: a text of the ANSI code page that the system does not convert counts as none. Takes
    /// about as long in a large dictionary as in a small one.
    KTString GetKeyValue(KTString const &key) override;

    /// Writes all entries to a new file: binary (version 2.7, UTF-16, little-endian), or text (UTF-16, little-endian,
    /// with a byte order mark). kKTErrorFailed if anything has that name already; it is never touched. Else kKTErrorNone,
    /// even if the file could not be created or written: no file is left then. The binary form holds keys of up to
    /// 65,535 bytes and texts of up to 32,767 units; with a longer one there is no file either, and the text form can
    /// be used.
    KTErrorCodeEnum WriteToFile(KTFile const &file, bool binary) override;

    /// Adds the entries of a file of any form and version to those that are there; a key that was there gets the new
    /// text. kKTErrorFailed if nothing is there. Else kKTErrorNone, whatever the file holds: reading ends where a file
    /// is damaged, and what was read until then stays; nothing is read of a file that cannot be opened or that somebody
    /// writes to meanwhile. Entries of files of version 1 are kept, but GetKeyValue does not find them.
    ///
    /// The file is read into memory and closed. A binary file of 1 MiB and more on a fixed disk of this machine is mapped
    /// instead, and stays open until the dictionary goes: others may read it, nobody can write to it, and if it is
    /// deleted its name is not free before that.
    KTErrorCodeEnum ReadFromFile(KTFile const &file) override;

  private:
    KTStringDictionary();

    std::unique_ptr<orvik_private::DictionaryReader> m_Dictionary; ///< null if there was no memory for it
};

#include "KTEndExports.h"
