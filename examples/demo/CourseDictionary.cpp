// CourseDictionary.cpp: loading, looking up, writing and reading back.

#include "CourseDictionary.h"

#include "IKTStringDictionary.h"
#include "KTFileUtil.h"
#include "KTPublicUtils.h"
#include "Table.h"

namespace {

constexpr std::size_t kLanguages = 2;

KTString FullKey(DictionaryEntry const &entry) { return KTString("$$$/") + entry.key; }

} // namespace

std::vector<TextResult *> ChooseLanguages(std::vector<TextResult> &results) {
    std::vector<TextResult *> languages;
    for (TextResult &result : results) {
        if (!result.entries.empty() && languages.size() < kLanguages) {
            languages.push_back(&result);
        }
    }
    return languages;
}

void LookTextsUp(std::vector<TextResult *> const &languages) {
    IKTStringDictionary &dictionary = KTPublicUtils::GetStringDictionary();
    for (TextResult *const language : languages) {
        dictionary.ReadFromFile(KTFile(language->file.path)); // replaces the texts of the language before
        for (DictionaryEntry &entry : language->entries) {
            entry.text = dictionary.GetKeyValue(FullKey(entry));
        }
    }
}

std::string ReportBinaryDictionary(std::vector<TextResult *> const &languages) {
    if (languages.empty()) {
        return "";
    }
    IKTStringDictionary &dictionary = KTPublicUtils::GetStringDictionary();
    KTPath path = KTFileUtil::GetSessionTempFolder();
    path.Append("strings.lxdc");
    KTFile const file(path);
    std::string text = "Binary dictionary\n";
    if (dictionary.WriteToFile(file, true) != kKTErrorNone || !file.Exists()) {
        return text + "  could not be written to " + Printable(path.GetPathAsKTString()) + "\n\n";
    }
    std::vector<DictionaryEntry> const &entries = languages.back()->entries;
    for (DictionaryEntry const &entry : entries) {
        dictionary.AddString(FullKey(entry), KTString()); // so that only the file can bring the texts back
    }
    dictionary.ReadFromFile(file);
    KTUInt64 same = 0;
    for (DictionaryEntry const &entry : entries) {
        same += dictionary.GetKeyValue(FullKey(entry)) == entry.text ? 1 : 0;
    }
    KTString const missing("$$$/Button/Help=Help^T #{mdash} \\\"at once\\\"");
    text += "  written to the session folder: " + Number(file.GetSize()) + " bytes\n";
    text += "  texts that are the same when read back: " + Number(same) + " of " + Number(entries.size()) + "\n";
    return text + "  " + Printable(missing) + " is not there and gives: " + Printable(dictionary.GetKeyValue(missing)) +
           "\n\n";
}
