// ReadCourse.cpp: the threads that read a course.

#include "ReadCourse.h"

#include "Table.h"
#include "TextReader.h"
#include "WDisk.h"
#include "WorkQueue.h"

#include <boost/thread/thread.hpp>

#include <algorithm>
#include <new>

namespace {

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
    result.cues = collector.TakeCues();
    if (result.facts.losslessPieces != result.facts.pieces) {
        result.notes.emplace_back("unpaired surrogates");
    }
    log.WorkerStep(worker, name,
                   "lines: " + std::to_string(result.facts.lines) + ", words: " + std::to_string(result.facts.words));

    result.hasFileName = LastName(result.file.name).IsPermissableFileName() != 0;
    result.numbersSurvive = NumbersSurvive(result.facts.units);
    result.isRead = true;
}

// Threads that read until the queue is closed and empty. The end of the object closes it and waits for them.
class Workers {
  public:
    Workers(std::vector<TextResult> &results, RunLog &log) : m_Results(results), m_Log(log) {}
    Workers(Workers const &) = delete;
    Workers &operator=(Workers const &) = delete;
    // A queue that could not be closed would never let its threads end: then the process ends instead.
    ~Workers() { // NOLINT(bugprone-exception-escape)
        m_Queue.Close();
        m_Threads.join_all();
    }

    void Start(int count) {
        for (int worker = 1; worker <= count; ++worker) {
            m_Threads.create_thread([this, worker] { Run(worker); });
        }
    }

    void Push(std::size_t index) { m_Queue.Push(index); }

  private:
    void Run(int worker) {
        int files = 0;
        m_Log.WorkerStarted(worker);
        while (std::optional<std::size_t> const index = m_Queue.Pop()) {
            TextResult &result = m_Results[*index];
            try {
                ReadText(result, worker, m_Log);
                ++files;
            } catch (std::bad_alloc const &) {
                result.notes.emplace_back("too large for the memory");
            }
        }
        m_Log.WorkerEnded(worker, files);
    }

    std::vector<TextResult> &m_Results; // each worker writes to the ones it took from the queue only
    RunLog &m_Log;
    WorkQueue<std::size_t> m_Queue;
    boost::thread_group m_Threads;
};

} // namespace

std::vector<TextResult> ReadCourse(std::vector<CourseFile> const &files, RunLog &log) {
    std::vector<TextResult> results;
    for (CourseFile const &file : files) {
        if (file.kind == FileKind::Text) {
            results.emplace_back().file = file;
        }
    }
    // Two threads even on one core, so that every run shows them at work; few, as each may hold a large file.
    constexpr unsigned kFewest = 2;
    constexpr unsigned kMost = 3;
    {
        Workers workers(results, log);
        workers.Start(static_cast<int>(std::clamp(boost::thread::hardware_concurrency(), kFewest, kMost)));
        for (std::size_t index = 0; index < results.size(); ++index) {
            workers.Push(index);
        }
    } // all are read here
    return results;
}
