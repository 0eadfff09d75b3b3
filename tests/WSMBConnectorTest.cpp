// WSMBConnectorTest.cpp: shares that answer and shares that do not. The set-up maps \\ktserver\share.

#include "KTSMBUtils.h"

#include "KTFile.h"
#include "LogLines.h"
#include "ModuleHandles.h"
#include "Units.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <new>
#include <string>
#include <vector>

namespace {

KTString const kThere("smb://ktserver/share/");
KTString const kNotThere("smb://ktserver/none/");

KTString LocalPathOf(KTSMBConnector const &connector) {
    KTString path("old");
    connector.getLocalPath(path);
    return path;
}

KTString SmbUrlOf(KTSMBConnector const &connector) {
    KTString url("old");
    connector.getSmbUrl(url);
    return url;
}

class SMBConnector : public testing::Test {
  protected:
    void SetUp() override {
        if (!KTFile(KTString("\\\\ktserver\\share")).Exists()) {
            GTEST_SKIP() << "no share to test with";
        }
    }
};

DWORD WINAPI ThrowOnAttributes(wchar_t const *) { throw std::bad_alloc(); }

DWORD g_Asked = 0;
DWORD WINAPI CountAttributes(wchar_t const *) {
    ++g_Asked;
    return INVALID_FILE_ATTRIBUTES;
}

} // namespace

TEST(SMBStatus, Values) {
    EXPECT_EQ(200, KTSMBConnector::CONNECTION_ESTABLISHED);
    EXPECT_EQ(401, KTSMBConnector::ERROR_AUTH_FAILED);
    EXPECT_EQ(404, KTSMBConnector::ERROR_SERVER_NOT_FOUND);
    EXPECT_EQ(500, KTSMBConnector::GENERAL_SERVER_ERROR);
    // They are in the library, not only in the header.
    auto const *const failed = reinterpret_cast<unsigned short const *>(
        ktabi::Symbol(ktabi::Library(), "_ZN14KTSMBConnector17ERROR_AUTH_FAILEDE"));
    ASSERT_NE(nullptr, failed);
    EXPECT_EQ(401, *failed);
}

TEST_F(SMBConnector, AShareThatAnswers) {
    LogLines log;
    KTSMBConnector connector;
    EXPECT_FALSE(connector.connectionFailed());
    EXPECT_EQ(200, connector.connect(kThere));
    EXPECT_FALSE(connector.connectionFailed());
    for (char const *const url : {"smb://ktserver/share/no folder/of this name", "file://///ktserver/share/",
                                  "file://localhost///ktserver/share/x"}) {
        EXPECT_EQ(200, connector.connect(url)) << url << ": only the share itself is tried";
    }
    EXPECT_TRUE(log.Take().empty());
}

TEST_F(SMBConnector, OneThatDoesNot) {
    LogLines log;
    KTSMBConnector connector;
    EXPECT_EQ(500, connector.connect(kNotThere));
    EXPECT_TRUE(connector.connectionFailed());
    EXPECT_EQ(500, connector.connect("smb://noserver/share/"));
    EXPECT_TRUE(connector.connectionFailed());
    EXPECT_EQ(500, connector.connect("smb://ktserver/sh*re/")) << "no name for a share";
    EXPECT_EQ(200, connector.connect(kThere));
    EXPECT_FALSE(connector.connectionFailed()) << "the last one counts";
    EXPECT_TRUE(log.Take().empty());
}

TEST_F(SMBConnector, NoServerOrNoShare) {
    KTSMBConnector connector;
    for (char const *const url :
         {"smb://ktserver", "smb://ktserver/share", "smb://", "SMB://ktserver/share/", "", "smb:///share/"}) {
        LogLines log;
        WImportHook const asked(L"KTPublic.dll", "GetFileAttributesW", CountAttributes);
        g_Asked = 0;
        EXPECT_EQ(404, connector.connect(url)) << url;
        EXPECT_EQ(0U, g_Asked);
        EXPECT_TRUE(connector.connectionFailed());
        EXPECT_EQ(std::vector<std::string>{"Assert failed:  at source/private/utils/WKTSMBUtils:66"}, log.Take());
    }
}

TEST_F(SMBConnector, AnExceptionCountsAsNoAnswer) {
    KTSMBConnector connector;
    {
        WImportHook const hook(L"KTPublic.dll", "GetFileAttributesW", ThrowOnAttributes);
        ASSERT_TRUE(hook.IsActive());
        EXPECT_EQ(500, connector.connect(kThere));
    }
    EXPECT_TRUE(connector.connectionFailed());
    EXPECT_EQ(200, connector.connect(kThere));
}

TEST_F(SMBConnector, MountingKeepsNothing) {
    KTSMBConnector connector;
    EXPECT_EQ(500, connector.mountSmbUrl(KTSmbUrl(kNotThere)));
    EXPECT_FALSE(connector.connectionFailed());
    EXPECT_EQ(KTString("file:////"), LocalPathOf(connector));
    EXPECT_EQ(200, connector.mountSmbUrl(KTSmbUrl(kThere)));
}

TEST_F(SMBConnector, DisconnectingDoesNothing) {
    KTSMBConnector connector;
    EXPECT_EQ(0, connector.disconnect());
    connector.connect(kNotThere);
    EXPECT_EQ(0, connector.disconnect());
    EXPECT_TRUE(connector.connectionFailed());
    EXPECT_EQ(KTString("file://ktserver/none/"), LocalPathOf(connector));
}

TEST_F(SMBConnector, GivesTheUrlInBothForms) {
    KTSMBConnector connector;
    connector.connect("file://localhost///ktserver/share/dir/file.txt");
    EXPECT_EQ(KTString("file://ktserver/share/dir/file.txt"), LocalPathOf(connector));
    EXPECT_EQ(KTString("smb://ktserver/share/dir/file.txt"), SmbUrlOf(connector));
    connector.connect("smb://ktserver/share/x");
    EXPECT_EQ(KTString("smb://ktserver/share/"), SmbUrlOf(connector)) << "a path of one unit is not taken";
    connector.connect("smb://ktserver/share");
    EXPECT_EQ(KTString("file://ktserver//"), LocalPathOf(connector));
    connector.connect("http://ktserver/share/");
    EXPECT_EQ(KTString("file:////"), LocalPathOf(connector));
    EXPECT_EQ(KTString("smb:////"), SmbUrlOf(connector));
}

TEST_F(SMBConnector, CopiesUrlAndFlag) {
    KTSMBConnector connector;
    connector.connect(kNotThere);
    KTSMBConnector copy(connector);
    KTSMBConnector assigned;
    assigned = connector;
    for (KTSMBConnector *const one : {&copy, &assigned}) {
        EXPECT_TRUE(one->connectionFailed());
        EXPECT_EQ(KTString("smb://ktserver/none/"), SmbUrlOf(*one));
    }
}

TEST_F(SMBConnector, EscapesStandForWhatTheFileLayerReads) {
    ASSERT_TRUE(KTFile(KTString("\\\\ktserver\\share")).Exists());
    KTSMBConnector connector;
    EXPECT_EQ(200, connector.connect("smb://ktserver/sh%61re/"));
    EXPECT_EQ(KTString("file://ktserver/sh%61re/"), LocalPathOf(connector));
}
