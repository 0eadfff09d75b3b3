// KTPath.cpp: the library's path value over the file layer's.

#include "KTPath.h"

#include <utility>

KTPath::KTPath() = default;

KTPath::KTPath(KTString const &path) : m_Path(path.GetOString()) {}

KTPath::KTPath(OPath path) : m_Path(std::move(path)) {}

KTPath::KTPath(KTPath const &other) = default;

KTPath &KTPath::operator=(KTPath const &other) = default;

KTPath::~KTPath() = default;

void KTPath::SetPath(KTString const &path) { m_Path = OPath(path.GetOString()); }

void KTPath::Append(KTString const &element) { m_Path.Append(element.GetOString()); }

KTPath &KTPath::operator+=(KTString const &element) {
    Append(element);
    return *this;
}

KTPath KTPath::GetParentKTPath() const { return KTPath(m_Path.GetParent()); }

KTString KTPath::GetPathAsKTString() const { return KTString(m_Path.GetString()); }

void KTPath::ReplaceAllBackSlashWithFrontSlash() { m_Path.ReplaceBackSlashes(); }

bool KTPath::operator==(KTPath const &other) const { return m_Path == other.m_Path; }

bool KTPath::operator!=(KTPath const &other) const { return m_Path != other.m_Path; }
