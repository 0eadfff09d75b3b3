// WOSVersionTest.cpp: the system's true version.

#include "KTOSVersion.h"

#include "WImportHook.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <winternl.h>

#include <bit>

namespace {

constexpr wchar_t kLibrary[] = L"KTPublic.dll";

struct Faked {
    DWORD majorVersion;
    DWORD minorVersion;
    BYTE product;
    bool isXP;
    bool isVista;
    bool isWin7;
};

Faked g_Faked;

NTSTATUS NTAPI FakeVersion(OSVERSIONINFOW *version) {
    auto *const info = reinterpret_cast<OSVERSIONINFOEXW *>(version);
    EXPECT_EQ(sizeof *info, info->dwOSVersionInfoSize);
    info->dwMajorVersion = g_Faked.majorVersion;
    info->dwMinorVersion = g_Faked.minorVersion;
    info->dwBuildNumber = 1234;
    info->wProductType = g_Faked.product;
    return 0;
}

NTSTATUS NTAPI FailVersion(OSVERSIONINFOW *) { return static_cast<NTSTATUS>(0xC000000D); }

} // namespace

TEST(OSVersion, IsTheKernels) {
    using Function = NTSTATUS(NTAPI *)(OSVERSIONINFOEXW *);
    auto const function = std::bit_cast<Function>(GetProcAddress(GetModuleHandleW(L"ntdll.dll"), "RtlGetVersion"));
    OSVERSIONINFOEXW expected{};
    expected.dwOSVersionInfoSize = sizeof expected;
    ASSERT_EQ(0, function(&expected));
    KTOSVersion::Version const version = KTOSVersion::GetOSVersion();
    EXPECT_EQ(expected.dwMajorVersion, version.majorVersion);
    EXPECT_EQ(expected.dwMinorVersion, version.minorVersion);
    EXPECT_EQ(expected.dwBuildNumber, version.buildNumber);
    EXPECT_EQ(expected.wProductType != VER_NT_WORKSTATION, version.isServer);
    EXPECT_GE(version.majorVersion, 6U);
    EXPECT_GT(version.buildNumber, 0U);
    EXPECT_EQ(nullptr, FindImport(kLibrary, "GetVersionExW")) << "answers what the manifest can bear";
}

TEST(OSVersion, EachIsItselfAlone) {
    constexpr BYTE kWorkstation = VER_NT_WORKSTATION;
    constexpr BYTE kServer = VER_NT_SERVER;
    WImportHook const hook(kLibrary, "RtlGetVersion", FakeVersion);
    ASSERT_TRUE(hook.IsActive());
    for (Faked const &faked :
         {Faked{5, 0, kWorkstation, false, false, false}, Faked{5, 1, kWorkstation, true, false, false},
          Faked{5, 2, kWorkstation, true, false, false}, Faked{5, 2, kServer, false, false, false},
          Faked{5, 2, VER_NT_DOMAIN_CONTROLLER, false, false, false}, Faked{6, 0, kWorkstation, false, true, false},
          Faked{6, 0, kServer, false, false, false}, Faked{6, 1, kWorkstation, false, false, true},
          Faked{6, 1, kServer, false, false, false}, Faked{6, 2, kWorkstation, false, false, false},
          Faked{10, 0, kWorkstation, false, false, false}, Faked{7, 1, kWorkstation, false, false, false}}) {
        SCOPED_TRACE(testing::Message() << faked.majorVersion << '.' << faked.minorVersion << " " << +faked.product);
        g_Faked = faked;
        EXPECT_EQ(faked.isXP, KTOSVersion::IsXP());
        EXPECT_EQ(faked.isVista, KTOSVersion::IsVista());
        EXPECT_EQ(faked.isWin7, KTOSVersion::IsWin7());
        KTOSVersion::Version const version = KTOSVersion::GetOSVersion();
        EXPECT_EQ(faked.majorVersion, version.majorVersion);
        EXPECT_EQ(faked.minorVersion, version.minorVersion);
        EXPECT_EQ(1234U, version.buildNumber);
        EXPECT_EQ(faked.product != kWorkstation, version.isServer);
    }
}

TEST(OSVersion, IsZeroIfTheSystemDoesNotTell) {
    WImportHook const hook(kLibrary, "RtlGetVersion", FailVersion);
    KTOSVersion::Version const version = KTOSVersion::GetOSVersion();
    EXPECT_EQ(0U, version.majorVersion + version.minorVersion + version.buildNumber);
    EXPECT_FALSE(version.isServer);
    EXPECT_FALSE(KTOSVersion::IsXP() || KTOSVersion::IsVista() || KTOSVersion::IsWin7());
}
