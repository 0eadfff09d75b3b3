// KTStringResourceXML.cpp: texts of a string dictionary as a flat XML document.

#include "KTStringResourceXML.h"

#include "KTException.h"

namespace {

constexpr char kReportPath[] = "source/private/utils/KTStringResourceXML";
constexpr int kFinishedLine = 50;

} // namespace

KTStringResourceXML::KTStringResourceXML(IKTStringDictionary &dictionary)
    : KTString("<root>"), m_Dictionary(dictionary) {}

KTStringResourceXML::KTStringResourceXML(KTStringResourceXML const &other) = default;

KTStringResourceXML::~KTStringResourceXML() = default;

void KTStringResourceXML::AddKeyValueItemToResourceXML(KTString const &key) {
    if (m_IsFinished) {
        throw KTLCException(kKTErrorInternal, kReportPath, kFinishedLine, false);
    }
    // Whole before it is appended: the key may be this document, and memory may be short.
    KTString item("<item><ResKey>");
    item += key;
    item += "</ResKey><ResVal>";
    item += m_Dictionary.GetKeyValue(key);
    item += "</ResVal></item>\n";
    append(item);
}

KTString &KTStringResourceXML::Finish() {
    append(KTString("</root>"));
    m_IsFinished = true;
    return *this;
}

void KTStringResourceXML::FetchOrRegString(IKTStringDictionary &dictionary, KTStringResourceXML *xml, char const *key,
                                           char const *value) {
    if (xml != nullptr) {
        xml->AddKeyValueItemToResourceXML(KTString(key, KTString::kKTEncodingUTF8));
    } else {
        dictionary.AddString(key, value);
    }
}
