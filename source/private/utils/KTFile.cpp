// KTFile.cpp: the library's file object over the file layer's.

#include "KTFile.h"

#include "KTAllocate.h"

#include <utility>

KTFile::KTFile() = default;

KTFile::KTFile(KTPath const &path) : m_File(path.GetOPath()) {}

KTFile::KTFile(KTString const &path) : m_File(OPath(path.GetOString())) {}

KTFile::KTFile(OFile file) : m_File(std::move(file)) {}

KTFile::KTFile(OPath path) : m_File(std::move(path)) {}

KTFile::KTFile(OString path) : m_File(OPath(std::move(path))) {}

KTFile::KTFile(KTFile const &other) = default;

KTFile &KTFile::operator=(KTFile const &other) = default;

KTFile::~KTFile() = default;

KTPath KTFile::GetPath() const { return KTPath(m_File.GetPath()); }

KTString KTFile::GetPathString() const { return KTString(m_File.GetPath().GetString()); }

bool KTFile::Exists() const { return m_File.Exists(); }

bool KTFile::DoesFileExist() const { return m_File.Exists(); }

bool KTFile::ParentExists() const { return m_File.ParentExists(); }

bool KTFile::Delete() const { return m_File.Delete(); }

bool KTFile::ForceDelete() const { return m_File.Delete(); }

bool KTFile::MakeFile(bool replace) const { return m_File.MakeFile(replace); }

bool KTFile::Touch() const { return m_File.Touch(); }

bool KTFile::ResolveAlias() {
    OPath const before = m_File.GetPath();
    bool const resolved = m_File.ResolveAlias();
    if (m_File.GetPath() != before) {
        PathChanged(m_File.GetPath().GetString());
    }
    return resolved;
}

bool KTFile::CanOpen(AccessMode access, ShareMode share) const { return m_File.CanOpen(access, share); }

KTUInt64 KTFile::GetSize() const { return m_File.GetSize(); }

KTUInt64 KTFile::GetTimeAttribute(TimeAttribute attribute) const { return m_File.GetTimeAttribute(attribute); }

bool KTFile::SetPath(KTPath const &path) {
    if (!m_File.Rename(path.GetOPath())) {
        return false;
    }
    PathChanged(m_File.GetPath().GetString());
    return true;
}

bool KTFile::SetPath(KTString const &path) { return SetPath(KTPath(path)); }

bool KTFile::operator==(KTFile const &other) const { return m_File == other.m_File; }

bool KTFile::operator!=(KTFile const &other) const { return m_File != other.m_File; }

void *KTFile::operator new(std::size_t size) { return Allocate(size); }

void KTFile::operator delete(void *block) { Deallocate(block); }

void KTFile::PathChanged(OString const &) {}
