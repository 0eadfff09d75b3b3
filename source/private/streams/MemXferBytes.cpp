// MemXferBytes.cpp: the transport over one block of memory.

#include "MemXferBytes.h"

#include "FileXferBytes.h"
#include "OString.h"

#include <algorithm>
#include <cstring>
#include <new>

namespace {

constexpr unsigned int kCapacity = 0x40000;
constexpr char kBackingFileName[] = "CopyBackingStore.tmp";

} // namespace

MemXferBytes::MemXferBytes() : m_Buffer(new unsigned char[kCapacity]), m_Capacity(kCapacity) {}

MemXferBytes::MemXferBytes(MemXferBytes const &other) = default;
MemXferBytes &MemXferBytes::operator=(MemXferBytes const &other) = default;

MemXferBytes::~MemXferBytes() {
    if (m_OwnsBuffer == 0) {
        return;
    }
    if (m_BackingStoreActive != 0) {
        m_BackingStore->Close();
    }
    delete[] m_Buffer;
    delete m_BackingStore;
}

unsigned int MemXferBytes::Read(void *buffer, unsigned int count) {
    if (m_BackingStoreActive != 0) {
        return m_BackingStore->Read(buffer, count);
    }
    unsigned int const available = m_Length - m_Position;
    if (count > available) {
        m_State = kKTStreamStateEndOfStream;
        count = available;
    }
    if (count != 0) {
        std::memcpy(buffer, m_Buffer + m_Position, count);
        m_Position += count;
    }
    return count;
}

unsigned int MemXferBytes::Write(void *buffer, unsigned int count) {
    if (m_BackingStoreActive != 0) {
        return m_BackingStore->Write(buffer, count);
    }
    if (count > m_Capacity - m_Position) {
        CreateFileBackingStore();
        return 0;
    }
    if (count != 0) {
        std::memcpy(m_Buffer + m_Position, buffer, count);
        m_Position += count;
        m_Length = std::max(m_Length, m_Position);
    }
    return count;
}

unsigned int MemXferBytes::Seek(int offset, KTSeekFromWhere origin) {
    if (m_BackingStoreActive != 0) {
        m_Position = m_BackingStore->Seek(offset, origin);
        return m_Position;
    }
    if (m_State == kKTStreamStateEndOfStream) {
        m_State = kKTStreamStateGood;
    }
    auto const distance = static_cast<unsigned int>(offset);
    switch (origin) {
    case kKTSeekFromBeginning:
        m_Position = distance;
        break;
    case kKTSeekFromCurrent:
        m_Position += distance;
        break;
    case kKTSeekFromEnd:
        m_Position = m_Length + distance;
        break;
    }
    m_Position = std::min(m_Position, m_Length);
    return m_Position;
}

unsigned int MemXferBytes::Tell() { return m_Position; }

void MemXferBytes::Flush() {
    if (m_BackingStoreActive != 0) {
        m_BackingStore->Flush();
    }
}

KTStreamState MemXferBytes::GetStreamState() {
    return m_BackingStoreActive != 0 ? m_BackingStore->GetStreamState() : m_State;
}

void MemXferBytes::SetEndOfStream() {
    if (m_BackingStoreActive != 0) {
        m_BackingStore->SetEndOfStream();
        return;
    }
    m_Length = m_Position;
}

// Names the file that a full block would spill to and goes no further, on purpose: the capacity is a hard limit.
// Without memory for the name there is none to discard.
void MemXferBytes::CreateFileBackingStore() try {
    m_BackingStore = nullptr;
    KTFile const file(OString::FromUTF8(kBackingFileName));
} catch (std::bad_alloc const &) { // NOLINT(bugprone-empty-catch)
}
