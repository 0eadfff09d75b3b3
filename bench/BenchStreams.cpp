// BenchStreams.cpp: a million mixed records, large arrays, and whole copies through the file streams, beside serialisation
// libraries on std::fstream, std::fstream itself, and the plain system calls.

#include "Bench.h"

#include "KTStreamUtil.h"

#include <windows.h>

#include <boost/archive/binary_iarchive.hpp>
#include <boost/archive/binary_oarchive.hpp>
#include <cereal/archives/binary.hpp>
#include <cereal/types/string.hpp>

#include <cstdint>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace bench {

namespace {

constexpr char kRecords[] = "stream-records";
constexpr char kArrays[] = "stream-arrays";
constexpr char kWhole[] = "stream-whole";
constexpr char kGrowth[] = "stream-growth";
constexpr char kCereal[] = "cereal";
constexpr char kBoost[] = "Boost.Serialization";
constexpr char kFstream[] = "fstream";
constexpr char kSystem[] = "system";

constexpr unsigned int kWriteNew = 0xA;
constexpr unsigned int kRead = 0x1;
constexpr DWORD kCall = 65536;

// A file in the temporary folder, removed at the end.
class TempFile {
  public:
    explicit TempFile(std::string const &name) : m_Path(std::filesystem::temp_directory_path() / name) {}
    TempFile(TempFile const &) = delete;
    TempFile &operator=(TempFile const &) = delete;
    ~TempFile() {
        std::error_code ignored;
        std::filesystem::remove(m_Path, ignored);
    }

    std::filesystem::path const &Path() const { return m_Path; }
    KTFile File() const { return KTFile(KTString(m_Path.c_str())); }

  private:
    std::filesystem::path m_Path;
};

// ---- records ----

// What all contenders write; the text is the contender's own kind of string.
template <typename Text> struct Record {
    int number = 0;
    int kind = 0;
    std::int64_t changed = 0;
    double length = 0;
    bool isDone = false;
    Text title;
};

// Texts that a KTString holds in itself, and texts that only a std::string does: the copy that XferString returns needs
// memory of its own then.
using Titles = char const *const (&)[2];
constexpr char const *kShortTitles[2] = {"Harbour", "Pier 7"};
constexpr char const *kTitles[2] = {"Lifebuoys", "Harbour office"};

template <typename Text> Record<Text> MakeRecord(int i, Titles titles) {
    return {i, i % 7, 0x100000000LL * i + 5, i * 0.25, i % 3 == 0, Text(titles[i % 2])};
}

struct OurRecord {
    Record<KTString> values;
    KTBool16 isDone = 0;

