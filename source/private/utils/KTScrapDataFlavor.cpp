// KTScrapDataFlavor.cpp: clipboard formats.

#include "KTScrapDataFlavor.h"

namespace {

constexpr unsigned short kDefaultId = 101;

} // namespace

KTScrapDataFlavor::KTScrapDataFlavor() : KTScrapDataFlavor(kDefaultId, KTString(), true) {}

KTScrapDataFlavor::KTScrapDataFlavor(unsigned short const &id, KTString const &name, bool ownFlavor)
    : m_Id(id), m_Name(name), m_OwnFlavor(ownFlavor) {}

KTScrapDataFlavor::KTScrapDataFlavor(KTScrapDataFlavor const &) = default;
KTScrapDataFlavor &KTScrapDataFlavor::operator=(KTScrapDataFlavor const &) = default;
KTScrapDataFlavor::~KTScrapDataFlavor() = default;

unsigned short KTScrapDataFlavor::GetID() const { return m_Id; }

KTString const &KTScrapDataFlavor::GetString() const { return m_Name; }

bool KTScrapDataFlavor::IsKTFlavor() const { return m_OwnFlavor; }

KTErrorCodeEnum KTScrapDataFlavor::SetIsKTFlavor(bool ownFlavor) {
    m_OwnFlavor = ownFlavor;
    return kKTErrorNone;
}

unsigned int KTScrapDataFlavor::GetWinFormat() const { return m_WinFormat; }

KTErrorCodeEnum KTScrapDataFlavor::SetWinFormat(unsigned int format) {
    m_WinFormat = format;
    return kKTErrorNone;
}

bool KTScrapDataFlavor::operator==(KTScrapDataFlavor const &other) const { return m_Name == other.m_Name; }

bool KTScrapDataFlavor::operator<(KTScrapDataFlavor const &other) const { return m_Name < other.m_Name; }
