// WThreadTest.cpp: threads and the system: priorities, structured exceptions, handles, memory, the debugger output.

#include "GatedThread.h"
#include "KTException.h"
#include "KTExceptionUtils.h"
#include "KTLocks.h"
#include "KTSimpleTimeKeeper.h"
#include "KTWorkerThread.h"
#include "WChildProcess.h"
#include "WHandleCount.h"
#include "WImportHook.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <atomic>
#include <cstdlib>
#include <string>

namespace {

constexpr wchar_t kLibrary[] = L"KTPublic.dll";
constexpr auto kWork = static_cast<KT_THREAD_MESSAGE>(100);
constexpr int kNone = 99;

struct PriorityRow {
    int priority;
    int expected; // the argument of SetThreadPriority; kNone: it is not called
};

constexpr PriorityRow kPriorities[] = {
    {0, THREAD_PRIORITY_LOWEST},       {1, THREAD_PRIORITY_BELOW_NORMAL}, {2, kNone},
    {3, THREAD_PRIORITY_ABOVE_NORMAL}, {4, THREAD_PRIORITY_HIGHEST},      {5, THREAD_PRIORITY_NORMAL},
    {-1, THREAD_PRIORITY_NORMAL},      {1000, THREAD_PRIORITY_NORMAL}};

std::atomic<int> setPriority{kNone};

BOOL WINAPI WatchSetThreadPriority(HANDLE thread, int priority) {
    setPriority = priority;
    return SetThreadPriority(thread, priority);
}

class PriorityTest : public testing::TestWithParam<PriorityRow> {
  protected:
    PriorityTest() { setPriority = kNone; }

    KTThreadPriorityEnum Wanted() const { return static_cast<KTThreadPriorityEnum>(GetParam().priority); }

    void ExpectPriority(int read) const {
        EXPECT_EQ(GetParam().expected, setPriority);
        EXPECT_EQ(GetParam().expected == kNone ? THREAD_PRIORITY_NORMAL : GetParam().expected, read);
    }

  private:
    WImportHook m_Hook{kLibrary, "SetThreadPriority", WatchSetThreadPriority};
};

void RunOneThread() {
    GatedThread thread;
    thread.Open();
    thread.start();
    for (int i = 0; i < 3; ++i) {
        thread.syncPostMessage(kWork, 0, 0, 0, 0);
    }
    thread.FinishAll();
}

// ---- allocations of the library, in the standard library's and the system's terms ----

std::atomic<int> allocations{0};

void *CountNew(std::size_t size) {
    ++allocations;
    return ::operator new(size);
}
void *CountMalloc(std::size_t size) {
    ++allocations;
    return std::malloc(size);
}
void *WINAPI CountHeapAlloc(HANDLE heap, DWORD flags, SIZE_T size) {
    ++allocations;
    return HeapAlloc(heap, flags, size);
}

std::string debugText;
void WINAPI KeepDebugText(char const *text) { debugText += text; }

// Counts its messages and does nothing else.
class Counter : public KTThread {
  public:
    void processMessage(KTThreadMsg const &) override {
        // Between the first and the last message of a full queue nobody waits.
        if (++count == 1) {
            atFirst = allocations;
        } else if (count == 1024) {
            atLast = allocations;
            all.Set();
        }
    }
    int count = 0;
    int atFirst = -1;
    int atLast = -2;
    Signal all;
};

// The client handler, which cannot be taken back: it lives for ever.
class StructuredWitness : public IKTExceptionHandler {
  public:
    void HandleException(KTException const &exception) override {
        if (auto const *const structured = dynamic_cast<WKTSEHException const *>(&exception)) {
            number = structured->getSENumber();
        }
    }
    std::atomic<KTUInt32> number{0};
};

} // namespace

TEST_P(PriorityTest, OfAMessageThreadIsSetBeforeItsFirstMessage) {
    int read = kNone;
    GatedThread thread(Wanted());
    thread.OnMessage([&](KTThreadMsg const &) { read = GetThreadPriority(GetCurrentThread()); });
    thread.start();
    thread.FinishAll();
    ExpectPriority(read);
}

TEST_P(PriorityTest, OfAWorkerIsSetBeforeItsWork) {
    class Worker : public KTWorkerThread {
      public:
        using KTWorkerThread::KTWorkerThread;
        void run() override { read = GetThreadPriority(GetCurrentThread()); }
        int read = kNone;
    };
    Worker worker(Wanted());
    worker.start();
    worker.join();
    ExpectPriority(worker.read);
}

INSTANTIATE_TEST_SUITE_P(All, PriorityTest, testing::ValuesIn(kPriorities),
                         [](auto const &one) { return "Row" + std::to_string(one.index); });

