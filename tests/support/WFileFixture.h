// WFileFixture.h: a folder of its own for each test of files, and quick ways to fill it.

#pragma once

#include "KTFileUtil.h"
#include "Units.h"
#include "WOHandle.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <objbase.h>
#include <shlobj.h>

#include <bit>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

inline std::ostream &operator<<(std::ostream &out, KTPath const &path) {
    return out << path.GetPathAsKTString().GetUTF8String();
}
inline std::ostream &operator<<(std::ostream &out, KTFile const &file) {
    return out << file.GetPathString().GetUTF8String();
}

class WFileFixture : public testing::Test {
  protected:
    WFileFixture() {
        auto const *const info = testing::UnitTest::GetInstance()->current_test_info();
        m_Folder = std::filesystem::temp_directory_path() / (std::string(info->test_suite_name()) + "." + info->name());
        Clean();
        std::filesystem::create_directories(m_Folder);
    }
    ~WFileFixture() override { Clean(); }

    /// A path in the test's folder.
    KTPath Path(KTString const &name) const {
        KTPath path{KTString(m_Folder.c_str())};
        path.Append(name);
        return path;
    }

    /// The same for the system's calls; names up to the system's ordinary length.
    std::wstring Wide(KTString const &name) const { return Path(name).GetPathAsKTString().GetWstring(); }

    /// A file with that content; missing folders are made.
    KTFile File(KTString const &name, std::string const &content = "") const {
        std::filesystem::path const path = Wide(name);
        std::filesystem::create_directories(path.parent_path());
        std::ofstream(path, std::ios::binary) << content;
        return KTFile(Path(name));
    }

    KTFile Folder(KTString const &name) const {
        std::filesystem::create_directories(Wide(name));
        return KTFile(Path(name));
    }

    std::string Content(KTString const &name) const {
        std::ifstream file(std::filesystem::path(Wide(name)), std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

    /// How many entries the folder has.
    std::ptrdiff_t Count(KTString const &name) const {
        return std::distance(std::filesystem::directory_iterator(Wide(name)), {});
    }

    void MakeReadOnly(KTString const &name) const { SetFileAttributesW(Wide(name).c_str(), FILE_ATTRIBUTE_READONLY); }

    /// Opens a file, sharing nothing unless asked.
    WOHandle Hold(KTString const &name, DWORD access = GENERIC_READ, DWORD share = 0) const {
        WOHandle handle(CreateFileW(Wide(name).c_str(), access, share, nullptr, OPEN_EXISTING, 0, nullptr));
        EXPECT_TRUE(handle.IsValid());
        return handle;
    }

    void SetTimes(KTString const &name, KTUInt64 time) const {
        WOHandle const file(
            CreateFileW(Wide(name).c_str(), FILE_WRITE_ATTRIBUTES, 0, nullptr, OPEN_EXISTING, 0, nullptr));
        FILETIME const value{static_cast<DWORD>(time), static_cast<DWORD>(time >> 32)};
        ASSERT_NE(SetFileTime(file.Get(), &value, &value, &value), FALSE);
    }

    void MakeShellLink(KTString const &name, std::wstring const &target) const {
        CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED);
        IShellLinkW *link = nullptr;
        IPersistFile *file = nullptr;
        ASSERT_EQ(CoCreateInstance(CLSID_ShellLink, nullptr, CLSCTX_INPROC_SERVER, IID_IShellLinkW,
                                   reinterpret_cast<void **>(&link)),
                  S_OK);
        link->SetPath(target.c_str());
        ASSERT_EQ(link->QueryInterface(IID_IPersistFile, reinterpret_cast<void **>(&file)), S_OK);
        ASSERT_EQ(file->Save(Wide(name).c_str(), TRUE), S_OK);
        file->Release();
        link->Release();
        CoUninitialize();
    }

    static bool IsWine() { return FindUnixName() != nullptr; }

    /// Makes a link to a folder or a file: by the system's call, or under Wine, which has no links of its own, by the system
    /// around it, in the place of one that an earlier run has left. False if there is neither.
    bool MakeLink(KTString const &name, KTString const &target, bool isFolder = true) const {
        std::filesystem::path const link = Wide(name);
        if (!IsWine()) {
            return CreateSymbolicLinkW(link.c_str(), Wide(target).c_str(),
                                       isFolder ? SYMBOLIC_LINK_FLAG_DIRECTORY : 0) != FALSE;
        }
        std::string const folder = FindUnixName()(Wide(target).c_str());
        std::string const place = FindUnixName()(link.parent_path().c_str());
        std::string command =
            "cmd.exe /c start /unix /bin/ln -sfn \"" + folder + "\" \"" + place + "/" + link.filename().string() + "\"";
        STARTUPINFOA startup{};
        startup.cb = sizeof startup;
        PROCESS_INFORMATION process{};
        if (CreateProcessA(nullptr, command.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup, &process) ==
            FALSE) {
            return false;
        }
        WOHandle const started(process.hProcess);
        WOHandle const thread(process.hThread);
        WaitForSingleObject(started.Get(), 60000);
        for (int attempt = 0; attempt < 200 && !std::filesystem::exists(link); ++attempt) {
            Sleep(50); // a program of the system around Wine cannot be waited for
        }
        return std::filesystem::exists(link);
    }

  private:
    using UnixName = char *(CDECL *)(wchar_t const *);

    // Wine's own addition to the system's library; null on Windows.
    static UnixName FindUnixName() {
        return std::bit_cast<UnixName>(GetProcAddress(GetModuleHandleW(L"kernel32"), "wine_get_unix_file_name"));
    }

    void Clean() const { KTFileUtil::DeleteDirectory(KTPath(KTString(m_Folder.c_str()))); }

    std::filesystem::path m_Folder;
};
