// WFiles.cpp: files through the system's own calls, by their extended names.

#include "WFiles.h"

#include "OLongPath.h"
#include "OUtf.h"
#include "WFileBytes.h"

#include <windows.h>

#include <optional>
#include <utility>

using orvik_private::ByteSource;
using orvik_private::OpenToRead;
using orvik_private::WFileSource;
using orvik_private::WriteWhole;

namespace {

constexpr std::size_t kPending = std::size_t{1} << 16;

std::string ToUtf8(std::wstring const &text) {
    KTUnits const units = OWideToUnits(text.data(), text.size());
    return OUnitsToUtf8(units.data(), units.size());
}

std::string ErrorText(DWORD error) {
    wchar_t text[512];
    DWORD length = FormatMessageW(FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS, nullptr, error, 0, text,
                                  static_cast<DWORD>(std::size(text)), nullptr);
    while (length != 0 && (text[length - 1] == L'\n' || text[length - 1] == L'\r' || text[length - 1] == L'.')) {
        --length;
    }
    return length == 0 ? "system error " + std::to_string(error) : ToUtf8(std::wstring(text, length));
}

class SystemFolders final : public OCurrentFolders {
  public:
    KTUnits Get(unsigned short drive) const override {
        wchar_t const ofDrive[] = {static_cast<wchar_t>(drive), L':', 0};
        std::wstring folder(32768, L'\0'); // the longest there is
        DWORD const length =
            GetFullPathNameW(drive == 0 ? L"." : ofDrive, static_cast<DWORD>(folder.size()), folder.data(), nullptr);
        return length < folder.size() ? OWideToUnits(folder.data(), length) : KTUnits();
    }
};

// The name that system calls take, without a limit of 260 characters; empty for what is no path.
std::wstring SystemName(std::string const &path) {
    std::optional<KTUnits> const full = OMakeFullPath(OUtf8ToUnits(path), SystemFolders());
    if (!full || full->empty()) {
        return {};
    }
    std::wstring name = OUnitsToWide(full->data(), full->size());
    if (name.starts_with(L"\\\\?\\")) {
        return name;
    }
    return name.starts_with(L"\\\\") ? L"\\\\?\\UNC\\" + name.substr(2) : L"\\\\?\\" + name;
}

std::unique_ptr<ByteSource> Open(std::wstring const &name, std::string &why) {
    std::uint64_t size = 0;
    WOHandle handle = OpenToRead(name.c_str(), size);
    if (!handle.IsValid()) {
        why = ErrorText(GetLastError());
        return nullptr;
    }
    return std::make_unique<WFileSource>(std::move(handle), size);
}

class TemporaryOutput final : public OutputFile {
  public:
    TemporaryOutput(WOHandle handle, std::wstring name, std::wstring target)
        : m_Handle(std::move(handle)), m_Name(std::move(name)), m_Target(std::move(target)) {}
    TemporaryOutput(TemporaryOutput const &) = delete;
    TemporaryOutput &operator=(TemporaryOutput const &) = delete;

    ~TemporaryOutput() override {
        m_Handle.Close();
        if (!m_Name.empty()) {
            DeleteFileW(m_Name.c_str());
        }
    }

    void Write(void const *bytes, std::size_t count) override {
        m_Pending.append(static_cast<char const *>(bytes), count);
        if (m_Pending.size() >= kPending) {
            WriteOut();
        }
    }

    bool Close(std::string &why) override {
        try {
            WriteOut();
        } catch (std::runtime_error const &error) {
            why = error.what();
            return false;
        }
        if (FlushFileBuffers(m_Handle.Get()) == FALSE) {
            why = ErrorText(GetLastError());
            return false;
        }
        m_Handle.Close();
        return true;
    }

    std::unique_ptr<ByteSource> Reopen(std::string &why) const override { return Open(m_Name, why); }

    bool Publish(bool overwrites, std::string &why) override {
        DWORD const flags = MOVEFILE_WRITE_THROUGH | (overwrites ? DWORD{MOVEFILE_REPLACE_EXISTING} : 0);
        if (MoveFileExW(m_Name.c_str(), m_Target.c_str(), flags) == FALSE) {
            why = ErrorText(GetLastError());
            return false;
        }
        m_Name.clear();
        return true;
    }

  private:
    void WriteOut() {
        if (!WriteWhole(m_Handle, m_Pending.data(), m_Pending.size())) {
            throw std::runtime_error(ErrorText(GetLastError()));
        }
        m_Pending.clear();
    }

    WOHandle m_Handle;
    std::wstring m_Name; // empty once it has the target's
    std::wstring m_Target;
    std::string m_Pending;
};

WOHandle OpenToIdentify(std::string const &path) {
    std::wstring const name = SystemName(path);
    constexpr DWORD kShareAll = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;
    return WOHandle(name.empty() ? INVALID_HANDLE_VALUE
                                 : CreateFileW(name.c_str(), FILE_READ_ATTRIBUTES, kShareAll, nullptr, OPEN_EXISTING,
                                               FILE_FLAG_BACKUP_SEMANTICS, nullptr));
}

} // namespace

std::unique_ptr<ByteSource> OpenInput(std::string const &path, std::string &why) {
    std::wstring const name = SystemName(path);
    if (name.empty()) {
        why = ErrorText(ERROR_INVALID_NAME);
        return nullptr;
    }
    return Open(name, why);
}

bool IsThere(std::string const &path) {
    std::wstring const name = SystemName(path);
    return !name.empty() && GetFileAttributesW(name.c_str()) != INVALID_FILE_ATTRIBUTES;
}

bool AreSameFile(std::string const &a, std::string const &b) {
    WOHandle const first = OpenToIdentify(a);
    WOHandle const second = OpenToIdentify(b);
    BY_HANDLE_FILE_INFORMATION one{};
    BY_HANDLE_FILE_INFORMATION other{};
    return first.IsValid() && second.IsValid() && GetFileInformationByHandle(first.Get(), &one) != FALSE &&
           GetFileInformationByHandle(second.Get(), &other) != FALSE &&
           one.dwVolumeSerialNumber == other.dwVolumeSerialNumber && one.nFileIndexHigh == other.nFileIndexHigh &&
           one.nFileIndexLow == other.nFileIndexLow;
}

std::unique_ptr<OutputFile> OutputFile::Create(std::string const &target, std::string &why) {
    std::wstring const name = SystemName(target);
    if (name.empty()) {
        why = ErrorText(ERROR_INVALID_NAME);
        return nullptr;
    }
    // The name is short whatever the target's is: both may be as long as the disk allows.
    std::wstring const stem =
        name.substr(0, name.rfind(L'\\') + 1) + L"ktdict-" + std::to_wstring(GetCurrentProcessId());
    for (unsigned attempt = 0;; ++attempt) {
        std::wstring temporary = stem + L"-" + std::to_wstring(attempt) + L".tmp";
        WOHandle handle(
            CreateFileW(temporary.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW, FILE_ATTRIBUTE_NORMAL, nullptr));
        if (handle.IsValid()) {
            return std::make_unique<TemporaryOutput>(std::move(handle), std::move(temporary), name);
        }
        constexpr unsigned kAttempts = 1000; // left over from processes that were ended
        if (GetLastError() != ERROR_FILE_EXISTS || attempt == kAttempts) {
            why = ErrorText(GetLastError());
            return nullptr;
        }
    }
}
