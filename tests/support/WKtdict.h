// WKtdict.h: the tool as its users meet it: a child process with arguments, judged by its exit status, what it prints
// and the files it leaves.

#pragma once

#include "DictionaryFiles.h"
#include "JsonValue.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

/// What became of one run.
struct KtdictOutcome {
    DWORD status = 0;
    std::string out;
    std::string err;

    JsonValue Json() const { return JsonReader::Read(out); }

    /// The lines of the standard output.
    std::vector<std::string> Lines() const {
        std::vector<std::string> lines;
        for (std::size_t at = 0; at < out.size();) {
            std::size_t const end = std::min(out.find('\n', at), out.size());
            lines.push_back(out.substr(at, end - at));
            at = end + 1;
        }
        return lines;
    }
};

/// Each test has a folder of its own, the current one of the tool's runs.
class KtdictTest : public testing::Test {
  protected:
    using Arguments = std::vector<std::wstring>;

    KtdictTest() {
        static std::filesystem::path const temp = std::filesystem::temp_directory_path();
        m_Folder = temp / testing::UnitTest::GetInstance()->current_test_info()->name();
        std::filesystem::remove_all(m_Folder);
        std::filesystem::create_directories(m_Folder / "work");
    }

    std::filesystem::path Path(std::wstring const &name) const { return m_Folder / "work" / name; }

    void Write(std::wstring const &name, std::string const &bytes) const {
        std::ofstream(Path(name), std::ios::binary) << bytes;
    }

    std::string Read(std::wstring const &name) const {
        std::ifstream file(Path(name), std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

    /// Names in the folder, sorted: nothing else may have been left there.
    std::vector<std::wstring> Names() const {
        std::vector<std::wstring> names;
        for (auto const &entry : std::filesystem::directory_iterator(m_Folder / "work")) {
            names.push_back(entry.path().filename().wstring());
        }
        std::sort(names.begin(), names.end());
        return names;
    }

    /// UTF-16 with its mark, as text dictionaries mostly are.
    static std::string Utf16(std::u16string_view text, bool isBig = false) {
        dictionary_files::Fields file(isBig);
        file.U16(0xFEFF);
        file.Units({reinterpret_cast<unsigned short const *>(text.data()), text.size()});
        return file.Bytes();
    }

    KtdictOutcome Run(Arguments const &arguments) const { return Run(arguments, nullptr); }

    /// The same with another standard output, which is not read.
    KtdictOutcome Run(Arguments const &arguments, HANDLE output) const {
        std::filesystem::path const outName = m_Folder / "out";
        std::filesystem::path const errName = m_Folder / "err";
        HANDLE const out = Inheritable(outName);
        HANDLE const err = Inheritable(errName);
        STARTUPINFOW startup{};
        startup.cb = sizeof startup;
        startup.dwFlags = STARTF_USESTDHANDLES;
        startup.hStdOutput = output != nullptr ? output : out;
        startup.hStdError = err;
        PROCESS_INFORMATION process{};
        std::wstring command = Quoted(Program());
        for (std::wstring const &argument : arguments) {
            command += L" " + Quoted(argument);
        }
        bool const started = CreateProcessW(nullptr, command.data(), nullptr, nullptr, TRUE, 0, nullptr,
                                            (m_Folder / "work").c_str(), &startup, &process) != FALSE;
        CloseHandle(out);
        CloseHandle(err);
        if (!started) {
            throw std::runtime_error("cannot start ktdict");
        }
        KtdictOutcome outcome;
        WaitForSingleObject(process.hProcess, INFINITE);
        GetExitCodeProcess(process.hProcess, &outcome.status);
        CloseHandle(process.hThread);
        CloseHandle(process.hProcess);
        outcome.out = ReadAll(outName);
        outcome.err = ReadAll(errName);
        return outcome;
    }

    std::filesystem::path const &Folder() const { return m_Folder; }

  private:
    static std::wstring Program() {
        std::wstring self(32768, L'\0');
        self.resize(GetModuleFileNameW(nullptr, self.data(), static_cast<DWORD>(self.size())));
        return std::filesystem::path(self).replace_filename(L"ktdict.exe").wstring();
    }

    static HANDLE Inheritable(std::filesystem::path const &path) {
        SECURITY_ATTRIBUTES inherited{sizeof inherited, nullptr, TRUE};
        return CreateFileW(path.c_str(), GENERIC_WRITE, FILE_SHARE_READ, &inherited, CREATE_ALWAYS,
                           FILE_ATTRIBUTE_NORMAL, nullptr);
    }

    static std::string ReadAll(std::filesystem::path const &path) {
        std::ifstream file(path, std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

    // As the run-time takes a command line apart: backslashes count only before a quotation mark.
    static std::wstring Quoted(std::wstring const &argument) {
        std::wstring quoted = L"\"";
        std::size_t backslashes = 0;
        for (wchar_t const letter : argument) {
            if (letter == L'"') {
                quoted.append(backslashes + 1, L'\\');
            }
            backslashes = letter == L'\\' ? backslashes + 1 : 0;
            quoted += letter;
        }
        quoted.append(backslashes, L'\\');
        return quoted + L"\"";
    }

    std::filesystem::path m_Folder;
};
