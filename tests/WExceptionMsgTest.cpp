// WExceptionMsgTest.cpp: the messages' registration, which happens once in a process: each test is one.

#include "KTPublic.h"
#include "LogLines.h"
#include "WChildProcess.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

namespace {

using Registered = std::vector<std::pair<std::string, std::string>>;

Registered const kAll = {
    {"kKTExceptionMsg", "A fatal error has occured and the application is being terminated. Quillon Veltrain has tried "
                        "to save all your work in the respective project folders as \".ktbak\" files.\n\nPlease "
                        "restart Quillon Veltrain."},
    {"kKTDataBackUpFailedMsg", "Failed to back up the data."},
};

Registered g_Registered;
std::vector<std::string> g_Asked;

KTErrorCodeEnum TakeText(KTString const &key, KTString const &text) {
    g_Registered.emplace_back(key.GetUTF8String(), text.GetUTF8String());
    return kKTErrorFailed; // does not keep the rest from being registered
}

KTString GiveText(KTString const &key) {
    g_Asked.push_back(key.GetUTF8String());
    return "localised " + key;
}

TEST(ExceptionMsgTest, DISABLED_RegisteredAndCached) {
    RegisterMsgRegistrarCallBack(&TakeText);
    RegisterMsgStrGetterCallBack(&GiveText);
    KTExceptionMsgManager::RegisterBaseExceptionMsgs(true);
    EXPECT_EQ(kAll, g_Registered);
    EXPECT_EQ((std::vector<std::string>{"kKTExceptionMsg", "kKTDataBackUpFailedMsg"}), g_Asked);

    EXPECT_STREQ("kKTExceptionMsg", kKTExceptionMsgStr);
    EXPECT_EQ(KTString("localised kKTExceptionMsg"), KTFatalException(kKTExceptionMsgStr).What());
    EXPECT_EQ(KTString("localised kKTDataBackUpFailedMsg"), KTExceptionMsgManager::GetDataBackUpFailedMsg());
    // The same characters at another address.
    KTString key(kKTExceptionMsgStr);
    EXPECT_EQ(key, KTFatalException(key).What());
    EXPECT_EQ(key, KTExceptionMsgManager::GetExceptionMessage(std::string(kKTExceptionMsgStr).c_str()));

    KTExceptionMsgManager::RegisterBaseExceptionMsgs(true); // nothing more
    EXPECT_EQ(2U, g_Registered.size());
    EXPECT_EQ(2U, g_Asked.size());
}

TEST(ExceptionMsgTest, DISABLED_CachedOnly) {
    RegisterMsgRegistrarCallBack(&TakeText);
    RegisterMsgStrGetterCallBack(&GiveText);
    KTExceptionMsgManager::RegisterBaseExceptionMsgs(false);
    EXPECT_TRUE(g_Registered.empty());
    EXPECT_EQ(2U, g_Asked.size());
    KTExceptionMsgManager::RegisterBaseExceptionMsgs(true); // the first call counted
    EXPECT_TRUE(g_Registered.empty());
}

// Before anything is registered, the key stands in; without a getter, empty texts are cached for good.
TEST(ExceptionMsgTest, DISABLED_WithoutCallBacks) {
    EXPECT_EQ(KTString("kKTExceptionMsg"), KTFatalException(kKTExceptionMsgStr).What());
    EXPECT_EQ(KTString("kKTDataBackUpFailedMsg"), KTExceptionMsgManager::GetDataBackUpFailedMsg());
    RegisterMsgRegistrarCallBack(&TakeText);
    UnRegisterMsgRegistrarCallBack();
    RegisterMsgStrGetterCallBack(&GiveText);
    UnRegisterMsgStrGetterCallBack();
    KTExceptionMsgManager::RegisterBaseExceptionMsgs(true);
    EXPECT_TRUE(g_Registered.empty());
    EXPECT_TRUE(KTFatalException(kKTExceptionMsgStr).What().empty());
    EXPECT_TRUE(KTExceptionMsgManager::GetDataBackUpFailedMsg().empty());
    RegisterMsgStrGetterCallBack(&GiveText);
    KTExceptionMsgManager::RegisterBaseExceptionMsgs(true);
    EXPECT_TRUE(KTExceptionMsgManager::GetDataBackUpFailedMsg().empty());
}

// As hosts do it: both callbacks on the process-wide dictionary.
KTErrorCodeEnum AddToDictionary(KTString const &key, KTString const &text) {
    return KTPublicUtils::GetStringDictionary().AddString(key, text);
}

KTString FindInDictionary(KTString const &key) { return KTPublicUtils::GetStringDictionary().GetKeyValue(key); }

TEST(ExceptionMsgTest, DISABLED_ThroughTheDictionary) {
    RegisterMsgRegistrarCallBack(&AddToDictionary);
    RegisterMsgStrGetterCallBack(&FindInDictionary);
    KTExceptionMsgManager::RegisterBaseExceptionMsgs(true);
    EXPECT_EQ(kAll[0].second, KTFatalException(kKTExceptionMsgStr).What().GetUTF8String());
    EXPECT_EQ(kAll[1].second, KTExceptionMsgManager::GetDataBackUpFailedMsg().GetUTF8String());
}

class ExceptionMsgChildTest : public testing::TestWithParam<char const *> {};

TEST_P(ExceptionMsgChildTest, InAProcessOfItsOwn) {
    WChildProcess child("ExceptionMsgTest.DISABLED_" + std::string(GetParam()));
    ASSERT_TRUE(child.Started());
    EXPECT_EQ(0U, child.ExitStatus());
}

INSTANTIATE_TEST_SUITE_P(Each, ExceptionMsgChildTest,
                         testing::Values("RegisteredAndCached", "CachedOnly", "WithoutCallBacks",
                                         "ThroughTheDictionary"));

} // namespace