    void Xfer(IKTStream &stream) {
        stream.XferInt32(values.number);
        stream.XferInt32(values.kind);
        long long changed = values.changed;
        values.changed = stream.XferInt64(changed);
        KTReal length = values.length;
        values.length = stream.XferRealNumber(length).AsDouble();
        stream.XferBool(isDone);
        stream.XferString(values.title, true, true);
    }
};

template <typename Archive> void Serialize(Archive &archive, Record<std::string> &record) {
    archive & record.number & record.kind & record.changed & record.length & record.isDone & record.title;
}

void WriteOurs(std::filesystem::path const &path, int count, Titles titles) {
    KTFile const file{KTString(path.c_str())};
    std::unique_ptr<IKTStream> const stream(KTStreamUtil::CreateFileStreamWrite(file, kWriteNew, 0, 0));
    OurRecord records[2] = {{MakeRecord<KTString>(0, titles)}, {MakeRecord<KTString>(1, titles)}};
    for (int i = 0; i < count; ++i) {
        OurRecord &record = records[i % 2];
        record.values.number = i;
        record.isDone = i % 3 == 0 ? 1 : 0;
        record.Xfer(*stream);
    }
}

void ReadOurs(std::filesystem::path const &path, int count) {
    KTFile const file{KTString(path.c_str())};
    std::unique_ptr<IKTStream> const stream(KTStreamUtil::CreateFileStreamRead(file, kRead, 0, 0));
    OurRecord record;
    for (int i = 0; i < count; ++i) {
        record.Xfer(*stream);
        benchmark::DoNotOptimize(record);
    }
}

// Archives and plain streams: `write` and `read` move one record.
template <typename Out, typename Write>
void WritePeers(std::filesystem::path const &path, int count, Titles titles, Write write) {
    std::ofstream file(path, std::ios::binary | std::ios::trunc);
    Out out(file);
    Record<std::string> records[2] = {MakeRecord<std::string>(0, titles), MakeRecord<std::string>(1, titles)};
    for (int i = 0; i < count; ++i) {
        Record<std::string> &record = records[i % 2];
        record.number = i;
        record.isDone = i % 3 == 0;
        write(out, record);
    }
}

template <typename In, typename Read> void ReadPeers(std::filesystem::path const &path, int count, Read read) {
    std::ifstream file(path, std::ios::binary);
    In in(file);
    Record<std::string> record;
    for (int i = 0; i < count; ++i) {
        read(in, record);
        benchmark::DoNotOptimize(record);
    }
}

struct BoostOut : boost::archive::binary_oarchive {
    explicit BoostOut(std::ostream &stream) : binary_oarchive(stream, boost::archive::no_header) {}
};
struct BoostIn : boost::archive::binary_iarchive {
    explicit BoostIn(std::istream &stream) : binary_iarchive(stream, boost::archive::no_header) {}
};

template <typename Value> void Put(std::ostream &stream, Value const &value) {
    stream.write(reinterpret_cast<char const *>(&value), sizeof value);
}
template <typename Value> void Get(std::istream &stream, Value &value) {
    stream.read(reinterpret_cast<char *>(&value), sizeof value);
}

void PutRecord(std::ostream &stream, Record<std::string> const &record) {
    Put(stream, record.number);
    Put(stream, record.kind);
    Put(stream, record.changed);
    Put(stream, record.length);
    Put(stream, static_cast<KTBool16>(record.isDone));
    Put(stream, static_cast<int>(record.title.size()));
    stream.write(record.title.data(), static_cast<std::streamsize>(record.title.size()));
}

void GetRecord(std::istream &stream, Record<std::string> &record) {
    KTBool16 isDone = 0;
    int size = 0;
    Get(stream, record.number);
    Get(stream, record.kind);
    Get(stream, record.changed);
    Get(stream, record.length);
    Get(stream, isDone);
    Get(stream, size);
    record.isDone = isDone != 0;
    record.title.resize(static_cast<std::size_t>(size));
    stream.read(record.title.data(), size);
}

using WriteJob = std::function<void(std::filesystem::path const &, int, Titles)>;
using ReadJob = std::function<void(std::filesystem::path const &, int)>;

// Each iteration makes, or reads, one file of all records.
void AddWrite(Task const &task, char const *contender, int count, Titles titles, WriteJob const &write) {
    Add(task, contender, [task, contender, count, &titles, write](benchmark::State &state) {
        TempFile const file(task.group + "-write-" + task.size + contender);
        for (auto _ : state) {
            write(file.Path(), count, titles);
        }
    });
}
void AddRead(Task const &task, char const *contender, int count, Titles titles, WriteJob const &write,
             ReadJob const &read) {
    Add(task, contender, [task, contender, count, &titles, write, read](benchmark::State &state) {
        TempFile const file(task.group + "-read-" + task.size + contender);
        write(file.Path(), count, titles);
        for (auto _ : state) {
            read(file.Path(), count);
        }
    });
}

struct Contender {
    char const *name;
    WriteJob write;
    ReadJob read;
};

std::vector<Contender> Contenders() {
    auto const serialize = [](auto &archive, auto &record) { Serialize(archive, record); };
    auto const fields = [](auto &archive, auto &record) {
        archive(record.number, record.kind, record.changed, record.length, record.isDone, record.title);
    };
    return {
        {kOurs, WriteOurs, ReadOurs},
        {kCereal,
         [fields](auto const &path, int count, Titles titles) {
             WritePeers<cereal::BinaryOutputArchive>(path, count, titles, fields);
         },
         [fields](auto const &path, int count) { ReadPeers<cereal::BinaryInputArchive>(path, count, fields); }},
        {kBoost,
         [serialize](auto const &path, int count, Titles titles) {
             WritePeers<BoostOut>(path, count, titles, serialize);
         },
         [serialize](auto const &path, int count) { ReadPeers<BoostIn>(path, count, serialize); }},
        {kFstream,
         [](auto const &path, int count, Titles titles) { WritePeers<std::ostream &>(path, count, titles, PutRecord); },
         [](auto const &path, int count) { ReadPeers<std::istream &>(path, count, GetRecord); }},
    };
}

void AddRecords() {
    constexpr int kCount = 1000000;
    for (Contender const &one : Contenders()) {
        AddWrite({kRecords, "write", "1M"}, one.name, kCount, kShortTitles, one.write);
    }
    for (Contender const &one : Contenders()) {
        AddRead({kRecords, "read", "1M"}, one.name, kCount, kShortTitles, one.write, one.read);
    }
    for (Contender const &one : Contenders()) {
        AddWrite({kRecords, "write-titles", "1M"}, one.name, kCount, kTitles, one.write);
    }
    for (Contender const &one : Contenders()) {
        AddRead({kRecords, "read-titles", "1M"}, one.name, kCount, kTitles, one.write, one.read);
    }
    struct Step {
        char const *name;
        int count;
    };
    for (Step const &step : {Step{"1x", 10000}, {"10x", 100000}, {"100x", 1000000}, {"1000x", 10000000}}) {
        AddWrite({kGrowth, "write", step.name}, kOurs, step.count, kShortTitles, WriteOurs);
        AddRead({kGrowth, "read", step.name}, kOurs, step.count, kShortTitles, WriteOurs, ReadOurs);
    }
}

// ---- arrays ----

class Handle {
  public:
    Handle(std::filesystem::path const &path, DWORD access, DWORD disposition)
        : m_Handle(CreateFileW(path.c_str(), access, FILE_SHARE_READ, nullptr, disposition, 0, nullptr)) {}
    Handle(Handle const &) = delete;
    Handle &operator=(Handle const &) = delete;
    ~Handle() { CloseHandle(m_Handle); }

