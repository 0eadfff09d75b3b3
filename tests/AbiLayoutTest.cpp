// AbiLayoutTest.cpp: what hosts' compiled code knows of objects and values: sizes, offsets and numbers.
//
//     handle (KTMutex, KTRecursiveMutex, KTLock, KTRecursiveLock, KTCondition, KTInterProcessFileLock), 16 bytes
//          0  virtual table
//          8  the owned implementation object
//
//     KTLogger, 80 bytes
//          0  virtual table
//          8  bool             writing is enabled
//         16  std::ofstream *  the log file
//         24  KTMutex
//         40  KTPath           the log file's path, up to 80
//
//     KTThread, KTWorkerThread, 16 bytes      KTThreadMsg, 40 bytes     KTCallBack, 32 bytes
//          0  virtual table                        0  i32  message           0  i32   kind
//          8  the owned implementation object      8  u64  param1 to 4       8  u64   two
//                                                                           24  void*
//
//     KTTimerService, 5856 bytes                          KTFixedSizedSlots<CTimerInfo, 50>, 2864 bytes
//          0  KTWorkerThread                                      0  virtual table
//         16  KTRecursiveMutex  of threads' timers                8  CTimerInfo  scratch
//         32  KTRecursiveMutex  of UI timers                     48  50 of       CTimerInfo, i32 previous, i32 next,
//         48  bool              running                                          i32 next free, 4 bytes nothing
//         56  slots             of thread timers               2848  i32         capacity
//       2920  slots             of single bursts               2852  i32         first free
//       5784  std::map          of UI timers                   2856  i32         first used
//       5832  i64               current UI timer
//       5840  void*             window                     CTimerInfo, 40 bytes
//       5848  its dispatch                                        0  KTThread*, i64 and i32 interval, i64 and i32
//                                                                    countdown, i32 message
//
//     KTTime, 16 bytes             KTDuration, 24 bytes
//          0  virtual table             0  virtual table
//          8  u64  count                8  KTReal  amount
//                                      16  i32     unit
//
//     KTColor, 56 bytes                        KTARGB, 32 bytes
//          0  virtual table                         0  KTReal  alpha
//          8  i32                  colour space     8  KTReal  red
//         16  std::vector<KTReal>  components      16  KTReal  green
//         40  KTReal               alpha           24  KTReal  blue
//         48  KTReal               transparency factor
//
//     KTPoint: f64 x, y                        KTRect, KTIntRect: f64 or i32 left, top, right, bottom
//     KTVector3f: f32 x, y, z                  KTColor4f: f32 red, green, blue, alpha
//     KTPlanef: KTVector3f normal, f32 d       KTMatrix4x4f: 16 f32, column by column
//     KTQuad3D: KTVector3f bottom left, bottom right, top right, top left
//     KTTransform: KTMatrix4x4f, KTColor4f     KTKeyframe: KTTransform, i32 frame
//
//     KTSmbUrl, 128 bytes          KTSMBConnector, 40 bytes
//          0  KTString  share           0  KTString  URL
//         32  KTString  path           32  bool      the connection failed
//         64  KTString  authority
//         96  KTString  scheme
//
//     KTException, KTFatalException, KTNonFatalException, 48 bytes      KTLCException, 80 bytes
//          0  virtual table                                                  0  virtual table
//          8  char const *  the key's characters                             8  KTString  reason
//         16  std::string   a copy of them, or empty                        40  KTString  file
//     WKTSEHException, 64 bytes: the same, then                             72  i32       line
//         48  u32  code
//         56  the system's record
//
//     KTExceptionUtils, 24 bytes                                        WKTExceptionUtils, 32 bytes: the same, then
//          0  virtual table                                                 24  the previous translator
//          8  bool  crashed
//         16  IKTExceptionHandler *
//
//     KTTextureCoord2D: f64 left, top, right, bottom
//     KTBoundingBox: f32 least x, greatest x, least y, greatest y, least z, greatest z
//
//     KTLoadTextureParams, 16 bytes            KTTexture2D, 48 bytes
//          0  bool  mipmaps                         0  u32  id
//          1  bool  bordered                        4  i32  width
//          2  bool  the renderer's                  8  i32  height
//          3  bool  no mipmaps                     16  f64  two of the renderer's
//          4  i32   the renderer's                 32  KTLoadTextureParams
//          8  i32   row length
//         12  i32   pixel format
//
//     KTTexturedQuad3D, 96 bytes               KTRendererInitializationParams, 6 texts of 32 bytes each, then
//          0  KTQuad3D                            192  i32
//         48  std::vector<KTTexture2D>            196  KTColor4f
//         72  std::vector<KTTextureCoord2D>       212  bool
//     KTLargeTexturedQuad3D: std::vector<KTTexturedQuad3D>
//     KTRenderObject3D: KTTexturedQuad3D, KTTransform; KTLargeRenderObject3D: KTLargeTexturedQuad3D, KTTransform
//     KTPrimitiveRenderModel: std::vector<KTRenderObject3D>; KTCompositeRenderModel: std::vector<KTLargeRenderObject3D>

