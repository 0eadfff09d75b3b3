// DictionaryFile_posix.cpp: dictionary files for the native developer build, through the standard library.

#include "DictionaryFile.h"

#include <cstdio>
#include <filesystem>

namespace orvik_private {

namespace {

struct CloseFile {
    void operator()(std::FILE *file) const { static_cast<void>(std::fclose(file)); }
};
using FileHandle = std::unique_ptr<std::FILE, CloseFile>;

std::string NativeName(OPath path) {
    path.ReplaceBackSlashes();
    return path.GetString().GetUTF8();
}

class FileSource final : public ByteSource {
  public:
    FileSource(FileHandle file, std::uint64_t size) : m_File(std::move(file)), m_Size(size) {}

    std::uint64_t Size() const override { return m_Size; }
    bool Failed() const override { return std::ferror(m_File.get()) != 0; }
    std::size_t Read(void *bytes, std::size_t count) override { return std::fread(bytes, 1, count, m_File.get()); }

  private:
    FileHandle m_File;
    std::uint64_t m_Size;
};

class FileSink final : public NewFile {
  public:
    FileSink(FileHandle file, std::string name) : m_File(std::move(file)), m_Name(std::move(name)) {}
    FileSink(FileSink const &) = delete;
    FileSink &operator=(FileSink const &) = delete;
    ~FileSink() override {
        if (m_File != nullptr) {
            static_cast<void>(std::remove(m_Name.c_str()));
        }
    }

    void Write(void const *bytes, std::size_t count) override {
        if (std::fwrite(bytes, 1, count, m_File.get()) != count) {
            throw std::runtime_error("the file cannot be written");
        }
    }

    bool Finish() override {
        if (std::fflush(m_File.get()) != 0) {
            return false;
        }
        m_File.reset();
        return true;
    }

  private:
    FileHandle m_File;
    std::string m_Name;
};

} // namespace

std::unique_ptr<ByteSource> OpenDictionaryFile(OPath const &path) {
    std::string const name = NativeName(path);
    std::error_code error;
    std::uint64_t const size = std::filesystem::file_size(name, error);
    FileHandle file(error ? nullptr : std::fopen(name.c_str(), "rb"));
    return file == nullptr ? nullptr : std::make_unique<FileSource>(std::move(file), size);
}

std::unique_ptr<NewFile> CreateDictionaryFile(OPath const &path, bool &isTaken) {
    std::string const name = NativeName(path);
    FileHandle file(std::fopen(name.c_str(), "wbx"));
    isTaken = file == nullptr && std::filesystem::exists(name);
    return file == nullptr ? nullptr : std::make_unique<FileSink>(std::move(file), name);
}

} // namespace orvik_private