    void Rewind() const { SetFilePointer(m_Handle, 0, nullptr, FILE_BEGIN); }
    DWORD Read(void *buffer) const {
        DWORD moved = 0;
        ReadFile(m_Handle, buffer, kCall, &moved, nullptr);
        return moved;
    }
    void Write(void const *buffer, DWORD size = kCall) const {
        DWORD moved = 0;
        WriteFile(m_Handle, buffer, size, &moved, nullptr);
    }

  private:
    HANDLE m_Handle;
};

constexpr int kArrayLength = 262144; // 1 MiB of integers
constexpr int kArrays16 = 16;

void AddArrays() {
    Add({kArrays, "write", "16x1M"}, kOurs, [](benchmark::State &state) {
        TempFile const file("arrays-ours");
        std::vector<int> numbers(kArrayLength, 7);
        std::unique_ptr<IKTStream> const stream(KTStreamUtil::CreateFileStreamWrite(file.File(), kWriteNew, 0, 0));
        for (auto _ : state) {
            stream->Seek(0, kKTSeekFromBeginning);
            for (int i = 0; i < kArrays16; ++i) {
                stream->XferInt32(numbers.data(), kArrayLength);
            }
        }
    });
    Add({kArrays, "write", "16x1M"}, kSystem, [](benchmark::State &state) {
        TempFile const file("arrays-system");
        std::vector<int> const numbers(kArrayLength, 7);
        Handle const handle(file.Path(), GENERIC_WRITE, CREATE_ALWAYS);
        for (auto _ : state) {
            handle.Rewind();
            for (int i = 0; i < kArrays16 * 16; ++i) {
                handle.Write(numbers.data() + static_cast<std::ptrdiff_t>(i % 16) * (kArrayLength / 16));
            }
        }
    });
    auto const fill = [](TempFile const &file) {
        std::ofstream(file.Path(), std::ios::binary) << std::string(kArrays16 << 20, 'x');
    };
    Add({kArrays, "read", "16x1M"}, kOurs, [fill](benchmark::State &state) {
        TempFile const file("arrays-ours");
        fill(file);
        std::vector<int> numbers(kArrayLength);
        std::unique_ptr<IKTStream> const stream(KTStreamUtil::CreateFileStreamRead(file.File(), kRead, 0, 0));
        for (auto _ : state) {
            stream->Seek(0, kKTSeekFromBeginning);
            for (int i = 0; i < kArrays16; ++i) {
                stream->XferInt32(numbers.data(), kArrayLength);
            }
        }
    });
    Add({kArrays, "read", "16x1M"}, kSystem, [fill](benchmark::State &state) {
        TempFile const file("arrays-system");
        fill(file);
        std::vector<int> numbers(kArrayLength);
        Handle const handle(file.Path(), GENERIC_READ, OPEN_EXISTING);
        for (auto _ : state) {
            handle.Rewind();
            for (int i = 0; i < kArrays16 * 16; ++i) {
                handle.Read(numbers.data() + static_cast<std::ptrdiff_t>(i % 16) * (kArrayLength / 16));
            }
        }
    });
}

// ---- whole streams ----

// Two files of 16 MiB with the same bytes.
struct TwoFiles {
    TwoFiles() {
        std::string const bytes(kArrays16 << 20, 'x');
        std::ofstream(first.Path(), std::ios::binary) << bytes;
        std::ofstream(second.Path(), std::ios::binary) << bytes;
    }
    TempFile first{"whole-first"};
    TempFile second{"whole-second"};
};

void AddWhole() {
    Add({kWhole, "copy", "16M"}, kOurs, [](benchmark::State &state) {
        TwoFiles const files;
        std::unique_ptr<IKTStream> const from(KTStreamUtil::CreateFileStreamRead(files.first.File(), kRead, 0, 0));
        std::unique_ptr<IKTStream> const to(KTStreamUtil::CreateFileStreamWrite(files.second.File(), 2, 0, 0));
        for (auto _ : state) {
            to->Seek(0, kKTSeekFromBeginning);
            KTStreamUtil::StreamCopy(from.get(), to.get());
        }
    });
    Add({kWhole, "copy", "16M"}, kSystem, [](benchmark::State &state) {
        TwoFiles const files;
        Handle const from(files.first.Path(), GENERIC_READ, OPEN_EXISTING);
        Handle const to(files.second.Path(), GENERIC_WRITE, OPEN_EXISTING);
        std::vector<char> buffer(kCall);
        for (auto _ : state) {
            from.Rewind();
            to.Rewind();
            while (DWORD const size = from.Read(buffer.data())) {
                to.Write(buffer.data(), size);
            }
        }
    });
    Add({kWhole, "compare", "16M"}, kOurs, [](benchmark::State &state) {
        TwoFiles const files;
        std::unique_ptr<IKTStream> const one(KTStreamUtil::CreateFileStreamRead(files.first.File(), kRead, 0, 0));
        std::unique_ptr<IKTStream> const other(KTStreamUtil::CreateFileStreamRead(files.second.File(), kRead, 0, 0));
        for (auto _ : state) {
            if (KTStreamUtil::Compare(one.get(), other.get(), KTStreamUtil::kCompareByteByByte) == 0) {
                state.SkipWithError("the files differ");
            }
        }
    });
    Add({kWhole, "compare", "16M"}, kSystem, [](benchmark::State &state) {
        TwoFiles const files;
        Handle const one(files.first.Path(), GENERIC_READ, OPEN_EXISTING);
        Handle const other(files.second.Path(), GENERIC_READ, OPEN_EXISTING);
        std::vector<char> buffers[2] = {std::vector<char>(kCall), std::vector<char>(kCall)};
        for (auto _ : state) {
            one.Rewind();
            other.Rewind();
            while (DWORD const size = one.Read(buffers[0].data())) {
                other.Read(buffers[1].data());
                benchmark::DoNotOptimize(std::memcmp(buffers[0].data(), buffers[1].data(), size));
            }
        }
    });
}

} // namespace

void AddStreamBenchmarks() {
    DescribeGroup(kRecords, "a million mixed records in a file, one field at a time");
    for (char const *const peer : {kCereal, kBoost, kFstream}) {
        ExpectSpeed(kRecords, peer, 2.0);
    }
    DescribeGroup(kArrays, "arrays of 1 MiB in a file");
    ExpectSpeed(kArrays, kSystem, 1 / 1.1);
    DescribeGroup(kWhole, "KTStreamUtil's StreamCopy and Compare beside the same work in calls of 64 KiB");
    ExpectSpeed(kWhole, kSystem, 1 / 1.5);
    DescribeGrowthGroup(kGrowth, "cost as the records grow from 10,000 to 10,000,000");
    AddRecords();
    AddArrays();
    AddWhole();
}

} // namespace bench
