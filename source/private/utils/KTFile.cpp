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

bool KTFile::operator==(KTFile const &other) const { return m_File == other.m_File; }

bool KTFile::operator!=(KTFile const &other) const { return m_File != other.m_File; }

void *KTFile::operator new(std::size_t size) { return Allocate(size); }

void KTFile::operator delete(void *block) { Deallocate(block); }

void KTFile::PathChanged(OString const &) {}
