// StringResourceXMLTest.cpp: KTStringResourceXML: items, the end, what is refused, and registering defaults.

#include "KTStringResourceXML.h"

#include "KTException.h"
#include "KTStringDictionary.h"
#include "LogLines.h"
#include "Units.h"

#include <gtest/gtest.h>

#include <memory>
#include <stdexcept>

namespace {

// A dictionary that says the key back in brackets, and keeps what it is told.
class EchoDictionary : public IKTStringDictionary {
  public:
    KTErrorCodeEnum AddString(KTString const &, KTString const &) override { return kKTErrorFailed; }
    KTErrorCodeEnum AddString(char const *key, char const *value) override {
        added.emplace_back(key == nullptr ? "null" : key, value == nullptr ? "null" : value);
        return kKTErrorFailed;
    }
    KTString GetKeyValue(KTString const &key) override {
        if (fails) {
            throw std::runtime_error("no text");
        }
        return "(" + key + ")";
    }
    KTErrorCodeEnum WriteToFile(KTFile const &, bool) override { return kKTErrorFailed; }
    KTErrorCodeEnum ReadFromFile(KTFile const &) override { return kKTErrorFailed; }

    std::vector<std::pair<std::string, std::string>> added;
    bool fails = false;
};

TEST(StringResourceXML, HoldsItemsBetweenTheRootTags) {
    IKTStringDictionary &dictionary = *KTStringDictionary::GetStringDictionary();
    dictionary.AddString(KTString("K"), KTString("V"));
    KTStringResourceXML xml(dictionary);
    EXPECT_EQ(KTString("<root>"), xml);
    xml.AddKeyValueItemToResourceXML("K");
    EXPECT_EQ(KTString("<root><item><ResKey>K</ResKey><ResVal>V</ResVal></item>\n"), xml);
    KTString const &text = xml.Finish();
    EXPECT_EQ(&xml, &text);
    EXPECT_EQ(KTString("<root><item><ResKey>K</ResKey><ResVal>V</ResVal></item>\n</root>"), text);
}

TEST(StringResourceXML, EscapesNothing) {
    EchoDictionary dictionary;
    KTStringResourceXML xml(dictionary);
    xml.AddKeyValueItemToResourceXML("<a & \"b\">");
    EXPECT_EQ(KTString("<root><item><ResKey><a & \"b\"></ResKey><ResVal>(<a & \"b\">)</ResVal></item>\n"), xml);
}

TEST(StringResourceXML, TakesUnitsAsTheyAre) {
    EchoDictionary dictionary;
    KTStringResourceXML xml(dictionary);
    KTString const key = FromUnits({'a', 0, 0xD800});
    xml.AddKeyValueItemToResourceXML(key);
    EXPECT_EQ("<root><item><ResKey>" + key + "</ResKey><ResVal>(" + key + ")</ResVal></item>\n", xml);
}

TEST(StringResourceXML, TakesItselfForAKey) {
    EchoDictionary dictionary;
    KTStringResourceXML xml(dictionary);
    xml.AddKeyValueItemToResourceXML(xml);
    EXPECT_EQ(KTString("<root><item><ResKey><root></ResKey><ResVal>(<root>)</ResVal></item>\n"), xml);
}

TEST(StringResourceXML, ThrowsOnceItIsFinishedAndStaysAsItIs) {
    EchoDictionary dictionary;
    KTStringResourceXML xml(dictionary);
    xml.Finish();
    LogLines log;
    try {
        xml.AddKeyValueItemToResourceXML("K");
        FAIL() << "not thrown";
    } catch (KTLCException const &exception) {
        EXPECT_EQ(KTString("kKTErrorInternal"), exception.GetReason());
        EXPECT_EQ(KTString("KTStringResourceXML"), exception.GetFile());
        EXPECT_EQ(50, exception.GetLine());
    }
    EXPECT_THROW(KTStringResourceXML::FetchOrRegString(dictionary, &xml, "K", "V"), KTLCException);
    EXPECT_EQ(KTString("<root></root>"), xml);
    EXPECT_EQ(std::vector<std::string>(), log.Take());
}

TEST(StringResourceXML, StaysAsItIsWhenTheDictionaryThrows) {
    EchoDictionary dictionary;
    dictionary.fails = true;
    KTStringResourceXML xml(dictionary);
    EXPECT_THROW(xml.AddKeyValueItemToResourceXML("K"), std::runtime_error);
    EXPECT_EQ(KTString("<root>"), xml);
}

TEST(StringResourceXML, AppendsTheEndTagAtEachFinish) {
    EchoDictionary dictionary;
    KTStringResourceXML xml(dictionary);
    xml.Finish();
    EXPECT_EQ(KTString("<root></root></root>"), xml.Finish());
}

TEST(StringResourceXML, CopiesTextDictionaryAndEnd) {
    EchoDictionary dictionary;
    KTStringResourceXML xml(dictionary);
    KTStringResourceXML open(xml);
    open.AddKeyValueItemToResourceXML("K");
    EXPECT_EQ(KTString("<root><item><ResKey>K</ResKey><ResVal>(K)</ResVal></item>\n"), open);
    EXPECT_EQ(KTString("<root>"), xml);
    open.Finish();
    KTStringResourceXML finished(open);
    EXPECT_EQ(open, finished);
    EXPECT_THROW(finished.AddKeyValueItemToResourceXML("L"), KTLCException);
}

TEST(StringResourceXML, FetchesIntoADocument) {
    EchoDictionary dictionary;
    KTStringResourceXML xml(dictionary);
    KTStringResourceXML::FetchOrRegString(dictionary, &xml, "\xC3\xA9", "not looked at");
    KTStringResourceXML::FetchOrRegString(dictionary, &xml, nullptr, nullptr);
    EXPECT_EQ(KTString("<root><item><ResKey>\xC3\xA9</ResKey><ResVal>(\xC3\xA9)</ResVal></item>\n"
                       "<item><ResKey></ResKey><ResVal>()</ResVal></item>\n"),
              xml);
    EXPECT_TRUE(dictionary.added.empty());
}

TEST(StringResourceXML, AsksTheDocumentsOwnDictionary) {
    EchoDictionary asked;
    EchoDictionary given;
    given.fails = true;
    KTStringResourceXML xml(asked);
    KTStringResourceXML::FetchOrRegString(given, &xml, "K", "V");
    EXPECT_TRUE(xml.Contains("(K)"));
}

TEST(StringResourceXML, RegistersWithoutADocument) {
    EchoDictionary echo;
    KTStringResourceXML::FetchOrRegString(echo, nullptr, "K", "V");
    KTStringResourceXML::FetchOrRegString(echo, nullptr, nullptr, nullptr);
    EXPECT_EQ((std::vector<std::pair<std::string, std::string>>{{"K", "V"}, {"null", "null"}}), echo.added);

    IKTStringDictionary &dictionary = *KTStringDictionary::GetStringDictionary();
    KTStringResourceXML::FetchOrRegString(dictionary, nullptr, "$$$/Reader/Key",
                                          "Gr\xC3\xB6\xC3\x9F"
                                          "e");
    EXPECT_EQ(KTString("Gr\xC3\xB6\xC3\x9F"
                       "e"),
              dictionary.GetKeyValue("$$$/Reader/Key"));
}

} // namespace
