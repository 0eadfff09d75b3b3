// MailRecipientsTest.cpp: lists of recipients taken apart.

#include "email/KTMailRecipients.h"
#include "Units.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

// "NAME|ADDRESS" of each recipient.
std::vector<std::string> Parsed(KTString const &list) {
    std::vector<std::string> texts;
    for (KTMailRecipient const &one : KTParseMailRecipients(list)) {
        texts.push_back(one.name.GetUTF8String() + "|" + one.address.GetUTF8String());
    }
    return texts;
}

using Texts = std::vector<std::string>;

TEST(MailRecipientsTest, AnAddressIsItsOwnName) {
    EXPECT_EQ(Texts{"a@example.com|SMTP:a@example.com"}, Parsed("a@example.com"));
    EXPECT_EQ(Texts{"a@example.com|SMTP:a@example.com"}, Parsed("<a@example.com>"));
    EXPECT_EQ(Texts{"a@example.com|SMTP:a@example.com"}, Parsed(" \t a@example.com \r\n"));
}

TEST(MailRecipientsTest, ANameWithAnAddress) {
    EXPECT_EQ(Texts{"Jürgen Groß|SMTP:j@example.com"}, Parsed("Jürgen Groß <j@example.com>"));
    EXPECT_EQ(Texts{"Jane|SMTP:j@example.com"}, Parsed("Jane< j@example.com >"));
}

TEST(MailRecipientsTest, ANameAloneIsForTheAddressBook) {
    EXPECT_EQ(Texts{"Harbour Office|"}, Parsed("Harbour Office"));
    EXPECT_EQ(Texts{"Harbour; Office|"}, Parsed("\"Harbour; Office\""));
    EXPECT_EQ(Texts{"Jane|"}, Parsed("Jane <>"));
}

TEST(MailRecipientsTest, SemicolonsAndLineEndsSeparate) {
    EXPECT_EQ((Texts{"a@x|SMTP:a@x", "b@x|SMTP:b@x", "c@x|SMTP:c@x", "d@x|SMTP:d@x"}), Parsed("a@x;b@x ; c@x\r\nd@x"));
}

TEST(MailRecipientsTest, CommasSeparateWhereThereIsNoSemicolon) {
    EXPECT_EQ((Texts{"a@x|SMTP:a@x", "b@x|SMTP:b@x"}), Parsed("a@x, b@x"));
    EXPECT_EQ((Texts{"Doe, Jane|SMTP:j@x", "b@x|SMTP:b@x"}), Parsed("Doe, Jane <j@x>; b@x"));
    EXPECT_EQ((Texts{"A; B|SMTP:a@x", "C|SMTP:c@x"}), Parsed("\"A; B\" <a@x>, C <c@x>"));
}

TEST(MailRecipientsTest, QuotesAndBracketsShelterSeparators) {
    EXPECT_EQ((Texts{"Doe, \"JD\"; \\|SMTP:d@x", "e@x|SMTP:e@x"}), Parsed(R"("Doe, \"JD\"; \\" <d@x>; e@x)"));
    EXPECT_EQ(Texts{"A|SMTP:a;b@x"}, Parsed("A <a;b@x>"));
}

TEST(MailRecipientsTest, WhatIsNeverClosedIsOrdinary) {
    EXPECT_EQ((Texts{"4\" pipe|", "b@x|SMTP:b@x"}), Parsed("4\" pipe; b@x"));
    EXPECT_EQ((Texts{"a <a@x|SMTP:a <a@x", "b@x|SMTP:b@x"}), Parsed("a <a@x; b@x"));
    EXPECT_EQ((Texts{"\"a\\\"|", "b@x|SMTP:b@x"}), Parsed(R"("a\"; b@x)"));
    EXPECT_EQ(Texts{"\"|"}, Parsed("\""));
    EXPECT_EQ(Texts{">|"}, Parsed(">"));
}

TEST(MailRecipientsTest, EmptyPiecesAreLeftOut) {
    EXPECT_EQ(Texts{}, Parsed(""));
    EXPECT_EQ(Texts{}, Parsed(" ; ;\r\n; "));
    EXPECT_EQ(Texts{}, Parsed(", ,"));
    EXPECT_EQ(Texts{}, Parsed("<>; \"\""));
    EXPECT_EQ(Texts{"a@x|SMTP:a@x"}, Parsed(";a@x;;"));
}

TEST(MailRecipientsTest, ATypedAddressKeepsItsType) {
    EXPECT_EQ(Texts{"FAX:+49 30 1234|FAX:+49 30 1234"}, Parsed("FAX:+49 30 1234"));
    EXPECT_EQ(Texts{"Jane|smtp:j@x"}, Parsed("Jane <smtp:j@x>"));
    EXPECT_EQ(Texts{"a1:b@x|SMTP:a1:b@x"}, Parsed("a1:b@x"));
    EXPECT_EQ(Texts{":|"}, Parsed(":"));
}

// A million openings that nothing closes take one pass, not a million.
TEST(MailRecipientsTest, LongListsTakeOnePass) {
    for (char const *const piece : {"<", "\"", "\\\"", "\"\\", "<\""}) {
        KTString list("\"");
        for (int i = 0; i < 500000; ++i) {
            list += piece;
        }
        EXPECT_LE(Parsed(list).size(), 1U) << piece;
    }
    KTString many;
    for (int i = 0; i < 100000; ++i) {
        many += "a@x;";
    }
    EXPECT_EQ(100000U, Parsed(many).size());
}

} // namespace