TEST(WThread, TheDefaultPriorityIsTheThreadsOwn) {
    WImportHook const hook(kLibrary, "SetThreadPriority", WatchSetThreadPriority);
    ASSERT_TRUE(hook.IsActive());
    setPriority = kNone;
    RunOneThread();
    EXPECT_EQ(kNone, setPriority);
}

TEST(WThread, LeavesNoHandleBehind) {
    RunOneThread();
    std::size_t const before = CountHandles();
    ASSERT_LT(0U, before);
    for (int i = 0; i < 30; ++i) {
        RunOneThread();
    }
    EXPECT_EQ(before, CountHandles());
}

TEST(WThread, PostingAndTakingAllocateNothing) {
    Counter thread;
    WImportHook const newHook(kLibrary, "_Znwy", CountNew);
    WImportHook const mallocHook(kLibrary, "malloc", CountMalloc);
    WImportHook const heapHook(kLibrary, "HeapAlloc", CountHeapAlloc);
    ASSERT_TRUE(newHook.IsActive());
    int const before = allocations;
    for (KTUInt64 i = 0; i < 1030; ++i) {
        thread.postMessage(kWork, i, 0, 0, 0);
        thread.postMessageIfNotSameAsPreviousMessage(kWork, i, 0, 0, 0);
    }
    thread.flushMessageQueueAndPostMessage(kWork, 0, 0, 0, 0);
    thread.syncPostMessage(static_cast<KT_THREAD_MESSAGE>(0), 0, 0, 0, 0);
    EXPECT_EQ(0U, thread.getPercentageOfMessageQueueThatIsOccupied());
    EXPECT_EQ(before, allocations);
    for (KTUInt64 i = 0; i < 1024; ++i) {
        thread.postMessage(kWork, i, 0, 0, 0);
    }
    EXPECT_EQ(before, allocations);
    thread.start();
    EXPECT_LT(before, allocations); // the count sees a thread being made
    EXPECT_TRUE(thread.all.IsSet());
    thread.postMessage(KT_THREAD_MSG_QUIT, 0, 0, 0, 0);
    thread.join();
    EXPECT_EQ(thread.atFirst, thread.atLast);
}

TEST(WThread, ALockLeavesTheLastErrorAlone) {
    KTMutex mutex;
    KTRecursiveMutex recursiveMutex;
    SetLastError(ERROR_DISK_FULL);
    {
        KTLock const lock(mutex);
        KTRecursiveLock const recursiveLock(recursiveMutex);
        EXPECT_EQ(static_cast<DWORD>(ERROR_DISK_FULL), GetLastError());
    }
    EXPECT_EQ(static_cast<DWORD>(ERROR_DISK_FULL), GetLastError());
}

TEST(WThread, AStructuredExceptionInTheHandlerGoesToTheExceptionHandler) {
    static StructuredWitness &witness = *new StructuredWitness;
    KTExceptionUtils::GetInstance().SetHandler(witness);
    GatedThread thread;
    thread.OnMessage([](KTThreadMsg const &) {
        volatile int *volatile nowhere = nullptr;
        *nowhere = 1;
    });
    thread.postMessage(kWork, 0, 0, 0, 0);
    thread.start();
    thread.join();
    EXPECT_EQ(0xC0000005U, witness.number);
}

TEST(WThread, DISABLED_AnExceptionLeavesAWorker) {
    class Worker : public KTWorkerThread {
        void run() override { throw 5; }
    };
    Worker worker;
    worker.start();
    worker.join();
    ExitProcess(42);
}

TEST(WThread, AnExceptionThatLeavesAWorkerEndsTheProcess) {
    WChildProcess child("WThread.DISABLED_AnExceptionLeavesAWorker");
    ASSERT_TRUE(child.Started());
    ASSERT_TRUE(child.EndsWithin(60000));
    EXPECT_NE(42U, child.ExitStatus());
    EXPECT_NE(0U, child.ExitStatus());
}

TEST(WThread, ATimeKeeperReportsToTheDebuggerOutputByDefault) {
    WImportHook const hook(kLibrary, "OutputDebugStringA", KeepDebugText);
    ASSERT_TRUE(hook.IsActive());
    debugText.clear();
    {
        KTSimpleTimeKeeper const keeper("the default");
    }
    EXPECT_EQ(0U, debugText.find("PROFILE: Time taken by the default = ")) << debugText;
    EXPECT_EQ('\n', debugText.back());
    debugText.clear();
    {
        KTSimpleTimeKeeper keeper("the default again");
        keeper.SetDumpFunction(nullptr);
        keeper.DoDumping();
        EXPECT_FALSE(debugText.empty());
        debugText.clear();
    }
    {
        KTSimpleTimeKeeper const silent;
    }
    EXPECT_EQ("", debugText);
}
