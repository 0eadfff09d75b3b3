// KTDataProvider.h: hands out a block of data in chunks of the size that the caller wants.
//
//     void *chunk = nullptr;
//     KTUInt64 size = 0;
//     auto result = IKTDataProvider::kKTDataProviderNoError;
//     while (result == IKTDataProvider::kKTDataProviderNoError) {
//         size = 0;
//         result = provider.GetNextData(4096, &chunk, size);
//         if (size != 0) {                        // the last chunk comes with the end of the data
//             Send(chunk, size);
//             provider.FreeDataMemory(chunk);
//         }
//     }

#pragma once

#include "KTTypes.h"

#include "KTBeginExports.h"

/// Hands out data in chunks, one after the other. One provider belongs to one thread at a time.
class KT_PUBLIC_API IKTDataProvider {
  public:
    /// How GetNextData ended.
    enum KTDataProviderError : int {
        kKTDataProviderNoError = 0,     ///< the chunk has the size that was asked for
        kKTDataProviderBadArgument = 2, ///< there is no place for the result
        kKTDataProviderEndOfData = 3    ///< more was asked for than there is; a shorter chunk may come with it
    };

    IKTDataProvider();
    IKTDataProvider(IKTDataProvider const &other);
    IKTDataProvider &operator=(IKTDataProvider const &other);
    virtual ~IKTDataProvider();

    /// Bytes in all.
    virtual unsigned long long GetDataSize() const = 0;

    /// Stores where the next `requested` bytes are in `*chunk`, and in `size` how many they are. Where nothing is left,
    /// or nothing is asked for, neither is touched.
    virtual KTDataProviderError GetNextData(unsigned long long requested, void **chunk, unsigned long long &size) = 0;

    /// Gives a chunk back.
    virtual void FreeDataMemory(void *chunk) = 0;
};

/// Hands out memory of the caller's, which must stay where it is as long as chunks are used: they point into it. Copies
/// share the memory, and go on from where the original was.
class KT_PUBLIC_API KTMemoryDataProvider : public IKTDataProvider {
  public:
    /// Hands out `size` bytes from `data` on. A null pointer is reported as an assertion, and std::invalid_argument is
    /// thrown.
    KTMemoryDataProvider(void *data, unsigned long long size);
    KTMemoryDataProvider(KTMemoryDataProvider const &other);
    KTMemoryDataProvider &operator=(KTMemoryDataProvider const &other);

    /// Frees nothing.
    ~KTMemoryDataProvider() override;

    unsigned long long GetDataSize() const override;

    /// A null `chunk` is reported as an assertion: kKTDataProviderBadArgument.
    KTDataProviderError GetNextData(unsigned long long requested, void **chunk, unsigned long long &size) override;

    /// Does nothing: the memory is the caller's.
    void FreeDataMemory(void *chunk) override;

  private:
    // The order of the fields is part of the binary interface.
    void *m_Data;
    unsigned long long m_Size;
    unsigned long long m_Offset = 0;
};

#include "KTEndExports.h"
