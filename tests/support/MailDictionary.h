// MailDictionary.h: a host's dictionary that holds what a test of the mail sender puts into it.

#pragma once

#include "IKTStringDictionary.h"

#include <map>
#include <string>
#include <vector>

class MailDictionary : public IKTStringDictionary {
  public:
    KTErrorCodeEnum AddString(KTString const &key, KTString const &value) override {
        m_Texts[key.GetUTF8String()] = value;
        return kKTErrorNone;
    }
    KTErrorCodeEnum AddString(char const *key, char const *value) override {
        return AddString(KTString(key), KTString(value));
    }
    KTString GetKeyValue(KTString const &key) override {
        askedFor.push_back(key.GetUTF8String());
        auto const found = m_Texts.find(askedFor.back());
        return found == m_Texts.end() ? KTString() : found->second;
    }
    KTErrorCodeEnum WriteToFile(KTFile const &, bool) override { return kKTErrorFailed; }
    KTErrorCodeEnum ReadFromFile(KTFile const &) override { return kKTErrorFailed; }

    std::vector<std::string> askedFor;

  private:
    std::map<std::string, KTString> m_Texts;
};

/// One that has all texts of the mail sender.
class FullMailDictionary : public MailDictionary {
  public:
    FullMailDictionary() {
        AddString("kKTMailClientError", "Kein Standard-Mailprogramm gefunden.");
        AddString("kKTMAPIError", "Das Mailprogramm hat die Nachricht abgelehnt.");
        AddString("kKTNone", "Gesendet.");
    }
    using MailDictionary::AddString;
};
