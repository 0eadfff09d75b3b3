// AbiTest.cpp: the virtual tables of the exported classes: which function stands in which entry, how long each table
// is, and that a class derived by the host takes part.
//
// A new class with virtual functions is one more line of kTables. Slots are listed in the order that hosts rely on,
// written down here and not derived from the headers.

#include "KTPublic.h"
#include "MailDictionary.h"
#include "VTable.h"

#include <gtest/gtest.h>

#include <memory>
#include <new>
#include <utility>

using namespace ktabi;

namespace {

VTableRow const kTables[] = {
    VTableOf<KTLogger>(
        {"pure", "pure", "KTLogger::Log(std::string const&)", "KTLogger::Log(char const*, ...)", "pure ~"}),
    VTableOf<WKTLogger>({"WKTLogger::Log(std::wstring const&)", "WKTLogger::Log(wchar_t const*, ...)",
                         "WKTLogger::Log(std::string const&)", "KTLogger::Log(char const*, ...)", "~"}),
    VTableOf<KTSendMail>({"pure", "pure ~"}),
    VTableOf<WKTSendMail>({"WKTSendMail::SendMail()", "~"}),
    VTableOf<KTPath>({"~"}),
    VTableOf<KTTime>({"~"}),
    VTableOf<KTDuration>({"~", "KTDuration::GetTime() const", "KTDuration::GetTimeInDeciSeconds() const",
                          "KTDuration::GetTimeWithFullPrecision() const", "KTDuration::SetTime(KTReal)",
                          "KTDuration::SetDurationUnitOfMeasure(KTDurationUnitOfMeasure)",
                          "KTDuration::GetDurationUnitOfMeasure() const"}),
    VTableOf<KTColor>(
        {"~", "KTColor::GetResultantARGB(KTARGB&) const", "KTColor::GetARGB(KTARGB&) const",
         "KTColor::GetAlpha() const", "KTColor::SetAlpha(KTReal const&)", "KTColor::GetResultantAlpha() const",
         "KTColor::GetTransparencyFactor()", "KTColor::SetTransparencyFactor(KTReal const&)",
         "KTColor::GetColorSpace() const", "KTColor::GetColorData() const", "KTColor::GetNumComponents() const",
         "KTColor::GetNthComponent(int) const", "KTColor::SetColorSpace(KTColor::ColorSpaceEnum)",
         "KTColor::SetColorData(KTColor::ColorSpaceEnum, std::vector<KTReal, std::allocator<KTReal> > const&)",
         "KTColor::SetColorData(std::vector<KTReal, std::allocator<KTReal> > const&)",
         "KTColor::IsEqual(KTColor const*) const"}),
    VTableOf<KTTextureManager>({"pure ~", "pure", "pure", "pure"}),
    VTableOf<IKTRenderer>({"pure ~", "pure", "pure"}),
    VTableOf<KTFile>({"~", "KTFile::PathChanged(OString const&)"}),
    VTableOf<IKTStringDictionary>({"pure ~", "pure", "pure", "pure", "pure", "pure"}),
    VTableOf<KTStringDictionary>(
        {"~", "KTStringDictionary::AddString(KTString const&, KTString const&)",
         "KTStringDictionary::AddString(char const*, char const*)", "KTStringDictionary::GetKeyValue(KTString const&)",
         "KTStringDictionary::WriteToFile(KTFile const&, bool)", "KTStringDictionary::ReadFromFile(KTFile const&)"}),
    VTableOf<KTMutex>({"~"}),
    VTableOf<KTRecursiveMutex>({"~"}),
    VTableOf<KTLock>({"~"}),
    VTableOf<KTRecursiveLock>({"~"}),
    VTableOf<KTCondition>({"~"}),
    VTableOf<KTScrapDataFlavor>({"~"}),
    VTableOf<KTInterProcessFileLock>({"~"}),
    VTableOf<IKTXferBytes>({"pure ~", "pure", "pure", "pure", "pure", "pure", "pure", "pure"}),
    VTableOf<MemXferBytes>({"~", "MemXferBytes::Read(void*, unsigned int)", "MemXferBytes::Write(void*, unsigned int)",
                            "MemXferBytes::Seek(int, KTSeekFromWhere)", "MemXferBytes::Tell()", "MemXferBytes::Flush()",
                            "MemXferBytes::GetStreamState()", "MemXferBytes::SetEndOfStream()"}),
    VTableOf<FileXferBytes>(
        {"~", "FileXferBytes::Read(void*, unsigned int)", "FileXferBytes::Write(void*, unsigned int)",
         "FileXferBytes::Seek(int, KTSeekFromWhere)", "FileXferBytes::Tell()", "FileXferBytes::Flush()",
         "FileXferBytes::GetStreamState()", "FileXferBytes::SetEndOfStream()",
         "FileXferBytes::Open(KTFile const&, unsigned int, unsigned int, unsigned int)", "FileXferBytes::Close()"}),
    VTableOf<TempFileXferBytes>(
        {"~", "FileXferBytes::Read(void*, unsigned int)", "FileXferBytes::Write(void*, unsigned int)",
         "FileXferBytes::Seek(int, KTSeekFromWhere)", "FileXferBytes::Tell()", "FileXferBytes::Flush()",
         "FileXferBytes::GetStreamState()", "FileXferBytes::SetEndOfStream()",
         "FileXferBytes::Open(KTFile const&, unsigned int, unsigned int, unsigned int)", "FileXferBytes::Close()"}),
    VTableOf<IKTStream>({"pure ~", "pure", "pure", "pure", "pure", "pure", "pure", "pure", "pure", "pure",
                         "pure",   "pure", "pure", "pure", "pure", "pure", "pure", "pure", "pure", "pure",
                         "pure",   "pure", "pure", "pure", "pure", "pure", "pure", "pure", "pure"}),
    VTableOf<CKTStreamRead>({"~",
                             "CKTStreamRead::XferByte(unsigned char*, int)",
                             "CKTStreamRead::XferByte(unsigned char&)",
                             "CKTStreamRead::XferString(KTString&, bool, bool)",
                             "CKTStreamRead::XferBool(short*, int)",
                             "CKTStreamRead::XferBool(short&)",
                             "CKTStreamRead::XferInt16(short*, int)",
                             "CKTStreamRead::XferInt16(short&)",
                             "CKTStreamRead::XferInt32(int*, int)",
                             "CKTStreamRead::XferInt32(int&)",
                             "CKTStreamRead::XferInt64(long long&)",
                             "CKTStreamRead::XferID(int*, int)",
                             "CKTStreamRead::XferID(int&)",
                             "CKTStreamRead::XferPropertyID(int*, int)",
                             "CKTStreamRead::XferPropertyID(int&)",
                             "CKTStreamRead::XferRealNumber(KTReal*, int)",
                             "CKTStreamRead::XferRealNumber(KTReal&)",
                             "CKTStreamRead::Comment(char*)",
                             "CKTStreamRead::Seek(int, KTSeekFromWhere)",
                             "CKTStreamRead::Tell()",
                             "CKTStreamRead::SetEndOfStream()",
                             "CKTStreamRead::Flush()",
                             "CKTStreamRead::GetStreamState()",
                             "CKTStreamRead::IsReading() const",
                             "CKTStreamRead::IsWriting() const",
                             "CKTStreamRead::SetSwapping(short)",
                             "CKTStreamRead::GetSwapping() const",
                             "CKTStreamRead::Open()",
                             "CKTStreamRead::Close()"}),
    VTableOf<CKTStreamWrite>({"~",
                              "CKTStreamWrite::XferByte(unsigned char*, int)",
                              "CKTStreamWrite::XferByte(unsigned char&)",
                              "CKTStreamWrite::XferString(KTString&, bool, bool)",
                              "CKTStreamWrite::XferBool(short*, int)",
                              "CKTStreamWrite::XferBool(short&)",
                              "CKTStreamWrite::XferInt16(short*, int)",
                              "CKTStreamWrite::XferInt16(short&)",
                              "CKTStreamWrite::XferInt32(int*, int)",
                              "CKTStreamWrite::XferInt32(int&)",
                              "CKTStreamWrite::XferInt64(long long&)",
                              "CKTStreamWrite::XferID(int*, int)",
                              "CKTStreamWrite::XferID(int&)",
                              "CKTStreamWrite::XferPropertyID(int*, int)",
                              "CKTStreamWrite::XferPropertyID(int&)",
                              "CKTStreamWrite::XferRealNumber(KTReal*, int)",
                              "CKTStreamWrite::XferRealNumber(KTReal&)",
                              "CKTStreamWrite::Comment(char*)",
                              "CKTStreamWrite::Seek(int, KTSeekFromWhere)",
                              "CKTStreamWrite::Tell()",
                              "CKTStreamWrite::SetEndOfStream()",
                              "CKTStreamWrite::Flush()",
                              "CKTStreamWrite::GetStreamState()",
                              "CKTStreamWrite::IsReading() const",
                              "CKTStreamWrite::IsWriting() const",
                              "CKTStreamWrite::SetSwapping(short)",
                              "CKTStreamWrite::GetSwapping() const",
                              "CKTStreamWrite::Open()",
                              "CKTStreamWrite::Close()"}),
    VTableOf<IKTReadWriteStream>({"pure ~", "pure", "pure", "pure", "pure", "pure", "pure", "pure",
                                  "pure",   "pure", "pure", "pure", "pure", "pure", "pure", "pure",
                                  "pure",   "pure", "pure", "pure", "pure", "pure", "pure", "pure",
                                  "pure",   "pure", "pure", "pure", "pure", "pure", "pure"}),
    VTableOf<CKTStreamReadWrite>({"~",
                                  "CKTStreamReadWrite::XferByte(unsigned char*, int)",
                                  "CKTStreamReadWrite::XferByte(unsigned char&)",
                                  "CKTStreamReadWrite::XferString(KTString&, bool, bool)",
                                  "CKTStreamReadWrite::XferBool(short*, int)",
                                  "CKTStreamReadWrite::XferBool(short&)",
                                  "CKTStreamReadWrite::XferInt16(short*, int)",
                                  "CKTStreamReadWrite::XferInt16(short&)",
                                  "CKTStreamReadWrite::XferInt32(int*, int)",
                                  "CKTStreamReadWrite::XferInt32(int&)",
                                  "CKTStreamReadWrite::XferInt64(long long&)",
                                  "CKTStreamReadWrite::XferID(int*, int)",
                                  "CKTStreamReadWrite::XferID(int&)",
                                  "CKTStreamReadWrite::XferPropertyID(int*, int)",
                                  "CKTStreamReadWrite::XferPropertyID(int&)",
                                  "CKTStreamReadWrite::XferRealNumber(KTReal*, int)",
                                  "CKTStreamReadWrite::XferRealNumber(KTReal&)",
                                  "CKTStreamReadWrite::Comment(char*)",
                                  "CKTStreamReadWrite::Seek(int, KTSeekFromWhere)",
                                  "CKTStreamReadWrite::Tell()",
                                  "CKTStreamReadWrite::SetEndOfStream()",
                                  "CKTStreamReadWrite::Flush()",
                                  "CKTStreamReadWrite::GetStreamState()",
                                  "CKTStreamReadWrite::IsReading() const",
                                  "CKTStreamReadWrite::IsWriting() const",
                                  "CKTStreamReadWrite::SetSwapping(short)",
                                  "CKTStreamReadWrite::GetSwapping() const",
                                  "CKTStreamReadWrite::Open()",
                                  "CKTStreamReadWrite::Close()",
                                  "CKTStreamReadWrite::SetMode(IKTReadWriteStream::Mode)",
                                  "CKTStreamReadWrite::GetMode() const",
                                  "CKTStreamReadWrite::Destroy()"}),
    VTableOf<CKTTempFileStreamReadWrite>({"~",
                                          "CKTStreamReadWrite::XferByte(unsigned char*, int)",
                                          "CKTStreamReadWrite::XferByte(unsigned char&)",
                                          "CKTStreamReadWrite::XferString(KTString&, bool, bool)",
                                          "CKTStreamReadWrite::XferBool(short*, int)",
                                          "CKTStreamReadWrite::XferBool(short&)",
                                          "CKTStreamReadWrite::XferInt16(short*, int)",
                                          "CKTStreamReadWrite::XferInt16(short&)",
                                          "CKTStreamReadWrite::XferInt32(int*, int)",
                                          "CKTStreamReadWrite::XferInt32(int&)",
                                          "CKTStreamReadWrite::XferInt64(long long&)",
                                          "CKTStreamReadWrite::XferID(int*, int)",
                                          "CKTStreamReadWrite::XferID(int&)",
                                          "CKTStreamReadWrite::XferPropertyID(int*, int)",
                                          "CKTStreamReadWrite::XferPropertyID(int&)",
                                          "CKTStreamReadWrite::XferRealNumber(KTReal*, int)",
                                          "CKTStreamReadWrite::XferRealNumber(KTReal&)",
                                          "CKTStreamReadWrite::Comment(char*)",
                                          "CKTStreamReadWrite::Seek(int, KTSeekFromWhere)",
                                          "CKTStreamReadWrite::Tell()",
                                          "CKTStreamReadWrite::SetEndOfStream()",
                                          "CKTStreamReadWrite::Flush()",
                                          "CKTStreamReadWrite::GetStreamState()",
                                          "CKTStreamReadWrite::IsReading() const",
                                          "CKTStreamReadWrite::IsWriting() const",
                                          "CKTStreamReadWrite::SetSwapping(short)",
                                          "CKTStreamReadWrite::GetSwapping() const",
                                          "CKTStreamReadWrite::Open()",
                                          "CKTStreamReadWrite::Close()",
                                          "CKTStreamReadWrite::SetMode(IKTReadWriteStream::Mode)",
                                          "CKTStreamReadWrite::GetMode() const",
                                          "CKTStreamReadWrite::Destroy()"}),
    VTableOf<IKTDataProvider>({"pure ~", "pure", "pure", "pure"}),
    VTableOf<KTMemoryDataProvider>(
        {"~", "KTMemoryDataProvider::GetDataSize() const",
         "KTMemoryDataProvider::GetNextData(unsigned long long, void**, unsigned long long&)",
         "KTMemoryDataProvider::FreeDataMemory(void*)"}),
    VTableOf<IKTGeneralProgressCallBack>(
        {"pure ~", "pure", "pure", "pure", "pure", "pure", "pure", "pure", "pure", "pure", "pure", "pure"}),
    VTableOf<KTException>({"~", "KTException::what() const", "KTException::What() const"}),
    VTableOf<KTFatalException>({"~", "KTException::what() const", "KTException::What() const"}),
    VTableOf<KTNonFatalException>({"~", "KTException::what() const", "KTException::What() const"}),
    VTableOf<WKTSEHException>({"~", "KTException::what() const", "KTException::What() const"}),
    VTableOf<KTLCException>({"~", "std::exception::what() const"}),
    VTableOf<IKTExceptionHandler>({"pure", "pure ~"}),
    VTableOf<KTExceptionUtils>({"pure ~", "pure", "pure", "pure"}),
    VTableOf<WKTExceptionUtils>({"~", "WKTExceptionUtils::InstallExceptionHandlerImpl()",
                                 "WKTExceptionUtils::DefaultHandler(KTException const&)",
                                 "WKTExceptionUtils::RestorePreviousHandler() const"}),
    VTableOf<KTThread>({"pure ~",
                        "KTThread::flushMessageQueueAndSyncPostMessage(KT_THREAD_MESSAGE, unsigned long long, unsigned "
                        "long long, unsigned long long, unsigned long long)",
                        "pure"}),
    VTableOf<KTWorkerThread>({"pure ~", "pure"}),
    VTableOf<KTTimerService>({"~", "KTTimerService::run()"}),
    VTableOf<KTStateMachine>({"KTStateMachine::Get() const", "KTStateMachine::Validate(int) const", "~"}),
};

constexpr std::size_t kCompleteDestructor = 0; // entries of a class whose first slot is its destructor
constexpr std::size_t kDeletingDestructor = 1;
constexpr std::size_t kLoggerDestructor = 4;

// Derived from an exported class as a host would; says when its own destructor runs.
template <typename Base> class Watched : public Base {
  public:
    template <typename... Arguments> explicit Watched(bool &destroyed, Arguments &&...arguments)
        : Base(std::forward<Arguments>(arguments)...), m_Destroyed(destroyed) {}
    Watched(Watched const &) = delete;
    Watched &operator=(Watched const &) = delete;
    ~Watched() override { m_Destroyed = true; }

  private:
    bool &m_Destroyed;
};

// Destroys one derived object by each of the first two entries.
template <typename Base, typename... Arguments> void ExpectDestructorFirst(Arguments &&...arguments) {
    using Derived = Watched<Base>;
    bool destroyed = false;
    alignas(Derived) std::byte place[sizeof(Derived)];
    Base *const placed = ::new (place) Derived(destroyed, arguments...);
    CallEntry(placed, kCompleteDestructor);
    EXPECT_TRUE(destroyed) << typeid(Base).name();

    destroyed = false;
    Base *const allocated = new Derived(destroyed, arguments...);
    CallEntry(allocated, kDeletingDestructor);
    EXPECT_TRUE(destroyed) << typeid(Base).name();
}

// A host's logger: keeps what it is given instead of writing it.
class HostLogger : public KTLogger {
  public:
    explicit HostLogger(bool &destroyed) : m_Destroyed(destroyed) {}
    HostLogger(HostLogger const &) = delete;
    HostLogger &operator=(HostLogger const &) = delete;
    ~HostLogger() override { m_Destroyed = true; }

