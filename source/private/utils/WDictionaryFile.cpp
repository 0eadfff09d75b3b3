// WDictionaryFile.cpp: dictionary files on Windows.

#include "DictionaryFile.h"

#include "WFileBytes.h"
#include "WOLongPath.h"

#include <windows.h>

#include <algorithm>
#include <string>
#include <string_view>
#include <utility>

namespace orvik_private {

namespace {

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

class MappableFile final : public WFileSource {
  public:
    using WFileSource::WFileSource;

    // Small files are read: that is as fast, and they are free again at once.
    std::shared_ptr<DictionaryBuffer> Map() override {
        if (Size() < kWorthMapping || !IsOnFixedDisk(Handle().Get())) {
            return nullptr;
        }
        WOHandle const section(CreateFileMappingW(Handle().Get(), nullptr, PAGE_WRITECOPY, 0, 0, nullptr));
        std::size_t const size = static_cast<std::size_t>(Size());
        std::unique_ptr<void, UnmapView> view(
            section.IsValid() ? MapViewOfFile(section.Get(), FILE_MAP_COPY, 0, 0, size) : nullptr);
        return view == nullptr ? nullptr : std::make_shared<MappedFile>(Handle(), std::move(view), size);
    }
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
        if (!WriteWhole(m_Handle, bytes, count)) {
            throw std::runtime_error("the file cannot be written");
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
    std::uint64_t size = 0;
    WOHandle handle = OpenToRead(name.c_str(), size);
    return handle.IsValid() ? std::make_unique<MappableFile>(std::move(handle), size) : nullptr;
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
