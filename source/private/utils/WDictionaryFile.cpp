// WDictionaryFile.cpp: dictionary files on Windows.

#include "DictionaryFile.h"

#include "WOHandle.h"
#include "WOLongPath.h"

#include <windows.h>

#include <algorithm>
#include <string>
#include <string_view>
#include <utility>

namespace orvik_private {

namespace {

constexpr DWORD kMostAtOnce = DWORD{1} << 30; // one system call does not take all that memory can hold
constexpr std::size_t kPending = std::size_t{1} << 16;
constexpr std::uint64_t kWorthMapping = std::uint64_t{1} << 20;

// Whether the file is on a disk that does not go away. Pages of a mapped file that cannot be had any more would end the
// process, as those of its program would; a file on the network or on a stick is therefore read at once.
bool IsOnFixedDisk(HANDLE file) {
    constexpr std::wstring_view kLong = L"\\\\?\\";
    std::wstring path(std::size_t{1} << 15, L'\0');
    DWORD const length = GetFinalPathNameByHandleW(file, path.data(), static_cast<DWORD>(path.size()), VOLUME_NAME_DOS);
    path.erase(std::min<std::size_t>(length, path.size()));
    if (length == 0 || !path.starts_with(kLong) || path.size() < kLong.size() + 3 || path[kLong.size() + 1] != L':') {
        return false; // such as \\?\UNC\server\share
    }
    return GetDriveTypeW(path.substr(kLong.size(), 3).c_str()) == DRIVE_FIXED;
}

struct UnmapView {
    void operator()(void *view) const { UnmapViewOfFile(view); }
};

// A view of a file, which is open for as long as it is there: nobody writes to it meanwhile.
class MappedFile final : public DictionaryBuffer {
  public:
    MappedFile(WOHandle &file, std::unique_ptr<void, UnmapView> view, std::size_t size)
        : m_File(std::move(file)), m_View(std::move(view)) {
        SetBytes(static_cast<unsigned char *>(m_View.get()), size);
    }

  private:
    WOHandle m_File;
    std::unique_ptr<void, UnmapView> m_View; // goes first
};

class FileSource final : public ByteSource {
  public:
    FileSource(WOHandle handle, std::uint64_t size) : m_Handle(std::move(handle)), m_Size(size) {}

    std::uint64_t Size() const override { return m_Size; }
    bool Failed() const override { return m_Failed; }

    std::size_t Read(void *bytes, std::size_t count) override {
        DWORD got = 0;
        DWORD const wanted = static_cast<DWORD>(std::min<std::size_t>(count, kMostAtOnce));
        if (ReadFile(m_Handle.Get(), bytes, wanted, &got, nullptr) == FALSE) {
            m_Failed = true;
            return 0;
        }
        return got;
    }

    // Small files are read: that is as fast, and they are free again at once.
    std::shared_ptr<DictionaryBuffer> Map() override {
        if (m_Size < kWorthMapping || !IsOnFixedDisk(m_Handle.Get())) {
            return nullptr;
        }
        WOHandle const section(CreateFileMappingW(m_Handle.Get(), nullptr, PAGE_WRITECOPY, 0, 0, nullptr));
        std::size_t const size = static_cast<std::size_t>(m_Size);
        std::unique_ptr<void, UnmapView> view(
            section.IsValid() ? MapViewOfFile(section.Get(), FILE_MAP_COPY, 0, 0, size) : nullptr);
        return view == nullptr ? nullptr : std::make_shared<MappedFile>(m_Handle, std::move(view), size);
    }

  private:
    WOHandle m_Handle;
    std::uint64_t m_Size;
    bool m_Failed = false;
};

class FileSink final : public NewFile {
  public:
    FileSink() { m_Pending.reserve(kPending); }
    FileSink(FileSink const &) = delete;
    FileSink &operator=(FileSink const &) = delete;

    // Half a dictionary is worse than none, and would keep the next attempt from its name.
    ~FileSink() override {
        if (m_Handle.IsValid()) {
            FILE_DISPOSITION_INFO disposition{TRUE};
            SetFileInformationByHandle(m_Handle.Get(), FileDispositionInfo, &disposition, sizeof disposition);
        }
    }

    // Takes the file, which nobody else has.
    void Own(WOHandle handle) { m_Handle = std::move(handle); }

    void Write(void const *bytes, std::size_t count) override {
        if (m_Pending.size() + count > kPending) {
            WriteOut(m_Pending.data(), m_Pending.size());
            m_Pending.clear();
        }
        if (count > kPending) {
            WriteOut(static_cast<char const *>(bytes), count);
        } else {
            m_Pending.append(static_cast<char const *>(bytes), count);
        }
    }

    bool Finish() override {
        try {
            WriteOut(m_Pending.data(), m_Pending.size());
        } catch (std::runtime_error const &) {
            return false;
        }
        m_Handle.Close();
        return true;
    }

  private:
    void WriteOut(char const *bytes, std::size_t count) {
        while (count != 0) {
            DWORD done = 0;
            DWORD const wanted = static_cast<DWORD>(std::min<std::size_t>(count, kMostAtOnce));
            if (WriteFile(m_Handle.Get(), bytes, wanted, &done, nullptr) == FALSE || done == 0) {
                throw std::runtime_error("the file cannot be written");
            }
            bytes += done;
            count -= done;
        }
    }

    WOHandle m_Handle;
    std::string m_Pending;
};

// Whether the folder lists the name. It does so for a file that has been deleted and is still open somewhere, to which the
// system denies all access.
bool IsListed(wchar_t const *name) {
    WIN32_FIND_DATAW entry{};
    HANDLE const search = FindFirstFileW(name, &entry);
    if (search == INVALID_HANDLE_VALUE) {
        return false;
    }
    FindClose(search);
    return true;
}

} // namespace

std::unique_ptr<ByteSource> OpenDictionaryFile(OPath const &path) {
    WOLongPath const name(path);
    if (!name.IsValid()) {
        return nullptr;
    }
    WOHandle handle(CreateFileW(name.c_str(), GENERIC_READ, FILE_SHARE_READ | FILE_SHARE_DELETE, nullptr, OPEN_EXISTING,
                                FILE_FLAG_SEQUENTIAL_SCAN, nullptr));
    LARGE_INTEGER size{};
    if (!handle.IsValid() || GetFileSizeEx(handle.Get(), &size) == FALSE) {
        return nullptr;
    }
    return std::make_unique<FileSource>(std::move(handle), static_cast<std::uint64_t>(size.QuadPart));
}

std::unique_ptr<NewFile> CreateDictionaryFile(OPath const &path, bool &isTaken) {
    isTaken = false;
    WOLongPath const name(path);
    if (!name.IsValid()) {
        return nullptr;
    }
    auto sink = std::make_unique<FileSink>(); // first: no file is left where there is no memory
    WOHandle handle(
        CreateFileW(name.c_str(), GENERIC_WRITE | DELETE, 0, nullptr, CREATE_NEW, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!handle.IsValid()) {
        DWORD const error = GetLastError();
        isTaken = error == ERROR_FILE_EXISTS || (error == ERROR_ACCESS_DENIED && IsListed(name.c_str()));
        return nullptr;
    }
    sink->Own(std::move(handle));
    return sink;
}

} // namespace orvik_private
