// WDigestTest.cpp: what the helpers ask of the system: its clock, its generator and its cryptography, each replaced in
// the library's import table to see what is made of its answers.

#include "KTPublicUtils.h"
#include "WChildProcess.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <bcrypt.h>

#include <new>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

constexpr wchar_t kLibrary[] = L"KTPublic.dll";
constexpr NTSTATUS kNoMemory = static_cast<NTSTATUS>(0xC0000017);
constexpr NTSTATUS kInternal = static_cast<NTSTATUS>(0xC00000E5);

// The replacements are called by plain address, so what they say and see is kept here.
long long theTime = 0;
int theNumber = 0;
std::vector<unsigned int> theSeeds;
NTSTATUS theStatus = 0;
int theDestroyed = 0;

long long FixedTime(long long *) { return theTime; }
int FixedNumber() { return theNumber; }
void KeepSeed(unsigned int seed) { theSeeds.push_back(seed); }
NTSTATUS WINAPI RefuseHash(BCRYPT_ALG_HANDLE, BCRYPT_HASH_HANDLE *, PUCHAR, ULONG, PUCHAR, ULONG, ULONG) {
    return theStatus;
}
NTSTATUS WINAPI RefuseBytes(BCRYPT_HASH_HANDLE, PUCHAR, ULONG, ULONG) { return theStatus; }
NTSTATUS WINAPI RefuseEnd(BCRYPT_HASH_HANDLE, PUCHAR, ULONG, ULONG) { return theStatus; }
NTSTATUS WINAPI CountDestroyed(BCRYPT_HASH_HANDLE hash) {
    ++theDestroyed;
    return BCryptDestroyHash(hash);
}

KTString HashOfText() { return KTPublicUtils::GenerateHash(KTString("abc"), kKTHashSHA256); }

} // namespace

TEST(WHttpTime, HasTheFixedForm) {
    WImportHook const hook(kLibrary, "_time64", FixedTime);
    ASSERT_TRUE(hook.IsActive());
    auto const dateAt = [](long long seconds) {
        theTime = seconds;
        return KTPublicUtils::GetRFC2616GMTTime().GetUTF8String();
    };
    EXPECT_EQ(dateAt(784111777), "Sun, 06 Nov 1994 08:49:37 GMT");
    EXPECT_EQ(dateAt(1709210096), "Thu, 29 Feb 2024 12:34:56 GMT");
    char const *const months[] = {"Mon, 01 Jan", "Thu, 01 Feb", "Fri, 01 Mar", "Mon, 01 Apr",
                                  "Wed, 01 May", "Sat, 01 Jun", "Mon, 01 Jul", "Thu, 01 Aug",
                                  "Sun, 01 Sep", "Tue, 01 Oct", "Fri, 01 Nov", "Sun, 01 Dec"};
    int const days[] = {0, 31, 60, 91, 121, 152, 182, 213, 244, 274, 305, 335}; // of 2024
    for (int month = 0; month < 12; ++month) {
        EXPECT_EQ(dateAt(1704067200LL + 86400LL * days[month] + 3661),
                  std::string(months[month]) + " 2024 01:01:01 GMT");
    }
}

TEST(WRandomNumber, IsTheGeneratorsNumberInTheRange) {
    WImportHook const hook(kLibrary, "rand", FixedNumber);
    ASSERT_TRUE(hook.IsActive());
    theNumber = 32767;
    EXPECT_EQ(KTPublicUtils::GetARandomNumber(9), 7U);
    EXPECT_EQ(KTPublicUtils::GetARandomNumber(32766), 0U);
    EXPECT_EQ(KTPublicUtils::GetARandomNumber(32767), 32767U);
    EXPECT_EQ(KTPublicUtils::GetARandomNumber(0xFFFFFFFE), 32767U) << "never above the generator's maximum";
    EXPECT_EQ(KTPublicUtils::GetARandomNumber(0), 0U);
}

TEST(WRandomNumber, DISABLED_FirstCallSeedsOnceWithTheTime) {
    WImportHook const clock(kLibrary, "_time64", FixedTime);
    WImportHook const seeding(kLibrary, "srand", KeepSeed);
    ASSERT_TRUE(clock.IsActive());
    ASSERT_TRUE(seeding.IsActive());
    theTime = 0x123456789;
    KTPublicUtils::GetARandomNumber(1);
    theTime += 5;
    KTPublicUtils::GetARandomNumber(1);
    EXPECT_EQ(theSeeds, std::vector<unsigned int>{0x23456789});
}

TEST(WRandomNumber, FirstCallSeedsOnceWithTheTime) {
    WChildProcess child("WRandomNumber.DISABLED_FirstCallSeedsOnceWithTheTime");
    ASSERT_TRUE(child.Started());
    EXPECT_EQ(child.ExitStatus(), 0U);
}

TEST(WRandomNumber, DISABLED_TheLargestMaximumIsADivisionFault) { KTPublicUtils::GetARandomNumber(0xFFFFFFFF); }

TEST(WRandomNumber, TheLargestMaximumIsADivisionFault) {
    WChildProcess child("WRandomNumber.DISABLED_TheLargestMaximumIsADivisionFault");
    ASSERT_TRUE(child.Started());
    EXPECT_EQ(child.ExitStatus(), EXCEPTION_INT_DIVIDE_BY_ZERO);
}

TEST(WDigest, RefusalsAreThrownAndNothingLeaks) {
    WImportHook const destroying(kLibrary, "BCryptDestroyHash", CountDestroyed);
    ASSERT_TRUE(destroying.IsActive());
    auto const expectThrows = [](int destroyed) {
        theDestroyed = 0;
        theStatus = kNoMemory;
        EXPECT_THROW(HashOfText(), std::bad_alloc);
        theStatus = kInternal;
        try {
            HashOfText();
            ADD_FAILURE() << "nothing thrown";
        } catch (std::runtime_error const &problem) {
            EXPECT_STREQ(problem.what(), "digest refused by the system, status 0xC00000E5");
        }
        EXPECT_EQ(theDestroyed, destroyed);
    };
    {
        WImportHook const hook(kLibrary, "BCryptCreateHash", RefuseHash);
        ASSERT_TRUE(hook.IsActive());
        expectThrows(0);
    }
    {
        WImportHook const hook(kLibrary, "BCryptHashData", RefuseBytes);
        ASSERT_TRUE(hook.IsActive());
        expectThrows(2);
    }
    {
        WImportHook const hook(kLibrary, "BCryptFinishHash", RefuseEnd);
        ASSERT_TRUE(hook.IsActive());
        expectThrows(2);
    }
    theDestroyed = 0;
    EXPECT_EQ(HashOfText().size(), 64U);
    EXPECT_EQ(theDestroyed, 1);
}
