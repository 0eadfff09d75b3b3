// ExceptionTest.cpp: the exception classes, who handles an exception, and the list of clean-up callbacks.

#include "KTPublic.h"
#include "LogLines.h"

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <stdexcept>
#include <string>
#include <type_traits>

namespace {

char const kKey[] = "kKTExceptionTest";

static_assert(std::is_base_of_v<std::exception, KTException>);
static_assert(std::is_base_of_v<KTException, KTFatalException>);
static_assert(std::is_base_of_v<KTException, KTNonFatalException>);
static_assert(std::is_base_of_v<KTFatalException, WKTSEHException>);
static_assert(std::is_base_of_v<std::exception, KTLCException> && !std::is_base_of_v<KTException, KTLCException>);

TEST(ExceptionTest, APointerIsKeptItself) {
    KTException const exception(kKey);
    EXPECT_EQ(kKey, exception.GetExceptionType());
    EXPECT_EQ(kKey, exception.what());
    EXPECT_EQ(KTString(kKey), exception.What());
    EXPECT_EQ(kKey, KTException(exception).GetExceptionType());
    EXPECT_EQ(kKey, KTFatalException(kKey).GetExceptionType());
    EXPECT_EQ(kKey, KTNonFatalException(KTNonFatalException(kKey)).GetExceptionType());
}

TEST(ExceptionTest, ATextIsCopiedAsUtf8) {
    KTString key("Gr\xC3\xB6\xC3\x9F"
                 "e");
    KTFatalException const exception(key);
    EXPECT_STREQ("Gr\xC3\xB6\xC3\x9F"
                 "e",
                 exception.GetExceptionType());
    KTString const text = key;
    key = "changed";
    EXPECT_EQ(text, exception.What());
}

// Copies outlive what they were copied from, also when the text is short enough to be held inside the object.
TEST(ExceptionTest, CopiesHoldTheirOwnKey) {
    for (std::string const text : {"short", "long enough to be held somewhere else than in the object itself"}) {
        KTString key(text.c_str());
        auto original = std::make_unique<KTFatalException>(key);
        KTFatalException const copy(*original);
        KTFatalException assigned(kKey);
        assigned = *original;
        EXPECT_NE(original->GetExceptionType(), copy.GetExceptionType());
        std::memset(const_cast<char *>(original->GetExceptionType()), 'x', text.size());
        original.reset();
        EXPECT_EQ(text, copy.GetExceptionType());
        EXPECT_EQ(text, assigned.GetExceptionType());
        KTFatalException const &self = assigned;
        assigned = self;
        EXPECT_EQ(text, assigned.GetExceptionType());
        assigned = KTFatalException(kKey);
        EXPECT_EQ(kKey, assigned.GetExceptionType());
    }
}

TEST(ExceptionTest, ANullKeyIsAnEmptyMessage) {
    KTException const exception(static_cast<char const *>(nullptr));
    EXPECT_EQ(nullptr, exception.GetExceptionType());
    EXPECT_STREQ("", exception.what());
    EXPECT_TRUE(exception.What().empty());
}

TEST(ExceptionTest, ClassesAreCaughtByTheirBases) {
    KTString key("k");
    EXPECT_THROW(throw KTFatalException(key), KTException);
    EXPECT_THROW(throw KTNonFatalException(kKey), KTException);
    EXPECT_THROW(throw KTException(kKey), std::exception);
    EXPECT_THROW(throw KTLCException("r", "f", 1), std::exception);
}

TEST(ExceptionTest, AnInternalErrorKnowsItsPlace) {
    LogLines log;
    KTLCException const exception(kKTErrorInternal, "source/private/utils/KTGraphicsStructs", -47, false);
    EXPECT_EQ(KTString("kKTErrorInternal"), exception.GetReason());
    EXPECT_EQ(KTString("KTGraphicsStructs"), exception.GetFile());
    EXPECT_EQ(-47, exception.GetLine());
    EXPECT_EQ(KTString("KTGraphicsStructs"), KTLCException(exception).GetFile());
    EXPECT_EQ(KTString("KTThing"), KTLCException("", "C:\\a\\KTThing.cpp", 0).GetFile());
    EXPECT_TRUE(KTLCException("", "", 0).GetFile().empty());
    EXPECT_TRUE(KTLCException("", nullptr, 0).GetFile().empty());
    EXPECT_TRUE(log.Take().empty());
}

TEST(ExceptionTest, AnInternalErrorIsLoggedIfAsked) {
    LogLines log;
    KTLCException const exception("a reason", "source/private/utils/KTThing", 12, true);
    EXPECT_EQ((std::vector<std::string>{"Assert failed: a reason at KTThing:12"}), log.Take());
}

// ---- messages that are not cached ----

TEST(ExceptionTest, AMessageThatIsNotCachedIsItsKey) {
    char const first[] = "first \xE2\x82\xAC";
    KTString const &text = KTExceptionMsgManager::GetExceptionMessage(first);
    EXPECT_EQ(KTString(first), text);
    // The next miss overwrites it.
    EXPECT_EQ(&text, &KTExceptionMsgManager::GetExceptionMessage("second"));
    EXPECT_EQ(KTString("second"), text);
    EXPECT_TRUE(KTExceptionMsgManager::GetExceptionMessage(nullptr).empty());
}

KTString AskedText(KTString const &key) { return "text of " + key; }

TEST(ExceptionTest, AMessageIsCachedUnderItsKeysAddress) {
    static char const key[] = "kKTOwnMessage";
    static char const sameCharacters[] = "kKTOwnMessage";
    RegisterMsgStrGetterCallBack(&AskedText);
    EXPECT_TRUE(KTExceptionMsgManager::CacheExceptionMessage(key));
    EXPECT_FALSE(KTExceptionMsgManager::CacheExceptionMessage(nullptr));
    KTString const &text = KTExceptionMsgManager::GetExceptionMessage(key);
    EXPECT_EQ(KTString("text of kKTOwnMessage"), text);
    EXPECT_EQ(KTString("kKTOwnMessage"), KTExceptionMsgManager::GetExceptionMessage(sameCharacters));
    EXPECT_EQ(KTString("text of kKTOwnMessage"), KTNonFatalException(key).What());
    EXPECT_EQ(KTString("text of kKTOwnMessage"), text); // a miss meanwhile does not touch it

    UnRegisterMsgStrGetterCallBack();
    EXPECT_TRUE(KTExceptionMsgManager::CacheExceptionMessage(key)); // replaced, by nothing
    EXPECT_TRUE(text.empty());
}

// ---- handling ----

class HostHandler final : public IKTExceptionHandler {
  public:
    void HandleException(KTException const &exception) override {
        last = exception.GetExceptionType();
        if (isThrowing) {
            throw std::runtime_error("the handler's own trouble");
        }
    }
    char const *last = nullptr;
    bool isThrowing = false;
};

TEST(ExceptionTest, TheClientHandlerIsCalledInsteadOfTheDefault) {
    static HostHandler handler; // stays the handler of this process
    KTExceptionUtils::GetInstance().SetHandler(handler);
    LogLines log;
    KTExceptionUtils::HandleException(KTFatalException(kKey));
    EXPECT_EQ(kKey, handler.last);
    EXPECT_FALSE(KTExceptionUtils::GetInstance().IsApplicationCrashed());
    EXPECT_TRUE(log.Take().empty());

    handler.isThrowing = true;
    EXPECT_NO_THROW(KTExceptionUtils::HandleException(KTNonFatalException("other")));
    EXPECT_STREQ("other", handler.last);
    EXPECT_EQ((std::vector<std::string>{"Assert failed: Failed to handle the exception at "
                                        "source/private/exceptions/KTExceptionUtils:97"}),
              log.Take());
}

void CleanUpOne() {}
void CleanUpTwo() {}

TEST(ExceptionTest, CleanUpCallbacksAreInTheListOnce) {
    EXPECT_EQ(kKTErrorFailed, KTExceptionUtils::UnRegisterCleanUpCallBack(&CleanUpOne)); // an empty list
    EXPECT_EQ(kKTErrorFailed, KTExceptionUtils::RegisterCleanUpCallBack(nullptr));
    EXPECT_EQ(kKTErrorNone, KTExceptionUtils::RegisterCleanUpCallBack(&CleanUpOne));
    EXPECT_EQ(kKTErrorFailed, KTExceptionUtils::RegisterCleanUpCallBack(&CleanUpOne));
    EXPECT_EQ(kKTErrorFailed, KTExceptionUtils::UnRegisterCleanUpCallBack(&CleanUpTwo));
    EXPECT_EQ(kKTErrorNone, KTExceptionUtils::RegisterCleanUpCallBack(&CleanUpTwo));
    EXPECT_EQ(kKTErrorNone, KTExceptionUtils::UnRegisterCleanUpCallBack(&CleanUpOne));
    EXPECT_EQ(kKTErrorNone, KTExceptionUtils::RegisterCleanUpCallBack(&CleanUpOne));
    EXPECT_EQ(kKTErrorNone, KTExceptionUtils::UnRegisterCleanUpCallBack(&CleanUpOne));
    EXPECT_EQ(kKTErrorNone, KTExceptionUtils::UnRegisterCleanUpCallBack(&CleanUpTwo));
    EXPECT_EQ(kKTErrorFailed, KTExceptionUtils::UnRegisterCleanUpCallBack(&CleanUpTwo));
}

} // namespace
