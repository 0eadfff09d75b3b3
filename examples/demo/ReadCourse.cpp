// ReadCourse.cpp: the message threads that read a course.

#include "ReadCourse.h"

#include "KTThread.h"
#include "Table.h"
#include "TextReader.h"
#include "WDisk.h"

#include <algorithm>
#include <exception>
#include <new>

namespace {

constexpr KTUInt64 kMostCaptions = 4ULL << 20; // of a caption file

KTString LastName(KTString const &name) {
    KTString::size_type const slash = name.rfind(static_cast<unsigned short>('/'));
    return slash == KTString::npos ? name : name.substr(slash + 1);
}

void ReadText(TextResult &result, int worker, RunLog &log) {
    std::string const name = Printable(result.file.name);
    DiskBytes disk = DiskRead(result.file.path, kMostBytes);
    if (!disk.problem.empty()) {
        result.notes.push_back(disk.problem);
        log.WorkerStep(worker, name, disk.problem);
        return;
    }
    bool const isCut = disk.size > disk.bytes.size();
    result.file.size = disk.size;
    log.WorkerStep(worker, name, "bytes read: " + std::to_string(disk.bytes.size()));

    DecodedText decoded = DecodeText(std::move(disk.bytes), isCut);
    result.encoding = decoded.encoding;
    result.notes = std::move(decoded.notes);
    if (isCut) {
        result.notes.push_back("only the first " + std::to_string(kMostBytes >> 20) + " MiB");
    }
    log.WorkerStep(worker, name, "encoding: " + result.encoding);

    CourseTextCollector collector;
    result.facts = ExamineText(decoded.text, [&](KTString const &line) { collector.AddLine(line); });
    result.entries = collector.TakeEntries();
    if (disk.size <= kMostCaptions) {
        result.cues = ReadCues(result.file.path);
    }
    result.shares = collector.TakeShares();
    if (result.facts.losslessPieces != result.facts.pieces) {
        result.notes.emplace_back("unpaired surrogates");
    }
    log.WorkerStep(worker, name,
                   "lines: " + std::to_string(result.facts.lines) + ", words: " + std::to_string(result.facts.words));

    result.hasFileName = LastName(result.file.name).IsPermissableFileName() != 0;
    result.numbersSurvive = NumbersSurvive(result.facts.units);
    result.isRead = true;
}

// The messages of a reader, besides the library's quit message.
constexpr auto kBegin = static_cast<KT_THREAD_MESSAGE>(100);
constexpr auto kReadFile = static_cast<KT_THREAD_MESSAGE>(101); // param1: the index of the result
constexpr auto kAllPosted = static_cast<KT_THREAD_MESSAGE>(102);

// A message thread that reads the files it is told to. The end of the object ends the thread, in the order a host must
// keep: quit message, join, and only then is what the thread uses destroyed.
class Reader : public KTThread {
  public:
    Reader(int worker, std::vector<TextResult> &results, RunLog &log)
        : m_Worker(worker), m_Results(results), m_Log(log) {
        start();
        postMessage(kBegin, 0, 0, 0, 0);
    }
    Reader(Reader const &) = delete;
    Reader &operator=(Reader const &) = delete;
    ~Reader() override {
        postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
        join();
    }

    // Waits for room where too many files wait already.
    void Read(std::size_t index) {
        while (!postMessage(kReadFile, index, 0, 0, 0)) {
            KTSleepForDuration(0, 1);
        }
    }

    // Messages are handled in their order, so all files have been read when this one has been handled.
    void WaitUntilAllAreRead() { syncPostMessage(kAllPosted, 0, 0, 0, 0); }

    void processMessage(KTThreadMsg const &msg) override {
        if (msg.message == kBegin) {
            m_Log.WorkerStarted(m_Worker);
        } else if (msg.message == kReadFile) {
            ReadOne(m_Results[msg.param1]);
        } else if (msg.message == KT_THREAD_MSG_QUIT) {
            m_Log.WorkerEnded(m_Worker, m_Files);
        }
    }

  private:
    // What left this function would end the thread, and with it the program.
    void ReadOne(TextResult &result) {
        try {
            ReadText(result, m_Worker, m_Log);
            ++m_Files;
        } catch (std::bad_alloc const &) {
            result.notes.emplace_back("too large for the memory");
        } catch (std::exception const &problem) {
            result.notes.emplace_back(problem.what());
        }
    }

    int m_Worker;
    std::vector<TextResult> &m_Results; // each reader writes to the ones it was told to only
    RunLog &m_Log;
    int m_Files = 0;
};

} // namespace

std::vector<TextResult> ReadCourse(std::vector<CourseFile> const &files, RunLog &log) {
    std::vector<TextResult> results;
    for (CourseFile const &file : files) {
        if (file.kind == FileKind::Text) {
            results.emplace_back().file = file;
        }
    }
    // Two, as each may hold a large file; they read every other file each.
    {
        Reader first(1, results, log);
        Reader second(2, results, log);
        for (std::size_t index = 0; index < results.size(); ++index) {
            (index % 2 == 0 ? first : second).Read(index);
        }
        first.WaitUntilAllAreRead();
        second.WaitUntilAllAreRead();
    } // both threads have ended here
    return results;
}