#include "KTPublic.h"
#include "TestTimerWindow.h"
#include "VTable.h"

#include <gtest/gtest.h>

#include <cstring>
#include <fstream>
#include <new>
#include <type_traits>

using namespace ktabi;

namespace {

// The pointer at an offset of an object.
void *PointerAt(void const *object, std::size_t offset) {
    void *pointer = nullptr;
    std::memcpy(static_cast<void *>(&pointer), static_cast<std::byte const *>(object) + offset, sizeof pointer);
    return pointer;
}

// Memory for a handle whose destructor must not run, because another handle owns the implementation.
template <typename Handle> struct Place {
    alignas(Handle) std::byte bytes[sizeof(Handle)];
};

// `first` and `second` each own an implementation; both are left as they were.
template <typename Handle> void ExpectHandle(Handle &first, Handle &second) {
    SCOPED_TRACE(typeid(Handle).name());
    EXPECT_EQ(16U, sizeof(Handle));
    EXPECT_EQ(8U, alignof(Handle));
    EXPECT_TRUE(std::has_virtual_destructor_v<Handle>);
    EXPECT_EQ(ExportedTable<Handle>(), PointerAt(&first, 0));
    EXPECT_NE(nullptr, PointerAt(&first, 8));
    EXPECT_EQ(static_cast<void *>(first.get()), PointerAt(&first, 8));
    EXPECT_NE(first.get(), second.get());

    auto *const implementation = first.get();
    auto *const otherImplementation = second.get();
    Place<Handle> place{};
    std::memset(place.bytes, 0xAB, sizeof place.bytes);
    auto *const copy = ::new (place.bytes) Handle(first);
    EXPECT_EQ(ExportedTable<Handle>(), PointerAt(copy, 0));
    EXPECT_EQ(static_cast<void *>(implementation), PointerAt(copy, 8));
    EXPECT_EQ(implementation, first.get());

    // A handle that is assigned to forgets its implementation without destroying it, so `copy` may stand in here.
    Handle *const result = &(*copy = second);
    EXPECT_EQ(copy, result);
    EXPECT_EQ(static_cast<void *>(otherImplementation), PointerAt(copy, 8));
    EXPECT_EQ(implementation, first.get());
    EXPECT_EQ(otherImplementation, second.get());
}

TEST(AbiLayoutTest, HandlesAreATableAndOnePointerAndCopiesShareIt) {
    KTMutex mutexes[2];
    ExpectHandle(mutexes[0], mutexes[1]);
    KTRecursiveMutex recursiveMutexes[2];
    ExpectHandle(recursiveMutexes[0], recursiveMutexes[1]);
    KTCondition conditions[2];
    ExpectHandle(conditions[0], conditions[1]);
    KTLock lock(mutexes[0]);
    KTLock otherLock(mutexes[1]);
    ExpectHandle(lock, otherLock);
    lock.unlock(); // would throw if a copy had released it
    otherLock.unlock();
    KTRecursiveLock recursiveLock(recursiveMutexes[0]);
    KTRecursiveLock otherRecursiveLock(recursiveMutexes[1]);
    ExpectHandle(recursiveLock, otherRecursiveLock);
    recursiveLock.unlock();
    otherRecursiveLock.unlock();
    KTString const existing = gKTLogger->GetLogFilePath().GetPathAsKTString();
    KTInterProcessFileLock fileLock(existing);
    KTInterProcessFileLock otherFileLock(existing);
    ExpectHandle(fileLock, otherFileLock);
}

// Two handles with one implementation are one lock: what the copy releases, the original no longer owns.
TEST(AbiLayoutTest, ACopiedLockIsTheSameLock) {
    KTMutex mutex;
    KTLock lock(mutex);
    Place<KTLock> place{};
    auto *const copy = ::new (place.bytes) KTLock(lock);
    copy->unlock();
    EXPECT_ANY_THROW(lock.unlock());
    lock.lock();
    EXPECT_ANY_THROW(copy->lock());
}

TEST(AbiLayoutTest, LoggersFieldsStandInOrder) {
    auto const *const bytes = reinterpret_cast<std::byte const *>(gKTLogger);
    EXPECT_EQ(80U, sizeof(KTLogger));
    EXPECT_EQ(sizeof(KTLogger), sizeof(WKTLogger));

    std::byte before[sizeof(KTLogger)];
    std::memcpy(before, bytes, sizeof before);
    ASSERT_TRUE(gKTLogger->IsLogEnabled());
    ASSERT_EQ(std::byte{1}, bytes[8]);
    gKTLogger->LogEnableAtRuntime(false);
    EXPECT_EQ(std::byte{0}, bytes[8]);
    before[8] = std::byte{0};
    EXPECT_EQ(0, std::memcmp(before, bytes, sizeof before)) << "more than the flag has changed";
    gKTLogger->LogEnableAtRuntime(true);
    EXPECT_EQ(std::byte{1}, bytes[8]);

    std::ofstream const stream;
    void const *const loggersStream = PointerAt(gKTLogger, 16);
    ASSERT_NE(nullptr, loggersStream);
    ASSERT_EQ(TableOfObject(&stream), TableOfObject(loggersStream));
    EXPECT_TRUE(static_cast<std::ofstream const *>(loggersStream)->is_open());

    EXPECT_EQ(ExportedTable<KTMutex>(), PointerAt(gKTLogger, 24));
    EXPECT_EQ(ExportedTable<KTPath>(), PointerAt(gKTLogger, 40));
    EXPECT_EQ(static_cast<void const *>(bytes + 40), static_cast<void const *>(&gKTLogger->GetLogFilePath()));
}

// The value at an offset of an object.
template <typename T> T ValueAt(void const *object, std::size_t offset) {
    T value{};
    std::memcpy(static_cast<void *>(&value), static_cast<std::byte const *>(object) + offset, sizeof value);
    return value;
}

TEST(AbiLayoutTest, TimesAndDurationsHaveTheirFieldsInOrder) {
    KTTime const time(0x0123456789ABCDEF);
    EXPECT_EQ(16U, sizeof(KTTime));
    EXPECT_EQ(0x0123456789ABCDEFU, ValueAt<KTUInt64>(&time, 8));

    KTDuration const duration(2.5, static_cast<KTDurationUnitOfMeasure>(0x01020304));
    EXPECT_EQ(24U, sizeof(KTDuration));
    EXPECT_EQ(2.5, ValueAt<double>(&duration, 8));
    EXPECT_EQ(0x01020304, ValueAt<int>(&duration, 16));
}

TEST(AbiLayoutTest, TheTimerServiceHasItsFieldsInOrder) {
    EXPECT_EQ(40U, sizeof(KTTimerService::CTimerInfo));
    KTTimerService::CTimerInfo const info{nullptr, 1, 2, 3, 4, static_cast<KT_THREAD_MESSAGE>(5)};
    EXPECT_EQ(nullptr, PointerAt(&info, 0));
    EXPECT_EQ(1, ValueAt<KTInt64>(&info, 8));
    EXPECT_EQ(2, ValueAt<KTInt32>(&info, 16));
    EXPECT_EQ(3, ValueAt<KTInt64>(&info, 24));
    EXPECT_EQ(4, ValueAt<KTInt32>(&info, 32));
    EXPECT_EQ(5, ValueAt<KTInt32>(&info, 36));

    constexpr std::size_t kSlots = 48; // behind table and scratch element
    constexpr std::size_t kSlot = 56;  // an element and three links
    constexpr std::size_t kLists = kSlots + 50 * kSlot;
    EXPECT_EQ(kLists + 16, sizeof(KTTimerService::CTimerSlots));

    KTCreateTimerService();
    KTTimerService const *const service = KTTimerService::GetInstance();
    ASSERT_NE(nullptr, service);
    EXPECT_EQ(5856U, sizeof(KTTimerService));
    EXPECT_EQ(ExportedTable<KTTimerService>(), PointerAt(service, 0));
    EXPECT_EQ(ExportedTable<KTRecursiveMutex>(), PointerAt(service, 16));
    EXPECT_EQ(ExportedTable<KTRecursiveMutex>(), PointerAt(service, 32));
    EXPECT_TRUE(ValueAt<bool>(service, 48));
    KTInt64 id = 0;
    KTCreateTimer(nullptr, 1'000'000'001, &id, static_cast<KT_THREAD_MESSAGE>(0x01020304));
    KTCreateSingleBurstTimer(nullptr, 2'000'000'002, &id, static_cast<KT_THREAD_MESSAGE>(0x05060708));
    KTInt64 seconds = 1'000'000;
    KTInt32 message = 0x01020304;
    for (std::size_t const slots : {56U, 56U + 2864U}) {
        std::size_t const first = slots + kSlots;
        EXPECT_EQ(nullptr, PointerAt(service, first));
        EXPECT_EQ(seconds, ValueAt<KTInt64>(service, first + 8));
        EXPECT_EQ(message, ValueAt<KTInt32>(service, first + 36));
        for (std::size_t const link : {40U, 44U, 48U}) {
            EXPECT_EQ(-1, ValueAt<KTInt32>(service, first + link));
        }
        EXPECT_EQ(2, ValueAt<KTInt32>(service, first + kSlot + 48)); // the free list goes on
        EXPECT_EQ(50, ValueAt<KTInt32>(service, slots + kLists));
        EXPECT_EQ(1, ValueAt<KTInt32>(service, slots + kLists + 4)); // first free
        EXPECT_EQ(0, ValueAt<KTInt32>(service, slots + kLists + 8)); // first used
        seconds *= 2;
        message += 0x04040404;
    }
    EXPECT_EQ(0, ValueAt<KTInt64>(service, 5832)); // behind the map: no UI timer's function runs
    EXPECT_EQ(FindTimerWindow(), PointerAt(service, 5840));
    KTDestroyTimerService();
}

TEST(AbiLayoutTest, ColoursHaveTheirFieldsInOrder) {
    KTColor color;
    color.SetColorData(static_cast<KTColor::ColorSpaceEnum>(0x01020304), {0.25, 0.5});
    color.SetAlpha(0.75);
    color.SetTransparencyFactor(0.125);
    EXPECT_EQ(56U, sizeof(KTColor));
    EXPECT_EQ(ExportedTable<KTColor>(), PointerAt(&color, 0));
    EXPECT_EQ(0x01020304, ValueAt<int>(&color, 8));
    auto const *const components = static_cast<double const *>(PointerAt(&color, 16));
    EXPECT_EQ(0.25, components[0]);
    EXPECT_EQ(0.5, components[1]);
    EXPECT_EQ(components + 2, PointerAt(&color, 24));
    EXPECT_EQ(0.75, ValueAt<double>(&color, 40));
    EXPECT_EQ(0.125, ValueAt<double>(&color, 48));

    KTARGB const argb{1, 2, 3, 4};
    EXPECT_EQ(32U, sizeof(KTARGB));
    for (std::size_t i = 0; i < 4; ++i) {
        EXPECT_EQ(static_cast<double>(i + 1), ValueAt<double>(&argb, 8 * i));
    }
}

// The value's words are first, first + 1, ... in the order of its fields.
template <typename Word, typename Value> void ExpectWords(Value const &value, std::size_t count, Word first) {
    SCOPED_TRACE(typeid(Value).name());
    EXPECT_TRUE(std::is_trivially_copyable_v<Value>);
    EXPECT_EQ(count * sizeof(Word), sizeof(Value));
    for (std::size_t i = 0; i < count; ++i) {
        EXPECT_EQ(first + static_cast<Word>(i), ValueAt<Word>(&value, i * sizeof(Word)));
    }
}

TEST(AbiLayoutTest, GeometryIsPlainNumbersInOrder) {
    ExpectWords<double>(KTPoint(1, 2), 2, 1);
    ExpectWords<double>(KTRect(1, 2, 3, 4), 4, 1);
    ExpectWords<int>(KTIntRect(1, 2, 3, 4), 4, 1);
    ExpectWords<float>(KTVector3f(1, 2, 3), 3, 1);
    ExpectWords<float>(KTColor4f(1, 2, 3, 4), 4, 1);
    ExpectWords<float>(KTPlanef({1, 2, 3}, 4), 4, 1);
    ExpectWords<float>(KTQuad3D({1, 2, 3}, {4, 5, 6}, {7, 8, 9}, {10, 11, 12}), 12, 1);
    KTMatrix4x4f const matrix({1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16});
    ExpectWords<float>(matrix, 16, 1);
    ExpectWords<float>(KTTransform(matrix, {17, 18, 19, 20}), 20, 1);
    KTKeyframe const keyframe(KTTransform(matrix, {17, 18, 19, 20}), 0x01020304);
    EXPECT_EQ(84U, sizeof(KTKeyframe));
    EXPECT_EQ(0x01020304, ValueAt<int>(&keyframe, 80));
    EXPECT_TRUE(std::is_trivially_copyable_v<KTKeyframe>);
}

TEST(AbiLayoutTest, ExceptionsHaveTheirFieldsInOrder) {
    EXPECT_EQ(48U, sizeof(KTException));
    EXPECT_EQ(48U, sizeof(KTFatalException));
    EXPECT_EQ(48U, sizeof(KTNonFatalException));
    static char const key[] = "key";
    KTException const ofPointer(key);
    EXPECT_EQ(key, PointerAt(&ofPointer, 8));
    EXPECT_TRUE(ValueAt<char *>(&ofPointer, 16) != nullptr);
    EXPECT_EQ(0U, ValueAt<std::size_t>(&ofPointer, 24)); // the copy's length
    KTString text("key");
    KTException const ofText(text);
    EXPECT_EQ(PointerAt(&ofText, 8), PointerAt(&ofText, 16));
    EXPECT_EQ(3U, ValueAt<std::size_t>(&ofText, 24));

    EXPECT_EQ(64U, sizeof(WKTSEHException));
    EXPECT_EQ(80U, sizeof(KTLCException));
    KTLCException const internal("reason", "file", 0x01020304);
    EXPECT_EQ(static_cast<void const *>(&internal.GetReason()), reinterpret_cast<char const *>(&internal) + 8);
    EXPECT_EQ(static_cast<void const *>(&internal.GetFile()), reinterpret_cast<char const *>(&internal) + 40);
    EXPECT_EQ(0x01020304, ValueAt<int>(&internal, 72));
}

class QuietHandler final : public IKTExceptionHandler {
  public:
    void HandleException(KTException const &) override {}
};

TEST(AbiLayoutTest, ExceptionUtilsHaveTheirFieldsInOrder) {
    EXPECT_EQ(24U, sizeof(KTExceptionUtils));
    EXPECT_EQ(32U, sizeof(WKTExceptionUtils));
    KTExceptionUtils &utils = KTExceptionUtils::GetInstance();
    EXPECT_EQ(&utils, &WKTExceptionUtils::GetInstance());
    EXPECT_FALSE(ValueAt<bool>(&utils, 8));
    EXPECT_EQ(nullptr, PointerAt(&utils, 16));
    EXPECT_EQ(nullptr, PointerAt(&utils, 24));
    static QuietHandler handler;
    utils.SetHandler(handler);
    EXPECT_EQ(static_cast<void *>(&handler), PointerAt(&utils, 16));
}

// The dictionary behind the text, then whether the document is finished.
TEST(AbiLayoutTest, TheResourceDocumentIsAStringAndTwoFields) {
    EXPECT_EQ(sizeof(KTString) + 16, sizeof(KTStringResourceXML));
    IKTStringDictionary &dictionary = *KTStringDictionary::GetStringDictionary();
    KTStringResourceXML const document(dictionary);
    EXPECT_EQ(static_cast<void const *>(&document), static_cast<KTString const *>(&document));
    EXPECT_EQ(8U, sizeof(KTSimpleIniFileReader));
    EXPECT_EQ(1U, sizeof(KTClosedCaptionFileReader));
}

TEST(AbiLayoutTest, ThreadsAndTheirMessagesHaveTheirFieldsInOrder) {
    EXPECT_EQ(16U, sizeof(KTThread));
    EXPECT_EQ(16U, sizeof(KTWorkerThread));
    EXPECT_EQ(40U, sizeof(KTThreadMsg));
    KTThreadMsg const msg{static_cast<KT_THREAD_MESSAGE>(0x01020304), 1, 2, 3, 4};
    EXPECT_EQ(0x01020304, ValueAt<int>(&msg, 0));
    for (KTUInt64 i = 1; i <= 4; ++i) {
        EXPECT_EQ(i, ValueAt<KTUInt64>(&msg, 8 * i));
    }
    KTStateMachine const state(0x01020304);
    EXPECT_EQ(16U, sizeof(KTStateMachine));
    EXPECT_EQ(0x01020304, ValueAt<int>(&state, 8));
    EXPECT_EQ(8U, sizeof(KTSimpleTimeKeeper));

    KTCallBack const callBack(static_cast<KTCallBackEnum>(0x01020304));
    EXPECT_EQ(32U, sizeof(KTCallBack));
    EXPECT_EQ(0x01020304, ValueAt<int>(&callBack, 0));
    EXPECT_EQ(0U, ValueAt<KTUInt64>(&callBack, 8));
    EXPECT_EQ(0U, ValueAt<KTUInt64>(&callBack, 16));
    EXPECT_EQ(nullptr, PointerAt(&callBack, 24));
}

// No virtual table: the first field stands at the beginning.
TEST(AbiLayoutTest, ShareUrlsAndConnectorsHaveTheirFieldsInOrder) {
    KTSmbUrl const url("smb://server/share/path");
    auto const *const bytes = reinterpret_cast<std::byte const *>(&url);
    EXPECT_EQ(4 * sizeof(KTString), sizeof(KTSmbUrl));
    EXPECT_EQ(static_cast<void const *>(bytes), &url.getShare());
    EXPECT_EQ(static_cast<void const *>(bytes + sizeof(KTString)), &url.getSmbPath());
    EXPECT_EQ(static_cast<void const *>(bytes + 2 * sizeof(KTString)), &url.getAuthority());
    EXPECT_EQ(static_cast<void const *>(bytes + 3 * sizeof(KTString)), &url.getScheme());

    KTSMBConnector connector;
    EXPECT_EQ(sizeof(KTString) + 8, sizeof(KTSMBConnector));
    connector.connect("smb://no share");
    EXPECT_EQ(std::byte{1}, reinterpret_cast<std::byte const *>(&connector)[sizeof(KTString)]);
    auto const *const kept = reinterpret_cast<KTString const *>(&connector);
    EXPECT_EQ(KTString("smb://no share"), *kept);
    EXPECT_FALSE(std::is_polymorphic_v<KTSmbUrl> || std::is_polymorphic_v<KTSMBConnector>);
}

TEST(AbiLayoutTest, TexturesHaveTheirFieldsInOrder) {
    ExpectWords<double>(KTTextureCoord2D(1, 2, 3, 4), 4, 1);
    ExpectWords<float>(KTBoundingBox(1, 2, 3, 4, 5, 6), 6, 1);
    for (std::size_t flag = 0; flag < 4; ++flag) {
        KTLoadTextureParams const params(flag == 0, flag == 1, flag == 2, flag == 3, 5, 6, kKTPixelFormatAlpha8);
        EXPECT_EQ(16U, sizeof params);
        EXPECT_EQ(1U << (8 * flag), ValueAt<KTUInt32>(&params, 0));
        EXPECT_EQ(5, ValueAt<int>(&params, 4));
        EXPECT_EQ(6, ValueAt<int>(&params, 8));
        EXPECT_EQ(3, ValueAt<int>(&params, 12));
    }
    KTTexture2D const texture(1, 2, 3, 4, 5);
    EXPECT_EQ(48U, sizeof texture);
    EXPECT_TRUE(std::is_trivially_copyable_v<KTTexture2D>);
    EXPECT_EQ(1U, ValueAt<KTUInt32>(&texture, 0));
    EXPECT_EQ(2, ValueAt<int>(&texture, 4));
    EXPECT_EQ(3, ValueAt<int>(&texture, 8));
    EXPECT_EQ(4.0, ValueAt<double>(&texture, 16));
    EXPECT_EQ(5.0, ValueAt<double>(&texture, 24));
    EXPECT_EQ(0x00010001U, ValueAt<KTUInt32>(&texture, 32));
    EXPECT_EQ(4, ValueAt<int>(&texture, 44));
}

TEST(AbiLayoutTest, QuadsAndModelsHaveTheirFieldsInOrder) {
    KTTexturedQuad3D quad;
    quad.textures.resize(1);
    quad.textureCoords.resize(1);
    EXPECT_EQ(96U, sizeof quad);
    EXPECT_EQ(static_cast<void *>(quad.textures.data()), PointerAt(&quad, 48));
    EXPECT_EQ(static_cast<void *>(quad.textureCoords.data()), PointerAt(&quad, 72));
    KTLargeTexturedQuad3D large;
    large.quads.resize(1);
    EXPECT_EQ(24U, sizeof large);
    EXPECT_EQ(static_cast<void *>(large.quads.data()), PointerAt(&large, 0));
    KTTransform const transform(KTMatrix4x4f(), {0.25F, 0, 0, 0});
    KTRenderObject3D const object(quad, transform);
    EXPECT_EQ(96U + 80U, sizeof object);
    EXPECT_EQ(0.25F, ValueAt<float>(&object, 96 + 64));
    KTLargeRenderObject3D const largeObject(large, transform);
    EXPECT_EQ(24U + 80U, sizeof largeObject);
    EXPECT_EQ(0.25F, ValueAt<float>(&largeObject, 24 + 64));
    EXPECT_EQ(24U, sizeof(KTPrimitiveRenderModel));
    EXPECT_EQ(24U, sizeof(KTCompositeRenderModel));
    KTRendererInitializationParams params;
    params.color = {0.5F, 0, 0, 1};
    params.flag = true;
    EXPECT_EQ(216U, sizeof params);
    EXPECT_EQ(static_cast<void *>(&params), static_cast<void *>(&params.text0));
    EXPECT_EQ(&params.text0 + 5, &params.text5);
    EXPECT_EQ(256, ValueAt<int>(&params, 192));
    EXPECT_EQ(0.5F, ValueAt<float>(&params, 196));
    EXPECT_EQ(1, ValueAt<char>(&params, 212));
}

TEST(AbiLayoutTest, NumbersAreFixed) {
    EXPECT_EQ(0, static_cast<int>(kKTPixelFormatRGB));
    EXPECT_EQ(1, static_cast<int>(kKTPixelFormatBGR));
    EXPECT_EQ(2, static_cast<int>(kKTPixelFormatBGRA));
    EXPECT_EQ(3, static_cast<int>(kKTPixelFormatAlpha8));
    EXPECT_EQ(4U, sizeof(KTPixelFormatEnum));
    EXPECT_EQ(1, static_cast<int>(kKTFeatureNPOT));
    EXPECT_EQ(2, static_cast<int>(kKTFeatureMipmaps));
    EXPECT_EQ(512, static_cast<int>(kKTFeatureTextureBorder));
    EXPECT_EQ(4U, sizeof(KTRendererFeatureEnum));
    EXPECT_EQ(0, static_cast<int>(kKTInterpolationLinear));
    EXPECT_EQ(1, static_cast<int>(kKTInterpolationEaseInEaseOut));
    EXPECT_EQ(4U, sizeof(KTInterpolationModeEnum));
    EXPECT_EQ(0, static_cast<int>(KTColor::kColorSpaceRGB));
    EXPECT_EQ(4U, sizeof(KTColor::ColorSpaceEnum));
    EXPECT_EQ(0, static_cast<int>(KTRect::kFirstPoint));
    EXPECT_EQ(7, static_cast<int>(KTRect::kLastPoint));
    EXPECT_EQ(8, static_cast<int>(KTRect::kCenter));
    EXPECT_EQ(4U, sizeof(KTRect::RefPoint));
    EXPECT_EQ(14, static_cast<int>(KT_THREAD_MSG_QUIT));
    EXPECT_EQ(4U, sizeof(KT_THREAD_MESSAGE));
    EXPECT_EQ(0, static_cast<int>(kKTThreadPriorityLowest));
    EXPECT_EQ(1, static_cast<int>(kKTThreadPriorityBelowNormal));
    EXPECT_EQ(2, static_cast<int>(kKTThreadPriorityUnchanged));
    EXPECT_EQ(3, static_cast<int>(kKTThreadPriorityAboveNormal));
    EXPECT_EQ(4, static_cast<int>(kKTThreadPriorityHighest));
    EXPECT_EQ(4U, sizeof(KTThreadPriorityEnum));
    EXPECT_EQ(4U, sizeof(KTCallBackEnum));
    EXPECT_EQ(0, static_cast<int>(kKTDurationSeconds));
    EXPECT_EQ(4U, sizeof(KTDurationUnitOfMeasure));
    EXPECT_EQ(0, static_cast<int>(kKTErrorNone));
    EXPECT_EQ(1, static_cast<int>(kKTErrorFailed));
    EXPECT_EQ(28, static_cast<int>(kKTErrorFileNotFound));
    EXPECT_EQ(4U, sizeof(KTErrorCodeEnum));
    EXPECT_EQ(0, static_cast<int>(kKTHashSHA256));
    EXPECT_EQ(4U, sizeof(KTHashFunctionEnum));
    EXPECT_EQ(4U, sizeof(KTVariant::KTVariantType));
    EXPECT_EQ(4U, sizeof(KTShortCutModifiers));
    EXPECT_EQ(4U, sizeof(KTShortCutKey));
    EXPECT_EQ(8U, sizeof(KTShortCut));
    EXPECT_EQ(0, static_cast<int>(KTString::kKTEncodingBytes));
    EXPECT_EQ(1, static_cast<int>(KTString::kKTEncodingUTF8));
    EXPECT_EQ(4U, sizeof(KTString::KTCharEncodingType));
    EXPECT_EQ(0xFFFFFFFFFFFFFFFFULL, KTString::npos);
    EXPECT_EQ(0xFFFFFFFFFFFFFFFFULL, KTString::GetNPos());
    EXPECT_EQ(8U, sizeof(KTString::size_type));
}

TEST(AbiLayoutTest, TypesAreFixed) {
    EXPECT_TRUE((std::is_same_v<KTBool16, short>));
    EXPECT_TRUE((std::is_same_v<KTInt32, int>));
    EXPECT_TRUE((std::is_same_v<KTUInt32, unsigned int>));
    EXPECT_TRUE((std::is_same_v<KTInt64, long long>));
    EXPECT_TRUE((std::is_same_v<KTUInt64, unsigned long long>));
    EXPECT_TRUE((std::is_same_v<KTString::value_type, unsigned short>));
    EXPECT_TRUE((std::is_same_v<decltype(KTString().Contains(KTString())), KTBool16>));
    EXPECT_EQ(2U, sizeof(wchar_t));
    EXPECT_EQ(8U, sizeof(KTReal));
    EXPECT_EQ(sizeof(KTUnits), sizeof(KTString));
    EXPECT_EQ(sizeof(KTUnits), sizeof(OString));
    EXPECT_EQ(sizeof(void *), sizeof(CComBSTR));
    EXPECT_EQ(8U + sizeof(KTUnits), sizeof(KTPath));
    EXPECT_EQ(8U + sizeof(KTUnits), sizeof(KTFile));
    EXPECT_EQ(sizeof(std::vector<KTFile>), sizeof(KTTempFileHolder));
    EXPECT_EQ(4U, sizeof(KTFileUtil::ErrorCodeEnum));
    EXPECT_EQ(4U, sizeof(KTFile::AccessMode));
    EXPECT_EQ(4U, sizeof(KTFile::ShareMode));
    EXPECT_EQ(4U, sizeof(KTFile::TimeAttribute));
}

} // namespace
