// WDictionaryTest.cpp: the dictionary where the system fails it: no memory, text that cannot be converted, a file that
// cannot be written, mapped or shared.

#include "DictionaryFiles.h"
#include "KTException.h"
#include "KTPublicUtils.h"
#include "KTStringDictionary.h"
#include "LogLines.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <bit>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <new>
#include <string>
#include <string_view>
#include <vector>

using namespace dictionary_files;

namespace {

constexpr wchar_t kLibrary[] = L"KTPublic.dll";

// A fresh dictionary and folder for each test.
class WDictionaryTest : public testing::Test {
  protected:
    WDictionaryTest() {
        auto const *const info = testing::UnitTest::GetInstance()->current_test_info();
        m_Folder = std::filesystem::temp_directory_path() / (std::string("WDictionary.") + info->name());
        std::filesystem::remove_all(m_Folder);
        std::filesystem::create_directories(m_Folder);
        Forget();
    }
    ~WDictionaryTest() override {
        Forget();
        std::filesystem::remove_all(m_Folder);
    }

    static void Forget() { delete KTStringDictionary::m_StringDictionary; }
    static KTStringDictionary &Texts() { return *KTStringDictionary::GetStringDictionary(); }

    KTFile File(char const *name) const { return KTFile(KTString((m_Folder / name).string().c_str())); }
    KTFile File(char const *name, std::string const &content) const {
        std::ofstream(m_Folder / name, std::ios::binary) << content;
        return File(name);
    }

