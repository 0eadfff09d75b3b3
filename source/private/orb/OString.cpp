// OString.cpp: the file layer's text type over the conversions of OUtf.h.

#include "OString.h"

#include "OCaseFold.h"
#include "OUtf.h"

#include <algorithm>
#include <utility>

OString::OString(KTUnits units) : m_Units(std::move(units)) {}

OString::OString(unsigned short const *units, std::size_t count) {
    if (count != 0) {
        m_Units.assign(units, count);
    }
}

void OString::Append(unsigned short const *units, std::size_t count) {
    if (count != 0) {
        m_Units.append(units, count);
    }
}

OString OString::FromUTF8(std::string_view bytes) { return OString(OUtf8ToUnits(bytes)); }

std::string OString::GetUTF8() const { return OUnitsToUtf8(m_Units.data(), m_Units.size()); }

bool OString::ContainsAny(OString const &set, unsigned long flags) const {
    bool const ignoreCase = (flags & kAnyOfIgnoreCase) != 0;
    KTUnits sorted = ignoreCase ? OFoldCase(set.m_Units) : set.m_Units;
    KTUnits const text = ignoreCase ? OFoldCase(m_Units) : KTUnits();
    std::sort(sorted.begin(), sorted.end());
    auto const inSet = [&](unsigned short unit) { return std::binary_search(sorted.begin(), sorted.end(), unit); };
    KTUnits const &searched = ignoreCase ? text : m_Units;
    return std::any_of(searched.begin(), searched.end(), inSet);
}