    using KTLogger::Log;
    void Log(std::wstring const &) override { last = "wide text"; }
    void Log(wchar_t const *const, ...) override { last = "wide format"; }
    void Log(std::string const &message) override { last = message; }

    std::string last;

  private:
    bool &m_Destroyed;
};

class VTableTest : public testing::TestWithParam<VTableRow> {};

TEST_P(VTableTest, HoldsTheSlotsInOrderAndNothingElse) { EXPECT_EQ("", CheckVTable(GetParam())); }

INSTANTIATE_TEST_SUITE_P(AbiTest, VTableTest, testing::ValuesIn(kTables),
                         [](auto const &one) { return "Class" + one.param.mangledClass; });

TEST(AbiTest, ObjectsPointToTheLibrarysTables) {
    KTMutex mutex;
    KTRecursiveMutex recursiveMutex;
    KTLock const lock(mutex);
    KTRecursiveLock const recursiveLock(recursiveMutex);
    KTCondition const condition;
    KTPath const path;
    KTFile const file;
    KTTime const time;
    KTDuration const duration;
    KTScrapDataFlavor const flavor;
    EXPECT_EQ(ExportedTable<KTMutex>(), TableOfObject(&mutex));
    EXPECT_EQ(ExportedTable<KTRecursiveMutex>(), TableOfObject(&recursiveMutex));
    EXPECT_EQ(ExportedTable<KTLock>(), TableOfObject(&lock));
    EXPECT_EQ(ExportedTable<KTRecursiveLock>(), TableOfObject(&recursiveLock));
    EXPECT_EQ(ExportedTable<KTCondition>(), TableOfObject(&condition));
    EXPECT_EQ(ExportedTable<KTPath>(), TableOfObject(&path));
    EXPECT_EQ(ExportedTable<KTFile>(), TableOfObject(&file));
    EXPECT_EQ(ExportedTable<KTTime>(), TableOfObject(&time));
    EXPECT_EQ(ExportedTable<KTDuration>(), TableOfObject(&duration));
    EXPECT_EQ(ExportedTable<KTScrapDataFlavor>(), TableOfObject(&flavor));
    EXPECT_EQ(ExportedTable<WKTLogger>(), TableOfObject(gKTLogger));
    EXPECT_EQ(ExportedTable<WKTExceptionUtils>(), TableOfObject(&KTExceptionUtils::GetInstance()));
}

TEST(AbiTest, SendingIsTheMailSendersFirstSlot) {
    MailDictionary dictionary;
    std::unique_ptr<KTSendMail> const mail(KTSendMail::GetSendMailHandler(dictionary));
    EXPECT_EQ(ExportedTable<WKTSendMail>(), TableOfObject(mail.get()));
    EXPECT_EQ(0U, EntryOf(&KTSendMail::SendMail));
    EXPECT_EQ(0U, EntryOf(&WKTSendMail::SendMail));
}

// The header's declarations give hosts' calls their entries, so they must count as the library does.
TEST(AbiTest, HostsCallTheLoggersSlotsByTheSameEntries) {
    EXPECT_EQ(0U, EntryOf<void (KTLogger::*)(std::wstring const &)>(&KTLogger::Log));
    EXPECT_EQ(1U, EntryOf<void (KTLogger::*)(wchar_t const *, ...)>(&KTLogger::Log));
    EXPECT_EQ(2U, EntryOf<void (KTLogger::*)(std::string const &)>(&KTLogger::Log));
    EXPECT_EQ(3U, EntryOf<void (KTLogger::*)(char const *, ...)>(&KTLogger::Log));
}

TEST(AbiTest, LibraryCallsTheRenderersSlotsByTheseEntries) {
    EXPECT_EQ(2U, EntryOf(&KTTextureManager::GetMaxTextureSize));
    EXPECT_EQ(3U, EntryOf(&KTTextureManager::LoadTexture));
    EXPECT_EQ(4U, EntryOf(&KTTextureManager::ReleaseTexture));
    EXPECT_EQ(2U, EntryOf(&IKTRenderer::IsFeatureSupported));
    EXPECT_EQ(3U, EntryOf(&IKTRenderer::GetTextureManager));
}

TEST(AbiTest, DerivedDestructorsRunThroughTheFirstSlot) {
    KTMutex mutex;
    KTRecursiveMutex recursiveMutex;
    ExpectDestructorFirst<KTPath>();
    ExpectDestructorFirst<KTFile>();
    ExpectDestructorFirst<KTTime>();
    ExpectDestructorFirst<KTDuration>();
    ExpectDestructorFirst<KTColor>();
    ExpectDestructorFirst<KTScrapDataFlavor>();
    ExpectDestructorFirst<KTMutex>();
    ExpectDestructorFirst<KTRecursiveMutex>();
    ExpectDestructorFirst<KTLock>(mutex);
    ExpectDestructorFirst<KTRecursiveLock>(recursiveMutex);
    ExpectDestructorFirst<KTCondition>();
    ExpectDestructorFirst<MemXferBytes>();
    ExpectDestructorFirst<FileXferBytes>();
    ExpectDestructorFirst<TempFileXferBytes>();
    ExpectDestructorFirst<CKTStreamRead>();
    ExpectDestructorFirst<CKTStreamWrite>();
    ExpectDestructorFirst<CKTStreamReadWrite>();
    ExpectDestructorFirst<CKTTempFileStreamReadWrite>();
    int data = 0;
    ExpectDestructorFirst<KTMemoryDataProvider>(static_cast<void *>(&data), 4ULL);

    std::wstring const lockedFile = gKTLogger->GetLogFilePath().GetPathAsKTString().GetWstring();
    ExpectDestructorFirst<KTInterProcessFileLock>(KTString(lockedFile.c_str()));
}

// The destructor's own work is done too, behind the derived class's: a lock that is gone has released its mutex.
TEST(AbiTest, DestroyingThroughTheTableReachesTheLibrarysDestructor) {
    KTMutex mutex;
    bool destroyed = false;
    KTLock *const lock = new Watched<KTLock>(destroyed, mutex);
    CallEntry(lock, kDeletingDestructor);
    KTLock const again(mutex); // would block for ever otherwise
    EXPECT_TRUE(destroyed);
}

TEST(AbiTest, HostsLoggerServesTheLibrarysInterface) {
    bool destroyed = false;
    auto *const host = new HostLogger(destroyed);
    KTLogger *const logger = host;
    logger->Log(std::wstring(L"x"));
    EXPECT_EQ("wide text", host->last);
    logger->Log(L"%d", 1);
    EXPECT_EQ("wide format", host->last);
    logger->Log(std::string("plain"));
    EXPECT_EQ("plain", host->last);
    // Inherited: the library formats and hands the line to the host's override.
    logger->Log("%d and %s", 42, "text");
    EXPECT_EQ("42 and text", host->last);
    CallEntry(logger, kLoggerDestructor + 1);
    EXPECT_TRUE(destroyed);
}

} // namespace
