// ReadCourse.cpp: the message threads that read a course, and the timers that save and show how far they are.

#include "ReadCourse.h"

#include "Autosave.h"
#include "KTThread.h"
#include "KTTimerService.h"
#include "Table.h"
#include "TextReader.h"
#include "WDisk.h"
#include "WPump.h"

#include <atomic>
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
constexpr auto kReadNext = static_cast<KT_THREAD_MESSAGE>(101);
constexpr auto kSave = static_cast<KT_THREAD_MESSAGE>(102);
constexpr auto kAllRead = static_cast<KT_THREAD_MESSAGE>(103);

constexpr long kSaveInterval = 20;     // milliseconds
constexpr long kProgressInterval = 20; // milliseconds

// What the readers share.
struct Work {
    Work(std::vector<TextResult> &allResults, RunLog &runLog) : results(allResults), log(runLog) {}

    std::vector<TextResult> &results; // each is written by the reader that took its index
    RunLog &log;
    std::atomic<std::size_t> next{0};
    Autosave autosave;
};

// A message thread that reads one file after another. Between two files it handles what else was posted: it posts the
// next step of its work to itself. The end of the object ends the thread, in the order a host must keep: quit message,
// join, and only then is what the thread uses destroyed.
class Reader : public KTThread {
  public:
    Reader(int worker, Work &work) : m_Worker(worker), m_Work(work) {
        start();
        postMessage(kBegin, 0, 0, 0, 0);
        postMessage(kReadNext, 0, 0, 0, 0);
    }
    Reader(Reader const &) = delete;
    Reader &operator=(Reader const &) = delete;
    ~Reader() override {
        postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
        join();
    }

    // Waits until this reader has found no more files to read, or has saved.
    void WaitUntilAllIsRead() { syncPostMessage(kAllRead, 0, 0, 0, 0); }
    void WaitUntilSaved() { syncPostMessage(kSave, 0, 0, 0, 0); }

    void processMessage(KTThreadMsg const &msg) override {
        if (msg.message == kBegin) {
            m_Work.log.WorkerStarted(m_Worker);
        } else if (msg.message == kReadNext) {
            ReadNext();
        } else if (msg.message == kSave) {
            m_Work.autosave.Save();
        } else if (msg.message == kAllRead) {
            while (ReadNext()) {
            }
        } else if (msg.message == KT_THREAD_MSG_QUIT) {
            m_Work.log.WorkerEnded(m_Worker, m_Files);
        }
    }

  private:
    // Whether there was one.
    bool ReadNext() {
        std::size_t const index = m_Work.next++;
        if (index >= m_Work.results.size()) {
            return false;
        }
        TextResult &result = m_Work.results[index];
        ReadOne(result);
        m_Work.autosave.Add(Printable(result.file.name) + "\t" + std::to_string(result.facts.lines) + "\t" +
                            std::to_string(result.facts.words));
        postMessage(kReadNext, 0, 0, 0, 0);
        return true;
    }

    // What left this function would end the thread, and with it the program.
    void ReadOne(TextResult &result) {
        try {
            ReadText(result, m_Worker, m_Work.log);
            ++m_Files;
        } catch (std::bad_alloc const &) {
            result.notes.emplace_back("too large for the memory");
        } catch (std::exception const &problem) {
            result.notes.emplace_back(problem.what());
        }
    }

    int m_Worker;
    Work &m_Work;
    int m_Files = 0;
};

// The library's timer service, for a scope of the thread that pumps messages.
class TimerService {
  public:
    TimerService() { KTCreateTimerService(); }
    TimerService(TimerService const &) = delete;
    TimerService &operator=(TimerService const &) = delete;
    ~TimerService() { KTDestroyTimerService(); }
};

// Shows how far the readers are, and ends the pump when all is read and saved. Called by a UI timer.
struct Progress {
    explicit Progress(Work &readersWork) : work(readersWork) {}

    Work &work;
    std::size_t shown = 0; // how often
    std::size_t lastLines = 0;

    static void Show(KTInt64 id, void *progress) { static_cast<Progress *>(progress)->Show(id); }

    void Show(KTInt64 id) {
        std::size_t const lines = work.autosave.Lines();
        if (shown == 0 || lines != lastLines) {
            ++shown;
            lastLines = lines;
            try {
                work.log.Step("progress: " + std::to_string(lines) + " of " + std::to_string(work.results.size()));
            } catch (std::bad_alloc const &) {
                lastLines = 0; // once more at the next tick: no exception may leave a timer's function
            }
        }
        if (lines == work.results.size() && work.autosave.Tried() == lines) {
            KTKillUITimer(id);
            QuitPump();
        }
    }
};

// Waits in the message pump until everything is read and saved; without the system's timers it just waits.
void WaitForReaders(Reader &first, Reader &second, Progress &progress) {
    KTInt64 saveTimer = 0;
    KTInt64 progressTimer = 0;
    KTCreateTimer(&first, kSaveInterval, &saveTimer, kSave);
    KTCreateUITimer(kProgressInterval, &progressTimer, &Progress::Show, &progress);
    if (saveTimer != 0 && progressTimer != 0) {
        PumpMessages();
    } else {
        KTKillUITimer(progressTimer);
        second.WaitUntilAllIsRead();
        first.WaitUntilAllIsRead();
        first.WaitUntilSaved();
    }
    KTKillTimer(saveTimer); // posts to a thread that is about to end
}

} // namespace

CourseReading ReadCourse(std::vector<CourseFile> const &files, RunLog &log) {
    CourseReading reading;
    for (CourseFile const &file : files) {
        if (file.kind == FileKind::Text) {
            reading.results.emplace_back().file = file;
        }
    }
    TimerService const timers;
    Work work(reading.results, log);
    Progress progress(work);
    {
        // Two, as each may hold a large file.
        Reader first(1, work);
        Reader second(2, work);
        WaitForReaders(first, second, progress);
    } // both threads have ended here
    reading.texts = work.autosave.Lines();
    reading.saved = work.autosave.Saved();
    reading.saves = work.autosave.Writes();
    reading.shown = progress.shown;
    return reading;
}
