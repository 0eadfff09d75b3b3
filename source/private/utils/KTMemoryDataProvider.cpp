// KTMemoryDataProvider.cpp: hands out memory of the caller's in chunks.

#include "KTAssert.h"
#include "KTDataProvider.h"

#include <algorithm>
#include <stdexcept>

namespace {

constexpr char kReportPath[] = "source/private/utils/KTMemoryDataProvider";
constexpr int kNoDataLine = 21;
constexpr int kNoPlaceLine = 57;

} // namespace

IKTDataProvider::IKTDataProvider() = default;
IKTDataProvider::IKTDataProvider(IKTDataProvider const &) = default;
IKTDataProvider &IKTDataProvider::operator=(IKTDataProvider const &) = default;
IKTDataProvider::~IKTDataProvider() = default;

KTMemoryDataProvider::KTMemoryDataProvider(void *data, unsigned long long size) : m_Data(data), m_Size(size) {
    if (data == nullptr) {
        KTAssertFailed("", kReportPath, kNoDataLine);
        throw std::invalid_argument("no data");
    }
}

KTMemoryDataProvider::KTMemoryDataProvider(KTMemoryDataProvider const &other) = default;
KTMemoryDataProvider &KTMemoryDataProvider::operator=(KTMemoryDataProvider const &other) = default;

// By volatile writes, which are made although the object ends here: who still has a pointer to it finds no data.
KTMemoryDataProvider::~KTMemoryDataProvider() {
    *const_cast<void *volatile *>(&m_Data) = nullptr;
    const_cast<unsigned long long volatile &>(m_Size) = 0;
    const_cast<unsigned long long volatile &>(m_Offset) = 0;
}

unsigned long long KTMemoryDataProvider::GetDataSize() const { return m_Size; }

IKTDataProvider::KTDataProviderError KTMemoryDataProvider::GetNextData(unsigned long long requested, void **chunk,
                                                                       unsigned long long &size) {
    if (chunk == nullptr) {
        KTAssertFailed("", kReportPath, kNoPlaceLine);
        return kKTDataProviderBadArgument;
    }
    unsigned long long const left = m_Size - m_Offset;
    unsigned long long const count = std::min(requested, left);
    if (count != 0) {
        *chunk = static_cast<unsigned char *>(m_Data) + m_Offset;
        size = count;
        m_Offset += count;
    }
    return requested > left ? kKTDataProviderEndOfData : kKTDataProviderNoError;
}

void KTMemoryDataProvider::FreeDataMemory(void *) {}
