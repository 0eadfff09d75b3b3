// WDictionaryFile.cpp: dictionary files on Windows.

#include "DictionaryFile.h"

#include "WOHandle.h"
#include "WOLongPath.h"

#include <windows.h>

#include <algorithm>
#include <utility>

namespace orvik_private {

namespace {

constexpr DWORD kMostAtOnce = DWORD{1} << 30; // one system call does not take all that memory can hold
constexpr std::size_t kPending = std::size_t{1} << 16;

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

  private:
    WOHandle m_Handle;
    std::uint64_t m_Size;
    bool m_Failed = false;
};

class FileSink final : public NewFile {
  public:
    explicit FileSink(WOHandle handle) : m_Handle(std::move(handle)) { m_Pending.reserve(kPending); }
    FileSink(FileSink const &) = delete;
    FileSink &operator=(FileSink const &) = delete;

    // Half a dictionary is worse than none, and would keep the next attempt from its name.
    ~FileSink() override {
        if (m_Handle.IsValid()) {
            FILE_DISPOSITION_INFO disposition{TRUE};
            SetFileInformationByHandle(m_Handle.Get(), FileDispositionInfo, &disposition, sizeof disposition);
        }
    }

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
    WOHandle handle(
        CreateFileW(name.c_str(), GENERIC_WRITE | DELETE, 0, nullptr, CREATE_NEW, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!handle.IsValid()) {
        isTaken = GetLastError() == ERROR_FILE_EXISTS;
        return nullptr;
    }
    return std::make_unique<FileSink>(std::move(handle));
}

} // namespace orvik_private
