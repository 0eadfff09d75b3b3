// DictionaryReader.cpp: keys and lookups, and which form a file has.

#include "DictionaryReader.h"

#include "DictionaryForms.h"
#include "DictionaryUnescape.h"
#include "OUtf.h"

#include <cstdio>

namespace orvik_private {

namespace {

DictionaryReader *defaultDictionary = nullptr;

// Counts what goes through.
class CountingSink final : public ByteSink {
  public:
    explicit CountingSink(ByteSink &sink) : m_Sink(sink) {}

    void Write(void const *bytes, std::size_t count) override {
        m_Sink.Write(bytes, count);
        m_Count += count;
    }
    std::uint64_t Count() const { return m_Count; }

  private:
    ByteSink &m_Sink;
    std::uint64_t m_Count = 0;
};

} // namespace

KeyText SplitKeyText(std::string_view text) noexcept {
    constexpr std::string_view kDollars = "$$$";
    KeyText key;
    if (text.starts_with('$')) {
        if (!text.starts_with(kDollars)) {
            key.isMalformed = true;
            return key;
        }
        text.remove_prefix(kDollars.size());
    }
    std::size_t const equals = FindByte(text, '=');
    key.name = text.substr(0, equals);
    key.hasDefault = equals != text.size();
    key.defaultText = key.hasDefault ? text.substr(equals + 1) : std::string_view();
    return key;
}

DictionaryReader::DictionaryReader(DictionaryVersion version) : m_Version(version), m_Array(new FastArray) {}

DictionaryReader::~DictionaryReader() {
    if (defaultDictionary == this) {
        defaultDictionary = nullptr;
    }
}

DictionaryReader *DictionaryReader::GetDefault() noexcept { return defaultDictionary; }

void DictionaryReader::SetDefault(DictionaryReader *dictionary) noexcept { defaultDictionary = dictionary; }

std::int64_t DictionaryReader::Add(std::string_view keyText, UnitsView value) {
    if (m_Version.major < 2) {
        return FastArray::kNotFound;
    }
    return m_Array->Add(SplitKeyText(keyText).name, value); // which takes no empty one
}

bool DictionaryReader::FindBytes(std::string_view name, KTUnits &scratch, std::string_view &bytes) const {
    if (m_Version.major < 2) {
        DictionaryEntry const *const entry = m_Legacy.Find(name);
        if (entry == nullptr) {
            return false;
        }
        scratch = entry->Value().Units();
        bytes = BytesOf(scratch);
        return true;
    }
    std::int64_t const index = m_Array->Find(name);
    if (index < 0) {
        return false;
    }
    try {
        bytes = m_Array->ValueBytes(static_cast<std::uint32_t>(index), scratch);
    } catch (TextConversionException const &) {
        return false; // lookups do not fail: a text that the system cannot convert is as good as none
    }
    return true;
}

bool DictionaryReader::LookupBytes(std::string_view name, KTUnits &scratch, std::string_view &bytes) const {
    if (name.empty()) {
        return false;
    }
    DictionaryReader const *const other = defaultDictionary;
    return FindBytes(name, scratch, bytes) ||
           (other != nullptr && other != this && other->FindBytes(name, scratch, bytes));
}

bool DictionaryReader::LookupName(std::string_view name, KTUnits &scratch, UnitsView &text) const {
    std::string_view bytes;
    if (!LookupBytes(name, scratch, bytes)) {
        return false;
    }
    text = UnitsOf(bytes, scratch);
    return true;
}

DictionaryFound DictionaryReader::Lookup(std::string_view keyText, KTUnits &scratch, UnitsView &text,
                                         int encoding) const {
    text = {};
    KeyText const key = SplitKeyText(keyText);
    if (LookupName(key.name, scratch, text)) {
        return DictionaryFound::Entry;
    }
    if (key.name.empty() || !key.hasDefault) {
        return DictionaryFound::Nothing;
    }
    scratch = encoding == kEncodingNone ? OWidenSigned(key.defaultText) : MultibyteToUnits(encoding, key.defaultText);
    if (MayHaveEscapes(scratch)) {
        scratch = Unescape(scratch);
    }
    text = scratch;
    return DictionaryFound::Default;
}

void DictionaryReader::Read(ByteSource &source, DictionaryObserver *observer) {
    BufferedSource buffered(source);
    if (buffered.Peek(kDictionaryMagic.size()) == kDictionaryMagic) {
        DictionaryBinaryReader(*this, observer).Read(buffered);
    } else {
        DictionaryTextReader(*this, observer).Read(buffered);
    }
}

std::uint64_t DictionaryReader::Write(ByteSink &sink, DictionaryForm const &form, bool *isComplete,
                                      DictionaryObserver *observer) const {
    CountingSink counting(sink);
    bool isWhole = true;
    try {
        WriteForm(counting, form, observer);
    } catch (...) {
        std::fputs("Serialize2", stderr);
        std::fputs(": Caught exception\n", stderr);
        isWhole = false;
    }
    if (isComplete != nullptr) {
        *isComplete = isWhole;
    }
    return counting.Count();
}

void DictionaryReader::WriteForm(ByteSink &sink, DictionaryForm const &form, DictionaryObserver *observer) const {
    if (!form.isBinary) {
        WriteText(*m_Array, sink, form.encoding, form.order, observer);
        return;
    }
    constexpr std::string_view kDefaultLocale = "en_US";
    bool const isBig = form.order == std::endian::big;
    std::string_view const locale = m_Locale ? std::string_view(*m_Locale) : kDefaultLocale;
    std::string head(kDictionaryMagic);
    head += {2, 7, static_cast<char>(form.encoding == kEncodingNone ? 0 : kEncodingUtf8), static_cast<char>(isBig)};
    std::uint32_t const length = static_cast<std::uint32_t>(locale.size());
    for (unsigned i = 0; i < 4; ++i) {
        head.push_back(static_cast<char>(length >> (8 * (isBig ? 3 - i : i))));
    }
    head += locale;
    sink.Write(head.data(), head.size());
    m_Array->WriteBlock(sink, form.order, form.encoding, observer);
}

} // namespace orvik_private
