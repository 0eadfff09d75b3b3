// DictionaryReadText.cpp: entries from the lines of the text form.

#include "DictionaryForms.h"
#include "DictionaryUnescape.h"

namespace orvik_private {

namespace {

constexpr std::string_view kLittleMark = "\xFF\xFE";
constexpr std::string_view kBigMark = "\xFE\xFF";

std::unique_ptr<DictionaryReader::LineReader> MakeLineReader(BufferedSource &source) {
    std::string_view const mark = source.Peek(kLittleMark.size());
    bool const isLittle = mark == kLittleMark;
    bool const isBig = mark == kBigMark;
    if (!isLittle && !isBig) {
        return std::make_unique<MultibyteReader>(source);
    }
    source.Take();
    source.Take();
    if (isLittle) {
        return std::make_unique<UnicodeReader>(source);
    }
    return std::make_unique<ByteSwapUnicodeReader>(source);
}

} // namespace

void DictionaryTextReader::Report(DictionaryProblemKind kind, std::uint64_t offset, char const *detail) {
    if (m_Observer != nullptr) {
        m_Observer->OnProblem({kind, m_Line, offset, m_Key, detail});
    }
}

void DictionaryTextReader::Read(BufferedSource &source) {
    auto const lines = MakeLineReader(source);
    KTUnits line;
    bool isRefused = false;
    try {
        while (lines->Next(line)) {
            m_Line = lines->LineNumber();
            ReadLine(line);
        }
    } catch (TextConversionException const &) {
        isRefused = true; // of 2 GiB, for example
    }
    m_Line = lines->LineNumber();
    m_Key.clear();
    if (isRefused) {
        m_Dictionary.m_IsValid = false;
        Report(DictionaryProblemKind::Damaged, 0, "the line cannot be converted; nothing is read from here on");
    }
    if (lines->EndedEarly()) {
        Report(DictionaryProblemKind::EarlyEnd, 0, "a zero begins the line; nothing is read from here on");
    }
    if (lines->HasOddByte()) {
        m_Dictionary.m_IsValid = false;
        Report(DictionaryProblemKind::OddByte, 0, "the file ends in the middle of a UTF-16 unit");
    }
    if (source.Failed()) {
        m_Dictionary.m_IsValid = false;
        Report(DictionaryProblemKind::ReadFailed, 0, "the file could not be read to its end");
    }
}

void DictionaryTextReader::ReadLine(UnitsView line) {
    constexpr std::size_t kDollars = 3;
    m_Key.clear();
    EntryPart const part = FindEntry(line);
    UnitsView entry = part.text;
    if (!entry.empty() && entry[0] == '$') {
        if (entry.size() < kDollars || entry[1] != '$' || entry[2] != '$') {
            m_Dictionary.m_IsValid = false;
            Report(DictionaryProblemKind::LoneDollar, 0, "the entry begins with $ but not with $$$");
            return;
        }
        entry.remove_prefix(kDollars);
    }
    std::size_t const equals = entry.find('=');
    bool isWide = false;
    for (unsigned short const unit : entry.substr(0, equals)) {
        isWide = isWide || unit > 0xFF;
        m_Key.push_back(static_cast<char>(unit & 0xFF));
    }
    if (m_Observer != nullptr) {
        ReportPlaces(part, equals != UnitsView::npos);
        if (isWide) {
            Report(DictionaryProblemKind::WideKey, 0, "the key has a character above U+00FF");
        }
    }
    if (m_Key.empty()) {
        Report(DictionaryProblemKind::EmptyKey, 0, "the entry has no key");
        return;
    }
    Add(equals == UnitsView::npos ? UnitsView() : entry.substr(equals + 1));
}

void DictionaryTextReader::ReportPlaces(EntryPart const &part, bool hasEquals) {
    if (part.hasTextBefore) {
        Report(DictionaryProblemKind::TextBefore, 0, "the text before the quotation mark is ignored");
    }
    if (part.isQuoted && !part.isClosed) {
        Report(DictionaryProblemKind::UnclosedQuote, 0, "the second quotation mark is missing");
    }
    if (part.hasTextAfter) {
        Report(DictionaryProblemKind::TextAfter, 0, "the text behind the second quotation mark is ignored");
    }
    if (!hasEquals) {
        Report(DictionaryProblemKind::NoEquals, 0, "the entry has no =");
    }
}

void DictionaryTextReader::Add(UnitsView value) {
    if (m_Dictionary.m_Version.major < 2) {
        if (m_Observer != nullptr && m_Dictionary.m_Legacy.Find(m_Key) != nullptr) {
            Report(DictionaryProblemKind::DuplicateKey, 0, "the key was there before; its text is replaced");
        }
        m_Dictionary.m_Legacy.Replace(std::make_unique<DictionaryEntry>(m_Key, true, ByteRunValue(value)));
        return;
    }
    if (m_Observer != nullptr && m_Dictionary.Find(m_Key) >= 0) {
        Report(DictionaryProblemKind::DuplicateKey, 0, "the key was there before; its text is replaced");
    }
    if (MayHaveEscapes(value)) {
        m_Dictionary.m_Array->Add(m_Key, UnescapeValue(value));
    } else {
        m_Dictionary.m_Array->Add(m_Key, value);
    }
}

KTUnits DictionaryTextReader::UnescapeValue(UnitsView value) {
    if (m_Observer == nullptr) {
        return Unescape(value);
    }
    return Unescape(value, PlatformCaretTable(), [this](EscapeProblem const &problem) {
        switch (problem.kind) {
        case EscapeProblem::UnknownEscape:
            Report(DictionaryProblemKind::UnknownEscape, problem.at, "the character after \\ has no meaning there");
            break;
        case EscapeProblem::UnknownCaret:
            Report(DictionaryProblemKind::UnknownCaret, problem.at, "the character after ^ has no meaning there");
            break;
        case EscapeProblem::TrailingEscape:
            Report(DictionaryProblemKind::TrailingEscape, problem.at, "the text ends with \\ or ^");
            break;
        case EscapeProblem::UnknownEntity:
            Report(DictionaryProblemKind::UnknownEntity, problem.at, "#{ begins neither a name nor a number");
            break;
        }
    });
}

} // namespace orvik_private