  private:
    std::filesystem::path m_Folder;
};

// ---- short of memory ----

void *NewWithoutEngines(std::size_t size) {
    if (size == sizeof(orvik_private::DictionaryReader)) {
        throw std::bad_alloc();
    }
    return ::operator new(size);
}
void *NoNew(std::size_t, std::nothrow_t const &) { return nullptr; }

TEST_F(WDictionaryTest, WithoutAnEngineItHoldsNothing) {
    KTStringDictionary *texts = nullptr;
    {
        WImportHook const hook(kLibrary, "_Znwy", &NewWithoutEngines);
        ASSERT_TRUE(hook.IsActive());
        texts = KTStringDictionary::GetStringDictionary();
    }
    ASSERT_NE(nullptr, texts);
    char const *const none = nullptr;
    EXPECT_EQ(kKTErrorNone, texts->AddString(KTString("/A"), KTString("B")));
    EXPECT_EQ(kKTErrorNone, texts->AddString("/A", "B"));
    EXPECT_EQ(kKTErrorFailed, texts->AddString("/A", none));
    EXPECT_EQ(KTString(), texts->GetKeyValue(KTString("/A"))) << "it would be here";
    EXPECT_EQ(KTString(), texts->GetKeyValue(KTString("/A=default")));
    for (bool const binary : {false, true}) {
        EXPECT_EQ(kKTErrorFailed, texts->WriteToFile(File("new"), binary));
        EXPECT_FALSE(File("new").Exists());
    }
    EXPECT_EQ(kKTErrorFailed, texts->ReadFromFile(File("text", "/A=B")));
}

TEST_F(WDictionaryTest, WithoutMemoryForTheObjectThereIsNone) {
    LogLines log;
    WImportHook const hook(kLibrary, "_ZnwyRKSt9nothrow_t", &NoNew);
    ASSERT_TRUE(hook.IsActive());
    EXPECT_EQ(nullptr, KTStringDictionary::GetStringDictionary());
    try {
        KTPublicUtils::GetStringDictionary();
        FAIL() << "there is no dictionary";
    } catch (KTLCException const &problem) {
        EXPECT_EQ(KTString("kKTErrorInternal"), problem.GetReason());
        EXPECT_EQ(159, problem.GetLine());
    }
    EXPECT_EQ((std::vector<std::string>{"Assert failed: KTStringDictionary::GetStringDictionary() at "
                                        "source/private/utils/KTPublicUtils:159"}),
              log.Take());
}

// There is no room for what is gathered before it is written. Strings have their memory from the run-time library.
void *MallocOfLittle(std::size_t size) { return size > 60'000 ? nullptr : std::malloc(size); }

TEST_F(WDictionaryTest, WithoutMemoryForWritingThereIsNoFile) {
    Texts().AddString("/A", "B");
    for (bool const binary : {false, true}) {
        WImportHook const hook(L"libstdc++-6.dll", "malloc", &MallocOfLittle);
        ASSERT_TRUE(hook.IsActive());
        EXPECT_THROW(Texts().WriteToFile(File("new"), binary), std::bad_alloc);
        EXPECT_FALSE(File("new").Exists());
    }
}

// ---- text that the system refuses ----

// Refuses text with an exclamation mark. This program's own import may be the one that is replaced.
int WINAPI RefuseText(UINT page, DWORD flags, LPCCH bytes, int count, LPWSTR units, int capacity) {
    bool const isRefused = std::string_view(bytes, static_cast<std::size_t>(count)).find('!') != std::string_view::npos;
    auto *const convert = std::bit_cast<decltype(&MultiByteToWideChar)>(
        GetProcAddress(GetModuleHandleW(L"kernel32.dll"), "MultiByteToWideChar"));
    return isRefused ? 0 : convert(page, flags, bytes, count, units, capacity);
}

constexpr char kText[] = "/Before=b\n/Refused=!\n/Behind=c\n";

// The text of "/A" is of three bytes, which are refused.
SmallFile Multibyte() {
    SmallFile file;
    file.encoding = 2;
    file.rawValues = "B!BHHH";
    file.valueOffsets = {0, 3};
    file.valueLengths = {3, 3};
    return file;
}

TEST_F(WDictionaryTest, TextThatCannotBeConvertedIsNeverThrown) {
    KTFile const text = File("text", kText);
    Texts().ReadFromFile(File("binary", Multibyte().Bytes()));
    {
        WImportHook const hook(kLibrary, "MultiByteToWideChar", &RefuseText);
        ASSERT_TRUE(hook.IsActive());
        KTErrorCodeEnum read = kKTErrorFailed;
        EXPECT_NO_THROW(read = Texts().ReadFromFile(text));
        EXPECT_EQ(kKTErrorNone, read);
        KTString found;
        EXPECT_NO_THROW(found = Texts().GetKeyValue(KTString("/A=default")));
        EXPECT_EQ(KTString("default"), found);
        EXPECT_NO_THROW(found = Texts().GetKeyValue(KTString("/A")));
        EXPECT_EQ(KTString(), found);
        EXPECT_EQ(KTString("HHH"), Texts().GetKeyValue(KTString("/Bc")));
    }
    EXPECT_EQ(KTString("B!B"), Texts().GetKeyValue(KTString("/A")));
    EXPECT_EQ(KTString("b"), Texts().GetKeyValue(KTString("/Before"))) << "what was read before it stays";
    EXPECT_EQ(KTString("none"), Texts().GetKeyValue(KTString("/Behind=none")));
}

TEST_F(WDictionaryTest, TextThatCannotBeConvertedClearsTheFlag) {
    WImportHook const hook(nullptr, "MultiByteToWideChar", &RefuseText); // of the engine in this program
    ASSERT_TRUE(hook.IsActive());
    DictionaryReader dictionary;
    Problems problems;
    ReadBytes(dictionary, kText, &problems);
    EXPECT_FALSE(dictionary.IsValid());
    EXPECT_EQ("/Before=b", List(dictionary));
    EXPECT_EQ("2:damaged:", problems.Text());
    DictionaryReader old;
    ReadBytes(old, Header(1, 5, 2).U32(1).U32(2).U32s({2, 1}).U16(548).Raw("/A!").Bytes(), &problems);
    EXPECT_FALSE(old.IsValid());
    EXPECT_EQ("2:damaged: 0:damaged:", problems.Text());
}

// ---- files ----

// Bytes that the system still takes.
DWORD g_room = 0;

BOOL WINAPI WriteUntilFull(HANDLE file, LPCVOID bytes, DWORD count, LPDWORD done, LPOVERLAPPED overlapped) {
    if (count > g_room) {
        *done = 0;
        SetLastError(ERROR_DISK_FULL);
        return FALSE;
    }
    g_room -= count;
    return WriteFile(file, bytes, count, done, overlapped);
}

TEST_F(WDictionaryTest, AFullDiskLeavesNoHalfFile) {
    for (int i = 0; i < 5000; ++i) { // several of the pieces that are written at once
        Texts().AddString(KTString(("/Key" + std::to_string(i)).c_str()), KTString("some text"));
    }
    auto const expectNoFile = [this](DWORD room) {
        for (bool const binary : {false, true}) {
            WImportHook const hook(kLibrary, "WriteFile", &WriteUntilFull);
            ASSERT_TRUE(hook.IsActive());
            g_room = room;
            testing::internal::CaptureStderr();
            EXPECT_EQ(kKTErrorNone, Texts().WriteToFile(File("new"), binary));
            testing::internal::GetCapturedStderr();
            EXPECT_FALSE(File("new").Exists()) << room;
        }
    };
    expectNoFile(0);
    expectNoFile(100'000);
    Forget();
    Texts().AddString("/A", "so little that it is written at the end");
    expectNoFile(0);
    EXPECT_EQ(kKTErrorNone, Texts().WriteToFile(File("new"), true));
    EXPECT_TRUE(File("new").Exists()) << "the name is free again";
}

// As the system does with the name of a file that has been deleted but is still open.
bool g_isListed = false;
HANDLE WINAPI DenyNewFiles(LPCWSTR name, DWORD access, DWORD share, LPSECURITY_ATTRIBUTES security, DWORD disposition,
                           DWORD flags, HANDLE from) {
    HANDLE const file = disposition != CREATE_NEW || g_isListed
                            ? CreateFileW(name, access, share, security, disposition, flags, from)
                            : INVALID_HANDLE_VALUE;
    if (disposition != CREATE_NEW) {
        return file;
    }
    if (file != INVALID_HANDLE_VALUE) {
        CloseHandle(file);
    }
    SetLastError(ERROR_ACCESS_DENIED);
    return INVALID_HANDLE_VALUE;
}

TEST_F(WDictionaryTest, ANameThatIsDeniedIsTakenIfItIsListed) {
    Texts().AddString("/A", "B");
    WImportHook const hook(kLibrary, "CreateFileW", &DenyNewFiles);
    ASSERT_TRUE(hook.IsActive());
    g_isListed = false;
    EXPECT_EQ(kKTErrorNone, Texts().WriteToFile(File("new"), true)) << "as any file that cannot be created";
    EXPECT_FALSE(File("new").Exists());
    g_isListed = true;
    EXPECT_EQ(kKTErrorFailed, Texts().WriteToFile(File("new"), true));
}

HANDLE WINAPI RefuseToMap(HANDLE, LPSECURITY_ATTRIBUTES, DWORD, DWORD, DWORD, LPCWSTR) { return nullptr; }
LPVOID WINAPI RefuseTheView(HANDLE, DWORD, DWORD, DWORD, SIZE_T) { return nullptr; }
UINT WINAPI EveryDriveIsAStick(LPCWSTR) { return DRIVE_REMOVABLE; }

class WUnmappedDictionaryTest : public WDictionaryTest {
  protected:
    // Reads a large file with the system's function replaced, and expects it to be read as a whole and free again.
    template <typename Function> void ExpectRead(char const *name, Function *replacement) {
        constexpr int kEntries = 20'000;
        auto const key = [](int i) { return KTString(("/Large/Key" + std::to_string(i)).c_str()); };
        auto const text = [](int i) { return KTString(("A text with the number " + std::to_string(i)).c_str()); };
        for (int i = 0; i < kEntries; ++i) {
            Texts().AddString(key(i), text(i));
        }
        KTFile const file = File("large");
        Texts().WriteToFile(file, true);
        ASSERT_LT(KTUInt64{1} << 20, file.GetSize());
        Forget();
        {
            WImportHook const hook(kLibrary, name, replacement);
            ASSERT_TRUE(hook.IsActive());
            EXPECT_EQ(kKTErrorNone, Texts().ReadFromFile(file));
        }
        File("large", "another"); // may be written to
        EXPECT_EQ(7U, file.GetSize());
        for (int i = 0; i < kEntries; ++i) {
            ASSERT_EQ(text(i), Texts().GetKeyValue(key(i)));
        }
    }
};

TEST_F(WUnmappedDictionaryTest, WhatCannotBeMappedIsRead) { ExpectRead("CreateFileMappingW", &RefuseToMap); }
TEST_F(WUnmappedDictionaryTest, WhatCannotBeViewedIsRead) { ExpectRead("MapViewOfFile", &RefuseTheView); }
TEST_F(WUnmappedDictionaryTest, WhatIsOnNoFixedDiskIsRead) { ExpectRead("GetDriveTypeW", &EveryDriveIsAStick); }

TEST_F(WDictionaryTest, AFileThatIsBeingWrittenIsNotRead) {
    KTFile const file = File("text", "/A=B");
    std::string const path = file.GetPathString().GetUTF8String();
    HANDLE const writer = CreateFileA(path.c_str(), GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE, nullptr,
                                      OPEN_EXISTING, 0, nullptr);
    ASSERT_NE(INVALID_HANDLE_VALUE, writer);
    EXPECT_EQ(kKTErrorNone, Texts().ReadFromFile(file));
    EXPECT_EQ(KTString("none"), Texts().GetKeyValue(KTString("/A=none")));
    CloseHandle(writer);
    EXPECT_EQ(kKTErrorNone, Texts().ReadFromFile(file));
    EXPECT_EQ(KTString("B"), Texts().GetKeyValue(KTString("/A=none")));
}

} // namespace
