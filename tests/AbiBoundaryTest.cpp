// AbiBoundaryTest.cpp: what crosses between host and library at run time: memory, objects and exceptions.

#include "KTPublic.h"
#include "VTable.h"

#include <boost/interprocess/exceptions.hpp>
#include <boost/thread/exceptions.hpp>
#include <boost/thread/lock_types.hpp>
#include <gtest/gtest.h>

#include <malloc.h>

#include <cstring>
#include <limits>
#include <memory>
#include <new>
#include <stdexcept>
#include <string>

using namespace ktabi;

namespace {

// The heap that this program's own allocations come from.
HANDLE OwnHeap() {
    return reinterpret_cast<HANDLE>(_get_heap_handle()); // NOLINT(performance-no-int-to-ptr)
}

// Whether the block lies in that heap, with room for `size` bytes.
bool IsInOwnHeap(void *block, std::size_t size) {
    return HeapValidate(OwnHeap(), 0, block) != FALSE && HeapSize(OwnHeap(), 0, block) >= size;
}

struct HostError {
    int number;
};

[[noreturn]] void ThrowHostError(char const *, char const *, char const *) { throw HostError{7}; }

class HostFile : public KTFile {
  public:
    HostFile(KTString const &path, bool &destroyed) : KTFile(path), m_Destroyed(destroyed) {}
    HostFile(HostFile const &) = delete;
    HostFile &operator=(HostFile const &) = delete;
    ~HostFile() override { m_Destroyed = true; }

  private:
    std::string m_More = std::string(100, 'x');
    bool &m_Destroyed;
};

TEST(AbiBoundaryTest, LibrarysMemoryIsFreedByTheHost) {
    for (KTUInt64 const size : {0U, 1U, 100U, 1U << 20}) {
        void *const block = Allocate(size);
        ASSERT_NE(nullptr, block);
        EXPECT_TRUE(IsInOwnHeap(block, size));
        EXPECT_EQ(0U, reinterpret_cast<std::size_t>(block) % alignof(std::max_align_t));
        std::memset(block, 0x5A, size);
        ::operator delete(block);
    }
    void *const first = Allocate(0);
    void *const second = Allocate(0);
    EXPECT_NE(first, second);
    ::operator delete(first);
    ::operator delete(second);
}

TEST(AbiBoundaryTest, HostsMemoryIsFreedByTheLibrary) {
    void *const block = ::operator new(1000);
    EXPECT_TRUE(IsInOwnHeap(block, 1000));
    Deallocate(block);
    Deallocate(nullptr);
    EXPECT_NE(FALSE, HeapValidate(OwnHeap(), 0, nullptr));
}

TEST(AbiBoundaryTest, FilesAreCreatedHereAndDestroyedThere) {
    auto *const file = new KTFile(KTString("C:\\a folder\\a name that needs memory of its own.txt"));
    EXPECT_TRUE(IsInOwnHeap(file, sizeof(KTFile)));
    // The deleting destructor is the library's own code: it destroys the text and frees the object.
    ASSERT_EQ(static_cast<void *>(ExportedTable<KTFile>()[1]), Symbol(Library(), "_ZN6KTFileD0Ev"));
    CallEntry(file, 1);

    bool destroyed = false;
    KTFile *const derived = new HostFile(KTString("C:\\another name that needs memory of its own.txt"), destroyed);
    EXPECT_TRUE(IsInOwnHeap(derived, sizeof(HostFile)));
    delete derived;
    EXPECT_TRUE(destroyed);
    EXPECT_NE(FALSE, HeapValidate(OwnHeap(), 0, nullptr));
}

TEST(AbiBoundaryTest, FilesComeFromTheLibrarysAllocation) {
    void *const block = KTFile::operator new(64);
    EXPECT_TRUE(IsInOwnHeap(block, 64));
    KTFile::operator delete(block);
    alignas(KTFile) std::byte place[sizeof(KTFile)];
    auto *const placed = new (place) KTFile(KTString("x"));
    EXPECT_EQ(static_cast<void *>(place), static_cast<void *>(placed));
    placed->~KTFile();
}

TEST(AbiBoundaryTest, TextMovesThroughTheBoundaryBothWays) {
    std::string const text(5000, 'k');
    std::unique_ptr<KTString> string;
    {
        OString const made = OString::FromUTF8(text);                      // allocated there
        string = std::make_unique<KTString>(KTFile(made).GetPathString()); // moved and copied here and there
    }
    EXPECT_EQ(text, string->GetUTF8String());
    OPath path(OString(KTUnits(5000, 'h'))); // allocated here, grown there
    path.Append(OString::FromUTF8(text));
    EXPECT_EQ(10001U, path.GetString().length());
}

TEST(AbiBoundaryTest, StandardExceptionsAreCaughtByTheirTypes) {
    KTString string("abc");
    try {
        string.at(3);
        FAIL();
    } catch (std::out_of_range const &error) {
        EXPECT_STREQ("invalid string position", error.what());
    }
    try {
        string.append(KTString::npos - 1, 'x');
        FAIL();
    } catch (std::length_error const &error) {
        EXPECT_STREQ("string too long", error.what());
    }
    EXPECT_THROW(Allocate(std::numeric_limits<KTUInt64>::max() / 2), std::bad_alloc);
    EXPECT_EQ(KTString("abc"), string);
}

TEST(AbiBoundaryTest, LockErrorsAreCaughtByTheirTypes) {
    KTMutex mutex;
    KTLock lock(mutex);
    EXPECT_THROW(lock.lock(), boost::lock_error);
    lock.unlock();
    EXPECT_THROW(lock.unlock(), boost::lock_error);
    KTRecursiveMutex recursiveMutex;
    KTRecursiveLock recursiveLock(recursiveMutex);
    EXPECT_THROW(recursiveLock.lock(), boost::lock_error);
    recursiveLock.unlock();
    EXPECT_THROW(recursiveLock.unlock(), boost::lock_error);
    EXPECT_THROW(recursiveLock.unlock(), std::exception);
}

TEST(AbiBoundaryTest, FileLockErrorsAreCaughtByTheirTypes) {
    KTString const missing("C:\\no such folder\\no such file");
    try {
        KTInterProcessFileLock const lock(missing);
        FAIL();
    } catch (boost::interprocess::interprocess_exception const &error) {
        EXPECT_EQ(ERROR_PATH_NOT_FOUND, error.get_native_error());
        EXPECT_EQ(boost::interprocess::not_found_error, error.get_error_code());
    }
    EXPECT_THROW(KTInterProcessFileLock const again(missing), std::exception);
}

// Unwinding passes the library's frames and runs what they have to clean up.
TEST(AbiBoundaryTest, HostsExceptionsPassThroughTheLibrary) {
    KTUserEventUtil::RegisterLogFunctionCallBack(&ThrowHostError);
    try {
        KTUserEventUtil::LogUserEvent("a", "b", "c");
        FAIL();
    } catch (HostError const &error) {
        EXPECT_EQ(7, error.number);
    }
}

} // namespace
